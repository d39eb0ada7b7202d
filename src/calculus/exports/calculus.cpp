#include "qx/calculus.h"
#include "calculus/differentiation.h"
#include "calculus/integration.h"
#include "calculus/volume.h"
#include "frame/export.h"

namespace qx {
namespace {

template <Remainder Leftover>
ErrorCode Definite(In<DBL1D> x, double dt, int32_t rule, OutDBL result) {
    if (x.isEmpty())
        return ErrEmptyInput;
    return DefiniteIntegral(x.view(), dt, rule, Leftover, result.address());
}

template <Remainder Leftover>
ErrorCode Definite2D(In<DBL2D> x, In<DBL1D> dts, int32_t rule, OutDBL result) {
    return DefiniteIntegral2D(x.view(), dts.view(), rule, Leftover, result.address());
}

template <Remainder Leftover>
ErrorCode Definite3D(In<DBL3D> x, In<DBL1D> dts, int32_t rule, OutDBL result) {
    const Volume volume = {x.data(), x.dimension(0), x.dimension(1), x.dimension(2)};
    return DefiniteIntegral3D(volume, dts.view(), rule, Leftover, result.address());
}

ErrorCode IntegralBySimpson(InOut<DBL1D> x, const double *initial, const double *final, double dt) {
    if (const ErrorCode bad =
            LastFailed({{dt <= 0.0, ErrSamplingNotPositive}, {x.isEmpty(), ErrEmptyInput}}))
        return bad;
    RunningIntegral(x.view(), dt, {initial, 1}, {final, 1}, Simpson, x.view());
    return 0;
}

// Checks the values that a formula needs beyond the data.
ErrorCode CheckIntegralEnds(int32_t rule, int32_t initial, int32_t final) {
    switch (rule) {
    case Trapezoid:
        return FirstFailed({{initial < 1, ErrEmptyInput}});
    case Simpson:
        return FirstFailed({{initial < 1 || final < 1, ErrEmptyInput}});
    case SimpsonThreeEighths:
        return FirstFailed({{final < 1, ErrEmptyInput}, {initial < 2, ErrFewerThanTwo}});
    case Bode:
        return FirstFailed({{initial < 2 || final < 2, ErrFewerThanTwo}});
    case LeftRectangle:
    case RightRectangle:
        return 0;
    default:
        return ErrInvalidSelector;
    }
}

ErrorCode IntegralByRule(InOut<DBL1D> x, In<DBL1D> initial, In<DBL1D> final, double dt,
                         int32_t rule) {
    if (const ErrorCode bad =
            FirstFailed({{dt <= 0.0, ErrSamplingNotPositive}, {x.isEmpty(), ErrEmptyInput}}))
        return bad;
    if (const ErrorCode bad = CheckIntegralEnds(rule, initial.size(), final.size()))
        return bad;
    RunningIntegral(x.view(), dt, initial.view(), final.view(), static_cast<IntegrationRule>(rule),
                    x.view());
    return 0;
}

ErrorCode IntegralFromZero(InOut<DBL1D> x, double dt, int32_t rule) {
    if (const ErrorCode bad =
            FirstFailed({{dt <= 0.0, ErrSamplingNotPositive}, {x.isEmpty(), ErrEmptyInput}}))
        return bad;
    return RunningIntegral2017(x.view(), dt, rule, x.view());
}

// kept: the checks are in the reverse order of those of the integral, and a step that is NaN fails.
ErrorCode CentralDerivative(InOut<DBL1D> x, const double *initial, const double *final, double dt) {
    if (const ErrorCode bad =
            LastFailed({{x.isEmpty(), ErrEmptyInput}, {!(dt > 0.0), ErrSamplingNotPositive}}))
        return bad;
    Differentiate(x.view(), dt, {initial, 1}, {final, 1}, CentralSecondOrder, x.view());
    return 0;
}

ErrorCode CheckDerivativeEnds(int32_t rule, int32_t initial, int32_t final) {
    switch (rule) {
    case CentralSecondOrder:
        return FirstFailed({{initial < 1 || final < 1, ErrEmptyInput}});
    case CentralFourthOrder:
        return FirstFailed({{initial < 2 || final < 2, ErrFewerThanTwo}});
    case Forward:
        return FirstFailed({{final < 1, ErrEmptyInput}});
    case Backward:
        return FirstFailed({{initial < 1, ErrEmptyInput}});
    default:
        return ErrInvalidSelector;
    }
}

ErrorCode DerivativeByRule(InOut<DBL1D> x, In<DBL1D> initial, In<DBL1D> final, double dt,
                           int32_t rule) {
    if (const ErrorCode bad =
            FirstFailed({{x.isEmpty(), ErrEmptyInput}, {dt <= 0.0, ErrSamplingNotPositive}}))
        return bad;
    if (const ErrorCode bad = CheckDerivativeEnds(rule, initial.size(), final.size()))
        return bad;
    Differentiate(x.view(), dt, initial.view(), final.view(),
                  static_cast<DifferentiationRule>(rule), x.view());
    return 0;
}

constexpr auto AtEnd = Remainder::LowerRuleAtEnd;
constexpr auto AtStart = Remainder::OwnOrderAtStart;

} // namespace
} // namespace qx

using qx::InErr;
using qx::Returned;

int32_t NumerIntegration_head(DBL1D x, const double *dt, const int32_t *rule, double *result,
                              ErrorCode *err) {
    return InErr(err, qx::Definite<qx::AtEnd>, x, *dt, *rule, result);
}

ErrorCode NumerIntegration_2017_head(DBL1D x, const double *dt, const int32_t *rule,
                                     double *result) {
    return Returned(qx::Definite<qx::AtStart>, x, *dt, *rule, result);
}

ErrorCode NumerIntegration2D_head(DBL2D x, DBL1D dts, uint16_t rule, double *result) {
    return Returned(qx::Definite2D<qx::AtEnd>, x, dts, rule, result);
}

ErrorCode NumerIntegration2D_2017_head(DBL2D x, DBL1D dts, uint16_t rule, double *result) {
    return Returned(qx::Definite2D<qx::AtStart>, x, dts, rule, result);
}

ErrorCode NumerIntegration3D_head(DBL3D x, DBL1D dts, uint16_t rule, double *result) {
    return Returned(qx::Definite3D<qx::AtEnd>, x, dts, rule, result);
}

ErrorCode NumerIntegration3D_2017_head(DBL3D x, DBL1D dts, uint16_t rule, double *result) {
    return Returned(qx::Definite3D<qx::AtStart>, x, dts, rule, result);
}

int32_t Integral(DBL1D x, const double *initial, const double *final, const double *dt,
                 ErrorCode *err) {
    return InErr(err, qx::IntegralBySimpson, x, initial, final, *dt);
}

ErrorCode Integral90(DBL1D x, DBL1D initial, DBL1D final, double dt, int32_t rule) {
    return Returned(qx::IntegralByRule, x, initial, final, dt, rule);
}

ErrorCode Integral_2017(DBL1D x, double dt, int32_t rule) {
    return Returned(qx::IntegralFromZero, x, dt, rule);
}

int32_t Derivative(DBL1D x, const double *initial, const double *final, const double *dt,
                   ErrorCode *err) {
    return InErr(err, qx::CentralDerivative, x, initial, final, *dt);
}

ErrorCode Derivative85(DBL1D x, DBL1D initial, DBL1D final, const double *dt, int32_t rule) {
    return Returned(qx::DerivativeByRule, x, initial, final, *dt, rule);
}
