#include "special/modified_complex.h"

#include "frame/constants.h"
#include "frame/lanes.h"
#include "special/extended.h"
#include "special/order_recurrence.h"
#include "special/rational.h"
#include "special/reciprocal_gamma.h"
#include "special/tables/bessel_complex.h"
#include "special/tables/debye.h"

#include <algorithm>
#include <cmath>
#include <iterator>

namespace qx {

namespace {

constexpr double kFar = 22;           // from here on asymptotic sums have all digits
constexpr double kDebyeFrom = 10;     // order from which Debye's expansion is used for smaller |z|
constexpr double kTurningWidth = 8.2; // times max(|z|, order)^(1/3)
constexpr double kLongWayUp = 25;     // up to here recurrence from near 0 is no slower than Debye's
constexpr double kAxisWidth = 1;      // |Re z| up to which I is computed from K on both sides
constexpr double kAxisFrom = 3;       // |z| from which this is done
constexpr double kSeriesUpTo = 2;     // |z| + Re z up to which Temme's series is used
constexpr double kNegligible = 0x1p-56;
constexpr double kRootHalfPi = 0x1.40d931ff62706p+0;
constexpr Complex kOne = {1, 0};

constexpr int kSteps = 210;
struct Inverses { // 1 / n
    double of[kSteps + 1] = {};
    constexpr Inverses() {
        for (int n = 1; n <= kSteps; ++n)
            of[n] = 1.0 / n;
    }
};
constexpr Inverses inverses;

// The argument of a z in the first quadrant. LongAngle has only the rounding error of an arc
// tangent of at most pi/4.
Extended LongAngle(Complex z) {
    if (z.im <= z.re)
        return {std::atan(z.im / z.re), 0};
    const Extended angle = ExactSum(table::extendedHalfPi.high, -std::atan(z.re / z.im));
    return {angle.high, angle.low + table::extendedHalfPi.low};
}
double Angle(Complex z) { return LongAngle(z).high; }
double Modulus(Complex z) {
    const double largest = std::max(std::fabs(z.re), std::fabs(z.im));
    return largest > 1e-140 && largest < 1e140 ? std::sqrt(z.re * z.re + z.im * z.im)
                                               : std::hypot(z.re, z.im);
}
double Size(Complex z) { return std::fabs(z.re) + std::fabs(z.im); }
Complex Conjugate(Complex z) { return {z.re, -z.im}; }
Complex Inverse(Complex z) {
    const double scale = 1 / (z.re * z.re + z.im * z.im);
    return {z.re * scale, -z.im * scale};
}
ExtendedComplex Negative(ExtendedComplex e) { return {-e.re, -e.im}; }
Complex Exp(Complex z) { return Value({kOne, Plain(z)}, Plain({0, 0})); }
Complex TimesI(Complex z) { return {-z.im, z.re}; }
Exponential Conjugate(const Exponential &term) {
    const Extended im = term.exponent.im;
    return {Conjugate(term.factor), {term.exponent.re, -im}};
}

// From here on z is in the first quadrant; for K it may lie slightly outside, as AxisI requires.

double TurningWidth(double order, double modulus) {
    return kTurningWidth * std::cbrt(std::max(modulus, order));
}

bool DebyeHolds(double order, double modulus, Complex z) {
    return (modulus >= kFar || order >= kDebyeFrom) &&
           std::hypot(order - z.im, z.re) >= TurningWidth(order, modulus);
}

// The sum of an asymptotic series, and the sum with alternating signs.
struct Sums {
    Complex plain, alternating;
};

// sum u_k / order^k, where u_k / order^k = P_k(order^2 / s^2) / s^k with real polynomials P_k, each
// evaluated by the recurrence for real coefficients (D. E. Knuth, The art of computer programming,
// 4.6.4); for N = 2 also the sum of the v_k.
template <int N>
struct DebyeSums {
    Sums of[N];

