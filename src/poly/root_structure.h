#ifndef QX_POLY_ROOT_STRUCTURE_H
#define QX_POLY_ROOT_STRUCTURE_H

#include "qx/errors.h"
#include "qx/types.h"

#include <cstdint>

namespace qx {

// Distinct roots and their multiplicities, found and refined after Z. Zeng, "Computing multiple
// roots of inexact polynomials", 2005. Here polynomials are monic and their coefficients descend:
// p[0] is 1 and p[degree] the constant term. Errors of coefficients are relative for coefficients
// above 1 in modulus, and absolute for others.

// The distinct roots and their multiplicities: with u the greatest common divisor of p and its
// derivative, p / u has each root once; the same for u gives the roots of multiplicity 2 and more,
// and so on. A polynomial counts as a divisor if changes of the coefficients within the tolerance
// make it one; from step to step the tolerance becomes at least a hundred times the error of the
// divisor found. If the steps contradict each other, the multiplicities do not add up to the
// degree. `roots` and `multiplicities` have `degree` elements, degree at least 1.
//
// ErrOutOfMemory; ErrNonFiniteInput; ErrIterationLimit (eigenvalues do not converge).
ErrorCode GCDRootStructure(const CDB *p, int32_t degree, double tolerance, CDB *roots,
                           I32 *multiplicities, int32_t *rootCount);

// Moves the roots, with fixed multiplicities, so that the product of their powers comes nearest to
// p, by Gauss-Newton steps. ErrOutOfMemory; ErrIterationLimit (they do not converge, or the
// polynomial that they lead to is not within a hundred times the tolerance of p).
ErrorCode PejorativeRefine(const CDB *p, int32_t degree, double tolerance, CDB *roots,
                           const I32 *multiplicities, int32_t rootCount);

// The eigenvalues of the companion matrix, with a real matrix if p is real: real roots then have no
// imaginary part, and the others are exact conjugate pairs.
ErrorCode CompanionRoots(const CDB *p, int32_t degree, CDB *roots);

} // namespace qx

#endif
