#include "special/incomplete_beta.h"

#include "frame/constants.h"
#include "special/beta.h"
#include "special/logarithms.h"

#include <algorithm>
#include <cmath>

namespace qx {

namespace {

constexpr double kStirlingFrom = 10.0;
constexpr double kLeast = 1e-290;  // an inverse below it is returned as 0
constexpr double kDirectTo = 33.0; // the powers and the beta function stay in range

Extended Whole(double x) { return {x, 0.0}; }

// x^power, including the low part of x.
double Power(Extended x, double power) {
    return std::pow(x.high, power) * (1.0 + power * (x.low / x.high));
}

// b x - a y, 0 at the mean.
Extended FromMean(double a, double b, const UnitPoint &point) {
    return Whole(b) * point.x - Whole(a) * point.y;
}

// a, b >= 10: sqrt(a b / (2 pi (a + b))) exp(-D), where D is the deviance of the point from the
// mean plus the corrections to Stirling's formula.
double PowerByDeviance(double a, double b, const UnitPoint &point, Extended exponent = {0.0, 0.0}) {
    const Extended sum = ExactSum(a, b);
    const Extended t = FromMean(a, b, point);
    const Extended deviance = Whole(a) * ExcessOfLog(t / Whole(a), sum * point.x / Whole(a)) +
                              Whole(b) * ExcessOfLog(-t / Whole(b), sum * point.y / Whole(b));
    const double rest =
        StirlingCorrection(sum.high) - StirlingCorrection(a) - StirlingCorrection(b);
    return std::sqrt(a / sum.high * b) * kInverseRootTwoPi *
           ExpOf(Whole(rest) - deviance + exponent);
}

// The smaller parameter is raised to Stirling's range: raising it by one multiplies the power by
// y (a + b) / b.
double PowerByShift(double a, double b, const UnitPoint &point) {
    Extended factor = {1.0, 0.0};
    Extended sum = ExactSum(a, b);
    Extended moved = Whole(b);
    int steps = 0;
    for (; moved.high < kStirlingFrom; moved = moved + Whole(1.0), sum = sum + Whole(1.0), ++steps)
        factor = factor * (moved / sum);
    // The deviance takes the parameter as one double; its low part is negligible.
    const Extended exponent = -(Whole(steps) * LogOf(point.y));
    return PowerByDeviance(a, moved.high, point, exponent) * factor.high;
}

// x^a / (a beta(a, b)) (1 + a sum((1 - b) ... (n - b) / (n! (a + n)) x^n)).
double BySeries(double a, double b, const UnitPoint &point) {
    const double x = point.x.high;
    double term = 1.0;
    double sum = 0.0;
    for (int n = 1; n < 10000; ++n) {
        term *= (n - b) / n * x;
        const double added = term / (a + n);
        sum += added;
        if (std::fabs(added) <= 0x1p-56 * std::fabs(sum) || term == 0.0)
            break;
    }
    return BetaPower(a, b, point) / (Power(point.y, b) * a) * (1.0 + a * sum);
}

// The value of 1 / (beta_1 + alpha_2 / (beta_2 + alpha_3 / ...)). The convergents determine the
// number of terms; the value is then computed backward from the last term, so that rounding errors
// do not accumulate.
template <class Terms>
double ContinuedFraction(Terms terms) {
    constexpr int limit = 1000000;
    double p0 = 1.0, p1 = 0.0, q0 = 0.0, q1 = 1.0; // A(-1), A(0), B(-1), B(0)
    double alpha = 1.0, beta = 1.0, before = 0.0;
    int n = 1;
    for (; n < limit; ++n) {
        terms(n, &alpha, &beta);
        const double p = beta * p1 + alpha * p0;
        const double q = beta * q1 + alpha * q0;
        const double value = p / q;
        if (!(std::fabs(value - before) > 0x1p-55 * std::fabs(value))) // or NaN
            break;
        before = value;
        const double scale = 1.0 / q;
        p0 = p1 * scale;
        p1 = value;
        q0 = q1 * scale;
        q1 = 1.0;
    }
    double rest = 0.0;
    for (; n >= 1; --n) {
        terms(n, &alpha, &beta);
        rest = alpha / (beta + rest);
    }
    return rest;
}

// For x at most at the mean. Where b exceeds 1, all terms are positive up to n = b.
double ByFraction(double a, double b, const UnitPoint &point) {
    const double x = point.x.high;
    const double y = point.y.high;
    const double fromMean = -FromMean(a, b, point).high;
    const double sum = a + b;
    const auto terms = [=](int n, double *alpha, double *beta) {
        const double m = n - 1;
        const double c = a + 2 * m - 1;
        *alpha = m == 0 ? 1.0 : (a + m - 1) / c * ((sum + m - 1) / c) * m * (b - m) * x * x;
        const double first = m == 0 ? 0.0 : m * (b - m) * x / c;
        *beta = m + first + (a + m) / (c + 2) * (fromMean + 1 + m * (1 + y));
    };
    return BetaPower(a, b, point) * ContinuedFraction(terms);
}

// The lower part, for x not far above the mean.
double LowerPart(double a, double b, const UnitPoint &point) {
    const double x = point.x.high;
    const bool isShort = x <= 0.7 && (b <= 1.0 || b * x <= (a <= 1.0 ? 1.4 : 0.7));
    return isShort ? BySeries(a, b, point) : ByFraction(a, b, point);
}

UnitPoint Opposite(const UnitPoint &point) { return {point.y, point.x}; }

// Whether to compute the lower part directly and the upper part from it. Where one parameter is
// below 1, the part on its side is computed directly only while it is little more than half of the
// whole.
bool LowerIsDirect(double a, double b, const UnitPoint &point) {
    const double x = point.x.high;
    const double y = point.y.high;
    if (a > 1.0 && b > 1.0)
        return FromMean(a, b, point).high <= 0.0;
    if (a <= 1.0 && b <= 1.0)
        return x <= 0.5;
    constexpr double reach = 1.4;
    constexpr double least = 0.3;
    if (a <= 1.0)
        return x <= 0.7 && b * x <= reach * std::max(least, a);
    return !(y <= 0.7 && a * y <= reach * std::max(least, b));
}

// The point with x / y multiplied by exp(step), computed from the smaller of x and y so that both
// keep their digits.
UnitPoint Moved(const UnitPoint &point, double step) {
    const bool isLeft = point.x.high <= point.y.high;
    const Extended w = isLeft ? point.x : point.y;
    const double s = isLeft ? step : -step;
    const Extended one = {1.0, 0.0};
    const Extended growth = Whole(std::expm1(s));
    const Extended denominator = one + w * growth;
    const Extended moved = std::fabs(s) < 0.5 ? w + w * (growth * (one - w) / denominator)
                                              : w * Whole(std::exp(s)) / denominator;
    const Extended other = moved.high <= 0.5 ? one - moved : (one - w) / denominator;
    return isLeft ? UnitPoint{moved, other} : UnitPoint{other, moved};
}

} // namespace

double BetaPower(double a, double b, UnitPoint point) {
    if (point.x.high == 0.0 || point.y.high == 0.0)
        return 0.0;
    if (a + b <= kDirectTo)
        return Power(point.x, a) * Power(point.y, b) / CompleteBeta(a, b);
    if (a < kStirlingFrom)
        return PowerByShift(b, a, Opposite(point));
    return b < kStirlingFrom ? PowerByShift(a, b, point) : PowerByDeviance(a, b, point);
}

BothTails IncompleteBeta(double a, double b, UnitPoint point) {
    if (point.x.high == 0.0)
        return {0.0, 1.0};
    if (point.y.high == 0.0)
        return {1.0, 0.0};
    const bool isLow = LowerIsDirect(a, b, point);
    if (isLow) {
        const double lower = LowerPart(a, b, point);
        return {lower, 1.0 - lower};
    }
    const double upper = LowerPart(b, a, Opposite(point));
    return {1.0 - upper, upper};
}

// Newton's method for the logarithm of the tail, which is concave in u = ln(x / y); dI/du is
// BetaPower.
UnitPoint InverseIncompleteBeta(double a, double b, double tail, bool isUpper) {
    constexpr int limit = 200;
    UnitPoint point = UnitPoint::Share(Whole(a), Whole(b));
    double low = -kInfinity, high = kInfinity; // bounds of u
    const auto logit = [](const UnitPoint &p) { return std::log(p.x.high) - std::log(p.y.high); };
    for (int turn = 0; turn < limit; ++turn) {
        const BothTails both = IncompleteBeta(a, b, point);
        const double got = isUpper ? both.upper : both.lower;
        const double power = BetaPower(a, b, point);
        const double u = logit(point);
        const bool isTooHigh = isUpper ? got < tail : got > tail;
        (isTooHigh ? high : low) = u;
        // An underflow shows only the direction.
        double step = got < kLeast ? kNaN : std::log(tail / got) * (got / power);
        if (isUpper)
            step = -step;
        double next = u + step;
        // Steps this small are below the rounding of u.
        constexpr double small = 1e-9;
        if (!(std::fabs(step) < small) && !(next > low && next < high && std::fabs(step) < 500)) {
            // One bound may still be infinite.
            if (std::isinf(low))
                next = u - std::max(1.0, std::fabs(u));
            else if (std::isinf(high))
                next = u + std::max(1.0, std::fabs(u));
            else
                next = 0.5 * (low + high);
            step = next - u;
        }
        point = Moved(point, step);
        if (point.x.high < kLeast)
            return {{0.0, 0.0}, {1.0, 0.0}};
        if (point.y.high < kLeast)
            return {{1.0, 0.0}, {0.0, 0.0}};
        if (std::fabs(step) <= 0x1p-50)
            break;
    }
    return point;
}

} // namespace qx
