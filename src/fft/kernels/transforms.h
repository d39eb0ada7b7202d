#ifndef QX_FFT_TRANSFORMS_H
#define QX_FFT_TRANSFORMS_H

#include "frame/lanes.h"

#include <cstddef>
#include <cstdint>

// The straight-line transforms are written once and become part of every loop that uses them.

namespace qx::QX_WIDTH {

template <class V>
struct Complex {
    V re, im;
};

// The p-point transforms; fft/kernels/generate.py writes them, each as
//     template <class V, class In, class Out> static void run(const In &in, const Out &out);
// `in.at(j)` gives value j, and `out.set(k, ...)` takes result k. Every value is read before any
// result is given, so the two may be the same memory.

// p complex values to p complex values, in a V real part beside imaginary part: set(k, value). A
// Lanes<2> holds one column, a Lanes<4> two.
template <int P>
struct PackedTransform;
// The same with the parts in a V each: at(j) is a Complex<V>, set(k, re, im).
template <int P>
struct SplitTransform;
// p real values to the half-complex spectrum: setPair(k, h[k], h[k + 1]) for even k, and for odd p
// set(p - 1, h[p - 1]).
template <int P>
struct RealTransform;
// For even p, p real values to the complex results q with 2q + 1 < p of the half-odd frequencies
// q + 1/2: set(q, re, im).
template <int P>
struct OddTransform;

typedef Lanes<nativeLanes> Wide;
typedef Lanes<2> One; // one packed complex value
typedef Lanes<1> Narrow;

// ---- Packed complex values ----

// Real and imaginary parts exchanged.
QX_INLINE Lanes<2> Swapped(Lanes<2> x) { return x.reversed(); }
QX_INLINE Lanes<4> Swapped(Lanes<4> x) {
    return Lanes<4>(__builtin_shufflevector(x.v, x.v, 1, 0, 3, 2));
}

// a with its real parts less those of b, its imaginary parts plus those of b.
QX_INLINE Lanes<2> MinusPlus(Lanes<2> a, Lanes<2> b) {
#ifdef __SSE3__
    return Lanes<2>(__builtin_shufflevector((a - b).v, (a + b).v, 0, 3));
#else
    typedef int64_t Bits __attribute__((vector_size(16)));
    const Bits sign = {INT64_MIN, 0};
    return a + Lanes<2>((Lanes<2>::Vector)((Bits)b.v ^ sign));
#endif
}
QX_INLINE Lanes<4> MinusPlus(Lanes<4> a, Lanes<4> b) {
    return Lanes<4>(__builtin_shufflevector((a - b).v, (a + b).v, 0, 5, 2, 7));
}

QX_INLINE Lanes<2> TimesI(Lanes<2> x) {
    typedef int64_t Bits __attribute__((vector_size(16)));
    const Bits sign = {INT64_MIN, 0};
    return Lanes<2>((Lanes<2>::Vector)((Bits)Swapped(x).v ^ sign));
}
QX_INLINE Lanes<4> TimesI(Lanes<4> x) {
    typedef int64_t Bits __attribute__((vector_size(32)));
    const Bits sign = {INT64_MIN, 0, INT64_MIN, 0};
    return Lanes<4>((Lanes<4>::Vector)((Bits)Swapped(x).v ^ sign));
}

// x (c - i s)
QX_INLINE Lanes<2> Turned(Lanes<2> x, double c, double s) {
    return x * Lanes<2>(c) + Swapped(x) * Lanes<2>(Lanes<2>::Vector{s, -s});
}
QX_INLINE Lanes<4> Turned(Lanes<4> x, double c, double s) {
    return x * Lanes<4>(c) + Swapped(x) * Lanes<4>(Lanes<4>::Vector{s, -s, s, -s});
}

// x times the packed w.
QX_INLINE Lanes<2> Twiddled(Lanes<2> x, Lanes<2> w) {
    const Lanes<2> c(__builtin_shufflevector(w.v, w.v, 0, 0));
    const Lanes<2> s(__builtin_shufflevector(w.v, w.v, 1, 1));
    return MinusPlus(x * c, Swapped(x) * s);
}
QX_INLINE Lanes<4> Twiddled(Lanes<4> x, Lanes<4> w) {
    const Lanes<4> c(__builtin_shufflevector(w.v, w.v, 0, 0, 2, 2));
    const Lanes<4> s(__builtin_shufflevector(w.v, w.v, 1, 1, 3, 3));
    return MinusPlus(x * c, Swapped(x) * s);
}

// ---- Pairs of neighbouring doubles ----

// a and b interleaved pair by pair: with lanes numbered from 0, the low half is a0 b0 (a2 b2), the
// high half a1 b1 (a3 b3). The same operations take the pairs apart again.
QX_INLINE Wide PairsLow(Wide a, Wide b) {
#ifdef __AVX2__
    return Wide(__builtin_shufflevector(a.v, b.v, 0, 4, 2, 6));
#else
    return Wide(__builtin_shufflevector(a.v, b.v, 0, 2));
#endif
}
QX_INLINE Wide PairsHigh(Wide a, Wide b) {
#ifdef __AVX2__
    return Wide(__builtin_shufflevector(a.v, b.v, 1, 5, 3, 7));
#else
    return Wide(__builtin_shufflevector(a.v, b.v, 1, 3));
#endif
}

// Two neighbouring doubles from each of nativeLanes / 2 places, and back.
QX_INLINE Wide LoadPairs(const DBL *const *from, std::ptrdiff_t at) {
#ifdef __AVX2__
    const Lanes<2> a = Lanes<2>::load(from[0] + at);
    const Lanes<2> b = Lanes<2>::load(from[1] + at);
    return Wide(__builtin_shufflevector(a.v, b.v, 0, 1, 2, 3));
#else
    return Wide::load(from[0] + at);
#endif
}
QX_INLINE void StorePairs(Wide pairs, DBL *const *to, std::ptrdiff_t at) {
#ifdef __AVX2__
    Lanes<2>(__builtin_shufflevector(pairs.v, pairs.v, 0, 1)).store(to[0] + at);
    // As a shuffle g++ makes it one across lanes and a store.
    Lanes<2>(__builtin_ia32_vextractf128_pd256(pairs.v, 1)).store(to[1] + at);
#else
    pairs.store(to[0] + at);
#endif
}

} // namespace qx::QX_WIDTH

#endif
