#ifndef QX_LINALG_EIGENPROBLEMS_SYMMETRIC_H
#define QX_LINALG_EIGENPROBLEMS_SYMMETRIC_H

#include "qx/types.h"

namespace qx {

// Eigenvalues, ascending, of the symmetric or Hermitian matrix of order n that has the lower
// triangle of a, and where `output` (EigenOutput) says so orthonormal eigenvectors in the columns
// of `vectors`, which may be a. Householder reduction to tridiagonal form and implicit QL iteration
// (R. S. Martin, C. Reinsch, J. H. Wilkinson, "Householder's tridiagonalization of a symmetric
// matrix", 1968; A. Dubrulle, R. S. Martin, J. H. Wilkinson, "The implicit QL algorithm", 1968).
// The error of a value is a few n eps times the largest one.
//
// ErrEmptyInput, ErrInvalidSelector, ErrNonFiniteInput, ErrOutOfMemory, ErrIterationLimit.
ErrorCode SymmetricEigen(const DBL *a, int32_t n, int32_t output, DBL *values, DBL *vectors);
ErrorCode SymmetricEigen(const CDB *a, int32_t n, int32_t output, DBL *values, CDB *vectors);

} // namespace qx

#endif
