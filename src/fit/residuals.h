#ifndef QX_FIT_RESIDUALS_H
#define QX_FIT_RESIDUALS_H

#include "qx/errors.h"
#include "qx/types.h"

#include <cmath>

namespace qx {

// The sum of |w| (y - f)^2 over the samples, divided by their count and not by the sum of the
// weights; w may be null. Always in the expanded form y^2 + (f - 2 y) f, term by term.
class SquaredResiduals {
public:
    explicit SquaredResiduals(const DBL *w) : w_(w) {}
    void add(int32_t i, double y, double f) {
        const double term = y * y + (f - 2.0 * y) * f;
        sum_ += w_ == nullptr ? term : term * std::fabs(w_[i]);
    }
    double mean(int32_t n) const { return sum_ / n; }

private:
    const DBL *w_;
    double sum_ = 0.0;
};

// ErrEmptyInput for n < 1.
ErrorCode WeightedMSE(const DBL *y, const DBL *fit, const DBL *w, int32_t n, DBL *mse);

// How well `fit` describes y: the weighted sum of squared residuals; 1 less its ratio to the
// squares about the mean; and sqrt(sse / dof). The mean is the plain one, and the weights count
// with their signs. dof of 0 or below becomes n - 2. Where all y are equal rSquare is 1 for a fit
// without residuals, else infinite. Expanded sums, as above.
//
// ErrFewerThanTwo; ErrTooFewForParameters for n <= dof.
ErrorCode GoodnessOfFit(const DBL *y, const DBL *fit, const DBL *w, int32_t n, int32_t dof,
                        DBL *sse, DBL *rSquare, DBL *rmse);

} // namespace qx

#endif
