#ifndef QX_FIT_LINE_H
#define QX_FIT_LINE_H

#include "qx/errors.h"
#include "qx/types.h"

namespace qx {

// The sums of a line fit, each in one accumulator from the first sample to the last. Weights are
// taken as |w| / max |w|; without them `weight` is n.
struct LineSums {
    double weight, x, y, xy, xx;
};
LineSums SumsOfLine(const DBL *x, const DBL *y, int32_t n, const DBL *w);

// y = slope x + intercept by least squares, from the closed formula: equal abscissae give NaN or
// infinities and no failure. `fit` gets the line's values and may be y; it may be null, and so may
// mse. Weights: SettleWeights.
ErrorCode FitLine(const DBL *x, const DBL *y, int32_t n, const DBL *w, DBL *fit, DBL *slope,
                  DBL *intercept, DBL *mse);

} // namespace qx

#endif
