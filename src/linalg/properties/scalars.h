#ifndef QX_LINALG_PROPERTIES_SCALARS_H
#define QX_LINALG_PROPERTIES_SCALARS_H

#include "qx/types.h"

#include <cstdint>

namespace qx {

// Scalars that describe a matrix. After a failure the result is NaN, or -1 for a rank.

// How a square matrix is known to be; the determinant of the last three needs no pivots.
enum class MatrixType : int32_t { general, positiveDefinite, lowerTriangular, upperTriangular };

// The determinant: a formula for n = 2 whatever the type; else by LU, Cholesky or the diagonal
// alone. 0 for a singular matrix of the first type.
// ErrEmptyInput, ErrInvalidSelector, ErrNonFiniteInput, ErrOutOfMemory, ErrNotPositiveDefinite.
ErrorCode MatrixDeterminant(const DBL *a, int32_t n, int32_t matrixType, DBL *det);
ErrorCode MatrixDeterminant(const CDB *a, int32_t n, int32_t matrixType, CDB *det);

enum NormType : int32_t { twoNorm, oneNorm, frobeniusNorm, infinityNorm };
// ErrEmptyInput, ErrNonFiniteInput, ErrInvalidSelector; of the 2-norm ErrOutOfMemory,
// ErrIterationLimit.
ErrorCode MatrixNorm(const DBL *a, int32_t m, int32_t n, int32_t normType, DBL *norm);
ErrorCode MatrixNorm(const CDB *a, int32_t m, int32_t n, int32_t normType, DBL *norm);

// The quotient of the extreme singular values, or norm(a) norm(a^-1) of a square matrix; infinity
// for a singular one. The codes of MatrixNorm, and ErrNotSquare.
ErrorCode ConditionNumber(const DBL *a, int32_t m, int32_t n, int32_t normType, DBL *cond);
ErrorCode ConditionNumber(const CDB *a, int32_t m, int32_t n, int32_t normType, DBL *cond);

// The number of singular values above the tolerance, which is max(m, n) times the largest one times
// the machine epsilon if negative. ErrEmptyInput, ErrNonFiniteInput, ErrOutOfMemory,
// ErrIterationLimit.
ErrorCode MatrixRank(const DBL *a, int32_t m, int32_t n, double tolerance, int32_t *rank);
ErrorCode MatrixRank(const CDB *a, int32_t m, int32_t n, double tolerance, int32_t *rank);

} // namespace qx

#endif
