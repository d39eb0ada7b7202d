#include "special/tail_integrals.h"

#include "frame/constants.h"
#include "special/logarithms.h"
#include "special/rational.h"
#include "special/tables/gauss_legendre.h"

#include <cmath>
#include <iterator>

namespace qx {

namespace {

constexpr double kStirlingFrom = 10.0;
constexpr double kDirectFrom = 8.0; // parameter from which the integral over its tail is short
constexpr double kHuge = 1e290;     // products in twice the precision overflow above it
constexpr double kAboveHalf = 0.55;

Extended Whole(double x) { return {x, 0.0}; }

// exp(u) - 1 - u.
double ExpRest(double u) {
    constexpr double c[] = {1.0 / 2,
                            1.0 / 6,
                            1.0 / 24,
                            1.0 / 120,
                            1.0 / 720,
                            1.0 / 5040,
                            1.0 / 40320,
                            1.0 / 362880,
                            1.0 / 3628800,
                            1.0 / 39916800,
                            1.0 / 479001600,
                            1.0 / 6227020800,
                            1.0 / 87178291200,
                            1.0 / 1307674368000,
                            1.0 / 20922789888000,
                            1.0 / 355687428096000,
                            1.0 / 6402373705728000};
    return std::fabs(u) < 1.0 ? u * u * Horner(c, u) : std::expm1(u) - u;
}

// ln(1 + w) - w.
double LogRest(double w) {
    if (std::fabs(w) > 0.3)
        return std::log1p(w) - w;
    constexpr double c[] = {1.0 / 3,  1.0 / 5,  1.0 / 7,  1.0 / 9, 1.0 / 11,
                            1.0 / 13, 1.0 / 15, 1.0 / 17, 1.0 / 19};
    const double z = w / (2.0 + w);
    return 2.0 * z * (z * z) * Horner(c, z * z) - w * z;
}

// The logarithm of the integrand at t = x exp(u) minus that at x.
struct GammaExponent {
    double lead, x; // a - x
    double slope() const { return lead; }
    double curvature() const { return x; }
    double operator()(double u) const { return lead * u - x * ExpRest(u); }
};

// The same where t / (1 - t) is exp(u) times x / y, computed from the smaller of x and y.
struct BetaExponent {
    double lead, sum, x, y; // a y - b x, a + b
    double slope() const { return lead; }
    double curvature() const { return sum * x * y; }
    double operator()(double u) const {
        const bool isLow = x <= y;
        return lead * u - sum * (isLow ? excess(x, u) : excess(y, -u));
    }
    // ln(1 + z (exp(u) - 1)) - z u
    static double excess(double z, double u) {
        if (std::fabs(u) > 1.0)
            return std::log1p(z * std::expm1(u)) - z * u;
        const double rest = ExpRest(u);
        return LogRest(z * (u + rest)) + z * rest;
    }
};

// The distance at which the integrand has fallen by 17 digits or more.
template <class Exponent>
double EndOfIntegral(const Exponent &exponent, double direction) {
    constexpr double least = -40.0, most = -70.0;
    const double s = std::fabs(exponent.slope());
    double v = -2 * least / (s + std::sqrt(s * s - 2 * least * exponent.curvature()));
    double low = 0.0, high = kInfinity;
    for (int turn = 0; turn < 2200; ++turn) { // enough to bisect the range of the doubles
        const double at = exponent(direction * v);
        if (at <= least && at >= most)
            break;
        (at > least ? low : high) = v;
        v = std::isinf(high) ? 1.5 * v : 0.5 * (low + high);
    }
    return v;
}

// The integral of exp(exponent(direction u)) over u from 0 on.
template <class Exponent>
double IntegralOf(const Exponent &exponent, double direction) {
    constexpr double longest = 5.5;
    constexpr double farthest = 1e5; // no correct integral extends this far
    const double end = EndOfIntegral(exponent, direction);
    if (!(end < farthest))
        return kNaN;
    const double panels = std::ceil(end / longest);
    const double width = end / panels;
    Extended sum = Whole(0.0);
    for (double panel = 0; panel < panels; ++panel)
        for (std::size_t i = 0; i < std::size(table::legendreNodes); ++i) {
            const double u = width * (panel + table::legendreNodes[i]);
            const Extended next =
                ExactSum(sum.high, table::legendreWeights[i] * std::exp(exponent(direction * u)));
            sum = {next.high, sum.low + next.low};
        }
    return (sum.high + sum.low) * width;
}

// factor times sqrt(square / (2 pi)) exp(exponent); the rounding error of the factor is moved into
// the exponent.
Scaled Front(Extended factor, Extended square, Extended exponent) {
    constexpr Extended inverseRoot = {kInverseRootTwoPi, -0x1.cbc0d30ebfd15p-56};
    const Extended whole = factor * SquareRoot(square) * inverseRoot;
    return {whole.high, exponent + Whole(whole.low / whole.high)};
}

// x^a exp(-x) / gamma(a).
Scaled GammaPower(double a, double x) {
    if (x > kHuge)
        return {1.0, Whole(-x)};
    Extended raised = Whole(a);
    Extended factor = Whole(1.0);
    int steps = 0;
    for (; raised.high < kStirlingFrom; raised = raised + Whole(1.0), ++steps)
        factor = factor * raised;
    const Extended ratio = Whole(x) / raised;
    Extended exponent = -(raised * ExcessOfLog((Whole(x) - raised) / raised, ratio)) -
                        Whole(StirlingCorrection(raised.high));
    if (steps > 0)
        exponent = exponent - Whole(steps) * LogOf(Whole(x));
    return Front(factor, raised, exponent);
}

// x^a y^b / beta(a, b).
Scaled BetaPowerOf(double a, double b, const UnitPoint &point) {
    Extended first = Whole(a), second = Whole(b), sum = ExactSum(a, b), factor = Whole(1.0);
    int firstSteps = 0, secondSteps = 0;
    const auto raise = [&](Extended &parameter, int &steps) {
        for (; parameter.high < kStirlingFrom; ++steps) {
            factor = factor * (parameter / sum);
            parameter = parameter + Whole(1.0);
            sum = sum + Whole(1.0);
        }
    };
    raise(first, firstSteps);
    raise(second, secondSteps);
    const Extended t = second * point.x - first * point.y;
    Extended exponent = Whole(StirlingCorrection(sum.high) - StirlingCorrection(first.high) -
                              StirlingCorrection(second.high)) -
                        first * ExcessOfLog(t / first, sum * point.x / first) -
                        second * ExcessOfLog(-t / second, sum * point.y / second);
    if (firstSteps > 0)
        exponent = exponent - Whole(firstSteps) * LogOf(point.x);
    if (secondSteps > 0)
        exponent = exponent - Whole(secondSteps) * LogOf(point.y);
    return Front(factor, first / sum * second, exponent);
}

int StepsToDirect(double a) {
    return a < kDirectFrom ? static_cast<int>(std::ceil(kDirectFrom - a)) : 0;
}

// The lower part divided by its slope: 1 / a (1 + x / (a + 1) (1 + x / (a + 2) (...))), with the
// integral as the remainder after the last term.
double LowerGamma(double a, double x) {
    const int steps = StepsToDirect(a);
    const double raised = a + steps;
    const double integral = IntegralOf(GammaExponent{raised - x, x}, -1.0);
    if (steps == 0)
        return integral;
    double sum = 1.0 + x * integral;
    for (int k = steps - 1; k > 0; --k)
        sum = 1.0 + x / (a + k) * sum;
    return sum / a;
}

double UpperGamma(double a, double x) { return IntegralOf(GammaExponent{a - x, x}, 1.0); }

double LowerBeta(double a, double b, const UnitPoint &point) {
    const int steps = StepsToDirect(a);
    const double x = point.x.high;
    const Extended raised = ExactSum(a, steps);
    const Extended lead = raised * point.y - Whole(b) * point.x;
    const double sum = raised.high + b;
    const double integral = IntegralOf(BetaExponent{lead.high, sum, x, point.y.high}, -1.0);
    if (steps == 0)
        return integral;
    double value = 1.0 + (a + b + (steps - 1)) * x * integral;
    for (int k = steps - 1; k > 0; --k)
        value = 1.0 + (a + b + (k - 1)) / (a + k) * x * value;
    return value / a;
}

// The part that is tried first, or the other one if the first exceeds kAboveHalf.
template <class Lower, class Upper>
Tails SmallerOf(const Scaled &slope, bool lowerFirst, Lower lower, Upper upper) {
    const Scaled first = slope * (lowerFirst ? lower() : upper());
    if (!(first.value() > kAboveHalf))
        return {first, lowerFirst, slope};
    return {slope * (lowerFirst ? upper() : lower()), !lowerFirst, slope};
}

} // namespace

double Scaled::value() const {
    const double turns = std::floor(exponent.high / 0.6931471805599453 + 0.5);
    if (!(std::fabs(turns) < 1e5))
        return exponent.high < 0 ? 0.0 : exponent.high > 0 ? kInfinity : kNaN;
    constexpr Extended lnTwo = {0x1.62e42fefa39efp-1, 0x1.abc9e3b39803fp-56};
    const Extended rest = exponent - Whole(turns) * lnTwo;
    return std::ldexp(factor * ExpOf(rest), static_cast<int>(turns));
}

double Scaled::logarithm() const { return (exponent + LogOf(Whole(factor))).high; }

double Tails::part(bool lower) const {
    return lower == isLower ? smaller.value() : 1.0 - smaller.value();
}

double Tails::logarithm(bool lower) const {
    return lower == isLower ? smaller.logarithm() : std::log1p(-smaller.value());
}

Tails GammaTails(double a, double x) {
    const Scaled slope = GammaPower(a, x);
    return SmallerOf(
        slope, x < a, [=] { return LowerGamma(a, x); }, [=] { return UpperGamma(a, x); });
}

Tails BetaTails(double a, double b, const UnitPoint &point) {
    const Scaled slope = BetaPowerOf(a, b, point);
    const UnitPoint opposite = {point.y, point.x};
    const Extended fromMean = Whole(b) * point.x - Whole(a) * point.y;
    return SmallerOf(
        slope, fromMean.high < 0.0, [&] { return LowerBeta(a, b, point); },
        [&] { return LowerBeta(b, a, opposite); });
}

} // namespace qx
