#ifndef QX_SPECIAL_BESSEL_COMPLEX_H
#define QX_SPECIAL_BESSEL_COMPLEX_H

#include "frame/complex.h"

#include <cstdint>

namespace qx {

// What became of a call; in the order in which it is decided.
enum class BesselStatus {
    Good = 0,
    Singular = 1, // an argument that is not finite, or a singularity
    Overflow = 2, // the result exceeds the range
    HalfLost = 3, // the rounding of the arguments leaves less than half the digits
    AllLost = 4,  // ... leaves none that are worth computing
};

struct ComplexValue {
    CDB value; // NaN where there is none
    BesselStatus status;
};

enum class BesselKind { J, Y, I, K, H1, H2 };

// Bessel functions of real order and complex argument from I and K in the right half-plane
// (special/modified_complex.h), all for Im z >= 0 and w = -i z, the rest by conjugation, which
// exchanges H1 and H2:
//   J = exp(i pi order / 2) I(w), H1 = -(2 i / pi) exp(-i pi order / 2) K(w), H2 = 2 J - H1,
//   Y = i (J - H1); I and K for Re z < 0 by continuation from -z; orders below 0 by reflection.
// No combination cancels beyond the modulus of the oscillating pair. What is real on the
// positive real axis is real to the bit.
ComplexValue ComplexBessel(BesselKind kind, double order, CDB z, bool isScaled);

enum class AiryKind { Ai, AiDerivative, Bi, BiDerivative };

// Airy functions: Maclaurin series for |z| <= 1.5; beyond from I and K of order 1/3, derivatives
// from order 2/3, at zeta = 2/3 z^(3/2), which for |arg z| > pi / 3 is first turned by pi into the
// right half-plane.
ComplexValue ComplexAiry(AiryKind kind, CDB z, bool isScaled);

} // namespace qx

#endif
