#ifndef QX_LINALG_EIGENPROBLEMS_GENERAL_H
#define QX_LINALG_EIGENPROBLEMS_GENERAL_H

#include "linalg/matrix.h"

namespace qx {

enum EigenOutput : int32_t { eigenValuesOnly = 0, eigenValuesAndVectors = 1 };
enum EigenMatrix : int32_t { generalMatrix = 0, hermitianMatrix = 1 };

// Eigenvalues of a square matrix and, unless `vectors` is empty, eigenvectors of unit length in its
// columns. Conjugate pairs are adjacent, the value with positive imaginary part first; otherwise
// the order is that of the iteration. Balancing, reduction to Hessenberg form and the QR iteration
// after J. H. Wilkinson and C. Reinsch, "Handbook for Automatic Computation", volume II, 1971.
//
// Backward stable: the values are those of a matrix that differs from a by a few n eps of its norm.
// How far that moves them depends on their condition; a value of multiplicity k moves by the k-th
// root of the perturbation.
//
// ErrNonFiniteInput, ErrOutOfMemory, ErrIterationLimit.
template <ElementType E>
ErrorCode EigenGeneral(const ConstMatrixView<E> &a, ComplexVector values,
                       const ComplexMatrix &vectors = {});
template <>
ErrorCode EigenGeneral(const ConstRealMatrix &a, ComplexVector values,
                       const ComplexMatrix &vectors);
template <>
ErrorCode EigenGeneral(const ConstComplexMatrix &a, ComplexVector values,
                       const ComplexMatrix &vectors);

// The same with blocked methods, from order fewestBlockedEigen on: reduction to Hessenberg form by
// blocks of reflections, iterations with many shifts and early deflation (K. Braman, R. Byers and
// R. Mathias, "The multishift QR algorithm", 2002), and vectors by products of matrices.
constexpr int32_t fewestBlockedEigen = 160;
template <ElementType E>
ErrorCode EigenBlocked(const ConstMatrixView<E> &a, ComplexVector values,
                       const ComplexMatrix &vectors);

// The same for a Hermitian matrix, which is read from its lower triangle; the values ascend and
// have no imaginary part. Uses SymmetricEigen or SymmetricEigenBlocked.
enum class Steps { OneByOne, Blocked };
ErrorCode EigenHermitian(const ConstComplexMatrix &a, Steps steps, ComplexVector values,
                         const ComplexMatrix &vectors);

} // namespace qx

#endif
