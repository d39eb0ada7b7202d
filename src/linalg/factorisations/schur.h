#ifndef QX_LINALG_FACTORISATIONS_SCHUR_H
#define QX_LINALG_FACTORISATIONS_SCHUR_H

#include "linalg/matrix.h"

namespace qx {

// The order of the eigenvalues along the diagonal.
enum SchurOrder : int32_t {
    schurUnordered = 0,
    schurRealAscending = 1,
    schurRealDescending = 2,
    schurModulusAscending = 3,
    schurModulusDescending = 4
};

// Schur form a = z t z^H of a square matrix through LAPACK: z is unitary, t upper triangular (with
// blocks of two for conjugate pairs if the elements are real), and w holds the eigenvalues. z may
// be empty. a may be t.
//
// ErrNonFiniteInput, ErrOutOfMemory, ErrIterationLimit, ErrConditionTooHigh.
template <ElementType E>
ErrorCode SchurDecompose(const ConstMatrixView<E> &a, SchurOrder order, const MatrixView<E> &z,
                         const MatrixView<E> &t, ComplexVector w);

// The same with the eigenvalues in order as they appear in t: an exchange with a block of two
// changes small eigenvalues, so the blocks are sorted again by their new values. ErrNonFiniteInput,
// ErrOutOfMemory, ErrIterationLimit; WarnLowAccuracy if some remain out of order.
template <ElementType E>
ErrorCode SchurInOrder(const ConstMatrixView<E> &a, SchurOrder order, const MatrixView<E> &z,
                       const MatrixView<E> &t, ComplexVector w);

} // namespace qx

#endif
