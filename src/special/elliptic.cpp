#include "special/elliptic.h"

#include "frame/constants.h"
#include "special/tables/elliptic.h"

#include <cmath>

namespace qx {

namespace {

constexpr double kHalfPiLow = 6.123233995736766e-17; // pi / 2 minus its double
constexpr int kMostRounds = 40; // of Landen's transformation; about 8 are needed

bool IsParameter(double m) { return m >= 0 && m <= 1; }

// F and E of 0 < phi < pi / 2, 0 < m < 1, in the scaled form of the transformation.
struct LandenSums {
    double first; // F
    double extra; // E = F E(m) / K(m) + extra
};

// floor((phi + pi / 2) / pi). Near an odd multiple of pi / 2, where rounding decides this number
// and the sign of t = tan(phi) independently, the number of half turns that is consistent with t.
double HalfTurns(double phi, double t) {
    constexpr double steep = 1e6;
    const double turns = std::floor((phi + kHalfPi) / kPi);
    return std::fabs(t) > steep ? std::rint((phi - std::atan(t)) / kPi) : turns;
}

LandenSums Landen(double phi, double m) {
    double a = 1;
    double b = std::sqrt(1 - m);
    double c = std::sqrt(m);
    double d = 1;
    double t = std::tan(phi);
    double turns = 0;
    double extra = 0;
    for (int round = 0; round < kMostRounds && std::fabs(c / a) > kEpsilon; ++round) {
        const double ratio = b / a;
        phi += std::atan(t * ratio) + turns * kPi;
        const double growth = (1 + ratio) / (1 - ratio * t * t);
        t = std::isinf(t) ? -(1 + ratio) / (ratio * t) : t * growth;
        turns = HalfTurns(phi, t);
        const double mean = std::sqrt(a * b);
        a = 0.5 * (a + b);
        b = mean;
        c = 0.25 * c * c / a; // half the previous difference of a and b, without its cancellation
        d += d;
        extra += c * std::sin(phi);
    }
    return {(std::atan(t) + turns * kPi) / (d * a), extra};
}

// An amplitude as a multiple of pi and a remainder within a quarter turn.
struct Amplitude {
    double halfTurns;
    double rest;
};

Amplitude Split(double phi) {
    if (std::fabs(phi) <= kHalfPi)
        return {0, phi};
    const double n = std::rint(phi / kPi);
    return {n, (phi - n * kPi) - n * (2 * kHalfPiLow)};
}

bool IsQuarter(double phi) { return std::fabs(phi - kHalfPi) <= kEpsilon; }

} // namespace

double EllipticK(double m) {
    if (!IsParameter(m))
        return kNaN;
    if (m <= 0.5)
        return kHalfPi + (m * table::ellipticKSmall(m) + kHalfPiLow);
    const double m1 = 1 - m;
    return table::ellipticKNear(m1) - std::log(m1) * table::ellipticKLog(m1);
}

double EllipticE(double m) {
    if (!IsParameter(m))
        return kNaN;
    if (m <= 0.5)
        return kHalfPi - (m * table::ellipticESmall(m) - kHalfPiLow);
    if (m == 1)
        return 1;
    const double m1 = 1 - m;
    return table::ellipticENear(m1) - std::log(m1) * (m1 * table::ellipticELog(m1));
}

namespace {

// An incomplete integral from its complete form and from functions for 0 < phi < pi / 2, one for m
// = 1 and one for other m.
template <class AtOne, class General>
double Incomplete(double phi, double m, double (*complete)(double), AtOne atOne, General general) {
    if (!IsParameter(m) || std::isnan(phi))
        return kNaN;
    if (std::isinf(phi))
        return phi;
    const Amplitude split = Split(phi);
    if (split.halfTurns != 0)
        return 2 * split.halfTurns * complete(m) +
               Incomplete(split.rest, m, complete, atOne, general);
    if (phi == 0 || m == 0)
        return phi;
    const double size = std::fabs(phi);
    double value;
    if (IsQuarter(size))
        value = complete(m);
    else
        value = m == 1 ? atOne(size) : general(size);
    return phi < 0 ? -value : value;
}

} // namespace

double EllipticF(double phi, double m) {
    return Incomplete(
        phi, m, EllipticK, [](double size) { return std::log(std::tan(0.25 * kPi + 0.5 * size)); },
        [m](double size) { return Landen(size, m).first; });
}

double EllipticFOfOne(double phi) {
    const auto nearZero = [](double size) {
        const double t = std::tan(0.5 * size);
        return std::log1p(2 * t / (1 - t));
    };
    return Incomplete(
        phi, 1, EllipticK,
        [nearZero](double size) {
            return size < 0.25 * kPi ? nearZero(size)
                                     : std::log((1 + std::sin(size)) / std::cos(size));
        },
        nearZero);
}

double EllipticE(double phi, double m) {
    return Incomplete(
        phi, m, EllipticE, [](double size) { return std::sin(size); },
        [m](double size) {
            const LandenSums parts = Landen(size, m);
            return parts.first * (EllipticE(m) / EllipticK(m)) + parts.extra;
        });
}

namespace {

JacobiValues NearCircular(double u, double m) {
    const double s = std::sin(u);
    const double c = std::cos(u);
    const double shift = 0.25 * m * (u - s * c);
    return {s - shift * c, c + shift * s, 1 - 0.5 * m * s * s, u - shift};
}

JacobiValues NearHyperbolic(double u, double m1) {
    const double t = std::tanh(u);
    const double cosh = std::cosh(u);
    const double sech = 1 / cosh;
    const double product = std::sinh(u) * cosh;
    const double quarter = 0.25 * m1;
    const double gudermannian = 2 * std::atan(std::tanh(0.5 * u));
    if (m1 == 0) // the products may overflow
        return {t, sech, sech, gudermannian};
    return {t + quarter * (product - u) * sech * sech, sech - quarter * (product - u) * t * sech,
            sech + quarter * (product + u) * t * sech,
            gudermannian + quarter * (product - u) * sech};
}

JacobiValues ByMeans(double u, double m) {
    constexpr int rounds = 8;
    double a[rounds + 1] = {1};
    double c[rounds + 1] = {std::sqrt(m)};
    double b = std::sqrt(1 - m);
    double scale = 1;
    int i = 0;
    // eps a is exact, so the rounded c / a exceeds eps if c exceeds eps a
    while (i < rounds && std::fabs(c[i]) > kEpsilon * a[i]) {
        a[i + 1] = 0.5 * (a[i] + b);
        c[i + 1] = 0.5 * (a[i] - b);
        b = std::sqrt(a[i] * b);
        scale += scale;
        ++i;
    }
    double phi = scale * a[i] * u;
    if (i > 0 && std::fabs(phi) >= 4 && std::fabs(c[i]) <= kEpsilon * a[i]) {
        phi *= 0.5; // the last arc sine is below half a unit in the last place of phi
        --i;
    }
    for (; i > 0; --i) {
        const double sine = c[i] * std::sin(phi) / a[i];
        // a small arc sine equals its argument to the last bit
        phi = 0.5 * ((std::fabs(sine) < 1e-8 ? sine : std::asin(sine)) + phi);
    }
    const double sn = std::sin(phi);
    const double cn = std::cos(phi);
    return {sn, cn, std::sqrt(cn * cn + (1 - m) * sn * sn), phi};
}

} // namespace

JacobiValues EllipticJacobi(double u, double m) {
    if (!IsParameter(m) || !std::isfinite(u))
        return {kNaN, kNaN, kNaN, kNaN};
    // The first-order forms are accurate where the neglected second order, of size (m u)^2 or
    // (m1 exp(2 u))^2, is below eps; elsewhere the means are used.
    if (m < 1e-9 && std::fabs(m * u) < 1e-8)
        return NearCircular(u, m);
    const double m1 = 1 - m;
    if (m1 == 0 || (m > 0.999999999 && m1 * std::exp(2 * std::fabs(u)) < 1e-8))
        return NearHyperbolic(u, m1);
    return ByMeans(u, m);
}

} // namespace qx
