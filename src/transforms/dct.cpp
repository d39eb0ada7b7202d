#include "transforms/dct.h"

#include "fft/quarter_wave.h"
#include "frame/lanes.h"
#include "transforms/dct_passes.h"
#include "transforms/padded_input.h"

#include <cmath>
#include <cstddef>

namespace qx {
namespace {

typedef Lanes<2> Pair;

// Below, (c, s) denotes cos and sin of pi k / (2n); for n - k they are (s, c), so bins k and n - k share
// one pair.

ErrorCode ForwardEven(const FFTPlan *plan, const DBL *x, DBL *out, int32_t n, DBL *work) {
    const double scale = 2.0 / std::sqrt(2.0 * n);
    const double root = std::sqrt(static_cast<double>(n));
    DBL *const reordered = work;
    DBL *const h = work + n;
    GatherEvenOdd(x, n, reordered);
    if (const ErrorCode failed = FFTRealForward(plan, reordered, h, 1, 1, n))
        return failed;
    const DBL *const wave = QuarterWave(plan);
    if (!wave)
        return ErrOutOfMemory;

    out[0] = h[0] / root;
    TurnHalfComplex(h, wave, scale, n, out);
    out[n / 2] = h[n / 2] * wave[n] * scale;
    return 0;
}

// Eight values, the block of image coding, are so few that calls and passes through memory would take most of
// the time. Both directions have the operations of the general routines for each result, in registers.

constexpr double cosineOfEighth = 0x1.6a09e667f3bcdp-1; // as in the straight-line transforms

// The transform of 8 real values in their new order (0, 2, 4, 6, 7, 5, 3, 1), then the rotations.
ErrorCode ForwardEight(const FFTPlan *plan, const DBL *x, DBL *out) {
    const DBL *const wave = QuarterWave(plan);
    if (!wave)
        return ErrOutOfMemory;
    const double outer = x[0] + x[7], outerTurned = x[0] - x[7];
    const double inner = x[4] + x[3], innerTurned = x[4] - x[3];
    const double left = x[2] + x[5], leftTurned = x[2] - x[5];
    const double right = x[6] + x[1], rightTurned = x[6] - x[1];
    const double even = outer + inner, odd = left + right;
    const double low = cosineOfEighth * (leftTurned - rightTurned);
    const double high = cosineOfEighth * (leftTurned + rightTurned);

    const Pair scale(2.0 / std::sqrt(16.0));
    const auto rotate = [&](int k, double re, double im) {
        const Pair w = Pair::load(wave + 2 * k);
        const Pair turned = Pair(re) * w + Pair(Pair::Vector{im, -im}) * w.reversed();
        const Pair result = turned * scale;
        out[k] = result[0];
        out[8 - k] = result[1];
    };
    out[0] = (even + odd) / std::sqrt(8.0);
    rotate(1, outerTurned + low, -(innerTurned + high));
    rotate(2, outer - inner, -(left - right));
    rotate(3, outerTurned - low, innerTurned - high);
    out[4] = (even - odd) * wave[8] * scale[0];
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

// Only the real parts of the inverse Fourier transform are needed, which is the forward transform of
// z with the results k and n - k exchanged. Pairs are complex values up to the last stage, and there
// two real parts.
ErrorCode InverseEight(const FFTPlan *plan, const DBL *spectrum, DBL *out) {
    const DBL *const wave = QuarterWave(plan);
    if (!wave)
        return ErrOutOfMemory;
    const auto secondNegated = [](Pair x) { return NegatedInPairs(x, false); };
    const auto timesI = [](Pair x) { return NegatedInPairs(Swapped(x), true); };
    const Pair scale(std::sqrt(16.0));
    const Pair w1 = Pair::load(wave + 2) * scale, w2 = Pair::load(wave + 4) * scale;
    const Pair w3 = Pair::load(wave + 6) * scale, w4 = Pair::load(wave + 8) * scale;
    const double z0 = spectrum[0] * std::sqrt(8.0);
    const double z4 = spectrum[4] * w4[1];
    const Pair z1 = Pair(spectrum[1]) * w1, z7 = Pair(spectrum[7]) * w1.reversed();
    const Pair z2 = Pair(spectrum[2]) * w2, z6 = Pair(spectrum[6]) * w2.reversed();
    const Pair z3 = Pair(spectrum[3]) * w3, z5 = Pair(spectrum[5]) * w3.reversed();

    // Real parts of the transform of z0, z2, z4, z6: 0 and 1, then 2 and 3.
    const Pair ends(Pair::Vector{z0 + z4, z0 - z4});
    const Pair middle = z2 + secondNegated(z6);
    const Pair even01 = ends + middle, even23 = ends - middle;
    // Of z1, z3, z5, z7: the real part of 0 with the imaginary one of 2, then 1 and 3 turned by odd eighths.
    const Pair sum15 = z1 + z5, difference15 = z1 - z5;
    const Pair sum37 = z3 + z7, turned37 = timesI(z3 - z7);
    const Pair odd02 = sum15 + secondNegated(sum37);
    const Pair odd1 = difference15 - turned37, odd3 = difference15 + turned37;
    const Pair odd13 =
        Pair(cosineOfEighth) * (PairsLow(odd1, odd3) + secondNegated(PairsHigh(odd1, odd3)));

    const Pair odd01 = PairsLow(odd02, odd13), odd23 = secondNegated(PairsHigh(odd02, odd13));
    const Pair eighth(1.0 / 8);
    const Pair u01 = (even01 + odd01) * eighth, u45 = (even01 - odd01) * eighth;
    const Pair u23 = (even23 + odd23) * eighth, u67 = (even23 - odd23) * eighth;
    u01.store(out);
    PairsHigh(u67, u23.reversed()).store(out + 2);
    PairsLow(u67, u23.reversed()).store(out + 4);
    u45.reversed().store(out + 6);
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
    if (n == 8 && in.size() >= 8)
        return ForwardEight(plan, in.data(), out.data());
    PaddedInput x;
    if (const ErrorCode failed = x.take(in, n))
        return failed;
    const auto forward = n % 2 == 0 ? ForwardEven : ForwardOdd;
    return forward(plan, x.data, out.data(), n, work);
}

ErrorCode DCTInverse(const FFTPlan *plan, ConstRealVector in, RealVector out, DBL *work) {
    const auto n = static_cast<int32_t>(out.size());
    QX_EXPECTS(n >= 1 && in.size() >= n && plan->length == DCTPlanLength(n));
    if (n == 8)
        return InverseEight(plan, in.data(), out.data());
    const auto inverse = n % 2 == 0 ? InverseEven : InverseOdd;
    return inverse(plan, in.data(), out.data(), n, work);
}

} // namespace qx
