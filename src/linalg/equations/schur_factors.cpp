#include "linalg/equations/schur_factors.h"

#include "linalg/eigenproblems/complex_qr.h"
#include "linalg/eigenproblems/real_qr.h"
#include "linalg/factorisations/hessenberg.h"
#include "linalg/transpose.h"

namespace qx {

template <ElementType E>
void CopyAdjoint(Part<ElementOf<E>> from, int32_t n, Part<ElementOf<E>> to) {
    CopyTransposed<E>(from.data, from.stride, n, n, to.data, to.stride);
    for (int32_t i = 0; E == ElementType::CDB && i < n; ++i)
        for (int32_t j = 0; j < n; ++j)
            to.data[i * to.stride + j] = Conj(to.data[i * to.stride + j]);
}

template <ElementType E>
ErrorCode SchurFactors<E>::allocate(int32_t n) {
    n_ = n;
    if (const ErrorCode failed = t_.allocate(n, n))
        return failed;
    if (const ErrorCode failed = adjoint_.allocate(n, n))
        return failed;
    return values_.allocate(n);
}

template <ElementType E>
ErrorCode SchurFactors<E>::compute(double norm) {
    Panel<E> z;
    Scratch<ElementType::DBL> exchanges;
    if (const ErrorCode failed = z.allocate(n_, n_))
        return failed;
    if (const ErrorCode failed = exchanges.allocate(n_))
        return failed;
    // Permutations alone: factors would spoil the backward stability.
    const Balanced range = Balance<E>(t_.data(), t_.stride(), n_, true, false, exchanges.data());
    if (const ErrorCode failed = ReduceToHessenberg<E>(t_.data(), t_.stride(), n_, range.low,
                                                       range.high, z.data(), z.stride()))
        return failed;
    UndoPermutation<E>(exchanges.data(), range, n_, z.data(), z.stride(), n_);
    CopyTransposed<E>(z.data(), z.stride(), n_, n_, adjoint_.data(), adjoint_.stride());
    // Each element that is dropped counts a little; all together they stay within the norm's eps.
    if (const ErrorCode failed = iterate(range, epsilon / 16.0 * norm))
        return failed;
    clearBelowDiagonal();
    for (int32_t i = 0; E == ElementType::CDB && i < n_; ++i)
        for (int32_t j = 0; j < n_; ++j)
            *adjoint_.at(i, j) = Conj(*adjoint_.at(i, j));
    return 0;
}

template <>
ErrorCode SchurFactors<ElementType::DBL>::iterate(Balanced range, double negligible) {
    return RealSchurIteration(t_.data(), t_.stride(), n_, range, negligible, values(),
                              adjoint_.data());
}
template <>
ErrorCode SchurFactors<ElementType::CDB>::iterate(Balanced range, double negligible) {
    return ComplexSchurIteration(t_.data(), t_.stride(), n_, range, negligible, values(),
                                 adjoint_.data());
}

template <ElementType E>
void SchurFactors<E>::clearBelowDiagonal() {
    for (int32_t i = 1; i < n_; ++i) {
        const bool isPair = E == ElementType::DBL && values_[i].im < 0.0;
        for (int32_t j = 0; j < (isPair ? i - 1 : i); ++j)
            *t_.at(i, j) = T{};
    }
}

template <ElementType E>
void SchurFactors<E>::setAdjoint(const SchurFactors &a) {
    for (int32_t i = 0; i < n_; ++i) {
        const int32_t mirror = n_ - 1 - i;
        for (int32_t j = 0; j < n_; ++j) {
            *t_.at(i, j) = Conj(*a.t_.at(n_ - 1 - j, mirror));
            *adjoint_.at(i, j) = *a.adjoint_.at(mirror, j);
        }
        values_[i] = Conj(a.values_[mirror]);
    }
}

template void CopyAdjoint<ElementType::DBL>(Part<DBL>, int32_t, Part<DBL>);
template void CopyAdjoint<ElementType::CDB>(Part<CDB>, int32_t, Part<CDB>);
template class SchurFactors<ElementType::DBL>;
template class SchurFactors<ElementType::CDB>;

} // namespace qx
