#ifndef QX_LINALG_SYSTEMS_TRIANGULAR_H
#define QX_LINALG_SYSTEMS_TRIANGULAR_H

#include "qx/types.h"

#include <cstdint>

namespace qx {

// Solves with a packed triangle, lower or upper, in place of x, which is n by `rightSides`.
//
// ErrNonFiniteInput; ErrSingularMatrix where the modulus of a diagonal element is not above the
// machine epsilon times the largest modulus of the triangle; ErrOutOfMemory.
ErrorCode SolveTriangular(const DBL *packed, int32_t n, int32_t triangle, int32_t rightSides,
                          DBL *x);
ErrorCode SolveTriangular(const CDB *packed, int32_t n, int32_t triangle, int32_t rightSides,
                          CDB *x);

// a x = b for a positive definite a, of which one triangle is read.
//
// ErrNonFiniteInput, ErrOutOfMemory, ErrNotPositiveDefinite.
ErrorCode CholeskySolve(const DBL *a, int32_t n, int32_t useUpper, const DBL *b, int32_t rightSides,
                        DBL *x);
ErrorCode CholeskySolve(const CDB *a, int32_t n, int32_t useUpper, const CDB *b, int32_t rightSides,
                        CDB *x);

} // namespace qx

#endif
