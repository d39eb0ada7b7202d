#include "qx/bounded_fits.h"

#include "fit/bounded_fits.h"
#include "fit/exports/fit_arguments.h"
#include "fit/peak_fit.h"
#include "frame/constants.h"

#include <cmath>

namespace qx {
namespace {

// What happens if the arrays of bounds are too short or differ in length. Unless the fit fails, an
// array that has a bound for every parameter is still used.
enum class BadBounds { Fail, Warn, Pass };

// The bounds of all parameters, infinite if there are none.
template <int32_t Count>
class BoundsOf {
public:
    ErrorCode take(In<DBL1D> lower, In<DBL1D> upper, BadBounds rule, ErrorCode *warning) {
        const bool isBad = lower.size() != upper.size() || IsShort(lower) || IsShort(upper);
        if (isBad && rule == BadBounds::Fail)
            return ErrSizesDisagree;
        if (isBad && rule == BadBounds::Warn)
            *warning = WarnFitIncomplete;
        for (int32_t i = 0; i < Count; ++i) {
            lower_[i] = lower.size() < Count ? -kInfinity : lower.data()[i];
            upper_[i] = upper.size() < Count ? kInfinity : upper.data()[i];
            if (std::isnan(lower_[i]) || std::isnan(upper_[i]))
                return ErrNaNInData;
        }
        return 0;
    }
    FitBounds bounds() const { return {{lower_, Count}, {upper_, Count}}; }

private:
    static bool IsShort(In<DBL1D> array) { return array.size() > 0 && array.size() < Count; }
    DBL lower_[Count], upper_[Count];
};

template <int32_t Count>
const DBL *GuessFrom(In<DBL1D> guess, ErrorCode *warning) {
    if (guess.size() >= Count)
        return guess.data();
    if (guess.size() > 0)
        *warning = WarnFitIncomplete;
    return nullptr;
}

// The frame of all exports: checks sizes and bounds, fits, and writes the parameters. `request` has
// the other arguments; a warning is returned if nothing fails.
template <std::size_t Count, class Fit>
ErrorCode FitBounded(InOut<DBL1D> y, In<DBL1D> x, In<DBL1D> w, In<DBL1D> lower, In<DBL1D> upper,
                     BadBounds rule, BoundedFit request, OutDBL (&parameters)[Count],
                     ErrorCode warning, const Fit &fit) {
    if (!SizesFit(y, x, w))
        return ErrSizeMismatch;
    BoundsOf<Count> bounds;
    if (const ErrorCode bad = bounds.take(lower, upper, rule, &warning))
        return bad;
    DBL p[Count] = {};
    request.samples = SamplesOf(y, x, w);
    request.bounds = bounds.bounds();
    request.p = p;
    request.values = y.view();
    const ErrorCode status = fit(request);
    for (std::size_t i = 0; i < Count; ++i)
        parameters[i] = p[i];
    return status == 0 ? warning : status;
}

// The part of a request that is taken from the arguments unchanged.
BoundedFit RequestOf(const DBL *guess, uint16_t method, double tolerance, OutI32 iterations,
                     OutDBL mse) {
    return {.guess = guess,
            .method = method,
            .tolerance = tolerance,
            .iterations = iterations.address(),
            .mse = mse.address()};
}

template <FitNorm Norm>
Outcome BoundedLine(InOut<DBL1D> y, In<DBL1D> x, In<DBL1D> w, double tolerance, OutI32 iterations,
                    In<DBL1D> lower, In<DBL1D> upper, OutDBL a, OutDBL b, OutDBL mse) {
    // kept: the robust exports continue with bounds of a wrong length
    constexpr BadBounds rule = Norm == leastSquares ? BadBounds::Fail : BadBounds::Warn;
    OutDBL p[] = {a, b};
    const ErrorCode status =
        FitBounded(y, x, w, lower, upper, rule,
                   RequestOf(nullptr, Norm, tolerance, iterations, mse), p, 0, FitBoundedLine);
    // The results are kept when the limit is reached.
    return status == ErrIterationLimit ? Outcome::WithResults(status) : status;
}

Outcome PlainBoundedLine(InOut<DBL1D> y, In<DBL1D> x, In<DBL1D> w, In<DBL1D> lower, In<DBL1D> upper,
                         OutDBL a, OutDBL b, OutDBL mse) {
    int32_t unused = 0;
    return BoundedLine<leastSquares>(y, x, w, 0.0, &unused, lower, upper, a, b, mse);
}

template <ErrorCode (*Fit)(const BoundedFit &)>
Outcome BoundedModel(InOut<DBL1D> y, In<DBL1D> x, In<DBL1D> w, double tolerance, OutI32 iterations,
                     In<DBL1D> guess, In<DBL1D> lower, In<DBL1D> upper, uint16_t method, OutDBL a,
                     OutDBL b, OutDBL c, OutDBL mse) {
    ErrorCode warning = 0;
    const DBL *const start = GuessFrom<3>(guess, &warning);
    OutDBL p[] = {a, b, c};
    return FitBounded(y, x, w, lower, upper, BadBounds::Fail,
                      RequestOf(start, method, tolerance, iterations, mse), p, warning, Fit);
}

Outcome BoundedLog(InOut<DBL1D> y, In<DBL1D> x, In<DBL1D> w, double base, OutI32 iterations,
                   In<DBL1D> guess, In<DBL1D> lower, In<DBL1D> upper, uint16_t method,
                   double tolerance, OutDBL a, OutDBL b, OutDBL mse) {
    ErrorCode warning = 0;
    GuessFrom<2>(guess, &warning); // kept: the guess is not used; the fit has its own start
    OutDBL p[] = {a, b};
    return FitBounded(y, x, w, lower, upper, BadBounds::Fail,
                      RequestOf(nullptr, method, tolerance, iterations, mse), p, warning,
                      [=](const BoundedFit &request) { return FitBoundedLog(request, base); });
}

Outcome BoundedGaussian(InOut<DBL1D> y, In<DBL1D> x, In<DBL1D> w, double tolerance,
                        OutI32 iterations, In<DBL1D> guess, In<DBL1D> lower, In<DBL1D> upper,
                        uint16_t method, OutDBL a, OutDBL m, OutDBL s, OutDBL c, OutDBL mse) {
    ErrorCode warning = 0;
    const DBL *start = GuessFrom<4>(guess, &warning);
    if (start != nullptr && !std::isfinite(start[0]))
        start = nullptr; // kept: only the first element is checked
    OutDBL p[] = {a, m, s, c};
    // kept: the lengths of the bounds are not checked
    return FitBounded(y, x, w, lower, upper, BadBounds::Pass,
                      RequestOf(start, method, tolerance, iterations, mse), p, warning,
                      FitBoundedGaussian);
}

Outcome BoundedPeak(InOut<DBL1D> y, In<DBL1D> x, In<DBL1D> w, double tolerance, OutI32 iterations,
                    In<DBL1D> guess, In<DBL1D> lower, In<DBL1D> upper, uint16_t method, OutDBL a,
                    OutDBL m, OutDBL s, OutDBL c, OutDBL mse) {
    ErrorCode warning = 0;
    const DBL *const start = GuessFrom<4>(guess, &warning);
    OutDBL p[] = {a, m, s, c};
    FitEnd end = FitEnd::Exact;
    const ErrorCode status =
        FitBounded(y, x, w, lower, upper, BadBounds::Fail,
                   RequestOf(start, method, tolerance, iterations, mse), p, 0,
                   [&](const BoundedFit &request) { return FitPeak(request, &end); });
    if (status != 0)
        return status;
    const Outcome outcome = OutcomeOf(end);
    return outcome ? outcome : warning;
}

} // namespace
} // namespace qx

