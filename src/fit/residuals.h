#ifndef QX_FIT_RESIDUALS_H
#define QX_FIT_RESIDUALS_H

#include "fit/samples.h"
#include "qx/errors.h"

namespace qx {

// The sum of |w| (y - f)^2 over the samples, divided by their number and not by the sum of the
// weights. It is always computed in the expanded form y^2 + (f - 2 y) f, term by term.
class SquaredResiduals {
public:
    explicit SquaredResiduals(const FitSamples &samples) : samples_(samples) {}
    void add(int32_t i, double f) {
        const double y = samples_.y[i];
        const double term = y * y + (f - 2.0 * y) * f;
        sum_ += samples_.w.isEmpty() ? term : term * std::fabs(samples_.w[i]);
    }
    double mean() const { return sum_ / samples_.n(); }

private:
    const FitSamples samples_;
    double sum_ = 0.0;
};

// The values of a fit, where valueAt(i) is the value at sample i, and their MSE.
template <class ValueAt>
void EvaluateFit(const FitSamples &samples, const FitOutput &out, const ValueAt &valueAt) {
    if (out.values.isEmpty() && out.mse == nullptr)
        return;
    SquaredResiduals squares(samples);
    for (int32_t i = 0; i < samples.n(); ++i) {
        const double f = valueAt(i);
        squares.add(i, f);
        if (!out.values.isEmpty())
            out.values[i] = f;
    }
    if (out.mse != nullptr)
        *out.mse = squares.mean();
}

struct FitScores {
    double sse, rSquare, rmse;
};

// How well `fit` describes y, which has at least one element: the weighted sum of squared
// residuals; 1 minus its ratio to the squares about the mean; and sqrt(sse / dof). The mean is
// unweighted, and the weights, if there are any, count with their signs. A dof of 0 or below means
// n - 2. If all y are equal, rSquare is 1 for a fit without residuals and infinite otherwise. The
// sums are expanded as above.
//
// ErrFewerThanTwo; ErrTooFewForParameters if n <= dof.
ErrorCode GoodnessOfFit(ConstRealVector y, ConstRealVector fit, ConstRealVector w, int32_t dof,
                        FitScores *scores);

} // namespace qx

#endif
