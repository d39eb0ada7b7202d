#include "fft/half_complex.h"

#include <cstddef>

namespace qx {
namespace {

void SetElement(DBL *buffer, std::ptrdiff_t i, double re, double im) {
    buffer[2 * i] = re;
    buffer[2 * i + 1] = im;
}

void ExpandPlain(DBL *buffer, std::ptrdiff_t n) {
    for (std::ptrdiff_t k = 1; k <= (n - 1) / 2; ++k) {
        const double re = buffer[2 * k];
        const double im = buffer[2 * (n - k)];
        SetElement(buffer, k, re, im);
        SetElement(buffer, n - k, re, -im);
    }
    buffer[1] = 0;
    if (n % 2 == 0)
        buffer[n + 1] = 0;
}

void ExpandShifted(DBL *buffer, std::ptrdiff_t n) {
    const std::ptrdiff_t middle = n / 2;
    const double zeroFrequency = buffer[0];
    const double nyquist = buffer[2 * middle];
    // Frequencies k and m swap places: element middle + k held the imaginary part of m, and
    // element middle + m that of k.
    for (std::ptrdiff_t k = 1, m = n - middle - 1; k <= m; ++k, --m) {
        const double reK = buffer[2 * k];
        const double imK = buffer[2 * (n - k)];
        const double reM = buffer[2 * m];
        const double imM = buffer[2 * (n - m)];
        SetElement(buffer, middle + k, reK, imK);
        SetElement(buffer, middle + m, reM, imM);
    }
    for (std::ptrdiff_t k = 1; k <= (n - 1) / 2; ++k)
        SetElement(buffer, middle - k, buffer[2 * (middle + k)], -buffer[2 * (middle + k) + 1]);
    if (n % 2 == 0)
        SetElement(buffer, 0, nyquist, 0);
    SetElement(buffer, middle, zeroFrequency, 0);
}

} // namespace

void FFTHalfToFull(DBL *buffer, int32_t n, int32_t shift) {
    const auto expand = shift == 0 ? ExpandPlain : ExpandShifted;
    expand(buffer, n);
}

void FFTCompactToFull(DBL *buffer, int32_t n) {
    const std::ptrdiff_t length = n;
    const DBL *const h = buffer + length;
    const double nyquist = h[length / 2];
    // Element k ends at 2k + 1, which reaches into h only where h[0] stood.
    SetElement(buffer, 0, h[0], 0);
    for (std::ptrdiff_t k = 1; k <= (length - 1) / 2; ++k)
        SetElement(buffer, k, h[k], h[length - k]);
    for (std::ptrdiff_t k = 1; k <= (length - 1) / 2; ++k)
        SetElement(buffer, length - k, buffer[2 * k], -buffer[2 * k + 1]);
    if (n % 2 == 0)
        SetElement(buffer, length / 2, nyquist, 0);
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
