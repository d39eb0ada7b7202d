#ifndef QX_LINALG_PROPERTIES_SPECIAL_H
#define QX_LINALG_PROPERTIES_SPECIAL_H

#include "linalg/matrix.h"

namespace qx {

// Matrices of a named kind, into memory of their full size.
template <ElementType E>
void FillDiagonal(ConstVectorView<E> x, const MatrixView<E> &out);
// First column x, the rest of the first row from y[1] on.
template <ElementType E>
void FillToeplitz(ConstVectorView<E> x, ConstVectorView<E> y, const MatrixView<E> &out);
// Row i: the powers n-1 to 0 of x[i].
template <ElementType E>
void FillVandermonde(ConstVectorView<E> x, const MatrixView<E> &out);
// Of the polynomial x[0] t^n + x[1] t^(n-1) + ... + x[n]: -x[j+1] / x[0] in the first row.
template <ElementType E>
void FillCompanion(ConstVectorView<E> x, const MatrixView<E> &out);

// Q diag(values) Q with the reflection Q = 1 - (2/n) e e^T, e being all ones: a full symmetric
// matrix with these eigenvalues.
void FillWithEigenvalues(ConstRealVector values, const RealMatrix &out);

// The coefficients of det(t - a), ascending, n + 1 of them, the last one 1: by the product of (t -
// w) over the eigenvalues w.
// ErrNonFiniteInput, ErrOutOfMemory, ErrIterationLimit, ErrOverflow.
template <ElementType E>
ErrorCode CharacteristicPolynomial(const ConstMatrixView<E> &a, VectorView<E> polynomial);

// out[i][j] = r(i - j) for a matrix of order maxLag + 1, where r(k) is the sum over i of x[i + k]
// conj(y[i]) wherever both exist, divided by 1, by the number of terms or by the size of x, which
// is that of y and above maxLag.
enum CorrelationScale : int32_t { unscaled, unbiased, biased };
// ErrOutOfMemory.
template <ElementType E>
ErrorCode CorrelationMatrix(ConstVectorView<E> x, ConstVectorView<E> y, CorrelationScale scale,
                            const MatrixView<E> &out);

} // namespace qx

#endif