    DebyeSums(double order, Complex s) {
        typedef Lanes<N> L;
        constexpr std::ptrdiff_t toSlope = table::debyeCount * table::debyeCount;
        const Complex step = Inverse(s);
        const Complex q = step * step * (order * order);
        const L twice(2 * q.re);
        const L square(q.re * q.re + q.im * q.im);
        L plainRe(1.0), plainIm(0.0), alternatingRe(1.0), alternatingIm(0.0);
        Complex power = step;
        double sign = -1;
        for (int k = 1; k < table::debyeCount; ++k) {
            const double *c = table::debye[0][k];
            L upper(0.0);
            L lower = L::gather(c + k, toSlope);
            for (int j = k - 1; j >= 1; --j) {
                const L next = (L::gather(c + j, toSlope) - square * upper) + twice * lower;
                upper = lower;
                lower = next;
            }
            const L re = (L::gather(c, toSlope) - square * upper) + L(q.re) * lower;
            const L im = L(q.im) * lower;
            const L termRe = L(power.re) * re - L(power.im) * im;
            const L termIm = L(power.re) * im + L(power.im) * re;
            plainRe = plainRe + termRe;
            plainIm = plainIm + termIm;
            alternatingRe = alternatingRe + L(sign) * termRe;
            alternatingIm = alternatingIm + L(sign) * termIm;
            double largest = 0;
            for (int n = 0; n < N; ++n)
                largest = std::max(largest, Size({termRe[n], termIm[n]}));
            if (largest < kNegligible)
                break;
            sign = -sign;
            power = power * step;
        }
        for (int n = 0; n < N; ++n)
            of[n] = {{plainRe[n], plainIm[n]}, {alternatingRe[n], alternatingIm[n]}};
    }
};

Sums HankelSums(double order, Complex z) {
    const Complex step = Inverse(z * 8);
    const double square = 4 * order * order;
    Sums sums = {kOne, kOne};
    Complex term = kOne;
    for (int k = 1; k < 48; ++k) {
        const double odd = 2 * k - 1;
        term = term * step * ((square - odd * odd) * inverses.of[k]);
        sums.plain += term;
        sums.alternating = k % 2 == 0 ? sums.alternating + term : sums.alternating - term;
        if (Size(term) < kNegligible)
            break;
    }
    return sums;
}

// exp(e) S(u) + i exp(i pi order) exp(-e) S(-u), times a scale over sqrt(2 pi).
ExponentialPair TwoExponentials(double order, Complex scale, const ExtendedComplex &exponent,
                                Complex growing, Complex decaying, bool hasSecond) {
    scale = scale * kInverseRootTwoPi;
    ExponentialPair pair = {{scale * growing, exponent}, {{0, 0}, exponent}};
    if (hasSecond)
        pair.second = {scale * decaying * TimesI(TurnByPi(order)), Negative(exponent)};
    return pair;
}

// Debye's expansion at one order and argument.
struct Debye {
    double order;
    Complex z;
    DebyeExponent place;
    Sums sums;
    Complex scale;

    Debye(Extended exactOrder, Complex at)
        : order(exactOrder.high), z(at), place(ExponentOfDebye(exactOrder, z)),
          sums(DebyeSums<1>(order, place.s).of[0]), scale(Inverse(RootOfUpperHalf(place.s))) {}
    ExponentialPair i() const {
        const bool isBeyondStokesLine = z.im > order && place.exponent.im.high > kHalfPi * order;
        return TwoExponentials(order, scale, place.exponent, sums.plain, sums.alternating,
                               isBeyondStokesLine && place.exponent.re.high < 20);
    }
    Exponential k() const {
        return {scale * kRootHalfPi * sums.alternating, Negative(place.exponent)};
    }
};

// The values for an order and a neighbouring one, divided by exp(exponent).
struct TwoOrders {
    Complex first, second;
    ExtendedComplex exponent;
};

// Debye's expansions of a function f and its derivative, which is +-s / z f except for the sums.
// From these I_(order - 1) = I' + order / z I and K_(order + 1) = -K' + order / z K, where nothing
// cancels.
TwoOrders DebyeTwo(Extended order, Complex z, bool isK) {
    const DebyeExponent place = ExponentOfDebye(order, z);
    const DebyeSums<2> sums(order.high, place.s);
    const Complex scale =
        Inverse(RootOfUpperHalf(place.s)) * (isK ? kRootHalfPi : kInverseRootTwoPi);
    const Complex f = isK ? sums.of[0].alternating : sums.of[0].plain;
    const Complex slope = isK ? sums.of[1].alternating : sums.of[1].plain;
    return {scale * f, scale * ((place.s * slope + f * order.high) / z),
            isK ? Negative(place.exponent) : place.exponent};
}

// Hankel's expansion.
struct Hankel {
    double order;
    Complex z;
    Sums sums;
    Complex scale;

