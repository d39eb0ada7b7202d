#ifndef QX_FFT_TRANSFORMS_H
#define QX_FFT_TRANSFORMS_H

#include "frame/lanes.h"

#include <cstddef>

// The straight-line transforms are written once and become part of every loop that uses them.
#define QX_INLINE __attribute__((always_inline)) inline

namespace qx {

template <class V>
struct Complex {
    V re, im;
};

// The p-point transforms; fft/kernels/generate.py writes them, each as
//     template <class V, class In, class Out> static void run(const In &in, const Out &out);
// `in.at(j)` gives value j, and `out.set(k, ...)` takes result k. Every value is read before any
// result is given, so the two may be the same memory.

// p complex values to p complex values: at(j) is a Complex<V>, set(k, re, im).
template <int P>
struct ComplexTransform;
// p real values to the half-complex spectrum: setPair(k, h[k], h[k + 1]) for even k, and for odd p
// set(p - 1, h[p - 1]).
template <int P>
struct RealTransform;
// p real values to the complex results q with 2q + 1 <= p of the half-odd frequencies q + 1/2:
// set(q, re, im), and for odd p setReal(q, re) for the last one, which is real.
template <int P>
struct OddTransform;

typedef Lanes<nativeLanes> Wide;
typedef Lanes<1> Narrow;

// a and b interleaved pair by pair: with lanes numbered from 0, the low half is a0 b0 (a2 b2), the
// high half a1 b1 (a3 b3). The same operations take the pairs apart again.
QX_INLINE Wide PairsLow(Wide a, Wide b) {
#ifdef __AVX__
    return Wide(__builtin_shufflevector(a.v, b.v, 0, 4, 2, 6));
#else
    return Wide(__builtin_shufflevector(a.v, b.v, 0, 2));
#endif
}
QX_INLINE Wide PairsHigh(Wide a, Wide b) {
#ifdef __AVX__
    return Wide(__builtin_shufflevector(a.v, b.v, 1, 5, 3, 7));
#else
    return Wide(__builtin_shufflevector(a.v, b.v, 1, 3));
#endif
}

// Two neighbouring doubles from each of nativeLanes / 2 places, and back.
QX_INLINE Wide LoadPairs(const DBL *const *from, std::ptrdiff_t at) {
#ifdef __AVX__
    const Lanes<2> a = Lanes<2>::load(from[0] + at);
    const Lanes<2> b = Lanes<2>::load(from[1] + at);
    return Wide(__builtin_shufflevector(a.v, b.v, 0, 1, 2, 3));
#else
    return Wide::load(from[0] + at);
#endif
}
QX_INLINE void StorePairs(Wide pairs, DBL *const *to, std::ptrdiff_t at) {
#ifdef __AVX__
    Lanes<2>(__builtin_shufflevector(pairs.v, pairs.v, 0, 1)).store(to[0] + at);
    Lanes<2>(__builtin_shufflevector(pairs.v, pairs.v, 2, 3)).store(to[1] + at);
#else
    pairs.store(to[0] + at);
#endif
}

// The column that stands in a lane after interleaved complex data has been taken apart: 0 2 1 3.
inline constexpr int laneColumn(int lane) {
    return nativeLanes == 4 && (lane == 1 || lane == 2) ? 3 - lane : lane;
}

} // namespace qx

#endif
