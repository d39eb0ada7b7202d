#include "fft/half_complex.h"

#include "fft/passes.h"

#include <cstddef>

namespace qx {
namespace {

void SetElement(DBL *buffer, std::ptrdiff_t i, double re, double im) {
    buffer[2 * i] = re;
    buffer[2 * i + 1] = im;
}

void ExpandPlain(DBL *buffer, std::ptrdiff_t n) {
    const DBL *const h = buffer + n;
    const double nyquist = h[n / 2];
    // Element k ends at 2k + 1 and overlaps h only at h[0].
    SetElement(buffer, 0, h[0], 0);
    const auto pairs = static_cast<int32_t>((n - 1) / 2);
    JoinMirrored(h + 1, h + n - 1, buffer + 2, pairs);
    ConjugateBackward(buffer + 2, buffer + 2 * (n - 1), pairs);
    if (n % 2 == 0)
        SetElement(buffer, n / 2, nyquist, 0);
}

void ExpandShifted(DBL *buffer, std::ptrdiff_t n) {
    const DBL *const h = buffer;
    const std::ptrdiff_t middle = n / 2;
    const double zeroFrequency = h[0];
    const double nyquist = h[middle];
    // The elements above the middle one lie after h, which is overwritten later.
    const auto pairs = static_cast<int32_t>((n - 1) / 2);
    DBL *const zero = buffer + 2 * middle;
    JoinMirrored(h + 1, h + n - 1, zero + 2, pairs);
    ConjugateBackward(zero + 2, zero - 2, pairs);
    if (n % 2 == 0)
        SetElement(buffer, 0, nyquist, 0);
    SetElement(buffer, middle, zeroFrequency, 0);
}

} // namespace

void FFTCompactToFull(DBL *buffer, int32_t n, int32_t shift) {
    const auto expand = shift == 0 ? ExpandPlain : ExpandShifted;
    expand(buffer, n);
}

void FFTFullToHalf(const DBL *in, int32_t n, int32_t shift, DBL *h) {
    const std::ptrdiff_t length = n;
    const DBL *const zero = in + (shift == 0 ? 0 : length / 2 * 2);
    h[0] = zero[0];
    for (std::ptrdiff_t k = 1; k <= (length - 1) / 2; ++k) {
        h[k] = zero[2 * k];
        h[length - k] = zero[2 * k + 1];
    }
    if (n % 2 == 0)
        h[length / 2] = in[shift == 0 ? length : 0];
}

} // namespace qx
