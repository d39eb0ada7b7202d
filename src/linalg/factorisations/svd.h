#ifndef QX_LINALG_FACTORISATIONS_SVD_H
#define QX_LINALG_FACTORISATIONS_SVD_H

#include "linalg/matrix.h"

namespace qx {

// Singular value decomposition of a matrix of m by n finite elements, with m and n above 0: a = U
// diag(s) V^H with s in descending order and k = min(m, n); u is m by k and v n by k, or both are
// square. They and a have no gaps between their rows. G. H. Golub and C. Reinsch, "Singular value
// decomposition and least squares solutions", 1970.
//
// The error of a singular value is a few n eps times the largest one, and never less than about
// eps itself: values below 2.2e-16 count as zero whatever the norm of the matrix.
//
// With SVDScaling::Always the matrix is brought to a norm of about 2^200 by a power of two first, so
// that the error is a few n eps times the largest value at any norm, and 2^k a has the values 2^k s
// and the vectors of a, to the bit.
//
// ErrOutOfMemory, ErrIterationLimit.
enum class SVDScaling { LargeNorms, Always };
// Whether the elements count as finite: LargeNorms refuses all that AllFinite refuses
// (linalg/matrix.h).
template <ElementType E>
bool MayBeTaken(const ConstMatrixView<E> &a, SVDScaling scaling) {
    return scaling == SVDScaling::Always ? HoldsOnlyNumbers<E>(a) : AllFinite<E>(a);
}
template <ElementType E>
ErrorCode SVDecompose(const ConstMatrixView<E> &a, const MatrixView<E> &u, RealVector s,
                      const MatrixView<E> &v, SVDScaling scaling = SVDScaling::LargeNorms);

// The singular values alone, in descending order.
template <ElementType E>
ErrorCode SingularValues(const ConstMatrixView<E> &a, RealVector s,
                         SVDScaling scaling = SVDScaling::LargeNorms);

} // namespace qx

#endif
