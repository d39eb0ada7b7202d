#ifndef QX_FFT_WHOLE_H
#define QX_FFT_WHOLE_H

#include "fft/kernels/kernel_set.h"

// Single transforms of contiguous values.

namespace qx::QX_WIDTH {

// ---- Primes ----
//
// A single transform has no columns to fill the lanes, so for odd primes the lanes hold frequencies.
// The arithmetic is that of the straight-line transform: mirrored values are added and subtracted,
// and X[k] and X[P-k] are formed from the same two sums over them, in ascending order.

constexpr bool runsOverFrequencies(int p) { return p >= 11 && p % 2 != 0 && p != 15; }

// For j from 1 to P / 2, a row of cos and -sin of 2 pi j k / P for k from 1, an even number of
// pairs.
template <int P>
struct PrimeTurns;

template <int P>
constexpr int primeRow = 2 * ((P / 2 + 1) / 2 * 2);
// The number of registers that hold all frequencies, and how many of them accumulate at a time.
template <int P>
constexpr int primeWides = (P / 2 + packedColumns - 1) / packedColumns;
template <int P, int Most>
constexpr int primeBlock = (primeWides<P> + (primeWides<P> + Most - 1) / Most - 1) /
                           ((primeWides<P> + Most - 1) / Most);

// The frequencies in the registers First to First + Count - 1, from `start` and the pairs (sum,
// difference) of mirrored values.
template <int P, int First, int Count>
QX_INLINE void RealPrimeBlock(One start, const One *mirrored, DBL *h) {
    Wide value[Count];
    for (int i = 0; i < Count; ++i)
        value[i] = InEveryPair<nativeLanes>(start);
    for (int j = 0; j < P / 2; ++j) {
        const double *const turns = PrimeTurns<P>::rows + j * primeRow<P> + First * nativeLanes;
        const Wide pair = InEveryPair<nativeLanes>(mirrored[j]);
        for (int i = 0; i < Count; ++i)
            value[i] = value[i] + pair * Wide::load(turns + i * nativeLanes);
    }
    for (int i = 0; i < Count * packedColumns; ++i) {
        const int k = First * packedColumns + i + 1;
        if (k > P / 2)
            break;
        h[k] = value[i / packedColumns][2 * (i % packedColumns)];
        h[P - k] = value[i / packedColumns][2 * (i % packedColumns) + 1];
    }
}

template <int P>
QX_INLINE void RealPrime(const DBL *x, DBL *h) {
    One mirrored[P / 2];
    double total = x[0];
    for (int j = 0; j < P / 2; ++j) {
        const double left = x[j + 1];
        const double right = x[P - 1 - j];
        mirrored[j] = One(One::Vector{left + right, left - right});
        total = total + (left + right);
    }
    h[0] = total;
    const One start(One::Vector{x[0], 0.0});
    constexpr int block = primeBlock<P, 8>;
    constexpr int rest = primeWides<P> % block;
    if constexpr (primeWides<P> >= block)
        RealPrimeBlock<P, 0, block>(start, mirrored, h);
    if constexpr (primeWides<P> >= 2 * block)
        RealPrimeBlock<P, block, block>(start, mirrored, h);
    if constexpr (primeWides<P> >= 3 * block)
        RealPrimeBlock<P, 2 * block, block>(start, mirrored, h);
    if constexpr (rest != 0)
        RealPrimeBlock<P, primeWides<P> - rest, rest>(start, mirrored, h);
}

// The same for complex values: sums and i times the differences are accumulated separately.
template <int P, int First, int Count>
QX_INLINE void ComplexPrimeBlock(One start, const One *sums, const One *differences, DBL *y) {
    Wide even[Count], odd[Count];
    for (int i = 0; i < Count; ++i) {
        even[i] = InEveryPair<nativeLanes>(start);
        odd[i] = Wide(0.0);
    }
    for (int j = 0; j < P / 2; ++j) {
        const double *const turns = PrimeTurns<P>::rows + j * primeRow<P> + First * nativeLanes;
        const Wide sum = InEveryPair<nativeLanes>(sums[j]);
        const Wide difference = InEveryPair<nativeLanes>(differences[j]);
        for (int i = 0; i < Count; ++i) {
            const Wide turn = Wide::load(turns + i * nativeLanes);
            even[i] = even[i] + sum * FirstsTwice(turn);
            odd[i] = odd[i] + difference * SecondsTwice(turn);
        }
    }
    for (int i = 0; i < Count; ++i) {
        const Wide direct = even[i] + odd[i];
        const Wide mirrored = even[i] - odd[i];
        for (int column = 0; column < packedColumns; ++column) {
            const int k = (First + i) * packedColumns + column + 1;
            if (k > P / 2)
                break;
            y[2 * k] = direct[2 * column];
            y[2 * k + 1] = direct[2 * column + 1];
            y[2 * (P - k)] = mirrored[2 * column];
            y[2 * (P - k) + 1] = mirrored[2 * column + 1];
        }
    }
}

template <int P>
QX_INLINE void ComplexPrime(const DBL *x, DBL *y) {
    One sums[P / 2], differences[P / 2];
    const One start = One::load(x);
    One total = start;
    for (int j = 0; j < P / 2; ++j) {
        const One left = One::load(x + 2 * (j + 1));
        const One right = One::load(x + 2 * (P - 1 - j));
        sums[j] = left + right;
        differences[j] = TimesI(left - right);
        total = total + sums[j];
    }
    total.store(y);
    constexpr int block = primeBlock<P, 5>;
    constexpr int rest = primeWides<P> % block;
    if constexpr (primeWides<P> >= block)
        ComplexPrimeBlock<P, 0, block>(start, sums, differences, y);
    if constexpr (primeWides<P> >= 2 * block)
        ComplexPrimeBlock<P, block, block>(start, sums, differences, y);
    if constexpr (primeWides<P> >= 3 * block)
        ComplexPrimeBlock<P, 2 * block, block>(start, sums, differences, y);
    if constexpr (primeWides<P> >= 4 * block)
        ComplexPrimeBlock<P, 3 * block, block>(start, sums, differences, y);
    if constexpr (primeWides<P> >= 5 * block)
        ComplexPrimeBlock<P, 4 * block, block>(start, sums, differences, y);
    if constexpr (rest != 0)
        ComplexPrimeBlock<P, primeWides<P> - rest, rest>(start, sums, differences, y);
}

// ---- Other lengths ----

template <int P>
QX_INLINE void WholeComplexTransform(const DBL *in, DBL *out) {
    if constexpr (runsOverFrequencies(P))
        ComplexPrime<P>(in, out);
    else
        RunPacked<P, One>(SideBySideIn{in}, SideBySideOut{out});
}

template <int P>
QX_INLINE void WholeRealTransform(const DBL *in, DBL *out) {
    if constexpr (runsOverFrequencies(P))
        RealPrime<P>(in, out);
    else
        RunReal<P, Narrow>(RealColumnIn{in, 1}, RealColumnOut{out, 1});
}

// A real transform of P = 2 m values as a complex one of m: the values of even index are its real
// parts, those of odd index its imaginary ones. With Z its spectrum, those of the even and of the
// odd values are E = (Z[k] + conj Z[m-k]) / 2 and O = -i (Z[k] - conj Z[m-k]) / 2, and X[k] =
// E + w O, X[m-k] = conj (E - w O) with w = exp(-2 pi i k / P). `turns` are the halved cosines
// and sines of the angles 2 pi k / P for k from 1 to (m - 1) / 2.
template <int P>
QX_INLINE void RealByHalf(const DBL *in, DBL *h, const double *turns) {
    constexpr int m = P / 2;
    const auto conjugate = [](One x) { return NegatedInPairs(x, false); };

    double z[P];
    WholeComplexTransform<m>(in, z);
    h[0] = z[0] + z[1];
    h[m] = z[0] - z[1];
#pragma GCC unroll 16
    for (int k = 1; 2 * k < m; ++k) {
        const One low = One::load(z + 2 * k);
        const One high = conjugate(One::load(z + 2 * (m - k)));
        const One even = (low + high) * One(0.5);
        const One odd = Turned(low - high, -turns[2 * k - 1], turns[2 * k - 2]);
        const One direct = even + odd;
        const One mirrored = conjugate(even - odd);
        h[k] = direct[0];
        h[P - k] = direct[1];
        h[m - k] = mirrored[0];
        h[m + k] = mirrored[1];
    }
    if constexpr (m % 2 == 0) {
        h[m / 2] = z[m];
        h[m + m / 2] = -z[m + 1];
    }
}

} // namespace qx::QX_WIDTH

#endif
