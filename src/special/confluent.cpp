#include "special/confluent.h"

#include "frame/constants.h"
#include "special/bessel_real.h"
#include "special/extended.h"
#include "special/gamma_quotient.h"
#include "special/hypergeometric.h"
#include "special/reciprocal_gamma.h"
#include "special/series.h"

#include <algorithm>
#include <cmath>

namespace qx {

namespace {

constexpr double kAllDigits = 8 * kEpsilon;
constexpr double kPairEps = 1e-30; // eps of sums in two doubles
constexpr double kUnusable = 1e38;
constexpr double kNoDigits = 0.01;

constexpr double kSeriesStop = 8.881784197001252e-16;
constexpr double kStopCareful = 1e-20;
constexpr int kMostTerms = 10000;
constexpr int kMostCarefulTerms = 2000;

constexpr double kBesselStop = 2.220446049250313e-14;
constexpr int kMostBesselTerms = 300;
constexpr int kBesselBlock = 16;
constexpr int kLongestBlock = 200;
constexpr double kHankelFrom = 12.9;

constexpr double kAcceptedError = 0.0001220703125;
constexpr double kAcceptedTruncation = 0.00048828125;

constexpr double kAsymptoticFrom = 25; // in |x|; below it the form cannot have full precision
constexpr int kMostAsymptoticTerms = 1000;
constexpr double kTricomiAsymptoticFrom = 6;
constexpr double kNearInteger = 0.0001;
constexpr double kAside = 0.0005;

struct KummerTerms {
    double a, b, x;

