#include "transforms/dct_passes.h"

#include "frame/lanes.h"

#include <cstddef>

namespace qx::QX_WIDTH {
namespace {

using std::ptrdiff_t;

typedef Lanes<nativeLanes> Wide;

} // namespace

void GatherEvenOdd(const DBL *x, int32_t n, DBL *reordered) {
    const ptrdiff_t half = n / 2;
    DBL *const end = reordered + n;
    ptrdiff_t j = 0;
    for (; j + nativeLanes <= half; j += nativeLanes) {
        const Wide a = Wide::load(x + 2 * j);
        const Wide b = Wide::load(x + 2 * j + nativeLanes);
        Evens(a, b).store(reordered + j);
        Odds(a, b).reversed().store(end - j - nativeLanes);
    }
    for (; j < half; ++j) {
        reordered[j] = x[2 * j];
        end[-1 - j] = x[2 * j + 1];
    }
}

void SpreadEvenOdd(const DBL *complex, int32_t n, DBL *x) {
    const ptrdiff_t half = n / 2;
    const DBL *const end = complex + 2 * ptrdiff_t{n};
    ptrdiff_t j = 0;
    for (; j + nativeLanes <= half; j += nativeLanes) {
        const DBL *const low = complex + 2 * j;
        const DBL *const high = end - 2 * (j + nativeLanes);
        const Wide even = Evens(Wide::load(low), Wide::load(low + nativeLanes));
        const Wide odd = Evens(Wide::load(high), Wide::load(high + nativeLanes)).reversed();
        TurnsLow(even, odd).store(x + 2 * j);
        TurnsHigh(even, odd).store(x + 2 * j + nativeLanes);
    }
    for (; j < half; ++j) {
        x[2 * j] = complex[2 * j];
        x[2 * j + 1] = end[-2 * (j + 1)];
    }
}

void TurnHalfComplex(const DBL *h, const DBL *wave, double scale, int32_t n, DBL *out) {
    const ptrdiff_t last = n / 2 - 1;
    ptrdiff_t k = 1;
    for (; k + nativeLanes - 1 <= last; k += nativeLanes) {
        const ptrdiff_t opposite = n - k - (nativeLanes - 1);
        const Wide w0 = Wide::load(wave + 2 * k);
        const Wide w1 = Wide::load(wave + 2 * k + nativeLanes);
        const Wide c = Evens(w0, w1);
        const Wide s = Odds(w0, w1);
        const Wide re = Wide::load(h + k);
        const Wide im = Wide::load(h + opposite).reversed();
        ((re * c + im * s) * Wide(scale)).store(out + k);
        ((re * s - im * c) * Wide(scale)).reversed().store(out + opposite);
    }
    for (; k <= last; ++k) {
        const double c = wave[2 * k];
        const double s = wave[2 * k + 1];
        out[k] = (h[k] * c + h[n - k] * s) * scale;
        out[n - k] = (h[k] * s - h[n - k] * c) * scale;
    }
}

void TurnReal(const DBL *x, const DBL *wave, double scale, int32_t n, DBL *complex) {
    const ptrdiff_t last = n / 2;
    ptrdiff_t k = 1;
    for (; k + nativeLanes - 1 < last; k += nativeLanes) {
        const ptrdiff_t opposite = n - k - (nativeLanes - 1);
        const Wide low = Wide::load(x + k);
        const Wide high = Wide::load(x + opposite).reversed();
        const Wide w[] = {Wide::load(wave + 2 * k) * Wide(scale),
                          Wide::load(wave + 2 * k + nativeLanes) * Wide(scale)};
        const Wide lows[] = {TurnsLow(low, low), TurnsHigh(low, low)};
        const Wide highs[] = {TurnsLow(high, high), TurnsHigh(high, high)};
        DBL *const up = complex + 2 * k;
        DBL *const down = complex + 2 * opposite;
        for (int part = 0; part < 2; ++part) {
            (lows[part] * w[part]).store(up + part * nativeLanes);
            // (c, s) reversed is the (s, c) of the opposite value.
            (highs[part] * w[part]).reversed().store(down + (1 - part) * nativeLanes);
        }
    }
    for (; k <= last; ++k) {
        const double c = wave[2 * k] * scale;
        const double s = wave[2 * k + 1] * scale;
        const double low = x[k];
        const double high = x[n - k];
        complex[2 * k] = low * c;
        complex[2 * k + 1] = low * s;
        complex[2 * (n - k)] = high * s;
        complex[2 * (n - k) + 1] = high * c;
    }
}

} // namespace qx::QX_WIDTH
