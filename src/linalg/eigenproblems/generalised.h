#ifndef QX_LINALG_EIGENPROBLEMS_GENERALISED_H
#define QX_LINALG_EIGENPROBLEMS_GENERALISED_H

#include "qx/types.h"

namespace qx {

// Problems of two matrices, through LAPACK. All matrices are row-major.

// Generalised Schur form of the square a and b of order n: a becomes s and b t, with a = q s z^H
// and b = q t z^H, ordered by the quotients alpha / beta as `order` (SchurOrder) says; a quotient
// with beta 0 is infinite. q, z and `vectors`, the right eigenvectors of unit length, may be null.
//
// ErrEmptyInput, ErrInvalidSelector, ErrNonFiniteInput, ErrOutOfMemory, ErrIterationLimit,
// ErrConditionTooHigh, ErrSolverCount.
ErrorCode GeneralisedSchur(DBL *a, DBL *b, int32_t n, int32_t order, DBL *q, DBL *z, CDB *alpha,
                           DBL *beta, CDB *vectors);
ErrorCode GeneralisedSchur(CDB *a, CDB *b, int32_t n, int32_t order, CDB *q, CDB *z, CDB *alpha,
                           CDB *beta, CDB *vectors);

// Generalised singular values of a (m by n) and b (p by n): u^H a q and v^H b q are diagonal
// matrices of alpha and of beta times the same triangle (0 r). a and b become LAPACK's results, in
// which r stands. alpha and beta have n elements, of which the first k + l count.
// ErrEmptyInput, ErrNonFiniteInput, ErrOutOfMemory, ErrIterationLimit.
ErrorCode GeneralisedSingular(DBL *a, DBL *b, int32_t m, int32_t n, int32_t p, int32_t *k,
                              int32_t *l, DBL *alpha, DBL *beta, DBL *u, DBL *v, DBL *q);
ErrorCode GeneralisedSingular(CDB *a, CDB *b, int32_t m, int32_t n, int32_t p, int32_t *k,
                              int32_t *l, DBL *alpha, DBL *beta, CDB *u, CDB *v, CDB *q);

} // namespace qx

#endif
