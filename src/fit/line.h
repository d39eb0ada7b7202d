#ifndef QX_FIT_LINE_H
#define QX_FIT_LINE_H

#include "fit/samples.h"
#include "frame/widths.h"
#include "qx/errors.h"

namespace qx {

struct Line {
    double slope, intercept;
    double at(double x) const { return slope * x + intercept; }
};

// The sums of a line fit, each in one accumulator from the first sample to the last. Weights are
// taken as |w| / max |w|; without them `weight` is n.
struct LineSums {
    double weight, x, y, xy, xx;
};
LineSums SumsOfLine(const FitSamples &samples);
LineSums SumsOfLine(const FitSamples &samples, double largestWeight);
// The same for weights whose largest magnitude is known.
QX_BY_WIDTH(void, WeightedLineSums,
            (const DBL *x, const DBL *y, const DBL *w, int32_t n, double largest, LineSums *sums))

// The line of least squares, from the closed formula: if all abscissae are equal, the result is NaN
// or infinite.
Line LineThrough(const FitSamples &samples, double largestWeight);

// The same after settling the weights (SettleWeights, which documents the codes), and the values of
// the line.
ErrorCode FitLine(FitSamples samples, Line *line, const FitOutput &out);

} // namespace qx

#endif
