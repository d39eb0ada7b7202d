#ifndef QX_SPECIAL_BESSEL_COMPLEX_H
#define QX_SPECIAL_BESSEL_COMPLEX_H

#include "frame/complex.h"

#include <cstdint>

namespace qx {

// The status of a call, in the order in which it is decided.
enum class BesselStatus {
    Good = 0,
    Singular = 1, // a non-finite argument, or a singularity
    Overflow = 2, // the result overflows
    HalfLost = 3, // rounding of the arguments leaves less than half the digits
    AllLost = 4,  // ... leaves no useful digits
};

struct ComplexValue {
    CDB value; // NaN if there is no value
    BesselStatus status;
};

enum class BesselKind { J, Y, I, K, H1, H2 };

// Bessel functions of real order and complex argument from I and K in the right half-plane
// (special/modified_complex.h), for Im z >= 0 with w = -i z. Values for Im z < 0 follow by
// conjugation, which exchanges H1 and H2:
//   J = exp(i pi order / 2) I(w), H1 = -(2 i / pi) exp(-i pi order / 2) K(w), H2 = 2 J - H1,
//   Y = i (J - H1); I and K for Re z < 0 by continuation from -z; orders below 0 by reflection.
// No combination loses digits relative to the modulus of the oscillating pair. Values that are real
// on the positive real axis have an imaginary part of exactly 0.
ComplexValue ComplexBessel(BesselKind kind, double order, CDB z, bool isScaled);

enum class AiryKind { Ai, AiDerivative, Bi, BiDerivative };

// Airy functions: Maclaurin series for |z| <= 1.5, otherwise from I and K of order 1/3
// (derivatives: order 2/3) at zeta = 2/3 z^(3/2). For |arg z| > pi / 3, zeta is first rotated by pi
// into the right half-plane.
ComplexValue ComplexAiry(AiryKind kind, CDB z, bool isScaled);

} // namespace qx

#endif