using qx::Returned;

ErrorCode BoundLinearFit_head(DBL1D y, DBL1D x, DBL1D w, DBL1D lower, DBL1D upper, double *a,
                              double *b, double *mse) {
    return Returned(qx::PlainBoundedLine, y, x, w, lower, upper, a, b, mse);
}

ErrorCode BoundLinearFitLAR_head(DBL1D y, DBL1D x, DBL1D w, double tolerance, int32_t *iterations,
                                 DBL1D lower, DBL1D upper, double *a, double *b,
                                 double *meanAbsResidual) {
    return Returned(qx::BoundedLine<qx::leastAbsolute>, y, x, w, tolerance, iterations, lower,
                    upper, a, b, meanAbsResidual);
}

ErrorCode BoundLinearFitBi_head(DBL1D y, DBL1D x, DBL1D w, double tolerance, int32_t *iterations,
                                DBL1D lower, DBL1D upper, double *a, double *b, double *mse) {
    return Returned(qx::BoundedLine<qx::bisquare>, y, x, w, tolerance, iterations, lower, upper, a,
                    b, mse);
}

ErrorCode BoundExpFit_head(DBL1D y, DBL1D x, DBL1D w, double tolerance, int32_t *iterations,
                           DBL1D guess, DBL1D lower, DBL1D upper, uint16_t method, double *a,
                           double *b, double *c, double *mse) {
    return Returned(qx::BoundedModel<qx::FitBoundedExponential>, y, x, w, tolerance, iterations,
                    guess, lower, upper, method, a, b, c, mse);
}

ErrorCode BoundPowerFit_head(DBL1D y, DBL1D x, DBL1D w, double tolerance, int32_t *iterations,
                             DBL1D guess, DBL1D lower, DBL1D upper, uint16_t method, double *a,
                             double *b, double *c, double *mse) {
    return Returned(qx::BoundedModel<qx::FitBoundedPower>, y, x, w, tolerance, iterations, guess,
                    lower, upper, method, a, b, c, mse);
}

ErrorCode BoundLogFit_head(DBL1D y, DBL1D x, DBL1D w, double base, int32_t *iterations, DBL1D guess,
                           DBL1D lower, DBL1D upper, uint16_t method, double tolerance, double *a,
                           double *b, double *mse) {
    return Returned(qx::BoundedLog, y, x, w, base, iterations, guess, lower, upper, method,
                    tolerance, a, b, mse);
}

ErrorCode BoundGaussianFit_head(DBL1D y, DBL1D x, DBL1D w, double tolerance, int32_t *iterations,
                                DBL1D guess, DBL1D lower, DBL1D upper, uint16_t method, double *a,
                                double *m, double *s, double *c, double *mse) {
    return Returned(qx::BoundedGaussian, y, x, w, tolerance, iterations, guess, lower, upper,
                    method, a, m, s, c, mse);
}

ErrorCode BoundGaussianFit2026_head(DBL1D y, DBL1D x, DBL1D w, double tolerance,
                                    int32_t *iterations, DBL1D guess, DBL1D lower, DBL1D upper,
                                    uint16_t method, double *a, double *m, double *s, double *c,
                                    double *mse) {
    return Returned(qx::BoundedPeak, y, x, w, tolerance, iterations, guess, lower, upper, method, a,
                    m, s, c, mse);
}