    Hankel(double ofOrder, Complex at)
        : order(ofOrder), z(at), sums(HankelSums(order, z)), scale(Inverse(RootOfUpperHalf(z))) {}
    ExponentialPair i() const {
        return TwoExponentials(order, scale, Plain(z), sums.alternating, sums.plain, z.re < 20);
    }
    Exponential k() const { return {scale * kRootHalfPi * sums.plain, Plain(-z)}; }
};

double ReciprocalGammaNextToOne(double mu) { // 1 / gamma(1 + mu), |mu| <= 1/2
    return Horner(table::reciprocalGamma, mu);
}

// The correction to the logarithm of (|z|/2)^order / gamma(order + 1) for the rounding of the
// modulus, which the power multiplies by the order, and for the rounding of order + 1, whose gamma
// function is used below order 20.
double RoundingInPower(double order, Complex z, double modulus) {
    const Extended square = ExactProduct(z.re, z.re) + ExactProduct(z.im, z.im);
    const Extended rounded = ExactProduct(modulus, modulus);
    double rest = 0;
    if (rounded.high > 1e-250)
        rest = order * ((square.high - rounded.high) + (square.low - rounded.low)) /
               (2 * rounded.high);
    if (order < 20)
        rest -= ExactSum(order, 1).low * (std::log(order + 1) - 0.5 / (order + 1));
    return rest;
}

// sum q^k / (k! (order + 1)_k) for |q| <= order + 1, nested: 1 + q / (order + 1) (1 + ...).
Complex NestedSeries(double order, Complex q) {
    constexpr int most = 24;
    double weights[most];
    const double size = Size(q);
    double term = 1;
    int n = 0;
    while (n < most && term > kNegligible) {
        weights[n] = inverses.of[n + 1] / (order + (n + 1));
        term *= size * weights[n];
        ++n;
    }
    Complex sum = kOne;
    while (--n >= 0)
        sum = kOne + q * weights[n] * sum;
    return sum;
}

// (z/2)^order / gamma(order + 1) sum (z^2/4)^k / (k! (order + 1)_k)
Exponential SeriesI(double order, Complex z, double modulus) {
    const Complex half = z * 0.5;
    const Complex sum = NestedSeries(order, half * half);
    if (order == 0)
        return {sum, Plain({0, 0})};
    const double size = PowerOverGamma(0.5 * modulus, order);
    const double rounding = order < 2 ? 0 : RoundingInPower(order, z, modulus);
    const Extended angle = order < 4 ? LongAngle(z) : ExtendedArgument({z.re, 0}, {z.im, 0});
    return {sum * size, {{0, rounding}, angle * Extended{order, 0}}};
}

// order = mu + m with |mu| <= 1/2.
struct SplitOrder {
    double mu;
    int m;
    explicit SplitOrder(double order)
        : mu(order - std::floor(order + 0.5)), m(static_cast<int>(std::floor(order + 0.5))) {}
};

// z found - 1, with more digits than the rounded product has.
Complex ExcessOfInverse(Complex z, Complex found) {
    const Extended re = ExactProduct(z.re, found.re) - ExactProduct(z.im, found.im);
    const Extended im = ExactProduct(z.re, found.im) + ExactProduct(z.im, found.re);
    return {(re - Extended{1, 0}).high, im.high};
}

// I_(mu + k) by downward recurrence from arbitrary start values, normalised by
// (z/2)^mu exp(z) = gamma(1 + mu) (I_mu + sum 2 (mu + k) (2 mu + 1)_(k-1) / k! I_(mu + k)).
Exponential MillerI(double order, Complex z, double modulus) {
    const SplitOrder split(order);
    const double reach = std::max(modulus, order);
    const int start = static_cast<int>(reach + 9 * std::cbrt(reach)) + 6;
    const Complex step = Inverse(z) * 2;
    const double mu = split.mu;
    Complex above = {0, 0};
    Complex p = kOne;
    Complex sum = p; // of the terms from k on, divided by the weight of k
    Complex wanted = p;
    Complex next = {0, 0}; // of the order above the wanted one
    for (int k = start; k >= 1; --k) {
        const double rounded = mu + k;
        const double rest = mu - (rounded - k);
        const Complex turned = step * p;
        const Complex below = above + turned * rest + turned * rounded;
        above = p;
        p = below;
        const double weight = k == 1 ? 2 * (mu + 1)
                                     : (mu + k) * (2 * mu + (k - 1)) /
                                           ((mu + (k - 1)) * k); // of k, divided by that of k - 1
        sum = p + sum * weight;
        if (k - 1 == split.m) {
            wanted = p;
            next = above;
        }
    }
    const Complex power = Exp(Complex{std::log(0.5 * modulus), Angle(z)} * mu);
    // So far everything except the power and the exponential is for the argument z (1 - excess).
    const Complex excess = ExcessOfInverse(z, step * 0.5);
    const Complex slope = z * (next - wanted) + wanted * split.m;
    return {(wanted + excess * slope) * power / sum * ReciprocalGammaNextToOne(mu), Plain(z)};
}

// K_mu = sqrt(pi / (2 z)) exp(-z) U_0 / sum C_n U_n, where U_n is the confluent function
// U(mu + 1/2 + n, 2 mu + 1, 2 z), C_n = (1/2 + mu)_n (1/2 - mu)_n / n!, and the U_n come from
// downward recurrence with arbitrary start values. The code computes n! U_n.
TwoOrders MillerK(double mu, Complex z, double modulus) {
    const int start = std::min(static_cast<int>(400 / (modulus + z.re)) + 9, kSteps - 1);
    const auto coefficient = [mu](int n) { return (n - 0.5) * (n - 0.5) - mu * mu; };
    Complex above = {0, 0};
    Complex u = kOne;
    Complex sum = u; // of C_m U_m from m = n on, divided by C_n / n!
    for (int n = start; n >= 1; --n) {
        const double twice = 2 * inverses.of[n];
        const Complex below = Complex{2 + twice * z.re, twice * z.im} * u -
                              above * (coefficient(n + 1) * (inverses.of[n] * inverses.of[n + 1]));
        above = u;
        u = below;
        sum = u + sum * (coefficient(n) * (inverses.of[n] * inverses.of[n]));
    }
    const Complex first = u * kRootHalfPi / (sum * RootOfUpperHalf(z));
    const Complex ratio = (z + (mu + 0.5) - above * coefficient(1) / u) / z;
    return {first, first * ratio, Plain(-z)};
}

// K_(-1/2) = K_(1/2) = sqrt(pi / (2 z)) exp(-z).
TwoOrders HalfOrderK(Complex z) {
    const Complex value = Complex{kRootHalfPi, 0} / RootOfUpperHalf(z);
    return {value, value, Plain(-z)};
}

// (z/2)^-mu, its inverse, sinh(s) / s for the exponent s of the power, and the logarithm of 2 / z.
struct PowersOfHalf {
    Complex grow, decay, sinc, logarithm;

