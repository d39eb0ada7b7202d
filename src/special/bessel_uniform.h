#ifndef QX_SPECIAL_BESSEL_UNIFORM_H
#define QX_SPECIAL_BESSEL_UNIFORM_H

namespace qx {

struct OscillatingPair {
    double j, y;
};
struct ModifiedPair {
    double i, k;
};

// J and Y for order >= 200 and any x > 0: Debye's expansions away from the turning point x = order,
// and for 0.6 order < x < 1.7 order Olver's expansion, called uniform because it holds there.
// Phases are formed in two doubles. Where Y overflows it is -infinity.
// Source: F. W. J. Olver, Asymptotics and Special Functions, 1974, chapters 10 and 11.
OscillatingPair BesselLargeOrder(double order, double x);

// I and K for order >= kModifiedUniformFrom, any x > 0, by Debye's expansion, which is uniform.
constexpr double kModifiedUniformFrom = 100;
ModifiedPair ModifiedBesselLargeOrder(double order, double x);

// The same for the argument x exp(i pi / 4), as the Kelvin functions need it.
struct ComplexModifiedPair {
    double iRe, iIm, kRe, kIm;
};
ComplexModifiedPair ModifiedBesselOnDiagonal(double order, double x);

} // namespace qx

#endif
