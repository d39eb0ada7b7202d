#include "linalg/aligned.h"
#include "linalg/eigenproblems/general.h"
#include "linalg/eigenproblems/symmetric.h"
#include "linalg/lapack.h"

namespace qx {
namespace {

// Eigenvectors from LAPACK's columns, which are rows here.
void WriteVectors(const ConstComplexMatrix &columns, ConstComplexVector,
                  const ComplexMatrix &vectors) {
    CopyTransposed<ElementType::CDB>(columns, vectors);
}
// For a conjugate pair, the two columns hold the real and the imaginary part.
void WriteVectors(const ConstRealMatrix &columns, ConstComplexVector values,
                  const ComplexMatrix &vectors) {
    const int32_t n = columns.rows();
    for (int32_t j = 0; j < n; ++j) {
        const bool isPair = values[j].im > 0.0 && j + 1 < n;
        for (int32_t i = 0; i < n; ++i) {
            vectors(i, j) = {columns(j, i), isPair ? columns(j + 1, i) : DBL(0.0)};
            if (isPair)
                vectors(i, j + 1) = {columns(j, i), -columns(j + 1, i)};
        }
        j += isPair;
    }
}

} // namespace

template <ElementType E>
ErrorCode EigenBlocked(const ConstMatrixView<E> &a, ComplexVector values,
                       const ComplexMatrix &vectors) {
    QX_EXPECTS(a.isSquare() && values.size() == a.rows());
    const int32_t n = a.rows();
    if (n < fewestBlockedEigen)
        return EigenGeneral<E>(a, values, vectors);
    if (!AllFinite<E>(a))
        return ErrNonFiniteInput;
    const int32_t order = vectors.isEmpty() ? 0 : n;
    MatrixView<E> columns, found;
    ScratchParts memory;
    if (const ErrorCode failed =
            memory.take(Aligned(Sized(columns, n, n)), Aligned(Sized(found, order, order))))
        return failed;
    CopyTransposed<E>(a, columns);
    ElementOf<E> *const z = order == 0 ? nullptr : found.data();
    if (const int32_t info = lapack::Eigen(n, columns.data(), values.data(), z))
        return info > 0 ? ErrIterationLimit : lapack::CodeOf(info);
    if (order != 0)
        WriteVectors(found, values, vectors);
    return 0;
}

template <ElementType E>
ErrorCode SymmetricEigenBlocked(const ConstMatrixView<E> &a, RealVector values,
                                const MatrixView<E> &vectors) {
    QX_EXPECTS(a.isSquare() && !a.isEmpty() && values.size() == a.rows());
    const int32_t n = a.rows();
    if (n < fewestBlockedSymmetric)
        return SymmetricEigen<E>(a, values, vectors);
    if (!AllFinite<E>(a))
        return ErrNonFiniteInput;
    MatrixView<E> columns;
    RealVector found;
    ScratchParts memory;
    if (const ErrorCode failed =
            memory.take(Aligned(Sized(columns, n, n)), Aligned(Sized(found, n))))
        return failed;
    CopyTransposed<E>(a, columns);
    if (const int32_t info =
            lapack::SymmetricEigen(n, columns.data(), found.data(), !vectors.isEmpty()))
        return info > 0 ? ErrIterationLimit : lapack::CodeOf(info);
    for (int32_t i = 0; i < n; ++i)
        values[i] = found[i];
    if (!vectors.isEmpty())
        CopyTransposed<E>(columns, vectors);
    return 0;
}

template ErrorCode SymmetricEigenBlocked(const ConstRealMatrix &, RealVector, const RealMatrix &);
template ErrorCode SymmetricEigenBlocked(const ConstComplexMatrix &, RealVector,
                                         const ComplexMatrix &);
template ErrorCode EigenBlocked(const ConstRealMatrix &, ComplexVector, const ComplexMatrix &);
template ErrorCode EigenBlocked(const ConstComplexMatrix &, ComplexVector, const ComplexMatrix &);

} // namespace qx
