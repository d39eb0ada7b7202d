#ifndef QX_LINALG_SYSTEMS_TRIANGULAR_H
#define QX_LINALG_SYSTEMS_TRIANGULAR_H

#include "linalg/matrix.h"

namespace qx {

// Solves with a packed triangle, lower or upper, in place of x, which has its order as rows and no
// gaps between them.
//
// ErrNonFiniteInput; ErrSingularMatrix where the modulus of a diagonal element is not above the
// machine epsilon times the largest modulus of the triangle; ErrOutOfMemory.
template <ElementType E>
ErrorCode SolveTriangular(ConstVectorView<E> packed, Triangle triangle, const MatrixView<E> &x);

// a x = b for a positive definite a, of which one triangle is read: lowerTriangle or upperTriangle.
//
// ErrNonFiniteInput, ErrOutOfMemory, ErrNotPositiveDefinite.
template <ElementType E>
ErrorCode CholeskySolve(const ConstMatrixView<E> &a, Triangle read, const ConstMatrixView<E> &b,
                        const MatrixView<E> &x);

} // namespace qx

#endif
