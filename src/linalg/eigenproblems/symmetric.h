#ifndef QX_LINALG_EIGENPROBLEMS_SYMMETRIC_H
#define QX_LINALG_EIGENPROBLEMS_SYMMETRIC_H

#include "linalg/matrix.h"

namespace qx {

// Eigenvalues, ascending, of the symmetric or Hermitian matrix that has the lower triangle of a,
// and unless `vectors` is empty orthonormal eigenvectors in its columns, which may be those of a.
// Householder reduction to tridiagonal form and implicit QL iteration (R. S. Martin, C. Reinsch,
// J. H. Wilkinson, "Householder's tridiagonalization of a symmetric matrix", 1968; A. Dubrulle,
// R. S. Martin, J. H. Wilkinson, "The implicit QL algorithm", 1968). The error of a value is a few
// n eps times the largest one.
//
// ErrNonFiniteInput, ErrOutOfMemory, ErrIterationLimit.
template <ElementType E>
ErrorCode SymmetricEigen(const ConstMatrixView<E> &a, RealVector values,
                         const MatrixView<E> &vectors);

} // namespace qx

#endif
