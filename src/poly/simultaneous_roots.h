#ifndef QX_POLY_SIMULTANEOUS_ROOTS_H
#define QX_POLY_SIMULTANEOUS_ROOTS_H

#include "frame/views.h"
#include "qx/errors.h"

#include <cstdint>

namespace qx {

// All roots of a polynomial of ascending coefficients at once, each as often as its multiplicity, by
// the iteration of L. W. Ehrlich and O. Aberth from the start of D. A. Bini, "Numerical computation
// of polynomial zeros by means of Aberth's method", 1996; then with values of twice the precision
// (S. Graillat, P. Langlois and N. Louvet, "Compensated Horner scheme", 2005), until a step is below
// half a unit in the last place.
//
// Around root i the polynomial is written in t = z / 2^k with |t| next to 1, and all coefficients
// are multiplied by one power of two, so that coefficients and roots may be of any size.

// The degree without vanishing top coefficients, or -1: NaN, infinity, or a constant.
int32_t DegreeOf(ConstComplexVector coef);

// The roots by rising modulus, degree many, and for each the radius of a disc around it in which the
// polynomial has a root. With `isReal` the coefficients have no imaginary parts, and the roots are
// real or exact conjugate pairs, of which the upper one comes first.
// ErrOutOfMemory, ErrOverflow (a root has no exponent in double), ErrIterationLimit.
ErrorCode SimultaneousRoots(ConstComplexVector coef, bool isReal, ComplexVector roots,
                            RealVector radii);

} // namespace qx

#endif
