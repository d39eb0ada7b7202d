#include "transforms/dct.h"

#include "fft/quarter_wave.h"
#include "frame/lanes.h"
#include "transforms/dct_passes.h"
#include "transforms/padded_input.h"

#include <cmath>
#include <cstddef>
#include <type_traits>

namespace qx {
namespace {

typedef Lanes<2> Pair;

// Below, (c, s) denotes cos and sin of pi k / (2n); for n - k they are (s, c), so bins k and n - k share
// one pair.

// `Length` is the type of n: an integer, or a constant for a length that is transformed whole, for which
// the compiler unrolls the loops and computes the scale.
template <class Length>
ErrorCode ForwardEven(const FFTPlan *plan, const DBL *x, DBL *out, Length n, DBL *work) {
    constexpr bool isLong = std::is_same_v<Length, int32_t>;
    const double scale = 2.0 / std::sqrt(2.0 * n);
    const double root = std::sqrt(static_cast<double>(n));
    DBL *const reordered = work;
    DBL *const h = work + n;
    if (isLong)
        GatherEvenOdd(x, n, reordered);
    else
        for (std::ptrdiff_t j = 0; j < n / 2; ++j) {
            reordered[j] = x[2 * j];
            reordered[n - 1 - j] = x[2 * j + 1];
        }
    if constexpr (!isLong)
        plan->whole.real(reordered, h);
    else if (const ErrorCode failed = FFTRealForward(plan, reordered, h, 1, 1, n))
        return failed;
    const DBL *const wave = QuarterWave(plan);
    if (!wave)
        return ErrOutOfMemory;

    out[0] = h[0] / root;
    if (isLong)
        TurnHalfComplex(h, wave, scale, n, out);
    else
        for (std::ptrdiff_t k = 1; k < n / 2; ++k) {
            // The values of h are read one by one: a single load of two values that a short transform
            // has stored separately would wait for both stores.
            const Pair w = Pair::load(wave + 2 * k);
            const double im = h[n - k];
            const Pair turned = Pair(h[k]) * w + Pair(Pair::Vector{im, -im}) * w.reversed();
            const Pair result = turned * Pair(scale);
            out[k] = result[0];
            out[n - k] = result[1];
        }
    out[n / 2] = h[n / 2] * wave[n] * scale;
    return 0;
}

ErrorCode ForwardOdd(const FFTPlan *plan, const DBL *x, DBL *out, int32_t n, DBL *work) {
    const std::ptrdiff_t length = 2 * std::ptrdiff_t{n};
    DBL *const mirrored = work;
    DBL *const h = work + length;
    for (std::ptrdiff_t j = 0; j < n; ++j)
        mirrored[j] = mirrored[length - 1 - j] = x[j];
    if (const ErrorCode failed =
            FFTRealForward(plan, mirrored, h, 1, 1, static_cast<int32_t>(length)))
        return failed;
    const DBL *const wave = QuarterWave(plan);
    if (!wave)
        return ErrOutOfMemory;

    const double scale = 1.0 / std::sqrt(2.0 * n);
    out[0] = 0.5 * h[0] / std::sqrt(static_cast<double>(n));
    for (std::ptrdiff_t k = 1; k <= n / 2; ++k) {
        const double c = wave[4 * k];
        const double s = wave[4 * k + 1];
        out[k] = (h[k] * c + h[length - k] * s) * scale;
        out[n - k] = (h[n - k] * s + h[n + k] * c) * scale;
    }
    return 0;
}

ErrorCode InverseEven(const FFTPlan *plan, const DBL *spectrum, DBL *out, int32_t n, DBL *work) {
    const DBL *const wave = QuarterWave(plan);
    if (!wave)
        return ErrOutOfMemory;
    // Interleaved, because the engine is fastest for that layout.
    CDB *const z = reinterpret_cast<CDB *>(work);
    CDB *const u = z + n;
    const double scale = std::sqrt(2.0 * n);
    z[0] = CDB{spectrum[0] * std::sqrt(static_cast<double>(n)), 0};
    TurnReal(spectrum, wave, scale, n, work);
    if (const ErrorCode failed = FFTComplexInverse(plan, &z->re, &z->im, &u->re, &u->im, 2, 2, n))
        return failed;
    SpreadEvenOdd(&u->re, n, out);
    return 0;
}

// The same for 8 values, in one piece. The inverse Fourier transform is the forward transform with the
// results k and n - k exchanged; only its real parts are needed.
ErrorCode InverseEight(const FFTPlan *plan, const DBL *spectrum, DBL *out, DBL *work) {
    constexpr std::ptrdiff_t n = 8;
    const DBL *const wave = QuarterWave(plan);
    if (!wave)
        return ErrOutOfMemory;
    DBL *const z = work;
    DBL *const u = work + 2 * n;
    const Pair scale(std::sqrt(2.0 * n));
    // Both parts of a value are stored together: the transform loads them together, and would wait for
    // two separate stores.
    Pair(Pair::Vector{spectrum[0] * std::sqrt(static_cast<double>(n)), 0.0}).store(z);
    for (std::ptrdiff_t k = 1; k <= n / 2; ++k) {
        const Pair w = Pair::load(wave + 2 * k) * scale;
        (Pair(spectrum[k]) * w).store(z + 2 * k);
        (Pair(spectrum[n - k]) * w.reversed()).store(z + 2 * (n - k));
    }
    plan->whole.complex(z, u);
    for (std::ptrdiff_t j = 0; j < n / 2; ++j) {
        out[2 * j] = u[2 * ((n - j) % n)] * (1.0 / n);
        out[2 * j + 1] = u[2 * (j + 1)] * (1.0 / n);
    }
    return 0;
}

ErrorCode InverseOdd(const FFTPlan *plan, const DBL *spectrum, DBL *out, int32_t n, DBL *work) {
    const DBL *const wave = QuarterWave(plan);
    if (!wave)
        return ErrOutOfMemory;
    const std::ptrdiff_t length = 2 * std::ptrdiff_t{n};
    DBL *const h = work;
    DBL *const u = work + length;
    const double scale = std::sqrt(2.0 * n);
    h[0] = 2.0 * spectrum[0] * std::sqrt(static_cast<double>(n));
    h[n] = 0;
    for (std::ptrdiff_t k = 1; k <= n / 2; ++k) {
        const double c = wave[4 * k] * scale;
        const double s = wave[4 * k + 1] * scale;
        const double low = spectrum[k];
        const double high = spectrum[n - k];
        h[k] = low * c;
        h[length - k] = low * s;
        h[n - k] = high * s;
        h[n + k] = high * c;
    }
    if (const ErrorCode failed = FFTRealInverse(plan, h, u, 1, 1, static_cast<int32_t>(length)))
        return failed;
    for (std::ptrdiff_t j = 0; j < n; ++j)
        out[j] = u[j];
    return 0;
}

} // namespace

ErrorCode DCTForward(const FFTPlan *plan, ConstRealVector in, RealVector out, DBL *work) {
    const auto n = static_cast<int32_t>(out.size());
    QX_EXPECTS(n >= 1 && plan->length == DCTPlanLength(n));
    PaddedInput x;
    if (const ErrorCode failed = x.take(in, n))
        return failed;
    if (n == 8) // the block of image coding, so short that the overhead dominates
        return ForwardEven(plan, x.data, out.data(), std::integral_constant<int32_t, 8>(), work);
    const auto forward = n % 2 == 0 ? ForwardEven<int32_t> : ForwardOdd;
    return forward(plan, x.data, out.data(), n, work);
}

ErrorCode DCTInverse(const FFTPlan *plan, ConstRealVector in, RealVector out, DBL *work) {
    const auto n = static_cast<int32_t>(out.size());
    QX_EXPECTS(n >= 1 && in.size() >= n && plan->length == DCTPlanLength(n));
    if (n == 8)
        return InverseEight(plan, in.data(), out.data(), work);
    const auto inverse = n % 2 == 0 ? InverseEven : InverseOdd;
    return inverse(plan, in.data(), out.data(), n, work);
}

} // namespace qx
