#ifndef QX_LINALG_PROPERTIES_DEFINITENESS_H
#define QX_LINALG_PROPERTIES_DEFINITENESS_H

#include "linalg/matrix.h"

namespace qx {

// Tests of square matrices that are not empty; the answer is 1 or 0.

// Whether |a[i][j] - a[j][i]| is nowhere above the limit, which is the tolerance, but at least 0;
// or, with `relative`, n tolerance M with M the largest |a[i][j]|, where a negative tolerance means
// the machine epsilon. `hermitian` compares with the conjugate, and so checks the diagonal, too.
// ErrNonFiniteInput.
template <ElementType E>
ErrorCode CheckSymmetric(const ConstMatrixView<E> &a, double tolerance, bool relative,
                         bool hermitian, int32_t *isSymmetric);

// Whether a matrix is exactly symmetric (Hermitian) and all its eigenvalues are above the machine
// epsilon times their largest modulus. NaN counts as a difference.
// ErrNonFiniteInput, ErrOutOfMemory, ErrIterationLimit.
template <ElementType E>
ErrorCode CheckPositiveDefinite(const ConstMatrixView<E> &a, int32_t *isDefinite);

// Whether a matrix is positive semi-definite, by an elimination that takes the largest diagonal
// element first. Let t be the tolerance (n machine epsilons if negative) times the largest diagonal
// element. The matrix must be symmetric (Hermitian) within t; each diagonal element above t serves
// as a pivot and adds one to the rank; when there are no more, all remaining elements must vanish
// within t. The rank is -1 if the answer is 0.
// ErrNonFiniteInput, ErrOutOfMemory.
template <ElementType E>
ErrorCode CheckPositiveSemiDefinite(const ConstMatrixView<E> &a, double tolerance,
                                    int32_t *isSemiDefinite, int32_t *rank);

} // namespace qx

#endif
