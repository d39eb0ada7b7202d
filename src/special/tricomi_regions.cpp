#include "special/tricomi_regions.h"

#include "frame/constants.h"
#include "special/digamma.h"
#include "special/extended.h"
#include "special/gamma.h"
#include "special/kummer_regions.h"
#include "special/reciprocal_gamma.h"

#include <algorithm>
#include <cmath>

namespace qx {

namespace {

constexpr double kGood = 40 * kEpsilon;
constexpr double kGoodRecurrence = 5e-13;
constexpr double kGoodConnection = 4e-14;
constexpr double kPlainError = 12 * kEpsilon;
constexpr double kGoodParts = 1e-27;
constexpr double kConnectionBelow = 1;
constexpr double kConnectionFirst = 0.2;
constexpr double kPlainBelow = 3, kPlainDistance = 0.05;
constexpr double kPlain = 20;          // parameters up to which gamma functions of doubles suffice
constexpr double kAsymptoticFrom = 25; // below it the asymptotic sum seldom has all digits
constexpr double kPlainPower = 300;    // logarithm of a power without overflow or underflow
constexpr double kAside = 0x1p-32;
constexpr int kMostTerms = 40000;
constexpr int kMostSteps = 3000;
constexpr double kBig = 0x1p300;
constexpr int kBigExponent = 300;

Extended Whole(double x) { return {x, 0}; }
bool Ends(Extended a) { return a.high <= 0 && a.low == 0 && IsInteger(a.high); }
constexpr Wide kOne = {{0.5, 0}, 1};

Extended Pair(double x) { return Whole(x); }
Extended Pair(Extended x) { return x; }
double Down(double x) { return x * (1 / kBig); }
Extended Down(Extended x) { return {x.high * (1 / kBig), x.low * (1 / kBig)}; }
template <class Number>
constexpr double kPrecision = kEpsilon;
template <>
constexpr double kPrecision<Extended> = 0x1p-100;

// The index at which the downward recurrence starts: where the terms of the normalising sum have
// fallen below the tolerance, by F. W. J. Olver's relation between the decaying and the growing
// solution (Numerical solution of second-order linear difference equations, 1967). 0 if it would be
// above kMostTerms.
int FirstTerm(double a, double b, double x, bool isWeighted, double tolerance) {
    constexpr int stride = 8;    // from one tested term to the next
    double p = 1, step = 1;      // the growing solution
    double product = 1, sum = 0; // weight times quotient of the coefficients; sum of the terms
    for (int n = 1; n < kMostTerms; ++n) {
        const double at = a + n;
        const double below = at - b + 1;
        product *= isWeighted ? (at - 1) * (at - b) / (below * n) : (at - 1) / below;
        step = ((at - 1) * step + x * p) * (1 / below);
        p += step;
        if (n % stride != 0)
            continue;
        const double term = product / p;
        sum += stride * term;
        if (!std::isfinite(sum))
            return 0;
        if (term * n < tolerance * sum)
            return n + 1;
        if (!(p < kBig)) {
            p /= kBig;
            step /= kBig;
            product /= kBig;
        }
        if (!(sum < kBig)) {
            product /= kBig;
            sum /= kBig;
        }
    }
    return 0;
}

// U(a, b, x) and U(a + 1, b, x) in units of 2^exponent, and the number of steps.
template <class Number>
struct Neighbours {
    Number at, above;
    Wide unit;
    int steps;
    bool isKnown;
};

// a >= 1, a - b >= 0. With f_n = (first)_n U(first + n, b, x), where first is a minus an integer,
// and d_n = f_n - f_(n+1), all positive:
// d_(n-1) = ((first + n - b + 1) d_n + x f_n) / (first + n - 1).
template <class Number>
Neighbours<Number> FromAbove(Extended a, Extended b, double x) {
    const double kept = std::floor(std::min(a.high - 1, a.high - b.high));
    const Neighbours<Number> none = {{}, {}, kOne, 0, false};
    if (!(kept < kMostTerms))
        return none;
    const Extended first = a - Whole(kept);
    const double tolerance = 0.1 * kPrecision<Number>;
    const int byWeight = FirstTerm(first.high, b.high, x, true, tolerance);
    const int bySize = FirstTerm(a.high, b.high, x, false, tolerance);
    if (byWeight == 0 || bySize == 0)
        return none;
    const int last = std::max(byWeight, bySize + static_cast<int>(kept));
    const Number start = Of<Number>(first), excess = Of<Number>(first - b),
                 point = Of<Number>(Whole(x));
    Number f = Of<Number>(Whole(1)), d = f, sum = f, above = Of<Number>(Whole(0)), at = above,
           next = above;
    Number product = f; // (first)_kept
    int downs = 0;      // scalings of the sum and the product since `at` and `next` were set
    for (int n = last; n > 0; --n) {
        const Number whole = Of<Number>(Whole(n));
        sum = sum * ((excess + whole) / whole);
        d = ((excess + Of<Number>(Whole(n + 1.0))) * d + point * f) /
            (start + Of<Number>(Whole(n - 1.0)));
        above = f;
        f = f + d;
        sum = sum + f;
        if (n == kept + 1) {
            at = f;
            next = above;
            downs = 0;
        }
        if (!(Leading(sum) < kBig)) {
            f = Down(f);
            d = Down(d);
            sum = Down(sum);
            ++downs;
        }
        if (n <= kept) {
            product = product * (start + Of<Number>(Whole(n - 1.0)));
            if (!(Leading(product) < kBig)) {
                product = Down(product);
                ++downs;
            }
        }
    }
    Wide unit = PowerOf(Whole(x), -first).value;
    unit.exponent -= kBigExponent * downs;
    const Number whole = product * sum;
    return {at / whole, next / (Of<Number>(a) * whole), unit, last, true};
}

template <class Number>
void KeepInRange(Number &u, Number &v, Wide &unit) {
    if (std::fabs(Leading(u)) < kBig && std::fabs(Leading(v)) < kBig)
        return;
    u = Down(u);
    v = Down(v);
    unit.exponent += kBigExponent;
}

// The same for any a and b <= x + 1.
template <class Number>
Neighbours<Number> DownInA(Extended a, Extended b, double x) {
    const double up =
        std::max(0.0, std::max(std::ceil(1 - a.high), std::ceil(b.high - a.high)) + 1);
    if (up > kMostSteps)
        return {{}, {}, kOne, 0, false};
    Neighbours<Number> u = FromAbove<Number>(a + Whole(up), b, x);
    for (double n = up; n > 0; --n) {
        const Extended top = a + Whole(n);
        const Number from = Of<Number>(top);
        const Number middle = Of<Number>(Whole(2) * top + Whole(x) - b);
        const Number below = middle * u.at - from * Of<Number>(top - b + Whole(1)) * u.above;
        u.above = u.at;
        u.at = below;
        KeepInRange(u.at, u.above, u.unit);
    }
    u.steps += static_cast<int>(up);
    return u;
}

// Upwards in b from b <= x + 1: e = U(b) - U(b - 1) = -U'(b - 1),
// x e(b + 1) = (b - 1 - a) e + a U(b).
template <class Number>
Estimated ByRecurrences(Extended a, Extended b, double x) {
    const double up = std::max(0.0, std::ceil(b.high - 1 - x));
    const Estimated none = {kOne, kInfinity};
    if (up > kMostSteps)
        return none;
    Extended second = b - Whole(up);
    Neighbours<Number> u = DownInA<Number>(a, second, x);
    if (!u.isKnown)
        return none;
    const Number first = Of<Number>(a), point = Of<Number>(Whole(x));
    // For a < 0, U oscillates in a with this change of phase per step.
    const double phase = a.high < 0 ? std::sqrt(x / (std::fabs(a.high) + x)) : 1;
    double scale = std::sqrt(std::fabs(a.high * (a.high - second.high + 1))) / phase;
    if (up > 0) {
        const Number e = first * (u.at - Of<Number>(a - second + Whole(1)) * u.above) / point;
        u.above = e;
        u.at = u.at + e;
        scale = std::sqrt(x / (std::fabs(a.high) + x));
    }
    for (double n = 1; n < up; ++n) {
        const Extended now = second + Whole(n - 1);
        const Extended fall = now - a; // the factor b - 1 - a
        if (fall.high > 0) {
            u.above = (Of<Number>(fall) * u.above + first * u.at) / point;
            u.at = u.at + u.above;
        } else {
            const Number next =
                u.at + (Of<Number>(now) * u.at - Of<Number>(fall) * (u.at - u.above)) / point;
            u.above = next - u.at;
            u.at = next;
        }
        KeepInRange(u.at, u.above, u.unit);
    }
    const double size = std::fabs(Leading(u.at));
    const double amplitude = size + scale * std::fabs(Leading(u.above));
    double weight = (8 + std::sqrt(static_cast<double>(u.steps)) + up) / phase;
    if (up > 0 && a.high < 0) // the growing part has a factor 1 / gamma(a)
        weight += 0.1 * weight / std::fabs((a - Whole(std::rint(a.high))).high);
    return {u.unit * WideOf(Pair(u.at)), 4 * weight * kPrecision<Number> * amplitude / size};
}

// a = -n, b >= 1: (-1)^n (b)_n M(-n, b, x).
Estimated Polynomial(Extended a, Extended b, double x) {
    const Estimated factor = GammaQuotientOf({b - a, Whole(1)}, {b, Whole(1)});
    const HyperForm form = {{a, Whole(1), b, Whole(x), false}, Whole(0), Whole(0)};
    const Estimated value = BestForm(&form, 1);
    const Wide sign = {Whole(IsOdd(a.high) ? -0.5 : 0.5), 1};
    return {value.value * factor.value * sign, value.error + factor.error};
}

// For b that is not an integer: gamma(1 - b) / gamma(a - b + 1) M(a, b, x) +
// gamma(b - 1) / gamma(a) x^(1-b) M(a - b + 1, 2 - b, x).
Estimated Connection(Extended a, Extended b, double x) {
    const Extended one = Whole(1);
    const Extended d = a - b + one;
    const Estimated firstFactor = GammaQuotientOf({one - b, one}, {d, one});
    const Estimated secondFactor = GammaQuotientOf({b - one, one}, {a, one});
    if (std::isinf(firstFactor.error + secondFactor.error))
        return {kOne, kInfinity};
    const Estimated m = CarefulSum({a, one, b, Whole(x), false}, kGoodParts);
    const Estimated n = CarefulSum({d, one, Whole(2) - b, Whole(x), false}, kGoodParts);
    const Wide first = firstFactor.value * m.value;
    const Estimated power = PowerOf(Whole(x), one - b);
    const Wide second = secondFactor.value * power.value * n.value;
    return SumOfParts({first, m.error + firstFactor.error},
                      {second, n.error + secondFactor.error + power.error});
}

// The same in double precision for moderate parameters, b away from integers.
Estimated PlainConnection(double a, double b, double x) {
    const double d = a - b + 1;
    if (!(std::fabs(a) <= kPlain && std::fabs(b) <= kPlain && std::fabs(d) <= kPlain))
        return {kOne, kInfinity};
    const HyperForm forms[] = {
        {{Whole(a), Whole(1), Whole(b), Whole(x), false}, {0, 0}, {0, 0}},
        {{Whole(d), Whole(1), Whole(2 - b), Whole(x), false}, {0, 0}, {0, 0}}};
    const Estimated m = BestForm(forms, 1);
    const Estimated n = BestForm(forms + 1, 1);
    const double first = GammaFunction(1 - b) * ReciprocalGamma(d);
    const double second = GammaFunction(b - 1) * ReciprocalGamma(a) * std::pow(x, 1 - b);
    const double error =
        kPlainError + kEpsilon * (1 + std::fabs(b) + std::fabs(d)) / std::fabs(b - std::rint(b)) +
        (d > 0.5 ? 0 : kEpsilon * (1 + std::fabs(d)) / std::fabs(d - std::rint(d)));
    return SumOfParts({WideOf(Whole(first)) * m.value, m.error + error},
                      {WideOf(Whole(second)) * n.value, n.error + error});
}

Estimated BesideIntegers(Extended a, Extended b, double x) {
    const double whole = std::rint(b.high);
    const Extended off = b - Whole(whole);
    if (std::fabs(off.high) >= kAside)
        return Connection(a, b, x);
    const Estimated low = Connection(a, Whole(whole) - Whole(kAside), x);
    const Estimated high = Connection(a, Whole(whole) + Whole(kAside), x);
    return Between(low, high, off.high / kAside);
}

double AtZero(double a, double b) {
    if (a == 0)
        return 1;
    const Extended d = ExactSum(1, -b) + Whole(a);
    const bool ends = a < 0 && IsInteger(a);
    if (b < 1) { // gamma(1 - b) / gamma(a - b + 1)
        const Estimated limit = GammaQuotientOf({ExactSum(1, -b), Whole(1)}, {d, Whole(1)});
        return std::isfinite(limit.error) ? limit.value.rounded() : kNaN;
    }
    if (ends) { // (-1)^n (b)_n
        const Estimated product =
            GammaQuotientOf({ExactSum(b, -a), Whole(1)}, {Whole(b), Whole(1)});
        return std::isfinite(product.error)
                   ? (IsOdd(a) ? -product.value.rounded() : product.value.rounded())
                   : kNaN;
    }
    const WideGamma gamma = GammaOf(Whole(a));
    return gamma.isPole || std::isinf(gamma.gamma.error)
               ? kNaN
               : std::copysign(kInfinity, gamma.gamma.value.value.high);
}

// For small x.
Estimated Connected(Extended a, Extended b, double x) {
    const Estimated plain = PlainConnection(a.high, b.high, x);
    return plain.error <= kGoodConnection ? plain : BesideIntegers(a, b, x);
}

// b >= 1.
Estimated FromLargeB(Extended a, Extended b, double x) {
    if (Ends(a))
        return Polynomial(a, b, x);
    const Estimated value = ByRecurrences<double>(a, b, x);
    return value.error <= kGoodRecurrence ? value : ByRecurrences<Extended>(a, b, x);
}

Estimated ByRegion(Extended a, Extended b, double x) {
    const bool isTurned = b.high < 1;
    const Extended first = isTurned ? a - b + Whole(1) : a;
    Estimated connected = {kOne, kInfinity};
    if (x < (a.high < 0 ? kConnectionBelow : kConnectionFirst) && !Ends(first))
        connected = Connected(a, b, x);
    else if (x < kPlainBelow && std::fabs(b.high - std::rint(b.high)) > kPlainDistance)
        connected = PlainConnection(a.high, b.high, x);
    if (connected.error <= kGoodConnection)
        return connected;
    Estimated value = FromLargeB(first, isTurned ? Whole(2) - b : b, x);
    if (isTurned)
        value.value = value.value * PowerOf(Whole(x), Whole(1) - b).value;
    if (x >= kConnectionFirst && x < kConnectionBelow && !(value.error <= kHyperAccepted))
        connected = Connected(a, b, x);
    return connected.error < value.error ? connected : value;
}

// The sum of the logarithmic connection 13.2.9 for b = n + 1 and a > 0, without its finite part.
Estimated LogarithmicSum(double a, int n, double x) {
    constexpr int most = 200;
    const double logX = std::log(x);
    double psi = Digamma(a) - 2 * Digamma(1); // psi(a + k) - psi(1 + k) - psi(n + 1 + k)
    for (int k = 1; k <= n; ++k)
        psi -= 1.0 / k;
    double term = 1, sum = logX + psi, size = std::fabs(logX) + std::fabs(psi) + 1;
    for (int k = 0; k < most; ++k) {
        term *= (a + k) * x / ((n + 1.0 + k) * (k + 1.0));
        psi += 1 / (a + k) - 1 / (k + 1.0) - 1 / (n + 1.0 + k);
        const double next = term * (logX + psi);
        sum += next;
        size += term * (std::fabs(logX) + std::fabs(psi) + 1);
        if (std::fabs(next) + term < 0.1 * kEpsilon * std::fabs(sum) && k > a * x)
            return {WideOf(Whole(sum)), 3 * kEpsilon * size / std::fabs(sum)};
    }
    return {kOne, kInfinity};
}

// For b = n + 1, n >= 0, a > 0 and small x.
Estimated AtInteger(double a, int n, double x) {
    double factorial = 1;
    for (int k = 2; k <= n; ++k)
        factorial *= k;
    const Estimated sum = LogarithmicSum(a, n, x);
    const double sign = n % 2 == 0 ? -1 : 1;
    const double first = sign / factorial * ReciprocalGamma(a - n) * sum.value.rounded();
    // (k - 1)! (1 - a + k)_(n - k) / (n - k)! x^(-k) from k = n down
    double term = factorial / (n > 0 ? n : 1) * std::pow(x, -n), second = 0, size = 0;
    for (int k = n; k >= 1; --k) {
        second += term;
        size += std::fabs(term);
        if (k > 1)
            term *= (k - a) / (n - k + 1.0) * x / (k - 1.0);
    }
    const double scale = ReciprocalGamma(a);
    const double total = first + second * scale;
    const double error = (std::fabs(first) * (sum.error + 10 * kEpsilon) +
                          size * std::fabs(scale) * (10 + n) * kEpsilon) /
                         std::fabs(total);
    return {WideOf(Whole(total)), std::isnan(error) ? kInfinity : error};
}

// a > 0, b > 0: gamma(b) / gamma(a) x^(-b) exp(x) = M' U - M U' with U' / U = 1 - U(b + 1) / U from
// the continued fraction 13.5.3, whose coefficients a, a - b + 1, a + 1, a - b + 2, ... are positive
// but for a few. It takes about 90 / x pairs of levels, more for large a.
// `power` is the value of x^(-b), or of it times a factor of U.
Estimated ByWronskian(double a, double b, double x, double power) {
    constexpr double digits = 39, big = 1e100;
    const double y = std::min(x, 30.0), z = 1 / x;
    const double lower = std::max(a + 0.5 * (1 - b), 0.0); // the mean of a and a - b + 1
    const double pairs =
        std::ceil((digits + y) / 4 * ((digits + y) / (4 * y) + 2 * std::sqrt(lower / y))) + 2;
    double top = 1, bottom = 1, lost = 1; // how much a negative coefficient cancels
    for (double m = pairs; m > 0; --m) {
        const double second = (a - b + m) * z * bottom;
        const double inner = top + second;
        if (second < 0)
            lost *= (top - second) / std::fabs(inner);
        bottom = inner;
        top = inner + (a + m - 1) * z * top;
        if (std::fabs(top) > big) {
            top *= 1 / big;
            bottom *= 1 / big;
        }
    }
    const double fall = (top - bottom) / bottom; // -U' / U
    double term = 1, sum = 1, moment = 0;
    for (double k = 0; term > 0.05 * kEpsilon * sum; ++k) {
        term *= (a + k) * x / ((b + k) * (k + 1));
        sum += term;
        moment += (k + 1) * term;
    }
    const double value =
        GammaFunction(b) * ReciprocalGamma(a) * power * std::exp(x) / (moment * z + sum * fall);
    return {WideOf(Whole(value)), (15 + 3 * lost) * kEpsilon};
}

// In double precision for moderate arguments: the best for the region alone, or none.
Estimated ByPlainRegion(double a, double b, double x) {
    constexpr double least = 0.05, fromWronskian = 1.0, fromSlowly = 0.15, farthest = 60;
    const Estimated none = {kOne, kInfinity};
    const double d = a - b + 1;
    if (!(a > least && a <= kPlain && std::fabs(b) <= kPlain && x <= farthest && x > 1e-10))
        return none;
    const double whole = std::rint(b);
    if (b == whole) {
        const int n = static_cast<int>(whole) - 1;
        if (x < fromWronskian && n >= 0)
            return AtInteger(a, n, x);
        if (x < fromWronskian && d > least) { // b <= 0: x^(1-b) U(d, 2 - b, x)
            Estimated value = AtInteger(d, -n, x);
            value.value = value.value * WideOf(Whole(std::pow(x, 1 - b)));
            return value;
        }
    } else if (x < fromWronskian && std::fabs(b - whole) > kPlainDistance) {
        const Estimated value = PlainConnection(a, b, x);
        if (value.error <= kGoodConnection)
            return value;
    }
    if (x < fromSlowly || b > x + 15)
        return none;
    if (b >= 1)
        return d > -2 ? ByWronskian(a, b, x, std::pow(x, -b)) : none;
    return d > least ? ByWronskian(d, 2 - b, x, 1 / x) : none; // x^(1-b) U(d, 2 - b, x)
}

} // namespace

double TricomiByRegion(double x, double a, double b) {
    if (!std::isfinite(x) || !std::isfinite(a) || !std::isfinite(b) || x < 0)
        return kNaN;
    if (a == 0)
        return 1;
    if (x == 0)
        return AtZero(a, b);
    const Extended d = ExactSum(1, -b) + Whole(a);
    if (x < kAsymptoticFrom) {
        const Estimated plain = ByPlainRegion(a, b, x);
        if (plain.error <= kGoodConnection)
            return plain.value.rounded();
    }
    const AsymptoticResult sum = AsymptoticSum(a, d.high, -1 / x);
    if (sum.error <= kGood && std::fabs(a * std::log(x)) < kPlainPower)
        return std::pow(x, -a) * sum.sum;
    if (sum.error <= kGood)
        return (PowerOf(Whole(x), Whole(-a)).value * WideOf(Whole(sum.sum))).rounded();
    const Estimated plain =
        x < kAsymptoticFrom ? Estimated{kOne, kInfinity} : ByPlainRegion(a, b, x);
    if (plain.error <= kGoodConnection)
        return plain.value.rounded();
    const Estimated value = ByRegion(Whole(a), Whole(b), x);
    return value.error <= kHyperAccepted ? value.value.rounded() : kNaN;
}

} // namespace qx
