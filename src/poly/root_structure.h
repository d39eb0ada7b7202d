#ifndef QX_POLY_ROOT_STRUCTURE_H
#define QX_POLY_ROOT_STRUCTURE_H

#include "qx/errors.h"
#include "qx/types.h"

#include <cstdint>

namespace qx {

// Distinct roots and their multiplicities, found and refined after Z. Zeng, "Computing multiple
// roots of inexact polynomials", 2005. Here polynomials are monic and their coefficients descend:
// p[0] is 1 and p[degree] the constant term. Errors of coefficients count relative to them where
// they are above 1 in size, else as they are.

// The distinct roots and their multiplicities: with u the greatest common divisor of p and its
// derivative, p / u has each root once; the same for u tells the roots of multiplicity 2 and more,
// and so on. A divisor is one if changes of the coefficients within the tolerance make it so; the
// tolerance grows a hundredfold from step to step. Where the steps contradict each other, the
// multiplicities do not add up to the degree. `roots` and `multiplicities` have `degree` places,
// degree at least 1.
//
// ErrOutOfMemory; ErrNonFiniteInput; ErrIterationLimit: eigenvalues do not converge.
ErrorCode GCDRootStructure(const CDB *p, int32_t degree, double tolerance, CDB *roots,
                           I32 *multiplicities, int32_t *rootCount);

// Moves the roots, with their multiplicities held, so that the product of their powers comes
// nearest to p: Gauss-Newton steps. ErrOutOfMemory; ErrIterationLimit: they do not converge, or to
// another polynomial than p within a hundred times the tolerance.
ErrorCode PejorativeRefine(const CDB *p, int32_t degree, double tolerance, CDB *roots,
                           const I32 *multiplicities, int32_t rootCount);

// The eigenvalues of the companion matrix, by a real matrix if p is real: then real roots have no
// imaginary part, and others come in exact pairs.
ErrorCode CompanionRoots(const CDB *p, int32_t degree, CDB *roots);

} // namespace qx

#endif
