#include "special/direct_tails.h"

#include "frame/constants.h"
#include "frame/extended.h"
#include "special/normal_tail.h"
#include "special/tables/stirling.h"

#include <algorithm>
#include <cmath>

namespace qx {

namespace {

constexpr double kLeastParameter = 0.5;
constexpr double kMostOfGamma = 200.0,
                 kMostOfBeta = 25.0;             // beyond, roundings add up to 4 eps and more
constexpr double kLeast = 1e-280, kMost = 1e280; // range of the factors
constexpr double kNearEnd = 0.7; // quotient of terms up to which the power series is taken
constexpr double kNegligible = 1e-18;
constexpr double kDigits = 39.0; // -ln of the error of a fraction
constexpr double kBig = 1e100;

constexpr DirectTails kUnknown = {0.0, false, 0.0, false};

bool IsUsable(double parameter, double most) {
    return parameter >= kLeastParameter && parameter <= most;
}

bool IsInRange(double x) { return x > kLeast && x < kMost; }

// a^(a - 1/2) exp(-a) / gamma(a), 1 / sqrt(2 pi) for large a.
double StirlingFactor(double a) {
    return a < 3.0 ? Piece(table::stirlingFew, 4.0, a - 0.5)
                   : Piece(table::stirlingMany, 24.0, 1.0 / a);
}

// A sum that begins with 1 and collects what its additions round away.
struct PositiveSum {
    double sum = 1.0, rest = 0.0;

