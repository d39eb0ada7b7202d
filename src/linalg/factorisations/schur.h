#ifndef QX_LINALG_FACTORISATIONS_SCHUR_H
#define QX_LINALG_FACTORISATIONS_SCHUR_H

#include "linalg/matrix.h"

namespace qx {

// How the eigenvalues stand along the diagonal.
enum SchurOrder : int32_t {
    schurUnordered = 0,
    schurRealAscending = 1,
    schurRealDescending = 2,
    schurModulusAscending = 3,
    schurModulusDescending = 4
};

// Schur form a = z t z^H of a square matrix through LAPACK: z is unitary, t upper triangular, for
// real elements with blocks of two for conjugate pairs, and w its eigenvalues. z may be empty. a
// may be t.
//
// ErrNonFiniteInput, ErrOutOfMemory, ErrIterationLimit, ErrConditionTooHigh.
template <ElementType E>
ErrorCode SchurDecompose(const ConstMatrixView<E> &a, SchurOrder order, const MatrixView<E> &z,
                         const MatrixView<E> &t, ComplexVector w);

// The same with eigenvalues that are in order as they stand in t: an exchange with a block of two
// changes small ones, so that blocks are sorted again by what they have become. ErrNonFiniteInput,
// ErrOutOfMemory, ErrIterationLimit; WarnLowAccuracy where some stay out of order all the same.
template <ElementType E>
ErrorCode SchurInOrder(const ConstMatrixView<E> &a, SchurOrder order, const MatrixView<E> &z,
                       const MatrixView<E> &t, ComplexVector w);

} // namespace qx

#endif
