#ifndef QX_LINALG_EIGENPROBLEMS_GENERAL_H
#define QX_LINALG_EIGENPROBLEMS_GENERAL_H

#include "qx/types.h"

namespace qx {

enum EigenOutput : int32_t { eigenValuesOnly = 0, eigenValuesAndVectors = 1 };
enum EigenMatrix : int32_t { generalMatrix = 0, hermitianMatrix = 1 };

// Eigenvalues of a square row-major matrix of order n and, where `output` says so, eigenvectors of
// unit length in the columns of `vectors` (n by n; else not touched). Conjugate pairs stand
// together, the one with positive imaginary part first; otherwise the order is that of the
// iteration. Balancing, reduction to Hessenberg form and the QR iteration after J. H. Wilkinson and
// C. Reinsch, "Handbook for Automatic Computation", volume II, 1971.
//
// Backward stable: the values are those of a matrix that differs from a by a few n eps of its norm.
// How far that moves them is a matter of their condition; a value of multiplicity k moves by the
// k-th root.
//
// ErrEmptyInput, ErrInvalidSelector, ErrNonFiniteInput, ErrOutOfMemory, ErrIterationLimit.
ErrorCode EigenGeneral(const DBL *a, int32_t n, int32_t output, CDB *values, CDB *vectors);

// Of a complex matrix. A Hermitian one is read from its lower triangle; its values then ascend and
// have no imaginary part.
ErrorCode CxEigenGeneral(const CDB *a, int32_t n, int32_t matrixType, int32_t output, CDB *values,
                         CDB *vectors);

} // namespace qx

#endif
