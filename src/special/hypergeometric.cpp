#include "special/hypergeometric.h"

#include "frame/constants.h"
#include "special/digamma.h"
#include "special/extended.h"
#include "special/gamma_quotient.h"
#include "special/series.h"

#include <algorithm>
#include <cmath>

namespace qx {

namespace {

constexpr double kStop = 8.881784197001252e-16;
constexpr double kStopCareful = 1e-20;
constexpr double kCancelled = 8;
constexpr int kMostTerms = 10000;
constexpr int kMostCarefulTerms = 2000;
constexpr double kLimitForm = 3.7252902984619132e-09; // distance of c - a - b from an integer
constexpr double kDirectBelow = 0.2;

struct GaussTerms {
    double a, b, c, x;

    template <class Number>
    Number ratio(double k) const {
        return Shifted<Number>(a, k) * Shifted<Number>(b, k) /
               (Shifted<Number>(c, k) * Shifted<Number>(1, k)) * Shifted<Number>(x, 0);
    }
    bool isPastPoles(double k) const { return c + k > 0; }
};

bool IsNearInteger(double x, double tolerance) { return std::fabs(x - std::rint(x)) < tolerance; }

// 0, -1, -2, ..., at which a series ends.
bool EndsSeries(double a) { return a <= 0 && IsNearInteger(a, kHyperTolerance); }

double Snapped(double a) { return EndsSeries(a) ? std::rint(a) : a; }

bool IsOutsideDomain(double x, double a, double b, double c) {
    return !std::isfinite(x) || !std::isfinite(a) || !std::isfinite(b) || !std::isfinite(c) ||
           std::fabs(x) > 1 || (x == 1 && c <= a + b);
}

// (1 - x)^p; 1 - x is rounded, and the power would multiply the rounding error by p.
double PowerOfOneMinus(double x, double p) {
    if (std::fabs(p) > 1000)
        return std::exp(p * std::log1p(-x));
    const double y = 1 - x;
    const double rest = (1 - y) - x;
    const double power = std::pow(y, p);
    return rest == 0 ? power : power * std::exp(p * (rest / y));
}

// The sum of (a)_k (b)_k / (k! (1 - m)_k) y^k over k < m.
double FiniteSum(double a, double b, double m, double y) {
    if (m == 0)
        return 0;
    double term = 1;
    double sum = 1;
    const double last = std::min(m, static_cast<double>(kMostTerms));
    for (double k = 0; k + 1 < last && term != 0; k += 1) {
        term *= (a + k) * (b + k) / ((k + 1) * (1 - m + k)) * y;
        sum += term;
    }
    return m > last && term != 0 ? kNaN : sum;
}

// The sum of (a)_k (b)_k m! / (k! (k + m)!) y^k [ln y - psi(k + 1) - psi(k + m + 1) + psi(a + k) +
// psi(b + k)].
double DigammaSum(double a, double b, double m, double y) {
    double bracket = std::log(y) - Digamma(1) - Digamma(m + 1) + Digamma(a) + Digamma(b);
    double factor = 1;
    double sum = 0;
    for (double k = 0; k < kMostTerms; k += 1) {
        const double term = factor * bracket;
        sum += term;
        const double ratio = (a + k) * (b + k) / ((k + 1) * (k + 1 + m)) * y;
        // kept: summed only to this tolerance; the bracket alone may pass through 0
        const double size = std::fmax(std::fabs(term), std::fabs(factor));
        if (size <= kHyperTolerance * (1 + std::fabs(sum)) && std::fabs(ratio) < 1)
            return sum;
        factor *= ratio;
        bracket += 1 / (a + k) + 1 / (b + k) - 1 / (k + 1) - 1 / (k + 1 + m);
    }
    return kNaN;
}

// c - a - b = m = 0, 1, 2, ...
double LimitForm(double x, double a, double b, double c, double m) {
    const double y = 1 - x;
    const double sign = IsOdd(m) ? 1 : -1;
    double finite = 0;
    if (m > 0)
        finite = GammaQuotient({m, c}, {a + m, b + m}) * FiniteSum(a, b, m, y);
    const double factor = GammaQuotient({c}, {a, b, m + 1}, m * std::log1p(-x));
    return finite + sign * factor * DigammaSum(a + m, b + m, m, y);
}

// The sum of the two parts of the connection with 1 - x.
double Connection(double x, double a, double b, double c, double s) {
    const double first = GammaQuotient({c, s}, {c - a, c - b}) * HyperSeries(a, b, 1 - s, 1 - x);
    const double second = PowerOfOneMinus(x, s) * GammaQuotient({c, -s}, {a, b}) *
                          HyperSeries(c - a, c - b, s + 1, 1 - x);
    return std::isfinite(first) && std::isfinite(second) ? first + second : kNaN;
}

double Pfaff(double x, double a, double b, double c) {
    const double z = -x / (1 - x);
    if (c - b < c)
        return PowerOfOneMinus(x, -a) * HyperSeries(a, c - b, c, z);
    return PowerOfOneMinus(x, -b) * HyperSeries(c - a, b, c, z);
}

// For parameters with which no series ends, and |x| < 1 or x = -1.
double Infinite(double x, double a, double b, double c, double pfaffBelow) {
    if (x < pfaffBelow)
        return Pfaff(x, a, b, c);
    if (x < kDirectBelow)
        return HyperSeries(a, b, c, x);
    const double s = c - a - b;
    if (!IsNearInteger(s, kLimitForm))
        return Connection(x, a, b, c, s);
    const double m = std::rint(s);
    if (m >= 0)
        return LimitForm(x, a, b, c, m);
    return PowerOfOneMinus(x, s) * LimitForm(x, c - a, c - b, c, -m); // Euler's transformation
}

} // namespace

double HyperSeries(double a, double b, double c, double x) {
    if (IsOutsideDomain(x, a, b, c))
        return kNaN;
    const GaussTerms terms = {a, b, c, x};
    const SeriesSum plain = SumSeries<double>(terms, kStop, 1, kMostTerms);
    if (plain.largest > kCancelled * std::fabs(plain.sum)) {
        const SeriesSum careful = SumSeries<Extended>(terms, kStopCareful, 0, kMostCarefulTerms);
        if (careful.isComplete)
            return careful.sum;
    }
    return plain.isComplete || std::isinf(plain.sum) ? plain.sum : kNaN;
}

double Gauss(double x, double a, double b, double c, double pfaffBelow) {
    if (IsOutsideDomain(x, a, b, c))
        return kNaN;
    if (std::fabs(x) < 1) {
        if (std::fabs(b - c) < kHyperTolerance)
            return PowerOfOneMinus(x, -a);
        if (std::fabs(a - c) < kHyperTolerance)
            return PowerOfOneMinus(x, -b);
    }
    const bool endsByA = EndsSeries(a);
    const bool endsByB = EndsSeries(b);
    if (EndsSeries(c)) {
        const bool endsBefore = (endsByA && std::floor(c) < std::floor(a)) ||
                                (endsByB && std::floor(c) < std::floor(b));
        if (!endsBefore)
            return kInfinity;
    }
    if (endsByA || endsByB)
        return HyperSeries(Snapped(a), Snapped(b), c, x);

    const double d = c - a;
    const double e = c - b;
    if (x == 1)
        return GammaQuotient({c, d - b}, {d, e});
    if (EndsSeries(d) || EndsSeries(e))
        return OneNaN(PowerOfOneMinus(x, d - b) * HyperSeries(Snapped(d), Snapped(e), c, x));
    return OneNaN(Infinite(x, a, b, c, pfaffBelow));
}

} // namespace qx
