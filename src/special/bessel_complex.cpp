#include "special/bessel_complex.h"

#include "frame/constants.h"
#include "special/extended.h"
#include "special/modified_complex.h"

#include <algorithm>
#include <cmath>

namespace qx {

namespace {

constexpr double kHalfLostFrom = 0x1.6a09e667f3bcdp+25; // sqrt(1 / (2 eps)), 4.7e7
constexpr double kAllLostFrom = 0x1p+31;
constexpr double kAxisFrom = 1;

constexpr ExtendedComplex kNone = {{0, 0}, {0, 0}};

Complex Conjugate(Complex z) { return {z.re, -z.im}; }
Complex TimesI(Complex z) { return {-z.im, z.re}; }

// Functions at z in the closed upper half-plane, times exp(scale).
struct UpperPlane {
    double order; // of the functions, without its sign
    Complex z;
    ExtendedComplex scale;

    Complex sum(const ExponentialPair &pair, Complex factor) const {
        return (Value(pair.first, scale) + Value(pair.second, scale)) * factor;
    }
    // Here J and Y are the real and imaginary parts of H1, so the long computation of I around the
    // turning point is not needed.
    bool isOscillatingOnAxis() const { return z.im == 0 && z.re > kAxisFrom && z.re > order; }
    Complex turned() const { return {z.im, -z.re}; } // -i z
    Complex j() const {
        if (!isOscillatingOnAxis())
            return sum(ModifiedI(order, turned()), TurnByPi(0.5 * order));
        const UpperPlane plain = {order, z, kNone};
        return Value({{plain.h1().re, 0}, kNone}, scale);
    }
    Complex h1() const { return ofK(ModifiedK(order, turned()), TurnByPi(-0.5 * order)); }
    struct JAndH1 {
        Complex j, h1;
    };
    JAndH1 jAndH1() const {
        if (isOscillatingOnAxis())
            return {j(), h1()};
        const ModifiedBoth both = ModifiedIAndK(order, turned());
        const Complex turn = TurnByPi(0.5 * order);
        return {sum(both.i, turn), ofK(both.k, Conjugate(turn))};
    }
    bool isLeft() const { return z.re < 0; }
    Complex i() const {
        return isLeft() ? sum(ModifiedI(order, -z), TurnByPi(order))
                        : sum(ModifiedI(order, z), {1, 0});
    }
    Complex k() const {
        if (!isLeft())
            return Value(ModifiedK(order, z), scale);
        const ModifiedBoth both = ModifiedIAndK(order, -z);
        return Value(both.k, scale) * TurnByPi(-order) - TimesI(sum(both.i, {kPi, 0}));
    }

private:
    Complex ofK(const Exponential &k, Complex turn) const {
        return TimesI(Value(k, scale) * turn * -kTwoOverPi);
    }
};

Complex OfJ(const UpperPlane &plane, bool isNegative) {
    if (!isNegative)
        return plane.j();
    // exp(-i pi order) J + i sin(pi order) H1; a factor of 0 drops a term that may be infinite
    const double sine = SinPi(plane.order);
    if (sine == 0)
        return plane.j() * TurnByPi(-plane.order);
    const UpperPlane::JAndH1 both = plane.jAndH1();
    return both.j * TurnByPi(-plane.order) + TimesI(both.h1 * sine);
}

Complex OfY(const UpperPlane &plane, bool isNegative) {
    if (!isNegative && plane.isOscillatingOnAxis())
        return {plane.h1().im, 0};
    const double cosine = isNegative ? CosPi(plane.order) : 1;
    if (cosine == 0)
        return TimesI(plane.j() * TurnByPi(-plane.order));
    const UpperPlane::JAndH1 both = plane.jAndH1();
    if (!isNegative)
        return TimesI(both.j - both.h1);
    // i (exp(-i pi order) J - cos(pi order) H1)
    return TimesI(both.j * TurnByPi(-plane.order) - both.h1 * cosine);
}

Complex OfI(const UpperPlane &plane, bool isNegative) {
    if (!isNegative)
        return plane.i();
    // I + 2 / pi sin(pi order) K; for Re z < 0 evaluated at -z and rotated
    const double sine = SinPi(plane.order);
    const Complex place = plane.isLeft() ? -plane.z : plane.z;
    Complex sum;
    if (sine == 0) {
        sum = plane.sum(ModifiedI(plane.order, place), {1, 0});
    } else {
        const ModifiedBoth both = ModifiedIAndK(plane.order, place);
        sum = plane.sum(both.i, {1, 0}) + Value(both.k, plane.scale) * (kTwoOverPi * sine);
    }
    return plane.isLeft() ? sum * TurnByPi(-plane.order) : sum;
}

// J + i Y on the positive real axis, where both are real. For z below the order J is far smaller
// than Y and would be lost in it, so it is computed separately.
Complex OnAxis(const UpperPlane &plane) {
    const UpperPlane plain = {plane.order, plane.z, kNone};
    const Complex h1 = plain.h1();
    return plane.z.re < plane.order ? Complex{plain.j().re, h1.im} : h1;
}

Complex OfH1(const UpperPlane &plane, bool isNegative) {
    const bool isAxis = plane.z.im == 0 && plane.z.re > 0;
    const Complex value = isAxis ? Value({OnAxis(plane), kNone}, plane.scale) : plane.h1();
    return isNegative ? value * TurnByPi(plane.order) : value;
}

Complex OfH2(const UpperPlane &plane, bool isNegative) {
    const bool isAxis = plane.z.im == 0 && plane.z.re > 0;
    Complex value;
    if (isAxis) {
        value = Value({Conjugate(OnAxis(plane)), kNone}, plane.scale);
    } else {
        const UpperPlane::JAndH1 both = plane.jAndH1();
        value = both.j * 2 - both.h1;
    }
    return isNegative ? value * TurnByPi(-plane.order) : value;
}

Complex ScaleOf(BesselKind kind, Complex z) {
    switch (kind) {
    case BesselKind::J:
    case BesselKind::Y:
        return {-z.im, 0};
    case BesselKind::I:
        return {-std::fabs(z.re), 0};
    case BesselKind::K:
        return z;
    case BesselKind::H1:
        return {z.im, -z.re};
    case BesselKind::H2:
        return {-z.im, z.re};
    }
    return {0, 0};
}

Complex InUpperPlane(BesselKind kind, double order, Complex z, bool isScaled) {
    const ExtendedComplex scale = isScaled ? Plain(ScaleOf(kind, z)) : kNone;
    const UpperPlane plane = {std::fabs(order), z, scale};
    const bool isNegative = order < 0;
    switch (kind) {
    case BesselKind::J:
        return OfJ(plane, isNegative);
    case BesselKind::Y:
        return OfY(plane, isNegative);
    case BesselKind::I:
        return OfI(plane, isNegative);
    case BesselKind::K:
        return plane.k();
    case BesselKind::H1:
        return OfH1(plane, isNegative);
    case BesselKind::H2:
        return OfH2(plane, isNegative);
    }
    return {kNaN, kNaN};
}

ComplexValue Failed(BesselStatus status) { return {{kNaN, kNaN}, status}; }

ComplexValue Judged(Complex value, bool isHalfLost) {
    if (!std::isfinite(value.re) || !std::isfinite(value.im))
        return Failed(BesselStatus::Overflow);
    return {value, isHalfLost ? BesselStatus::HalfLost : BesselStatus::Good};
}

ComplexValue AtZero(BesselKind kind, double order) {
    const bool isEntire = order >= 0 || IsInteger(order);
    if ((kind != BesselKind::J && kind != BesselKind::I) || !isEntire)
        return Failed(BesselStatus::Singular);
    return {{order == 0 ? 1.0 : 0.0, 0}, BesselStatus::Good};
}

bool IsRealOnRealAxis(BesselKind kind) { return kind != BesselKind::H1 && kind != BesselKind::H2; }

} // namespace

ComplexValue ComplexBessel(BesselKind kind, double order, CDB z, bool isScaled) {
    if (!std::isfinite(order) || !std::isfinite(z.re) || !std::isfinite(z.im))
        return Failed(BesselStatus::Singular);
    if (z.re == 0 && z.im == 0)
        return AtZero(kind, order);
    double size = std::max(std::fabs(order), std::fabs(z.re) + std::fabs(z.im));
    if (size > kHalfLostFrom)
        size = std::max(std::fabs(order), std::hypot(z.re, z.im));
    if (size > kAllLostFrom)
        return Failed(BesselStatus::AllLost);
    const bool isBelow = std::signbit(z.im);
    if (isBelow && kind == BesselKind::H1)
        kind = BesselKind::H2;
    else if (isBelow && kind == BesselKind::H2)
        kind = BesselKind::H1;
    Complex value = InUpperPlane(kind, order, isBelow ? Conjugate(z) : Complex(z), isScaled);
    if (z.im == 0 && z.re > 0 && IsRealOnRealAxis(kind) && !std::isnan(value.re))
        value.im = 0;
    return Judged(isBelow ? Conjugate(value) : value, size > kHalfLostFrom);
}

namespace {

constexpr double kSeriesLimit = 1.5;
constexpr double kAiryAtZero = 0x1.6b8c7962715b8p-2;      // Ai(0) = 1 / (3^(2/3) gamma(2/3))
constexpr double kAirySlopeAtZero = 0x1.0907f42b70f8bp-2; // -Ai'(0) = 1 / (3^(1/3) gamma(1/3))
constexpr double kInverseRootThree = 0x1.279a74590331cp-1;
constexpr double kRootThreeOverPi = 0x1.1a47c7ee5a514p-1;

bool IsDerivative(AiryKind kind) {
    return kind == AiryKind::AiDerivative || kind == AiryKind::BiDerivative;
}
bool IsAi(AiryKind kind) { return kind == AiryKind::Ai || kind == AiryKind::AiDerivative; }

// f = 1 + z^3 / (2 3) + ..., g = z + z^4 / (3 4) + ..., or their derivatives.
Complex AirySeries(AiryKind kind, Complex z) {
    const Complex square = z * z;
    const Complex cube = square * z;
    const bool isDerivative = IsDerivative(kind);
    Complex termF = isDerivative ? square * 0.5 : Complex{1, 0};
    Complex termG = isDerivative ? Complex{1, 0} : z;
    Complex f = termF;
    Complex g = termG;
    for (int k = 1; k < 20; ++k) {
        const double n = 3 * k;
        termF = termF * cube / (isDerivative ? n * (n + 2) : n * (n - 1));
        termG = termG * cube / (isDerivative ? n * (n - 2) : n * (n + 1));
        f += termF;
        g += termG;
        if (std::fabs(termF.re) + std::fabs(termF.im) < 0x1p-60 &&
            std::fabs(termG.re) + std::fabs(termG.im) < 0x1p-60)
            break;
    }
    f = f * kAiryAtZero;
    g = g * kAirySlopeAtZero;
    return IsAi(kind) ? f - g : (f + g) * kRootThree;
}

// Ai = sqrt(z / 3) / pi K, Bi = sqrt(z / 3) (2 I + 2 / pi sin(pi / 3) K) at zeta of order 1/3 in
// the right half-plane; rotated, Ai = sqrt(z / 3) / pi (exp(-i pi / 3) K - i pi I) and
// Bi = sqrt(z / 3) (I - i sqrt(3) / pi exp(i pi / 6) K). The derivatives are the same with
// -z / sqrt(3) and order 2/3, where the phases of K are twice and minus those above.
Complex AiryFromBessel(AiryKind kind, Complex z, const ExtendedComplex &zeta, bool isTurned,
                       const ExtendedComplex &scale) {
    const bool isDerivative = IsDerivative(kind);
    const double order = isDerivative ? 0x1.5555555555555p-1 : 0x1.5555555555555p-2;
    const Complex place =
        isTurned ? Complex{-zeta.re.high, -zeta.im.high} : Complex{zeta.re.high, zeta.im.high};
    const double sign = isTurned ? -1 : 1;
    const ExtendedComplex rest = {{sign * zeta.re.low, 0}, {sign * zeta.im.low, 0}};
    const auto valueOfK = [&] {
        Exponential k = ModifiedK(order, place);
        k.exponent.re = k.exponent.re + Extended{-rest.re.high, 0};
        k.exponent.im = k.exponent.im + Extended{-rest.im.high, 0};
        return Value(k, scale);
    };
    const auto valueOfI = [&] {
        ExponentialPair i = ModifiedI(order, place);
        i.first.exponent.re = i.first.exponent.re + rest.re;
        i.first.exponent.im = i.first.exponent.im + rest.im;
        i.second.exponent.re = i.second.exponent.re + Extended{-rest.re.high, 0};
        i.second.exponent.im = i.second.exponent.im + Extended{-rest.im.high, 0};
        return Value(i.first, scale) + Value(i.second, scale);
    };
    Complex value;
    if (IsAi(kind))
        value = (isTurned ? valueOfK() * TurnByPi(-order) - TimesI(valueOfI() * kPi) : valueOfK()) *
                kInversePi;
    else if (isTurned)
        value = valueOfI() * (isDerivative ? -1 : 1) -
                TimesI(valueOfK() * TurnByPi(isDerivative ? -1.0 / 6 : 1.0 / 6)) * kRootThreeOverPi;
    else
        value = valueOfI() * 2 + valueOfK() * kRootThreeOverPi;
    const Complex root = RootOfUpperHalf(z);
    const Complex slope = z * kInverseRootThree;
    if (isDerivative)
        return value * (IsAi(kind) ? -slope : slope);
    return value * root * kInverseRootThree;
}

// 2/3 z sqrt(z), z in the upper half-plane.
ExtendedComplex ZetaOf(Complex z) {
    constexpr Extended twoThirds = {0x1.5555555555555p-1, 0x1.5555555555555p-55};
    const Extended x = {z.re, 0};
    const Extended y = {z.im, 0};
    const ExtendedComplex root = ExtendedRoot({x, y});
    const Extended crossed = y * root.im;
    return {twoThirds * (x * root.re - crossed), twoThirds * (x * root.im + y * root.re)};
}

} // namespace

ComplexValue ComplexAiry(AiryKind kind, CDB z, bool isScaled) {
    if (!std::isfinite(z.re) || !std::isfinite(z.im))
        return Failed(BesselStatus::Singular);
    const double modulus = std::hypot(z.re, z.im);
    const double size = modulus * std::sqrt(modulus) * (2.0 / 3);
    if (size > kAllLostFrom)
        return Failed(BesselStatus::AllLost);
    const bool isBelow = std::signbit(z.im);
    const Complex upper = isBelow ? Conjugate(z) : Complex(z);
    const ExtendedComplex zeta = ZetaOf(upper);
    const double side = zeta.re.high < 0 ? 1 : -1;
    ExtendedComplex scale = kNone;
    if (isScaled)
        scale =
            IsAi(kind) ? zeta : ExtendedComplex{{side * zeta.re.high, side * zeta.re.low}, {0, 0}};
    // Ai is real on the negative axis; its scaled form is not.
    const bool isRealAxis = z.im == 0;
    const bool isScaledLast = modulus <= kSeriesLimit || (isRealAxis && z.re < 0);
    const ExtendedComplex inner = isScaledLast ? kNone : scale;
    Complex value;
    if (modulus <= kSeriesLimit) {
        value = AirySeries(kind, upper);
    } else { // |arg z| > pi / 3
        const bool isTurned = upper.im > kRootThree * upper.re;
        value = AiryFromBessel(kind, upper, zeta, isTurned, inner);
    }
    if (isRealAxis && !std::isnan(value.re))
        value.im = 0;
    if (isScaledLast && isScaled)
        value = Value({value, kNone}, scale);
    return Judged(isBelow ? Conjugate(value) : value, size > kHalfLostFrom);
}

} // namespace qx
