#include "qx/bounded_fits.h"

#include "fit/bounded_fits.h"
#include "frame/constants.h"
#include "frame/export.h"

#include <cmath>
#include <cstring>

namespace qx {
namespace {

// What becomes of bound arrays that are too short or differ in length; what they hold for every
// parameter still counts.
enum class BadBounds { Fail, Warn, Pass };

// The bounds of all parameters, infinite where there are none.
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
    FitBounds bounds() const { return {lower_, upper_}; }

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

ErrorCode CheckLengths(InOut<DBL1D> y, In<DBL1D> x, In<DBL1D> w) {
    const bool fits = x.size() == y.size() && (w.isEmpty() || w.size() == y.size());
    return fits ? 0 : ErrSizeMismatch;
}

FitSamples Samples(InOut<DBL1D> y, In<DBL1D> x, In<DBL1D> w) {
    return {x.data(), y.data(), w.isEmpty() ? nullptr : w.data(), y.size()};
}

// A limit that is reached leaves the results where they are; a warning counts where all else is
// well.
Outcome Told(ErrorCode status, ErrorCode warning) {
    if (status == ErrIterationLimit)
        return Outcome::WithResults(status);
    return status == 0 ? warning : status;
}

template <FitNorm Norm>
Outcome BoundedLine(InOut<DBL1D> y, In<DBL1D> x, In<DBL1D> w, double tolerance, OutI32 iterations,
                    In<DBL1D> lower, In<DBL1D> upper, OutDBL a, OutDBL b, OutDBL mse) {
    if (const ErrorCode bad = CheckLengths(y, x, w))
        return bad;
    ErrorCode warning = 0;
    BoundsOf<2> bounds;
    // kept: the robust exports go on with bounds of bad length
    constexpr BadBounds rule = Norm == leastSquares ? BadBounds::Fail : BadBounds::Warn;
    if (const ErrorCode bad = bounds.take(lower, upper, rule, &warning))
        return bad;
    DBL p[2] = {};
    const ErrorCode status =
        FitBoundedLine({Samples(y, x, w), nullptr, bounds.bounds(), Norm, tolerance,
                        iterations.address(), p, y.data(), mse.address()});
    a = p[0];
    b = p[1];
    return Told(status, warning);
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
    if (const ErrorCode bad = CheckLengths(y, x, w))
        return bad;
    ErrorCode warning = 0;
    const DBL *const start = GuessFrom<3>(guess, &warning);
    BoundsOf<3> bounds;
    if (const ErrorCode bad = bounds.take(lower, upper, BadBounds::Fail, &warning))
        return bad;
    DBL p[3] = {};
    const ErrorCode status = Fit({Samples(y, x, w), start, bounds.bounds(), method, tolerance,
                                  iterations.address(), p, y.data(), mse.address()});
    a = p[0];
    b = p[1];
    c = p[2];
    return status == 0 ? warning : status;
}

Outcome BoundedLog(InOut<DBL1D> y, In<DBL1D> x, In<DBL1D> w, double base, OutI32 iterations,
                   In<DBL1D> guess, In<DBL1D> lower, In<DBL1D> upper, uint16_t method,
                   double tolerance, OutDBL a, OutDBL b, OutDBL mse) {
    if (const ErrorCode bad = CheckLengths(y, x, w))
        return bad;
    ErrorCode warning = 0;
    GuessFrom<2>(guess, &warning); // kept: the fit has its own start
    BoundsOf<2> bounds;
    if (const ErrorCode bad = bounds.take(lower, upper, BadBounds::Fail, &warning))
        return bad;
    DBL p[2] = {};
    const ErrorCode status =
        FitBoundedLog({Samples(y, x, w), nullptr, bounds.bounds(), method, tolerance,
                       iterations.address(), p, y.data(), mse.address()},
                      base);
    a = p[0];
    b = p[1];
    return status == 0 ? warning : status;
}

Outcome BoundedGaussian(InOut<DBL1D> y, In<DBL1D> x, In<DBL1D> w, double tolerance,
                        OutI32 iterations, In<DBL1D> guess, In<DBL1D> lower, In<DBL1D> upper,
                        uint16_t method, OutDBL a, OutDBL m, OutDBL s, OutDBL c, OutDBL mse) {
    if (const ErrorCode bad = CheckLengths(y, x, w))
        return bad;
    ErrorCode warning = 0;
    const DBL *start = GuessFrom<4>(guess, &warning);
    if (start != nullptr && !std::isfinite(start[0]))
        start = nullptr; // kept: only the first element is looked at
    BoundsOf<4> bounds;
    // kept: no test of the lengths
    if (const ErrorCode bad = bounds.take(lower, upper, BadBounds::Pass, &warning))
        return bad;
    DBL p[4] = {};
    const ErrorCode status =
        FitBoundedGaussian({Samples(y, x, w), start, bounds.bounds(), method, tolerance,
                            iterations.address(), p, y.data(), mse.address()});
    a = p[0];
    m = p[1];
    s = p[2];
    c = p[3];
    return status == 0 ? warning : status;
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