    PowersOfHalf(double mu, Complex z, double modulus) {
        int exponent;
        const double mantissa = std::frexp(modulus, &exponent);
        // For small |z| the rounding of the logarithm would become an error of the power.
        const double part = std::log(mantissa);
        const Extended turns = {static_cast<double>(1 - exponent), 0};
        const Extended logOfSize = turns * table::extendedLnTwo + Extended{-part, 0};
        const double angle = Angle(z);
        logarithm = {logOfSize.high, -angle};
        grow = decay = sinc = kOne;
        if (mu == 0)
            return;
        const Extended s = logOfSize * Extended{mu, 0};
        const Complex turn = {std::cos(mu * angle), -std::sin(mu * angle)};
        const double size = std::exp(s.high) * (1 + s.low);
        grow = turn * size;
        decay = Conjugate(turn) * (1 / size);
        const Complex sigma = {s.high, -mu * angle};
        const double sigmaSize = Size(sigma);
        if (sigmaSize > 0.5) {
            sinc = (grow - decay) * 0.5 / sigma;
        } else if (sigmaSize > 1e-9) {
            const Complex w = sigma * sigma;
            for (int k = 7; k >= 1; --k)
                sinc = kOne + w * sinc * (0.5 * inverses.of[k] * inverses.of[2 * k + 1]);
        }
    }
};

// The two series of Temme about z = 0, sum q^k / k! f_k and sum q^k / k! (p_k - k f_k) with
// f_k = (k f_(k-1) + p_(k-1) + q_(k-1)) / (k^2 - mu^2), p_k = p_(k-1) / (k - mu) and
// q_k = q_(k-1) / (k + mu). The coefficients of f_0, p_0 and q_0 in the terms, divided by k!, are
// real.
struct TemmeTerms {
    static constexpr int most = 20;
    double first[3][most] = {{1}, {0}, {0}};
    double second[3][most] = {{0}, {1}, {0}};
    int last = 0;

