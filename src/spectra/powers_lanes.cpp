#include "spectra/powers.h"

#include "frame/lanes.h"

#include <cstddef>

namespace qx::QX_WIDTH {
namespace {

// The power at the frequencies from k on, one per lane, and at the opposite frequencies.
template <class L>
void PowerPairs(const DBL *h, std::ptrdiff_t k, std::ptrdiff_t n, double scale, DBL *power) {
    const std::ptrdiff_t opposite = n - k - (L::count - 1);
    const L re = L::load(h + k);
    const L im = L::load(h + opposite).reversed();
    const L both = (re * re + im * im) * L(scale);
    both.store(power + k);
    both.reversed().store(power + opposite);
}

} // namespace

void PowerOfHalfComplex(const DBL *h, int32_t n, double scale, DBL *power) {
    power[0] = (h[0] * h[0]) * scale;
    const std::ptrdiff_t last = (n - 1) / 2;
    std::ptrdiff_t k = 1;
    for (; k + 2 * nativeLanes - 1 <= last; k += 2 * nativeLanes) {
        PowerPairs<Lanes<nativeLanes>>(h, k, n, scale, power);
        PowerPairs<Lanes<nativeLanes>>(h, k + nativeLanes, n, scale, power);
    }
    for (; k <= last; ++k)
        PowerPairs<Lanes<1>>(h, k, n, scale, power);
    if (n % 2 == 0)
        power[n / 2] = scale * (h[n / 2] * h[n / 2]);
}

void PowerOfComplex(const DBL *spectrum, int32_t n, double scale, DBL *power) {
    for (std::ptrdiff_t k = 0; k < n; ++k) {
        const double re = spectrum[2 * k];
        const double im = spectrum[2 * k + 1];
        power[k] = (re * re + im * im) * scale;
    }
}

void CrossOfComplex(const DBL *x, const DBL *y, int32_t n, double scale, DBL *out) {
    for (std::ptrdiff_t k = 0; k < n; ++k) {
        const double xRe = x[2 * k];
        const double xIm = x[2 * k + 1];
        const double yRe = y[2 * k];
        const double yIm = y[2 * k + 1];
        out[2 * k] = (xRe * yRe + yIm * xIm) * scale;
        out[2 * k + 1] = (xRe * yIm - yRe * xIm) * scale;
    }
}

} // namespace qx::QX_WIDTH
