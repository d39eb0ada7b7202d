#include "linalg/equations/schur_factors.h"

#include "linalg/eigenproblems/complex_qr.h"
#include "linalg/eigenproblems/real_qr.h"
#include "linalg/factorisations/hessenberg.h"

namespace qx {

namespace {

template <ElementType E>
void ConjugateInPlace(const MatrixView<E> &a) {
    for (int32_t i = 0; E == ElementType::CDB && i < a.rows(); ++i)
        for (int32_t j = 0; j < a.cols(); ++j)
            a(i, j) = Conj(a(i, j));
}

} // namespace

template <ElementType E>
void CopyAdjoint(const ConstMatrixView<E> &from, const MatrixView<E> &to) {
    CopyTransposed<E>(from, to);
    ConjugateInPlace<E>(to);
}

template <ElementType E>
ErrorCode SchurFactors<E>::allocate(int32_t n) {
    n_ = n;
    return memory_.take(SizedPadded(t_, n, n), SizedPadded(adjoint_, n, n), Sized(values_, n));
}

template <ElementType E>
ErrorCode SchurFactors<E>::compute(double negligible) {
    MatrixView<E> z;
    RealVector exchanges;
    ScratchParts memory;
    if (const ErrorCode failed = memory.take(SizedPadded(z, n_, n_), Sized(exchanges, n_)))
        return failed;
    // Permutations only: scaling would spoil the backward stability.
    const Balanced range = Balance<E>(t_, true, false, exchanges);
    if (const ErrorCode failed = ReduceToHessenberg<E>(t_, range.low, range.high, z))
        return failed;
    UndoPermutation<E>(exchanges, range, z);
    CopyTransposed<E>(z, adjoint_);
    if (const ErrorCode failed = iterate(range, negligible))
        return failed;
    clearBelowDiagonal();
    ConjugateInPlace<E>(adjoint_);
    return 0;
}

template <>
ErrorCode SchurFactors<ElementType::DBL>::iterate(Balanced range, double negligible) {
    return RealSchurIteration(t_, range, negligible, values_, adjoint_);
}
template <>
ErrorCode SchurFactors<ElementType::CDB>::iterate(Balanced range, double negligible) {
    return ComplexSchurIteration(t_, range, negligible, values_, adjoint_);
}

template <ElementType E>
void SchurFactors<E>::clearBelowDiagonal() {
    for (int32_t i = 1; i < n_; ++i) {
        const bool isPair = E == ElementType::DBL && values_[i].im < 0.0;
        for (int32_t j = 0; j < (isPair ? i - 1 : i); ++j)
            t_(i, j) = {};
    }
}

template <ElementType E>
void SchurFactors<E>::setAdjoint(const SchurFactors &a) {
    for (int32_t i = 0; i < n_; ++i) {
        const int32_t mirror = n_ - 1 - i;
        for (int32_t j = 0; j < n_; ++j) {
            t_(i, j) = Conj(a.t_(n_ - 1 - j, mirror));
            adjoint_(i, j) = a.adjoint_(mirror, j);
        }
        values_[i] = Conj(a.values_[mirror]);
    }
}

template void CopyAdjoint(const ConstRealMatrix &, const RealMatrix &);
template void CopyAdjoint(const ConstComplexMatrix &, const ComplexMatrix &);
template class SchurFactors<ElementType::DBL>;
template class SchurFactors<ElementType::CDB>;

} // namespace qx
