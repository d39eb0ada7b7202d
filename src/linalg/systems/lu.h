#ifndef QX_LINALG_SYSTEMS_LU_H
#define QX_LINALG_SYSTEMS_LU_H

#include "linalg/matrix.h"

namespace qx {

// Matrices here have no gaps between their rows.

// Factors P a = L U in place, m by n, by exchanging rows so that each column has its largest pivot,
// in Crout's order of arithmetic: a[i][k] minus a[i][j] a[j][k] term by term, j ascending. L has a
// unit diagonal. pivots has m elements: in step k, row k was exchanged with row pivots[k]. parity
// is 0 or 1 for an even or odd number of exchanges. Of equal candidates the earlier row is the
// pivot; NaN is never a pivot.
//
// WarnSingular if a column has no pivot other than 0; the factors are still complete.
template <ElementType E>
ErrorCode LUDecompose(const MatrixView<E> &a, IndexVector pivots, int32_t *parity);

// Solves with the factors of a square matrix; x may be b.
// ErrIndexOutOfRange (a pivot is not a row of the matrix), ErrOutOfMemory.
template <ElementType E>
ErrorCode LUSolve(const ConstMatrixView<E> &lu, ConstIndexVector pivots,
                  const ConstMatrixView<E> &b, const MatrixView<E> &x);

// a x = b for a square a; the inputs are not changed. ErrOutOfMemory, ErrSingularMatrix.
template <ElementType E>
ErrorCode SolveByLU(const ConstMatrixView<E> &a, ConstVectorView<E> b, VectorView<E> x);

// a x = b for all columns of b, with elements of any magnitude: a and each column are scaled by
// powers of two, and the solutions are scaled back. *reciprocalCondition is 1 / (|a| |a^-1|) in the
// 1-norm, with an estimate of the second factor that is seldom too small by more than a factor of
// 3. x may be b. ErrNonFiniteInput, ErrOutOfMemory, ErrSingularMatrix; WarnLowAccuracy if the
// reciprocal is below eps.
template <ElementType E>
ErrorCode SolveSetByLU(const ConstMatrixView<E> &a, const ConstMatrixView<E> &b,
                       const MatrixView<E> &x, double *reciprocalCondition);

// The inverse; out may be a. ErrOutOfMemory, ErrSingularMatrix.
template <ElementType E>
ErrorCode InvertByLU(const ConstMatrixView<E> &a, const MatrixView<E> &out);

// The inverse from the factors, which it replaces. ErrIndexOutOfRange, ErrOutOfMemory.
template <ElementType E>
ErrorCode InvertFactors(const MatrixView<E> &lu, ConstIndexVector pivots);

} // namespace qx

#endif
