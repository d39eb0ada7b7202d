#ifndef QX_LINALG_PROPERTIES_SPECIAL_H
#define QX_LINALG_PROPERTIES_SPECIAL_H

#include "linalg/matrix.h"

namespace qx {

// Each fills `out`, which has the size of the result, with a matrix of the named kind.
template <ElementType E>
void FillDiagonal(ConstVectorView<E> x, const MatrixView<E> &out);
// The first column is x; the rest of the first row is y[1], y[2], ...
template <ElementType E>
void FillToeplitz(ConstVectorView<E> x, ConstVectorView<E> y, const MatrixView<E> &out);
// Row i holds the powers n-1 to 0 of x[i].
template <ElementType E>
void FillVandermonde(ConstVectorView<E> x, const MatrixView<E> &out);
// The companion matrix of x[0] t^n + x[1] t^(n-1) + ... + x[n]: its first row holds -x[j+1] / x[0].
template <ElementType E>
void FillCompanion(ConstVectorView<E> x, const MatrixView<E> &out);

// Q diag(values) Q with the reflection Q = 1 - (2/n) e e^T, where e is all ones: a full symmetric
// matrix with these eigenvalues.
void FillWithEigenvalues(ConstRealVector values, const RealMatrix &out);

// The n + 1 coefficients of det(t - a), in ascending order, the last of which is 1, from the
// product of (t - w) over the eigenvalues w.
// ErrNonFiniteInput, ErrOutOfMemory, ErrIterationLimit, ErrOverflow.
template <ElementType E>
ErrorCode CharacteristicPolynomial(const ConstMatrixView<E> &a, VectorView<E> polynomial);

// out[i][j] = r(i - j) for a matrix of order maxLag + 1, where r(k) is the sum over i of x[i + k]
// conj(y[i]) where both exist, divided by 1, by the number of terms or by the size of x. x and y
// have the same size, which is above maxLag.
enum CorrelationScale : int32_t { unscaled, unbiased, biased };
// ErrOutOfMemory.
template <ElementType E>
ErrorCode CorrelationMatrix(ConstVectorView<E> x, ConstVectorView<E> y, CorrelationScale scale,
                            const MatrixView<E> &out);

} // namespace qx

#endif
