#ifndef QX_LINALG_FACTORISATIONS_CHOLESKY_H
#define QX_LINALG_FACTORISATIONS_CHOLESKY_H

#include "linalg/matrix.h"

namespace qx {

// Packed storage is that of linalg/matrix.h: a triangle of order n >= 1, column by column.

// Factors a = l l^H, the lower triangle of a being replaced by l. Only the real parts of the
// diagonal count. ErrNotPositiveDefinite if a pivot is not above 0, which ends the factorisation,
// or if a diagonal element of the factor is below sqrt(2.2e-16) times the largest element so far;
// the factor is then still completed.
template <ElementType E>
ErrorCode PackedCholesky(VectorView<E> packed, int32_t n);

// The inverse of l l^H from its factor, as a lower triangle, in place. ErrSingularMatrix if a
// diagonal element is 0.
template <ElementType E>
ErrorCode InvertFromCholesky(VectorView<E> packed, int32_t n);

// The inverse of a packed triangle, lower or upper, in place. ErrNonFiniteInput; ErrSingularMatrix
// if a diagonal element is at most 2.2e-16 times the largest element in absolute value.
template <ElementType E>
ErrorCode InvertTriangle(VectorView<E> packed, int32_t n, Triangle triangle);

} // namespace qx

#endif
