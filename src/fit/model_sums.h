#ifndef QX_FIT_MODEL_SUMS_H
#define QX_FIT_MODEL_SUMS_H

#include "frame/widths.h"
#include "qx/types.h"

namespace qx {

// The sums of the normal equations of a model over n samples with the weights |w|, or without
// weights if w is null: the sum of w r^2, then for each parameter i the sums of w d_i d_j for j up
// to i, and of w d_i r, with r = y - f(x) and the derivatives d. Each sum is made of four, each
// over every fourth sample. Exponentials have an error of up to 1.01 ulp.
QX_BY_WIDTH(void, ExponentialSums,
            (const DBL *x, const DBL *y, const DBL *w, int32_t n, const DBL *p, DBL *sums))
QX_BY_WIDTH(void, GaussianSums,
            (const DBL *x, const DBL *y, const DBL *w, int32_t n, const DBL *p, DBL *sums))
constexpr int32_t SumsOfModel(int32_t parameters) {
    return 1 + parameters * (parameters + 1) / 2 + parameters;
}

} // namespace qx

#endif
