#ifndef QX_LINALG_SYSTEMS_TRIANGULAR_H
#define QX_LINALG_SYSTEMS_TRIANGULAR_H

#include "linalg/matrix.h"

namespace qx {

// Solves with a packed triangle, lower or upper; the solution replaces x, whose number of rows is
// the order of the triangle and which has no gaps between its rows.
//
// ErrNonFiniteInput; ErrSingularMatrix if the modulus of a diagonal element is not above the
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
