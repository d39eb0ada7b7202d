#ifndef QX_POLY_MULTIPLE_ROOTS_H
#define QX_POLY_MULTIPLE_ROOTS_H

#include "qx/errors.h"
#include "qx/types.h"

#include <cstdint>

namespace qx {

// The distinct roots of a complex polynomial of n ascending coefficients with their multiplicities
// (poly/root_structure.h), for which errors of the coefficients up to `tolerance` are allowed; one
// not above 0 is 1e-10. `simple` holds the roots as the structure gives them, and `refined` the
// same again or, with `refine`, the refined ones; then all are sorted, by rising multiplicity and
// falling modulus. Without a structure that adds up, or without convergence, the eigenvalues of the
// companion matrix are taken, of which exactly equal ones count as one. All three arrays have n
// places and come out with the same count.
//
// ErrEmptyInput; ErrBadCoefficients (a coefficient is not finite); ErrAllCoefficientsZero;
// ErrOrderNotPositive (a constant); ErrOutOfMemory; ErrNonFiniteInput (the monic polynomial
// overflows); ErrIterationLimit (eigenvalues do not converge).
ErrorCode MultipleRootsComplex(const CDB *coef, int32_t n, int32_t refine, double tolerance,
                               CDB *refined, int32_t *refinedCount, CDB *simple, I32 *multiplicity,
                               int32_t *simpleCount);

} // namespace qx

#endif
