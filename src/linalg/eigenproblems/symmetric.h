#ifndef QX_LINALG_EIGENPROBLEMS_SYMMETRIC_H
#define QX_LINALG_EIGENPROBLEMS_SYMMETRIC_H

#include "linalg/matrix.h"

namespace qx {

// Eigenvalues, ascending, of the symmetric or Hermitian matrix whose lower triangle is that of a,
// and, unless `vectors` is empty, orthonormal eigenvectors in the columns of `vectors`, which may
// be a. Householder reduction to tridiagonal form and implicit QL iteration (R. S. Martin, C.
// Reinsch, J. H. Wilkinson, "Householder's tridiagonalization of a symmetric matrix", 1968; A.
// Dubrulle, R. S. Martin, J. H. Wilkinson, "The implicit QL algorithm", 1968). The error of a value
// is a few n eps times the largest one.
//
// ErrNonFiniteInput, ErrOutOfMemory, ErrIterationLimit.
template <ElementType E>
ErrorCode SymmetricEigen(const ConstMatrixView<E> &a, RealVector values,
                         const MatrixView<E> &vectors);

// The same with blocked methods, from order fewestBlockedSymmetric on: reduction to tridiagonal form by
// blocks of reflections, and divide and conquer (M. Gu and S. C. Eisenstat, "A divide-and-conquer
// algorithm for the symmetric tridiagonal eigenproblem", 1995); eigenvalues without vectors are
// computed by the QL iteration without square roots.
constexpr int32_t fewestBlockedSymmetric = 64;
template <ElementType E>
ErrorCode SymmetricEigenBlocked(const ConstMatrixView<E> &a, RealVector values,
                                const MatrixView<E> &vectors);

} // namespace qx

#endif