    void add(double term) { // not above the sum by much
        const double next = sum + term;
        rest += term - (next - sum);
        sum = next;
    }
    double value() const { return sum + rest; }
};

// 1 + x / (a + 1) (1 + x / (a + 2) (...)).
double LowerSeries(double a, double x) {
    PositiveSum sum;
    double term = 1.0;
    for (double k = 1.0; term > kNegligible * sum.sum; ++k) {
        term *= x / (a + k);
        sum.add(term);
    }
    return sum.value();
}

// 1 + (p + q) / (q + 1) v (1 + (p + q + 1) / (q + 2) v (...)), v well below 1; `rest` is what the
// rounding of v left, relative to it.
double LowerSeries(double p, double q, double v, double rest) {
    PositiveSum sum;
    double term = 1.0, moment = 0.0;
    for (double k = 0.0; term > kNegligible; ++k) {
        term *= (p + q + k) / (q + 1.0 + k) * v;
        sum.add(term);
        moment += (k + 1.0) * term;
    }
    return sum.value() + moment * rest;
}

// The convergence of the fraction for gamma(a, x), a < 1: m pairs of levels leave an error of about
// exp(x - 4 sqrt(m x)), for large x even less.
double PairsOfLevels(double x, double digits) {
    const double y = std::min(x, 30.0);
    return (digits + y) * (digits + y) / (16.0 * y) + 2.0;
}

// x exp(x) x^(-a) gamma(a, x), 0 < a < 1: 1 / (1 + (1 - a) / x / (1 + 1 / x / (1 + (2 - a) / x /
// ...))), upwards from its last level as a quotient of two positive numbers.
double GammaFraction(double a, double x, double digits) {
    const double pairs = std::ceil(PairsOfLevels(x, digits));
    const double z = 1.0 / x;
    double top = 1.0, bottom = 1.0;
    for (double m = pairs; m > 0.0; --m) {
        const double inner = top + m * z * bottom;
        const double next = inner + (m - a) * z * top;
        bottom = inner;
        top = next;
        if (top > kBig) {
            top *= 1.0 / kBig;
            bottom *= 1.0 / kBig;
        }
    }
    return bottom / top;
}

// -ln of the error that a part may have whose share of the sum is `share`.
double DigitsFor(double share) { return kDigits + std::log(std::min(share, 1.0)); }

double MedianOfGamma(double a) { return a < 1.0 ? 0.93 * a - 0.24 : a - 1.0 / 3.0; }

// The part above x divided by the slope.
double UpperGamma(double a, double x) {
    PositiveSum sum;
    double term = 1.0, left = a;
    for (; left > 2.0; left -= 1.0) {
        term *= (left - 1.0) / x;
        sum.add(term);
        if (!(term > kNegligible * sum.sum))
            return sum.value() / x;
    }
    double total = sum.value();
    if (left > 1.0) {
        left -= 1.0;
        term *= left / x;
    } else {
        total = 0.0;
    }
    // term is that of x^(left - 1)
    const double fraction =
        left == 1.0 ? 1.0 : GammaFraction(left, x, DigitsFor(term / (total + term)));
    return (total + term * fraction) / x;
}

// base^power, including the low part of the base.
double Power(const Extended &base, double power) {
    return std::pow(base.high, power) * (1.0 + power * (base.low / base.high));
}

// A point u and v = 1 - u; the exact v is v (1 + rest).
struct Sides {
    double u, v, rest;
};

// I_u(p, q) from its slope, q at most 1. `share` is what the slope contributes to the result.
double LastPart(double slope, double p, double q, const Sides &at, double share) {
    constexpr double central = 0.4; // up to here 1 less the other part is at least about 1/2
    const double front = slope / (p * at.v) * (1.0 - at.rest);
    if (q == 1.0)
        return front;
    if (p * at.v < central * at.u)
        return 1.0 - slope / q * LowerSeries(p, q, at.v, at.rest);
    const double z = at.u / at.v * (1.0 - at.rest);
    const double levels = FractionLevels(p + 1.0, z, DigitsFor(share));
    return front * BetaFraction(1.0 - q, p + 1.0, z, levels);
}

} // namespace

double FractionLevels(double c, double z, double digits) {
    const double confluent = 2.0 * PairsOfLevels((c - 1.0) / z, digits) + 4.0;
    const double root = std::sqrt(1.0 + z);
    const double geometric = digits / std::log1p(2.0 / (root - 1.0)) + 2.0;
    return std::min(confluent, geometric);
}

// The continued fraction 1 / (1 + k_1 z / (1 + k_2 z / ...)), upwards from its last level as a
// quotient of two positive numbers, so that no division waits for another.
double BetaFraction(double b, double c, double z, double levels) {
    double top = 1.0, bottom = 1.0;
    for (double m = std::ceil(0.5 * levels); m > 0.0; --m) {
        const double middle = c + 2.0 * m - 1.0;
        const double odd = z * (b + m) * (c - 1.0 + m) / (middle * (middle + 1.0));
        const double even = z * m * (c - b + m - 1.0) / ((middle - 1.0) * middle);
        const double inner = top + odd * bottom;
        top = inner + even * top;
        bottom = inner;
        if (top > kBig) {
            top *= 1.0 / kBig;
            bottom *= 1.0 / kBig;
        }
    }
    return top / (top + z * b / c * bottom);
}

// x^a exp(-x) / gamma(a) is (x / a)^a exp(a - x) sqrt(a) times StirlingFactor(a).
DirectTails DirectGammaTails(double a, double x) {
    if (!IsUsable(a, kMostOfGamma) || !(x > kLeast && x < kMost))
        return kUnknown;
    const Extended quotient = Extended{x, 0.0} / Extended{a, 0.0};
    const Extended lead = ExactSum(a, -x);
    const double power = Power(quotient, a);
    const double fall = std::exp(lead.high) * (1.0 + lead.low);
    const double slope = power * fall * (std::sqrt(a) * StirlingFactor(a));
    if (!IsInRange(power) || !IsInRange(fall) || !IsInRange(slope))
        return kUnknown;
    if (x < MedianOfGamma(a))
        return {slope / a * LowerSeries(a, x), true, slope, true};
    if (a == 0.5) {
        const double tail = ScaledNormalTail(std::sqrt(2.0 * x));
        return {2.0 * std::exp(-x) * tail, false, slope, true};
    }
    if (a < 1.0 && x < 0.4)
        return {1.0 - slope / a * LowerSeries(a, x), false, slope, true};
    return {slope * UpperGamma(a, x), false, slope, true};
}

// x^a y^b / beta(a, b) is (f g)^a g^b, where f g and g = (a + b) / (a f + b) are the quotients of x and
// y by those of the mean, times sqrt(a b / (a + b)) and the three factors of Stirling's formula.
DirectTails DirectBetaTails(double f, double a, double b, bool takesLower) {
    if (!IsUsable(a, kMostOfBeta) || !IsUsable(b, kMostOfBeta))
        return kUnknown;
    const Extended first = ExactProduct(a, f);
    const Extended sum = ExactSum(a, b);
    const Extended whole = first + Extended{b, 0.0};
    const double p = takesLower ? a : b;
    double left = takesLower ? b : a;
    const Extended near = (takesLower ? first : Extended{b, 0.0}) / whole;
    const double u = near.high;
    const Extended share = (takesLower ? Extended{b, 0.0} : first) / whole;
    const double v = share.high;
    if (left == 1.0) {
        const double part = Power(near, p);
        return IsInRange(part) ? DirectTails{part, takesLower, p * part * v, true} : kUnknown;
    }
    const Extended g = sum / whole;
    const double ofX = Power(Extended{f, 0.0} * g, a), ofY = Power(g, b);
    const double stirling = StirlingFactor(a) * StirlingFactor(b) / StirlingFactor(sum.high) *
                            std::sqrt(a / sum.high * b);
    const double slope = ofX * ofY * stirling;
    if (!IsInRange(ofX) || !IsInRange(ofY) || !IsInRange(slope))
        return kUnknown;
    if (u < kNearEnd && u * sum.high < kNearEnd * (p + 1.0))
        return {slope / p * LowerSeries(left, p, u, near.low / u), takesLower, slope, true};
    const Sides at = {u, v, share.low / v};
    if (left <= 1.0)
        return {LastPart(slope, p, left, at, 1.0), takesLower, slope, true};
    PositiveSum terms;
    double term = 1.0, moment = 0.0; // the sum of k times the term k
    const double lead = slope / (v * (p + left - 1.0)) * (1.0 - at.rest);
    left -= 1.0; // the parameter after the first term
    const Extended scaled = ExactProduct(p, v);
    for (double k = 1.0; left > 1.0; ++k, left -= 1.0) {
        term *= left / (scaled.high + ((left - 1.0) * v + scaled.low)); // (p + left - 1) v
        terms.add(term);
        moment += k * term;
        if (!(term > kNegligible * terms.sum))
            break;
    }
    const double total = terms.value() - moment * at.rest;
    // u^p v^left / beta(p, left) is left times the last term; its part is at most this over p v
    const double last = term * left / (p * v * total);
    if (!(last > kNegligible))
        return {lead * total, takesLower, slope, true};
    const double rest = LastPart(lead * term * left, p, left, at, last);
    return {lead * total + rest, takesLower, slope, true};
}

} // namespace qx
