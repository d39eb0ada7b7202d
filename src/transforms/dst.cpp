#include "transforms/dst.h"

#include "transforms/strided_window.h"

#include <cstddef>

namespace qx {
namespace {

// The half-complex spectrum, in the second half of the work buffer, of the odd extension of x.
// The imaginary part of bin k stands at length - k and is -2 times the sine sum of k.
ErrorCode OddExtensionSpectrum(const FFTPlan *plan, const DBL *x, std::ptrdiff_t stride, int32_t n,
                               DBL *work) {
    const int64_t length = DSTPlanLength(n);
    if (plan->length != length)
        return ErrInternal;
    DBL *const extended = work;
    extended[0] = 0;
    extended[n + std::ptrdiff_t{1}] = 0;
    for (std::ptrdiff_t j = 0; j < n; ++j) {
        const double value = x[j * stride];
        extended[j + 1] = value;
        extended[length - 1 - j] = -value;
    }
    return FFTRealForward(plan, extended, work + length, 1, 1, plan->length);
}

} // namespace

ErrorCode DSTForward(const FFTPlan *plan, const DBL *in, int32_t inCount, DBL *out,
                     int32_t inStride, int32_t outStride, int32_t n, DBL *work) {
    if (inCount < 1)
        return ErrEmptyInput;
    if (n < 1)
        return ErrFFTSizeNotPositive;
    StridedWindow x;
    if (const ErrorCode failed = x.take(in, inCount, inStride, n))
        return failed;
    if (const ErrorCode failed = OddExtensionSpectrum(plan, x.data, x.stride, n, work))
        return failed;
    const DBL *const end = work + 2 * DSTPlanLength(n);
    for (std::ptrdiff_t k = 1; k <= n; ++k)
        out[(k - 1) * outStride] = -0.5 * end[-k];
    return 0;
}

ErrorCode DSTInverse(const DBL *in, DBL *out, int32_t inStride, int32_t outStride, int32_t n,
                     DBL *work, const FFTPlan *plan) {
    if (n < 1)
        return ErrEmptyInput;
    if (const ErrorCode failed = OddExtensionSpectrum(plan, in, inStride, n, work))
        return failed;
    const DBL *const end = work + 2 * DSTPlanLength(n);
    const double divisor = n + 1.0;
    for (std::ptrdiff_t k = 1; k <= n; ++k)
        out[(k - 1) * outStride] = -end[-k] / divisor;
    return 0;
}

} // namespace qx
