#include "transforms/dst.h"

#include "transforms/padded_input.h"

#include <cstddef>

namespace qx {
namespace {

// The half-complex spectrum, in the second half of the work buffer, of the odd extension of x.
// The imaginary part of bin k is at length - k and equals -2 times the sine sum of k.
ErrorCode OddExtensionSpectrum(const FFTPlan *plan, const DBL *x, int32_t n, DBL *work) {
    const int64_t length = DSTPlanLength(n);
    QX_EXPECTS(n >= 1 && plan->length == length);
    DBL *const extended = work;
    extended[0] = 0;
    extended[n + std::ptrdiff_t{1}] = 0;
    for (std::ptrdiff_t j = 0; j < n; ++j) {
        const double value = x[j];
        extended[j + 1] = value;
        extended[length - 1 - j] = -value;
    }
    return FFTRealForward(plan, extended, work + length, 1, 1, plan->length);
}

} // namespace

ErrorCode DSTForward(const FFTPlan *plan, ConstRealVector in, RealVector out, DBL *work) {
    const auto n = static_cast<int32_t>(out.size());
    PaddedInput x;
    if (const ErrorCode failed = x.take(in, n))
        return failed;
    if (const ErrorCode failed = OddExtensionSpectrum(plan, x.data, n, work))
        return failed;
    const DBL *const end = work + 2 * DSTPlanLength(n);
    for (std::ptrdiff_t k = 1; k <= n; ++k)
        out[k - 1] = -0.5 * end[-k];
    return 0;
}

ErrorCode DSTInverse(const FFTPlan *plan, ConstRealVector in, RealVector out, DBL *work) {
    const auto n = static_cast<int32_t>(out.size());
    QX_EXPECTS(in.size() >= n);
    if (const ErrorCode failed = OddExtensionSpectrum(plan, in.data(), n, work))
        return failed;
    const DBL *const end = work + 2 * DSTPlanLength(n);
    const double divisor = n + 1.0;
    for (std::ptrdiff_t k = 1; k <= n; ++k)
        out[k - 1] = -end[-k] / divisor;
    return 0;
}

} // namespace qx
