#ifndef QX_LINALG_FACTORISATIONS_CHOLESKY_H
#define QX_LINALG_FACTORISATIONS_CHOLESKY_H

#include "linalg/matrix.h"

namespace qx {

// Packed storage is that of linalg/matrix.h: a triangle of order n >= 1, column after column.

// a = l l^H of the lower triangle in place. Only the real parts of the diagonal count.
// ErrNotPositiveDefinite where a pivot is not above 0, at once, or where one lies below
// sqrt(2.2e-16) times the largest element of the factor so far; then the factor is complete all
// the same.
template <ElementType E>
ErrorCode PackedCholesky(VectorView<E> packed, int32_t n);

// The inverse of l l^H from its factor, as a lower triangle in its place. ErrSingularMatrix where a
// diagonal element is 0.
template <ElementType E>
ErrorCode InvertFromCholesky(VectorView<E> packed, int32_t n);

// The inverse of a packed triangle, lower or upper, in its place. ErrNonFiniteInput;
// ErrSingularMatrix where a diagonal element is at most 2.2e-16 of the largest element in absolute
// value.
template <ElementType E>
ErrorCode InvertTriangle(VectorView<E> packed, int32_t n, Triangle triangle);

} // namespace qx

#endif
