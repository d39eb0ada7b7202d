#ifndef QX_POLY_SIMULTANEOUS_ROOTS_H
#define QX_POLY_SIMULTANEOUS_ROOTS_H

#include "frame/views.h"
#include "qx/errors.h"

#include <cstdint>

namespace qx {

// All roots of a polynomial of ascending coefficients at once, each repeated according to its
// multiplicity, by the iteration of L. W. Ehrlich and O. Aberth from the start points of D. A. Bini,
// "Numerical computation of polynomial zeros by means of Aberth's method", 1996; then with values in
// twice the precision (S. Graillat, P. Langlois and N. Louvet, "Compensated Horner scheme", 2005),
// until a step is below half a unit in the last place.
//
// Around root i the polynomial is written in t = z / 2^k with |t| near 1, and all coefficients are
// multiplied by one power of two, so that coefficients and roots may have any magnitude.

// The degree without vanishing top coefficients, or -1 if a coefficient is NaN or infinite, or if
// the polynomial is constant.
int32_t DegreeOf(ConstComplexVector coef);

// The roots by ascending modulus, as many as the degree, and for each the radius of a disc around it
// that contains a root of the polynomial. With `isReal` the coefficients have no imaginary parts,
// and the roots are real or exact conjugate pairs, of which the upper one comes first.
// ErrOutOfMemory, ErrOverflow (a root is outside the range of doubles), ErrIterationLimit.
ErrorCode SimultaneousRoots(ConstComplexVector coef, bool isReal, ComplexVector roots,
                            RealVector radii);

} // namespace qx

#endif
