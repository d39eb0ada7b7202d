#ifndef QX_FFT_TRANSFORMS_H
#define QX_FFT_TRANSFORMS_H

#include "frame/lanes.h"

#include <cstddef>
#include <cstdint>

// The straight-line transforms are written once and inlined into every loop that uses them.

namespace qx::QX_WIDTH {

template <class V>
struct Complex {
    V re, im;
};

// The p-point transforms; fft/kernels/generate.py writes them, each as
//     template <class V, class In, class Out> static void run(const In &in, const Out &out);
// `in.at(j)` gives value j, and `out.set(k, ...)` takes result k. Every value is read before any
// result is given, so the two may be the same memory.

// p complex values to p complex values, with real and imaginary parts interleaved in a V:
// set(k, value). A Lanes<2> holds one column, a Lanes<4> two.
template <int P>
struct PackedTransform;
// The same with each part in a V of its own: at(j) is a Complex<V>, set(k, re, im).
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

template <int N>
QX_INLINE Lanes<N> TimesI(Lanes<N> x) {
    return NegatedInPairs(Swapped(x), true);
}

// x (c - i s)
template <int N>
QX_INLINE Lanes<N> Turned(Lanes<N> x, double c, double s) {
    return x * Lanes<N>(c) + Swapped(x) * InEveryPair<N>(One(One::Vector{s, -s}));
}

// x times the packed w.
template <int N>
QX_INLINE Lanes<N> Twiddled(Lanes<N> x, Lanes<N> w) {
    // Eight lanes have no instruction that alternately adds and subtracts.
    if constexpr (N == 8)
        return x * FirstsTwice(w) + Swapped(x) * NegatedInPairs(SecondsTwice(w), true);
    else
        return MinusPlus(x * FirstsTwice(w), Swapped(x) * SecondsTwice(w));
}

} // namespace qx::QX_WIDTH

#endif
