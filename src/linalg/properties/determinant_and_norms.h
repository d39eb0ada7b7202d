#ifndef QX_LINALG_PROPERTIES_DETERMINANT_AND_NORMS_H
#define QX_LINALG_PROPERTIES_DETERMINANT_AND_NORMS_H

#include "linalg/matrix.h"

namespace qx {

// Scalars that describe a matrix that is not empty and has no gaps between its rows.

// What is known about a square matrix; the determinant of the last three needs no pivots.
enum class MatrixType : int32_t { general, positiveDefinite, lowerTriangular, upperTriangular };

// The determinant: by a formula for n = 2 whatever the type, otherwise by LU, Cholesky or the
// diagonal alone. It is 0 for a singular matrix of the first type.
// ErrNonFiniteInput, ErrOutOfMemory, ErrNotPositiveDefinite.
template <ElementType E>
ErrorCode MatrixDeterminant(const ConstMatrixView<E> &a, MatrixType type, ElementOf<E> *det);

enum NormType : int32_t { twoNorm, oneNorm, frobeniusNorm, infinityNorm };
// ErrNonFiniteInput, ErrInvalidSelector; for the 2-norm also ErrOutOfMemory, ErrIterationLimit.
template <ElementType E>
ErrorCode MatrixNorm(const ConstMatrixView<E> &a, int32_t normType, double *norm);

// The quotient of the extreme singular values, or norm(a) norm(a^-1) of a square matrix; infinite
// for a singular matrix. ErrNonFiniteInput, ErrInvalidSelector, ErrNotSquare, ErrOutOfMemory,
// ErrIterationLimit.
template <ElementType E>
ErrorCode ConditionNumber(const ConstMatrixView<E> &a, int32_t normType, double *cond);

// The number of singular values above the tolerance, which, if negative, is replaced by max(m, n)
// times the largest one times the machine epsilon. ErrNonFiniteInput, ErrOutOfMemory,
// ErrIterationLimit.
template <ElementType E>
ErrorCode MatrixRank(const ConstMatrixView<E> &a, double tolerance, int32_t *rank);

// The same three for matrices of any norm, which are scaled by a power of two: no intermediate
// result overflows or vanishes. A tolerance that is not a number counts as negative.
template <ElementType E>
ErrorCode ScaledNorm(const ConstMatrixView<E> &a, int32_t normType, double *norm);
template <ElementType E>
ErrorCode ScaledConditionNumber(const ConstMatrixView<E> &a, int32_t normType, double *cond);
template <ElementType E>
ErrorCode ScaledRank(const ConstMatrixView<E> &a, double tolerance, int32_t *rank);

} // namespace qx

#endif
