#include "qx/model_fits.h"

#include "fit/exponential_power.h"
#include "fit/exports/fit_arguments.h"
#include "fit/gaussian.h"
#include "fit/logarithm.h"
#include "fit/peak_fit.h"
#include "frame/constants.h"

namespace qx {
namespace {

// Fits without iteration, as the oldest exports do.
template <class Gives, class Deviations>
Outcome LogLinearExp(typename Gives::Y y, In<DBL1D> x, Deviations deviations, OutDBL a, OutDBL b,
                     typename Gives::MSE mse) {
    if (!SizesFit(y, x, deviations))
        return ErrSizeMismatch;
    SampleWeights weights;
    if (const ErrorCode failed = weights.make(deviations, Given::Deviations))
        return failed;
    DBL p[2] = {};
    const ErrorCode status = FitExponential(
        {{x.view(), y.view(), weights.view()}, nullptr, {}, p, nullptr, Gives::output(y, mse)},
        ExponentialMethod::LogarithmicLine);
    a = p[0];
    b = p[1];
    return status;
}

// The frame of the others: checks the sizes, takes the guess, and writes the parameters.
template <class Gives, std::size_t Count, class Fit>
Outcome Iterated(typename Gives::Y y, In<DBL1D> x, In<DBL1D> w, double tolerance, In<DBL1D> guessed,
                 OutDBL (&parameters)[Count], typename Gives::MSE mse, OutI32 iterations,
                 double floor, const Fit &fit) {
    if (!SizesFit(y, x, w))
        return ErrSizeMismatch;
    const Guess guess(guessed, Count);
    int32_t *const steps = iterations.address();
    DBL p[Count] = {};
    const ErrorCode status = fit(ModelFit{SamplesOf(y, x, w),
                                          guess.data(),
                                          {tolerance, floor, *steps},
                                          p,
                                          steps,
                                          Gives::output(y, mse)});
    for (std::size_t i = 0; i < Count; ++i)
        parameters[i] = p[i];
    return guess.merge(status);
}

template <class Gives>
Outcome Exp(typename Gives::Y y, In<DBL1D> x, In<DBL1D> w, double tolerance, In<DBL1D> guess,
            int32_t method, OutDBL a, OutDBL b, typename Gives::MSE mse, OutI32 iterations,
            double floor) {
    const auto way =
        method == 0 ? ExponentialMethod::LogarithmicLine : ExponentialMethod::GaussNewton;
    OutDBL p[] = {a, b};
    return Iterated<Gives>(y, x, w, tolerance, guess, p, mse, iterations, floor,
                           [=](const ModelFit &request) { return FitExponential(request, way); });
}

template <class Gives>
Outcome Power(typename Gives::Y y, In<DBL1D> x, In<DBL1D> w, double tolerance, In<DBL1D> guess,
              OutDBL a, OutDBL b, typename Gives::MSE mse, OutI32 iterations, double floor) {
    OutDBL p[] = {a, b};
    return Iterated<Gives>(y, x, w, tolerance, guess, p, mse, iterations, floor, FitPower);
}

template <class Gives>
Outcome Gaussian(typename Gives::Y y, In<DBL1D> x, In<DBL1D> w, double tolerance, In<DBL1D> guess,
                 OutDBL a, OutDBL c, OutDBL s, typename Gives::MSE mse, OutI32 iterations,
                 double floor) {
    OutDBL p[] = {a, c, s};
    return Iterated<Gives>(y, x, w, tolerance, guess, p, mse, iterations, floor, FitGaussian);
}

// The peak of the bounded fit, with its level fixed at 0.
Outcome PeakAtEveryScale(InOut<DBL1D> y, In<DBL1D> x, In<DBL1D> w, double tolerance,
                         In<DBL1D> guess, OutDBL a, OutDBL c, OutDBL s, OutDBL mse,
                         OutI32 iterations, double) {
    if (!SizesFit(y, x, w))
        return ErrSizeMismatch;
    const Guess start(guess, 3);
    const DBL lower[] = {-kInfinity, -kInfinity, -kInfinity, 0.0};
    const DBL upper[] = {kInfinity, kInfinity, kInfinity, 0.0};
    DBL p[4] = {}, first[4] = {};
    for (int32_t j = 0; start.data() != nullptr && j < 3; ++j)
        first[j] = start.data()[j];
    FitEnd end = FitEnd::Exact;
    const BoundedFit request = {.samples = SamplesOf(y, x, w),
                                .guess = start.data() != nullptr ? first : nullptr,
                                .bounds = {{lower, 4}, {upper, 4}},
                                .tolerance = tolerance,
                                .iterations = iterations.address(),
                                .p = p,
                                .mse = mse.address(),
                                .values = y.view()};
    if (const ErrorCode failed = FitPeak(request, &end))
        return failed;
    a = p[0];
    c = p[1];
    s = p[2];
    const Outcome outcome = OutcomeOf(end);
    return outcome ? outcome : start.merge(0);
}

template <class Gives>
Outcome Logarithm(typename Gives::Y y, In<DBL1D> x, In<DBL1D> w, double base, OutDBL a, OutDBL b,
                  typename Gives::MSE mse) {
    if (!SizesFit(y, x, w))
        return ErrSizeMismatch;
    DBL p[2] = {};
    const ErrorCode status = FitLog(SamplesOf(y, x, w), base, p, Gives::output(y, mse));
    a = p[0];
    b = p[1];
    return status;
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
ErrorCode GaussianPeakFit2026_head(DBL1D y, DBL1D x, DBL1D w, double tolerance, DBL1D guess,
                                   double *a, double *c, double *s, double *mse,
                                   int32_t *iterations, double floor) {
    return Returned(qx::PeakAtEveryScale, y, x, w, tolerance, guess, a, c, s, mse, iterations,
                    floor);
}
