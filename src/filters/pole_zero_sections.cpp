#include "filters/pole_zero_sections.h"

#include "frame/complex.h"
#include "frame/constants.h"

#include <cmath>

namespace qx {

namespace {

// Sine and cosine of pi f / fs; above a quarter of the rate computed from the distance to half the
// rate, which is exact.
struct EdgeAngle {
    double sine, cosine;
    EdgeAngle(double f, double fs) {
        const bool isUpper = f > 0.25 * fs;
        const double angle = kPi * ((isUpper ? 0.5 * fs - f : f) / fs);
        sine = isUpper ? std::cos(angle) : std::sin(angle);
        cosine = isUpper ? std::sin(angle) : std::cos(angle);
    }
    double tangent() const { return sine / cosine; }
};

double Square(double x) { return x * x; }
double SquareOf(CDB s) { return s.re * s.re + s.im * s.im; }
double Modulus(CDB s) { return std::hypot(s.re, s.im); }
double FromOne2(CDB s) { return Square(1.0 - s.re) + s.im * s.im; } // |1 - S|^2

// (1 + S) / (1 - S).
CDB ToZ(CDB s) {
    const double scale = 1.0 / FromOne2(s);
    return {((1.0 - s.re) * (1.0 + s.re) - s.im * s.im) * scale, 2.0 * s.im * scale};
}
double ToZ(double s) { return (1.0 + s) / (1.0 - s); }

// The square root with nonnegative real part.
CDB Root(CDB x) {
    const double size = Modulus(x);
    if (size == 0.0)
        return {0.0, 0.0};
    const double larger = std::sqrt(0.5 * (size + std::fabs(x.re)));
    const double smaller = std::fabs(x.im) / (2.0 * larger);
    const double re = x.re >= 0.0 ? larger : smaller, im = x.re >= 0.0 ? smaller : larger;
    return {re, x.im < 0.0 ? -im : im};
}

// The root of larger modulus of S^2 - 2 q S + A: q plus the root of q^2 - A. The parts of that root
// either both have the signs of the parts of q, or both have the opposite signs.
CDB LargerRoot(CDB q, double A) {
    const CDB root = Root({(q.re - q.im) * (q.re + q.im) - A, 2.0 * q.re * q.im});
    const bool isAlong = q.re * root.re + q.im * root.im >= 0.0;
    return isAlong ? q + root : q - root;
}

CDB Reciprocal(CDB s) { return CDB{s.re, -s.im} / SquareOf(s); }

// 1 + z1 / z + z2 / z^2 for a pole in S and its conjugate. Near z = +-1 the value there, |1 -+
// z|^2, determines the resonance, and it is a small difference of the coefficients; z2 is chosen to
// make it accurate for the rounded z1.
PoleZeroSections::Denominator DenominatorOf(CDB pole) {
    constexpr double isNear = 0.25;
    const double below = FromOne2(pole), square = SquareOf(pole);
    const double z1 = -2.0 * ((1.0 - pole.re) * (1.0 + pole.re) - pole.im * pole.im) / below;
    const double atOne = 4.0 * square / below, atMinusOne = 4.0 / below;
    if (atOne < isNear)
        return {z1, atOne - (1.0 + z1)};
    if (atMinusOne < isNear)
        return {z1, atMinusOne - (1.0 - z1)};
    return {z1, (Square(1.0 + pole.re) + pole.im * pole.im) / below};
}

} // namespace

PoleZeroSections::PoleZeroSections(int32_t type, const FilterBand &band, double gainAt0,
                                   const PoleZeroDesign &design)
    : type_(type), A_(1.0), B_(1.0), pending_(gainAt0), design_(design) {
    const EdgeAngle lower(band.fl, band.fs);
    g_ = lower.tangent();
    if (!isBand())
        return;
    const EdgeAngle upper(band.fh, band.fs);
    A_ = g_ * upper.tangent();
    B_ = std::sin(kPi * ((band.fh - band.fl) / band.fs)) / (lower.cosine * upper.cosine);
}

void PoleZeroSections::put(double lead, double b1, double b2, const Denominator &a) {
    lead *= pending_;
    pending_ = 1.0;
    gain_ *= lead;
    design_.a[2 * section_] = a.z1;
    design_.a[2 * section_ + 1] = a.z2;
    design_.b[3 * section_] = lead;
    design_.b[3 * section_ + 1] = lead * b1;
    design_.b[3 * section_ + 2] = lead * b2;
    ++section_;
}

void PoleZeroSections::putPoles(CDB pole) {
    const CDB z = ToZ(pole);
    design_.poles[pole_++] = {z.re, std::fabs(z.im)};
    design_.poles[pole_++] = {z.re, -std::fabs(z.im)};
}

void PoleZeroSections::putZeros(double zero) {
    const CDB z = ToZ(CDB{0.0, zero});
    design_.zeros[zero_++] = z;
    design_.zeros[zero_++] = {z.re, -z.im};
}

void PoleZeroSections::putPair(double lead, CDB pole, double zero) {
    const double below = FromOne2(pole);
    putPoles(pole);
    putZeros(zero);
    put(lead / below, -2.0 * ((1.0 - zero) * (1.0 + zero)) / (1.0 + zero * zero), 1.0,
        DenominatorOf(pole));
}

void PoleZeroSections::putAllPole(double lead, CDB pole) {
    if (type_ == Bandstop) {
        putPair(lead, pole, std::sqrt(A_));
        return;
    }
    const double below = FromOne2(pole);
    const double first = type_ == Lowpass ? -1.0 : 1.0, second = type_ == Highpass ? 1.0 : -1.0;
    putPoles(pole);
    design_.zeros[zero_++] = {first, 0.0};
    design_.zeros[zero_++] = {second, 0.0};
    put(lead / below, -(first + second), first * second, DenominatorOf(pole));
}

void PoleZeroSections::add(CDB pole, double zero) {
    const bool hasZero = zero != noZero;
    if (type_ == Lowpass) {
        const CDB S = pole * g_;
        const double x = zero * g_;
        hasZero ? putPair(SquareOf(S) * (1.0 + x * x) / (x * x), S, x) : putAllPole(SquareOf(S), S);
        return;
    }
    if (type_ == Highpass) {
        const CDB S = Reciprocal({pole.re, -pole.im}) * g_;
        const double x = hasZero ? g_ / zero : 0.0;
        hasZero ? putPair(1.0 + x * x, S, x) : putAllPole(1.0, S);
        return;
    }
    const double halfB = 0.5 * B_;
    const CDB q = type_ == Bandpass ? pole * halfB : Reciprocal({pole.re, -pole.im}) * halfB;
    const CDB outer = LargerRoot(q, A_);
    const CDB S[2] = {outer, Reciprocal({outer.re, -outer.im}) * A_};
    const double c = !hasZero ? 0.0 : type_ == Bandpass ? zero * halfB : halfB / zero;
    const double farther = c + std::hypot(c, std::sqrt(A_));
    const double x[2] = {farther, A_ / farther};
    for (int side = 0; side < 2; ++side) {
        const CDB s = S[side];
        const double square = Square(x[side]);
        if (type_ == Bandstop)
            putPair(SquareOf(s) * (1.0 + square) / square, s, x[side]);
        else if (hasZero)
            putPair(Modulus(pole) * Modulus(s) * (1.0 + square) / (zero * x[side]), s, x[side]);
        else
            putAllPole(Modulus(pole) * Modulus(s) * (B_ / std::sqrt(A_)), s);
    }
}

void PoleZeroSections::add(double pole) {
    if (!isBand()) {
        const double S = type_ == Lowpass ? g_ * pole : g_ / pole;
        const double z = ToZ(S), zero = type_ == Lowpass ? -1.0 : 1.0;
        design_.poles[pole_++] = {z, 0.0};
        design_.zeros[zero_++] = {zero, 0.0};
        put((type_ == Lowpass ? -S : 1.0) / (1.0 - S), -zero, 0.0, {-z, 0.0});
        return;
    }
    const double q = type_ == Bandpass ? 0.5 * B_ * pole : 0.5 * B_ / pole;
    const double size = std::fabs(pole) * B_;
    if (q * q < A_) {
        const CDB S = {q, std::sqrt((std::sqrt(A_) - q) * (std::sqrt(A_) + q))};
        putAllPole(type_ == Bandpass ? size : 1.0 + A_, S);
        return;
    }
    const double outer = q - std::sqrt((-q - std::sqrt(A_)) * (-q + std::sqrt(A_)));
    const double inner = A_ / outer;
    const double z1 = ToZ(outer), z2 = ToZ(inner), below = (1.0 - outer) * (1.0 - inner);
    design_.poles[pole_++] = {z1, 0.0};
    design_.poles[pole_++] = {z2, 0.0};
    if (type_ == Bandpass) {
        design_.zeros[zero_++] = {-1.0, 0.0};
        design_.zeros[zero_++] = {1.0, 0.0};
        put(size / below, 0.0, -1.0, {-(z1 + z2), z1 * z2});
    } else {
        putZeros(std::sqrt(A_));
        put((1.0 + A_) / below, -2.0 * (1.0 - A_) / (1.0 + A_), 1.0, {-(z1 + z2), z1 * z2});
    }
}

} // namespace qx
