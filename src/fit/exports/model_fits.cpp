#include "qx/model_fits.h"

#include "fit/exports/fit_arguments.h"
#include "fit/gaussian.h"
#include "fit/growth.h"
#include "fit/logarithm.h"

namespace qx {
namespace {

template <class Y, class Weights>
bool SizesFit(Y y, In<DBL1D> x, Weights w) {
    return x.size() == y.size() && WeightsFit(w, y.size());
}

FitLimits LimitsOf(double tolerance, double floor, OutI32 iterations) {
    return {tolerance, floor, *iterations.address()};
}

// Without iteration, as the oldest exports fit.
template <class Gives, class Deviations>
Outcome LogLinearExp(typename Gives::Y y, In<DBL1D> x, Deviations deviations, OutDBL a, OutDBL b,
                     typename Gives::MSE mse) {
    if (!SizesFit(y, x, deviations))
        return ErrSizeMismatch;
    SampleWeights weights;
    if (const ErrorCode failed = weights.make(deviations, Given::Deviations))
        return failed;
    int32_t steps;
    return FitExponential(x.data(), y.data(), weights.data(), y.size(), Gives::fit(y), a.address(),
                          b.address(), Gives::mse(mse), 0, nullptr, {}, &steps);
}

template <class Gives>
Outcome Exp(typename Gives::Y y, In<DBL1D> x, In<DBL1D> w, double tolerance, In<DBL1D> guessed,
            int32_t method, OutDBL a, OutDBL b, typename Gives::MSE mse, OutI32 iterations,
            double floor) {
    if (!SizesFit(y, x, w))
        return ErrSizeMismatch;
    const Guess guess(guessed, 2);
    return guess.merge(FitExponential(x.data(), y.data(), WeightsOf(w), y.size(), Gives::fit(y),
                                      a.address(), b.address(), Gives::mse(mse), method,
                                      guess.data(), LimitsOf(tolerance, floor, iterations),
                                      iterations.address()));
}

template <class Gives>
Outcome Power(typename Gives::Y y, In<DBL1D> x, In<DBL1D> w, double tolerance, In<DBL1D> guessed,
              OutDBL a, OutDBL b, typename Gives::MSE mse, OutI32 iterations, double floor) {
    if (!SizesFit(y, x, w))
        return ErrSizeMismatch;
    const Guess guess(guessed, 2);
    return guess.merge(FitPower(x.data(), y.data(), WeightsOf(w), y.size(), Gives::fit(y),
                                a.address(), b.address(), Gives::mse(mse), guess.data(),
                                LimitsOf(tolerance, floor, iterations), iterations.address()));
}

template <class Gives>
Outcome Logarithm(typename Gives::Y y, In<DBL1D> x, In<DBL1D> w, double base, OutDBL a, OutDBL b,
                  typename Gives::MSE mse) {
    if (!SizesFit(y, x, w))
        return ErrSizeMismatch;
    return FitLog(x.data(), y.data(), WeightsOf(w), y.size(), Gives::fit(y), base, a.address(),
                  b.address(), Gives::mse(mse));
}

template <class Gives>
Outcome Gaussian(typename Gives::Y y, In<DBL1D> x, In<DBL1D> w, double tolerance, In<DBL1D> guessed,
                 OutDBL a, OutDBL c, OutDBL s, typename Gives::MSE mse, OutI32 iterations,
                 double floor) {
    if (!SizesFit(y, x, w))
        return ErrSizeMismatch;
    const Guess guess(guessed, 3);
    return guess.merge(FitGaussian(x.data(), y.data(), WeightsOf(w), y.size(), Gives::fit(y),
                                   a.address(), c.address(), s.address(), Gives::mse(mse),
                                   guess.data(), LimitsOf(tolerance, floor, iterations),
                                   iterations.address()));
}

} // namespace
} // namespace qx

using qx::CoefficientsOnly;
using qx::In;
using qx::Returned;
using qx::ValuesInPlace;

ErrorCode ExpFit_head(DBL1D y, DBL1D x, DBL1D deviations, double *a, double *b, double *mse) {
    return Returned(qx::LogLinearExp<ValuesInPlace, In<DBL1D>>, y, x, deviations, a, b, mse);
}
ErrorCode ExpFitCoef_head(DBL1D y, DBL1D x, double *a, double *b) {
    return Returned(qx::LogLinearExp<CoefficientsOnly, std::nullptr_t>, y, x, nullptr, a, b,
                    nullptr);
}
ErrorCode ExpFit80_head(DBL1D y, DBL1D x, DBL1D w, double tolerance, DBL1D guess, uint16_t method,
                        double *a, double *b, double *mse, int32_t *iterations, double floor) {
    return Returned(qx::Exp<ValuesInPlace>, y, x, w, tolerance, guess, method, a, b, mse,
                    iterations, floor);
}
ErrorCode ExpFitCoef80_head(DBL1D y, DBL1D x, DBL1D w, int32_t method, double tolerance,
                            DBL1D guess, double *a, double *b, int32_t *iterations, double floor) {
    return Returned(qx::Exp<CoefficientsOnly>, y, x, w, tolerance, guess, method, a, b, nullptr,
                    iterations, floor);
}

ErrorCode PowerFit_head(DBL1D y, DBL1D x, DBL1D w, double tolerance, DBL1D guess, double *a,
                        double *b, double *mse, int32_t *iterations, double floor) {
    return Returned(qx::Power<ValuesInPlace>, y, x, w, tolerance, guess, a, b, mse, iterations,
                    floor);
}
ErrorCode PowerFitCoef_head(DBL1D y, DBL1D x, DBL1D w, double tolerance, DBL1D guess, double *a,
                            double *b, int32_t *iterations, double floor) {
    return Returned(qx::Power<CoefficientsOnly>, y, x, w, tolerance, guess, a, b, nullptr,
                    iterations, floor);
}

ErrorCode LogFit_head(DBL1D y, DBL1D x, DBL1D w, double base, double *a, double *b, double *mse) {
    return Returned(qx::Logarithm<ValuesInPlace>, y, x, w, base, a, b, mse);
}
ErrorCode LogFitCoef_head(DBL1D y, DBL1D x, DBL1D w, double base, double *a, double *b) {
    return Returned(qx::Logarithm<CoefficientsOnly>, y, x, w, base, a, b, nullptr);
}

ErrorCode GaussianPeakFit_head(DBL1D y, DBL1D x, DBL1D w, double tolerance, DBL1D guess, double *a,
                               double *c, double *s, double *mse, int32_t *iterations,
                               double floor) {
    return Returned(qx::Gaussian<ValuesInPlace>, y, x, w, tolerance, guess, a, c, s, mse,
                    iterations, floor);
}
ErrorCode GaussianPeakFitCoef_head(DBL1D y, DBL1D x, DBL1D w, double tolerance, DBL1D guess,
                                   double *a, double *c, double *s, int32_t *iterations,
                                   double floor) {
    return Returned(qx::Gaussian<CoefficientsOnly>, y, x, w, tolerance, guess, a, c, s, nullptr,
                    iterations, floor);
}