    TemmeTerms(double mu, double size) {
        double p = 1;
        double q = 1;
        double term = 1;
        while (last + 1 < most && term > kNegligible) {
            const int k = ++last;
            const double scale = inverses.of[k] / ((k - mu) * (k + mu));
            first[0][k] = scale * (k * first[0][k - 1]);
            first[1][k] = scale * (k * first[1][k - 1] + p);
            first[2][k] = scale * (k * first[2][k - 1] + q);
            p *= (k + mu) * scale;
            q *= (k - mu) * scale;
            second[0][k] = -k * first[0][k];
            second[1][k] = p - k * first[1][k];
            second[2][k] = -k * first[2][k];
            term *= size * scale * k;
        }
    }
    Complex sum(const double (&of)[3][most], const Complex (&start)[3], Complex q) const {
        Complex sums[3] = {};
        for (int k = last; k >= 0; --k)
            for (int n = 0; n < 3; ++n)
                sums[n] = sums[n] * q + of[n][k];
        return start[0] * sums[0] + (start[1] * sums[1] + start[2] * sums[2]);
    }
};

TwoOrders SeriesK(double mu, Complex z, double modulus, bool hasSecond) {
    double even = 0; // (1 / gamma(1 - mu) + 1 / gamma(1 + mu)) / 2
    double odd = 0;  // (1 / gamma(1 - mu) - 1 / gamma(1 + mu)) / (2 mu)
    for (int k = static_cast<int>(std::size(table::reciprocalGamma)) - 2; k >= 0; k -= 2) {
        even = even * (mu * mu) + table::reciprocalGamma[k];
        odd = odd * (mu * mu) - table::reciprocalGamma[k + 1];
    }
    const PowersOfHalf power(mu, z, modulus);
    const double reflected = mu == 0 ? 1 : kPi * mu / SinPi(mu);
    const Complex start[3] = {
        ((power.grow + power.decay) * (0.5 * odd) + power.sinc * power.logarithm * even) *
            reflected,
        power.grow * (0.5 / (even - mu * odd)), // gamma(1 + mu) / 2 times the power
        power.decay * (0.5 / (even + mu * odd))};
    const Complex half = z * 0.5;
    const Complex square = half * half;
    const TemmeTerms terms(mu, Size(square));
    const Complex first = terms.sum(terms.first, start, square);
    const Complex second =
        hasSecond ? terms.sum(terms.second, start, square) / half : Complex{0, 0};
    return {first, second, Plain({0, 0})};
}

// K_(order + steps) from K_order and K_(order + 1).
Exponential Upwards(double order, int steps, Complex z, const TwoOrders &start) {
    if (steps <= 1)
        return {steps == 0 ? start.first : start.second, start.exponent};
    // Scaled down, because the steps need values away from the overflow limit.
    constexpr double down = 0x1p-60;
    OrderRecurrence k(z, ExactSum(order, 1), 1, start.first * down, start.second * down);
    for (int n = 1; n < steps; ++n)
        k.advance();
    return {k.value() * (1 / down), start.exponent};
}

// Near the turning point: downwards from an order above it.
Exponential TurningI(double order, Complex z, double modulus) {
    // at an order above the starting order
    const double width = TurningWidth(0, modulus + 10 * std::cbrt(modulus) + 7);
    const double wide = std::sqrt(std::max(0.0, width * width - z.re * z.re));
    const int steps = std::max(1, static_cast<int>(std::ceil(z.im + wide - order)));
    const TwoOrders start = DebyeTwo(ExactSum(order, steps + 1), z, false);
    OrderRecurrence i(z, ExactSum(order, steps), -1, start.first, start.second);
    for (int k = steps; k >= 1; --k)
        i.advance();
    return {i.value(), start.exponent};
}

// Near the turning point: upwards from an order below it, or from an order near 0.
Exponential TurningK(double order, Complex z, double modulus) {
    const double width = TurningWidth(0, modulus);
    const double wide = std::sqrt(std::max(0.0, width * width - z.re * z.re));
    const int steps = static_cast<int>(std::ceil(order - (z.im - wide))) + 1;
    const double low = order - steps;
    if (low > kLongWayUp)
        return Upwards(low, steps, z, DebyeTwo({low, 0}, z, true));
    const SplitOrder split(order);
    return Upwards(split.mu, split.m, z, MillerK(split.mu, z, modulus));
}

// The asymptotic expansion that holds.
enum class Region { Hankel, Debye, Other };
Region RegionOf(double order, Complex z, double modulus) {
    if (modulus >= kFar && order * order <= 2 * modulus)
        return Region::Hankel;
    return DebyeHolds(order, modulus, z) ? Region::Debye : Region::Other;
}

Exponential NearK(double order, Complex z, double modulus) {
    if (modulus >= kFar)
        return TurningK(order, z, modulus);
    const SplitOrder split(order);
    if (split.mu == -0.5)
        return Upwards(split.mu, split.m, z, HalfOrderK(z));
    return Upwards(split.mu, split.m, z,
                   modulus + z.re <= kSeriesUpTo ? SeriesK(split.mu, z, modulus, split.m > 0)
                                                 : MillerK(split.mu, z, modulus));
}

Exponential UpperK(double order, Complex z) {
    const double modulus = Modulus(z);
    if (order >= kDebyeFrom && modulus < 1e-60)
        return {{kInfinity, 0}, Plain({0, 0})};
    switch (RegionOf(order, z, modulus)) {
    case Region::Hankel:
        return Hankel(order, z).k();
    case Region::Debye:
        return Debye({order, 0}, z).k();
    case Region::Other:
        break;
    }
    return NearK(order, z, modulus);
}

bool IsNextToAxis(double order, Complex z, double modulus) {
    return z.re <= kAxisWidth && z.im > order && modulus > kAxisFrom && modulus < kFar;
}

// Near the imaginary axis, where I oscillates: from K on both sides of the axis,
// i pi I(z) = K(z exp(-i pi)) - exp(i pi order) K(z), without a recurrence through the turning point.
ExponentialPair AxisI(double order, Complex z, const Exponential &k) {
    const Exponential mirrored = Conjugate(UpperK(order, {-z.re, z.im}));
    const Complex turn = TimesI(TurnByPi(order));
    return {{mirrored.factor * Complex{0, -kInversePi}, mirrored.exponent},
            {k.factor * turn * kInversePi, k.exponent}};
}

bool SeriesHolds(double order, double modulus) { return 0.25 * modulus * modulus <= order + 1; }

// Where no asymptotic expansion holds.
Exponential NearI(double order, Complex z, double modulus) {
    if (SeriesHolds(order, modulus))
        return SeriesI(order, z, modulus);
    return modulus < kFar && order < kDebyeFrom ? MillerI(order, z, modulus)
                                                : TurningI(order, z, modulus);
}

ExponentialPair Single(const Exponential &term) { return {term, {{0, 0}, Plain({0, 0})}}; }

ExponentialPair UpperI(double order, Complex z) {
    const double modulus = Modulus(z);
    if (SeriesHolds(order, modulus))
        return Single(SeriesI(order, z, modulus));
    switch (RegionOf(order, z, modulus)) {
    case Region::Hankel:
        return Hankel(order, z).i();
    case Region::Debye:
        return Debye({order, 0}, z).i();
    case Region::Other:
        break;
    }
    if (IsNextToAxis(order, z, modulus))
        return AxisI(order, z, UpperK(order, z));
    return Single(NearI(order, z, modulus));
}

ModifiedBoth UpperIAndK(double order, Complex z) {
    const double modulus = Modulus(z);
    switch (modulus < kFar && SeriesHolds(order, modulus) ? Region::Other
                                                          : RegionOf(order, z, modulus)) {
    case Region::Hankel: {
        const Hankel hankel(order, z);
        return {hankel.i(), hankel.k()};
    }
    case Region::Debye: {
        const Debye debye({order, 0}, z);
        return {debye.i(), debye.k()};
    }
    case Region::Other:
        break;
    }
    const Exponential k = UpperK(order, z);
    if (IsNextToAxis(order, z, modulus) && !SeriesHolds(order, modulus))
        return {AxisI(order, z, k), k};
    return {Single(NearI(order, z, modulus)), k};
}

} // namespace

ExponentialPair ModifiedI(double order, Complex z) {
    if (!std::signbit(z.im))
        return UpperI(order, z);
    const ExponentialPair pair = UpperI(order, Conjugate(z));
    return {Conjugate(pair.first), Conjugate(pair.second)};
}

Exponential ModifiedK(double order, Complex z) {
    return std::signbit(z.im) ? Conjugate(UpperK(order, Conjugate(z))) : UpperK(order, z);
}

ModifiedBoth ModifiedIAndK(double order, Complex z) {
    if (!std::signbit(z.im))
        return UpperIAndK(order, z);
    const ModifiedBoth both = UpperIAndK(order, Conjugate(z));
    return {{Conjugate(both.i.first), Conjugate(both.i.second)}, Conjugate(both.k)};
}

} // namespace qx