    template <class Number>
    Number ratio(double k) const {
        return Shifted<Number>(a, k) * Shifted<Number>(x, 0) /
               (Shifted<Number>(b, k) * Shifted<Number>(1, k));
    }
    bool isPastPoles(double k) const { return b + k > 0; }
};

KummerEstimate Unusable() { return {kNaN, kUnusable, kUnusable}; }

// 0F1(; c; -w), c >= w >= 0: terms below 1 / k!.
double LimitSeries(double c, double w) {
    double term = 1;
    double sum = 1;
    for (double k = 0; k < 40 && std::fabs(term) > 0.25 * kEpsilon; k += 1) {
        term *= -w / ((k + 1) * (c + k));
        sum += term;
    }
    return sum;
}

// 0F1(; c; -w) by its series or as gamma(c) (X/2)^(1-c) J_(c-1)(X), X = 2 sqrt(w).
double Limit(double c, double w) {
    if (c >= w && c >= 1)
        return LimitSeries(c, w);
    const double root = std::sqrt(w);
    return BesselJ(c - 1, 2 * root) / PowerOverGamma(root, c - 1);
}

// A block of 0F1(; c + i; -w), i < count: the last two directly, the others from these by downward
// recurrence, which is stable.
void FillBlock(double c, double w, int count, double *block) {
    block[count - 1] = Limit(c + (count - 1), w);
    block[count - 2] = Limit(c + (count - 2), w);
    for (int i = count - 3; i >= 0; --i) {
        const double above = c + (i + 1);
        block[i] = block[i + 1] - w / (above * (above - 1)) * block[i + 2];
    }
}

// The relative error of the Bessel functions: X eps from their argument, and for orders that are
// not integers also the error of Hankel's form.
double BesselError(double b, double w) {
    const double x = 2 * std::sqrt(w);
    const double hankel = x > kHankelFrom && !IsInteger(b) ? std::exp(-2 * x) : 0.0;
    return (4 + x) * kEpsilon + hankel;
}

// With no correct digits left the estimate itself is meaningless.
KummerEstimate Judge(const SeriesSum &sum, double eps) {
    const double size = std::fabs(sum.sum);
    const double truncation = sum.last / size;
    const double error = std::fmax(truncation, sum.largest * eps / size);
    if (!(error < kNoDigits) || std::isinf(size))
        return Unusable();
    return {sum.sum, error, truncation};
}

struct AsymptoticSum {
    double sum;
    double error;
};

// The sum of (p)_n (q)_n / n! y^n, divergent: truncated at its smallest term once n is above -p and
// -q, where the terms begin their final growth.
AsymptoticSum SumAsymptotic(double p, double q, double y) {
    double term = 1;
    double sum = 1;
    double largest = 1;
    for (double n = 0; n < kMostAsymptoticTerms; n += 1) {
        const double ratio = (p + n) * (q + n) / (n + 1) * y;
        if (ratio == 0 || std::fabs(term) <= 0.25 * kEpsilon * std::fabs(sum))
            break;
        if (!(std::fabs(ratio) < 1) && n > -p && n > -q)
            return {sum, std::fmax(std::fabs(term), kEpsilon * largest) / std::fabs(sum)};
        if (n + 1 == kMostAsymptoticTerms)
            return {sum, kUnusable};
        term *= ratio;
        sum += term;
        largest = std::max(largest, std::fabs(term));
    }
    return {sum, kEpsilon * largest / std::fabs(sum)};
}

// gamma(b) / gamma(a) y^power exp(scale).
double Prefactor(double b, double a, double y, double power, double scale) {
    const double direct = std::pow(y, power);
    if (!(direct > 1e-100 && direct < 1e100))
        return GammaQuotient({b}, {a}, scale + power * std::log(y));
    const double quotient = GammaQuotient({b}, {a});
    if (quotient == 0)
        return 0;
    const double half = std::exp(0.5 * scale); // exp(scale) may overflow though the result does not
    return direct * half * quotient * half;
}

} // namespace

KummerEstimate KummerBessel(double a, double b, double x) {
    const double d = b - 2 * a;
    const double w = 0.5 * x * d;
    if (d == 0 || (a < 0) == (x < 0) || !(w > 0) || std::isinf(w))
        return Unusable();
    const double half = 0.5 * x;
    const double square = half * half;
    const double cube = d * half * square;
    double block[kLongestBlock];
    int blockStart = 0;
    int blockEnd = 0;
    int length =
        static_cast<int>(std::clamp(w - b + 2, double{kBesselBlock}, double{kLongestBlock}));
    // A_n half^n / (b)_n for n and the two preceding indices
    double factor = 1;
    double before = 0;
    double beforeThat = 0;
    double sum = 0;
    double largest = 0;
    double last[3] = {};
    for (int n = 0; n < kMostBesselTerms; ++n) {
        if (n == blockEnd) {
            FillBlock(b + n, w, length, block);
            blockStart = n;
            blockEnd = n + length;
            length = kBesselBlock;
        }
        const double term = factor * block[n - blockStart];
        sum += term;
        last[n % 3] = std::fabs(term);
        largest = std::max(largest, std::fabs(term));
        const double recent = std::max({last[0], last[1], last[2]});
        if (n > 2 && recent <= kBesselStop * std::fabs(sum)) {
            const double size = std::fabs(sum);
            const double error = largest * BesselError(b, w) / size;
            return {std::exp(half) * sum, std::fmax(error, recent / size), recent / size};
        }
        const double m = b + n;
        double next = before * square / (m * (n + 1));
        if (n >= 2)
            next -= beforeThat * cube / ((n + 1) * (m - 2) * (m - 1) * m);
        beforeThat = before;
        before = factor;
        factor = next;
        if (!std::isfinite(sum) || !std::isfinite(factor))
            return Unusable();
    }
    return Unusable();
}

KummerEstimate KummerSeries(double a, double b, double x) {
    const KummerTerms terms = {a, b, x};
    const KummerEstimate plain =
        Judge(SumSeries<double>(terms, kSeriesStop, 0, kMostTerms), kEpsilon);
    if (plain.error <= kAllDigits)
        return plain;
    // the terms cancel: the series in two doubles
    const SeriesSum sum = SumSeries<Extended>(terms, kStopCareful, 0, kMostCarefulTerms);
    const KummerEstimate careful = Judge(sum, kPairEps);
    return careful.error < plain.error ? careful : plain;
}

KummerEstimate KummerAsymptotic(double a, double b, double x) {
    const double y = std::fabs(x);
    // for x < 0 by exp(x) M(b - a, b, -x), which exchanges the two parts
    const double p = x < 0 ? b - a : a;
    const double q = x < 0 ? a : b - a;
    const double firstPower = x < 0 ? -a : a - b;
    const double secondPower = x < 0 ? a - b : -a;
    const AsymptoticSum exponential = SumAsymptotic(q, x < 0 ? 1 + a - b : 1 - a, 1 / y);
    const AsymptoticSum power = SumAsymptotic(p, x < 0 ? 1 - a : 1 + a - b, -1 / y);
    const double first = Prefactor(b, p, y, firstPower, x < 0 ? 0.0 : x) * exponential.sum;
    double second = 0;
    if (std::isfinite(y))
        second = CosPi(p) * Prefactor(b, q, y, secondPower, x < 0 ? x : 0.0) * power.sum;
    const double value = first + second;
    if (std::isnan(value))
        return Unusable();
    if (std::isinf(value) || value == 0)
        return {value, exponential.error, exponential.error};
    const double error =
        (std::fabs(first) * exponential.error + std::fabs(second) * power.error) / std::fabs(value);
    return {value, error, error};
}

double Kummer(double x, double a, double b) {
    if (std::isnan(x) || std::isnan(a) || std::isnan(b))
        return kNaN;
    if (std::isinf(a) && std::isinf(b))
        return std::exp(x);
    if (std::isinf(a) && std::isinf(x))
        return kNaN;
    if (x == kInfinity && std::isfinite(a) && std::isfinite(b) && a != 0)
        return kInfinity; // kept: positive for every a and b
    if (a == 0 || x == 0)
        return 1;
    if (a == b)
        return std::exp(x);

    // Where the asymptotic form is as accurate as any, the other methods would only take more time.
    KummerEstimate asymptotic = Unusable();
    if (std::fabs(x) >= kAsymptoticFrom) {
        asymptotic = KummerAsymptotic(a, b, x);
        if (asymptotic.error <= kBesselStop)
            return asymptotic.value;
    }
    const KummerEstimate bessel = KummerBessel(a, b, x);
    if (bessel.error < kHyperTolerance)
        return bessel.value;
    const KummerEstimate series = KummerSeries(a, b, x);
    if (series.error < kHyperTolerance)
        return series.value;
    if (std::fabs(x) < kAsymptoticFrom)
        asymptotic = KummerAsymptotic(a, b, x);
    if (asymptotic.error < kHyperTolerance)
        return asymptotic.value;
    if (series.error <= asymptotic.error && series.error < kUnusable)
        return series.value;
    // kept: also if the asymptotic form has the smaller error
    if (series.error < kAcceptedError && series.truncation < kAcceptedTruncation)
        return series.value;
    if (asymptotic.error < series.error && asymptotic.error < kAcceptedError)
        return asymptotic.value;
    return kNaN;
}

namespace {

// x >= 6. The terms alternate in sign once n is above -a and -b', and from there on the sum ends
// when they grow. The remainder of the sum is then the last term times C(n) = 1 - r(n) C(n + 1),
// where r is the magnitude of the ratio. Its slope r' is small, so that
// C = 1 / (1 + r) + r r' / (1 + r)^3 - ...
double TricomiAsymptotic(double x, double a, double b) {
    const double p = a + 1 - b;
    double term = 1;
    double sum = 0;
    for (double n = 0; n < kMostAsymptoticTerms; n += 1) {
        const double r = (n + a) * (p + n) / ((n + 1) * x);
        if (std::fabs(r) >= 1 && n > -a && n > -p) {
            const double slope = r * (1 / (n + a) + 1 / (n + p) - 1 / (n + 1));
            const double s = 1 + r;
            const double terminant =
                1 / s + r * slope / (s * s * s) - r * slope * slope * (2 - r) / (s * s * s * s * s);
            return (sum + term * terminant) * std::pow(x, -a);
        }
        sum += term;
        term *= -r;
        if (std::fabs(term) <= 0.25 * kEpsilon * std::fabs(sum) || std::isnan(sum))
            return sum * std::pow(x, -a);
    }
    return kNaN;
}

double TricomiConnection(double x, double a, double b) {
    const double p = 1 + a - b;
    const double first = Kummer(x, a, b) * (ReciprocalGamma(p) * ReciprocalGamma(b));
    const double second =
        std::pow(x, 1 - b) * Kummer(x, p, 2 - b) * (ReciprocalGamma(a) * ReciprocalGamma(2 - b));
    return kPi / SinPi(b) * (first - second);
}

} // namespace

double Tricomi(double x, double a, double b) {
    if (!std::isfinite(x) || !std::isfinite(a) || !std::isfinite(b) || x < 0)
        return kNaN;
    if (x == 0)
        return kInfinity; // kept: also if U has a finite limit
    if (x >= kTricomiAsymptoticFrom)
        return OneNaN(TricomiAsymptotic(x, a, b));
    // kept: a mean, not the limit form with digamma functions
    if (std::fabs(b - std::rint(b)) <= kNearInteger)
        return OneNaN(0.5 *
                      (TricomiConnection(x, a, b - kAside) + TricomiConnection(x, a, b + kAside)));
    return OneNaN(TricomiConnection(x, a, b));
}

} // namespace qx
