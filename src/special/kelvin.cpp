#include "special/kelvin.h"

#include "frame/constants.h"
#include "special/bessel_uniform.h"
#include "special/diagonal.h"
#include "special/extended.h"
#include "special/reciprocal_gamma.h"

#include <cmath>

namespace qx {

namespace {

constexpr double kTwoGamma = 1.1544313298030657; // twice Euler's constant

// a times i^n.
Complex Turn(Complex a, double n) {
    switch (static_cast<int>(std::fmod(n, 4.0))) {
    case 1:
        return {-a.im, a.re};
    case 2:
        return {-a.re, -a.im};
    case 3:
        return {a.im, -a.re};
    default:
        return a;
    }
}

// The real and the imaginary part of a sum with factors exp(i k pi / 2): the sums over even and odd
// k.
struct Halves {
    double even = 0;
    double odd = 0;
    void add(int k, double term) { (k % 2 == 0 ? even : odd) += k % 4 < 2 ? term : -term; }
};

Complex SeriesI(double n, double x) {
    const double q = 0.25 * x * x;
    Halves sum;
    double term = 1;
    for (int k = 0; k < 200 && std::fabs(term) > 1e-18; ++k) {
        sum.add(k, term);
        term *= q / ((k + 1) * (n + k + 1));
    }
    const double factor = PowerOverGamma(0.5 * x, n);
    const double c = CosPi(0.75 * std::fmod(n, 8.0));
    const double s = SinPi(0.75 * std::fmod(n, 8.0));
    return {factor * (c * sum.even - s * sum.odd), factor * (s * sum.even + c * sum.odd)};
}

// exp(+-z) of z = x exp(i pi / 4), with its parts in two doubles.
Complex ExpOnDiagonal(double x, double sign) {
    constexpr Extended diagonal = {kRootHalf, -4.833646656726457e-17};
    const Extended part = diagonal * Extended{sign * x, 0};
    const Complex e = Exp(Complex{part.high, part.high});
    return e * Complex{1 + part.low, part.low};
}

// K_0 and K_1 by Temme's continued fraction, |z| >= 2.
struct OrdersZeroOne {
    Complex k0, k1;
};

OrdersZeroOne ContinuedK(Complex z, double x) {
    Complex b = (z + 1.0) * 2;
    Complex d = Complex{1, 0} / b;
    Complex h = d;
    Complex step = d;
    Complex q1 = {0, 0};
    Complex q2 = {1, 0};
    double c = 0.25;
    double a = -0.25;
    Complex q = {0.25, 0};
    Complex s = q * step + 1.0;
    for (int i = 2; i < 500; ++i) {
        a -= 2 * (i - 1);
        c = -a * c / i;
        const Complex next = (q1 - b * q2) * (1 / a);
        q1 = q2;
        q2 = next;
        q = q + next * c;
        b = b + 2.0;
        d = Complex{1, 0} / (b + d * a);
        step = (b * d + -1.0) * step;
        h = h + step;
        const Complex change = q * step;
        s = s + change;
        if (Size(change) <= 0.25 * kEpsilon * Size(s))
            break;
    }
    OrdersZeroOne k = {};
    k.k0 = RootOfRightHalf(Complex{0.5 * kPi, 0} / z) * ExpOnDiagonal(x, -1) / s;
    k.k1 = k.k0 * (z + 0.5 - h * 0.25) / z;
    return k;
}

struct Neighbours {
    Complex k, next;
};

Neighbours UpwardK(int n, Complex z, double x) {
    const OrdersZeroOne start = ContinuedK(z, x);
    Complex value = start.k0;
    Complex next = start.k1;
    for (int k = 1; k <= n; ++k) {
        const Complex following = Complex{2.0 * k, 0} / z * next + value;
        value = next;
        next = following;
    }
    return {value, next};
}

// ker and kei for x < 2: the logarithm, the finite sum of n terms, and the infinite sum.
Complex SeriesK(int n, double x) {
    const double q = 0.25 * x * x;
    const double c = CosPi(0.75 * (n % 8));
    const double s = SinPi(0.75 * (n % 8));
    const double factor = PowerOverGamma(0.5 * x, n);
    Halves finite;
    double term = n > 0 ? 0.5 / (n * factor) : 0;
    for (int k = 0; k < n && std::fabs(term) > 0; ++k) {
        finite.add(k, term);
        if (k + 1 < n)
            term *= q / ((k + 1.0) * (n - k - 1.0));
    }
    double psi = -kTwoGamma; // psi(k + 1) + psi(n + k + 1)
    for (int k = 1; k <= n; ++k)
        psi += 1.0 / k;
    Halves infinite;
    term = 0.5 * factor;
    for (int k = 0; k < 60; ++k) {
        infinite.add(k, term * psi);
        term *= q / ((k + 1.0) * (n + k + 1.0));
        psi += 1 / (k + 1.0) + 1 / (n + k + 1.0);
    }
    const Complex ber = SeriesI(n, x);
    const double l = std::log(0.5 * x);
    // a factor of exactly 0 drops a sum that may be infinite
    const auto part = [](double phase, double sum) { return phase == 0 ? 0.0 : phase * sum; };
    const Complex first = {part(c, finite.even) - part(s, finite.odd),
                           -(part(s, finite.even) + part(c, finite.odd))};
    const Complex last = {c * infinite.even - s * infinite.odd,
                          s * infinite.even + c * infinite.odd};
    return {first.re - l * ber.re + 0.25 * kPi * ber.im + last.re,
            first.im - l * ber.im - 0.25 * kPi * ber.re + last.im};
}

Complex AsymptoticI(double n, Complex z, double x) {
    const double square = 4 * n * n;
    Complex term = {1, 0};
    Complex sum = term;
    const Complex inverse = Complex{0.125, 0} / z;
    for (int k = 1; k < 100; ++k) {
        const double odd = 2 * k - 1;
        term = term * inverse * ((odd * odd - square) / k);
        sum = sum + term;
        if (Size(term) <= 0.25 * kEpsilon)
            break;
    }
    return ExpOnDiagonal(x, 1) * (sum / RootOfRightHalf(z * (2 * kPi)));
}

// I_n from the ratio I_(n+1) / I_n, by downward recurrence from a much higher order, and the
// Wronskian.
Complex WronskianI(int n, Complex z, double x) {
    const int start = n + 30 + static_cast<int>(x + 4 * std::sqrt(x));
    Complex ratio = {0, 0};
    for (int k = start; k > n; --k)
        ratio = Complex{1, 0} / (Complex{2.0 * k, 0} / z + ratio);
    const Neighbours k = UpwardK(n, z, x);
    return Complex{1, 0} / (z * (k.next + ratio * k.k));
}

double Magnitude(int32_t n) { return std::fabs(static_cast<double>(n)); }

} // namespace

KelvinPair KelvinI(double x, int32_t n) {
    if (std::isnan(x) || std::isinf(x))
        return {kNaN, kNaN};
    const double m = Magnitude(n);
    const double a = std::fabs(x);
    if (a == 0)
        return {m == 0 ? 1.0 : 0.0, 0};
    const Complex z = {a * kRootHalf, a * kRootHalf};
    Complex value;
    if (a <= 5 || (a < 50 && 0.25 * a * a < m)) {
        value = SeriesI(m, a);
    } else if (m >= kModifiedUniformFrom) {
        const ComplexModifiedPair pair = ModifiedBesselOnDiagonal(m, a);
        value = Turn({pair.iRe, pair.iIm}, m);
    } else if (a > 1100 || a >= std::fmax(40, m * m)) {
        value = Turn(AsymptoticI(m, z, a), m);
    } else {
        value = Turn(WronskianI(static_cast<int>(m), z, a), m);
    }
    const bool negative = IsOdd(m) && (n < 0) != (x < 0);
    return negative ? KelvinPair{-value.re, -value.im} : KelvinPair{value.re, value.im};
}

KelvinPair KelvinK(double x, int32_t n) {
    if (!(x > 0))
        return {kNaN, kNaN};
    if (std::isinf(x))
        return {0, 0};
    const double m = Magnitude(n);
    const double quarters = 4 - std::fmod(m, 4.0); // i^-m
    Complex value;
    if (m >= kModifiedUniformFrom) {
        const ComplexModifiedPair pair = ModifiedBesselOnDiagonal(m, x);
        value = Turn({pair.kRe, pair.kIm}, quarters);
    } else if (x < 2) {
        value = SeriesK(static_cast<int>(m), x);
    } else if (x > 1100) {
        value = {0, 0};
    } else {
        const Complex z = {x * kRootHalf, x * kRootHalf};
        value = Turn(UpwardK(static_cast<int>(m), z, x).k, quarters);
    }
    return n < 0 && IsOdd(m) ? KelvinPair{-value.re, -value.im} : KelvinPair{value.re, value.im};
}

} // namespace qx
