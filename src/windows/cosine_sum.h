#ifndef QX_WINDOWS_COSINE_SUM_H
#define QX_WINDOWS_COSINE_SUM_H

#include "qx/errors.h"
#include "windows/signal.h"

namespace qx {

constexpr int32_t maxCosineTerms = 7; // for the named windows

struct CosineCoefficients {
    int32_t count; // 0 for a selector that is not a cosine sum
    double a[maxCosineTerms];
};
const CosineCoefficients &CosineWindowCoefs(int32_t selector);

// x[i] times the sum over k of (-1)^k a[k] cos(2 pi k i / n) / d, where d is a[0] if `scaled`,
// otherwise 1. One sine pair per term, then a rotation per sample in the form "old value minus a
// correction", which keeps the sum accurate over long arrays (Singleton: On computing the fast
// Fourier transform, 1967, for the recurrence). ErrEmptyInput for n < 1, then, except for n = 1,
// for an empty a.
template <ElementType E>
ErrorCode ApplyCosineSumWindow(VectorView<E> x, ConstRealVector a, bool scaled);

// ErrEmptyInput for n < 1, ErrInvalidSelector for a selector without coefficients.
template <ElementType E>
ErrorCode ApplyCosineWindowBySelector(VectorView<E> x, int32_t selector, bool scaled);

} // namespace qx

#endif
