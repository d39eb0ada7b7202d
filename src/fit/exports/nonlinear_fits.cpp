#include "qx/nonlinear_fits.h"

#include "fit/exports/fit_arguments.h"
#include "fit/nonlinear.h"
#include "frame/constants.h"
#include "linalg/matrix.h"

#include <cmath>

namespace qx {
namespace {

// The procedures of the caller and their arguments.
struct CallersModel {
    FitProcedure model, jacobian;
    void *context;
    ConstRealVector x;
    int32_t count, n;

    int32_t call(FitProcedure procedure, const DBL *p, DBL *out) const {
        return procedure(context, x.data(), static_cast<int32_t>(x.size()), p, count, out, n);
    }
    SampledModel sampled() const {
        SampledModel found = {count,
                              [](const void *user, const DBL *p, DBL *out) {
                                  const auto &self = *static_cast<const CallersModel *>(user);
                                  return self.call(self.model, p, out);
                              },
                              nullptr, this};
        if (jacobian != nullptr)
            found.jacobian = [](const void *user, const DBL *p, DBL *out) {
                const auto &self = *static_cast<const CallersModel *>(user);
                return self.call(self.jacobian, p, out);
            };
        return found;
    }
};

// Counts the parameters that are free within the bounds, which have as many elements as there are
// parameters, or none.
ErrorCode CheckBounds(In<DBL1D> lower, In<DBL1D> upper, int32_t count, int32_t *free) {
    *free = count;
    for (int32_t j = 0; j < count; ++j) {
        const double low = lower.isEmpty() ? -kInfinity : lower.data()[j];
        const double high = upper.isEmpty() ? kInfinity : upper.data()[j];
        if (std::isnan(low) || std::isnan(high))
            return ErrNaNInData;
        *free -= low == high;
    }
    for (int32_t j = 0; !lower.isEmpty() && !upper.isEmpty() && j < count; ++j)
        if (lower.data()[j] > upper.data()[j])
            return ErrBoundsCrossed;
    return 0;
}

ErrorCode CheckSamples(In<DBL1D> y, In<DBL1D> w, In<DBL1D> guess, int32_t free) {
    if (y.size() < free)
        return ErrFitPointsTooFew;
    int32_t counting = w.isEmpty() ? y.size() : 0;
    for (const double weight : w.view())
        counting += weight != 0.0;
    return FirstFailed(
        {{CheckFinite(y.data(), y.size()) != 0 || CheckFinite(w.data(), w.size()) != 0 ||
              CheckFinite(guess.data(), guess.size()) != 0,
          ErrNonFiniteInput},
         {counting < free, ErrTooFewWeights}});
}

bool IsOfSize(In<DBL1D> bounds, int32_t count) {
    return bounds.isEmpty() || bounds.size() == count;
}

Outcome FitCallersModel(In<DBL1D> x, In<DBL1D> y, In<DBL1D> w, FitProcedure model,
                        FitProcedure jacobian, void *context, In<DBL1D> guess, In<DBL1D> lower,
                        In<DBL1D> upper, int32_t loss, double scale, double tolerance,
                        OutI32 iterations, Out<DBL1D> p, Out<DBL2D> covariance,
                        Out<DBL1D> residuals, OutDBL cost, OutI32 reason) {
    constexpr int32_t usualLimit = 2000;
    const int32_t n = y.size(), count = guess.size();
    if (const ErrorCode bad = FirstFailed(
            {{!WeightsFit(w, n) || (n > 0 ? x.size() % n != 0 : !x.isEmpty()), ErrSizeMismatch},
             {n == 0 || count == 0, ErrEmptyInput},
             {!IsOfSize(lower, count) || !IsOfSize(upper, count), ErrSizesDisagree},
             {model == nullptr, ErrNotAvailable},
             {loss < 0 || loss >= lossCount, ErrInvalidSelector},
             {loss != 0 && !(scale > 0.0), ErrNotStrictlyPositive}}))
        return bad;
    int32_t free;
    if (const ErrorCode bad = CheckBounds(lower, upper, count, &free))
        return bad;
    if (const ErrorCode bad = CheckSamples(y, w, guess, free))
        return bad;
    if (const Outcome bad = p.resize(count))
        return bad;
    if (const Outcome bad = covariance.resize(count, count))
        return bad;
    if (const Outcome bad = residuals.resize(n))
        return bad;
    const CallersModel callers = {model, jacobian, context, x.view(), count, n};
    const int32_t limit = *iterations.address();
    const NonlinearFit fit = {callers.sampled(),
                              y.view(),
                              w.view(),
                              {lower.view(), upper.view()},
                              static_cast<Loss>(loss),
                              scale,
                              tolerance > 0.0 ? tolerance : 0.0,
                              limit > 0 ? limit : usualLimit};
    for (int32_t j = 0; j < count; ++j)
        p.data()[j] = guess.data()[j];
    NonlinearResult result = {p.view(), covariance.view(), residuals.view()};
    if (const ErrorCode failed = FitNonlinear(fit, &result))
        return failed;
    cost = result.cost;
    iterations = result.iterations;
    reason = static_cast<int32_t>(result.end);
    return OutcomeOf(result.end);
}

} // namespace
} // namespace qx

ErrorCode NonlinearFit2026(DBL1D x, DBL1D y, DBL1D w, FitProcedure model, FitProcedure jacobian,
                           void *context, DBL1D guess, DBL1D lower, DBL1D upper, int32_t loss,
                           double scale, double tolerance, int32_t *iterations, DBL1D p,
                           DBL2D covariance, DBL1D residuals, double *cost, int32_t *reason) {
    return qx::Returned(qx::FitCallersModel, x, y, w, model, jacobian, context, guess, lower, upper,
                        loss, scale, tolerance, iterations, p, covariance, residuals, cost, reason);
}
