#ifndef QX_FRAME_LANES_H
#define QX_FRAME_LANES_H

#include "frame/widths.h"
#include "qx/types.h"

#include <cstddef>
#include <cstdint>

#ifdef __aarch64__
#include <arm_neon.h>
#define QX_VECTOR_REGISTER "w"
#else
#define QX_VECTOR_REGISTER "x"
#endif

// QX_VECTOR_REGISTER is the assembly constraint for a register of lanes.

// Operations are inlined into the loop that uses them at every optimisation level.
#define QX_INLINE __attribute__((always_inline)) inline

// Placed before a loop of at most eight iterations over an array of vectors, so that the array
// stays in registers: g++ 12 by itself unrolls some of these loops too late for that.
#ifdef __clang__
#define QX_UNROLLED _Pragma("unroll")
#else
#define QX_UNROLLED _Pragma("GCC unroll 8")
#endif

namespace qx {

// SIMD over independent elements: Lanes<N> holds N doubles, and every operation does in each lane
// exactly what it would do to a single double. Code written over Lanes therefore gives the same
// bits for every N, and an array may be split into Lanes<nativeLanes> and a remainder of Lanes<1>
// at any point.
//
//     template <class L>
//     void ScaleSome(DBL *x, double factor) { (L::load(x) * L(factor)).store(x); }
//
//     for (; i + nativeLanes <= n; i += nativeLanes) ScaleSome<Lanes<nativeLanes>>(x + i, f);
//     for (; i < n; ++i) ScaleSome<Lanes<1>>(x + i, f);
//
// Memory need not be aligned. N is 1, 2, 4 or 8. Everything that depends on the instruction set is
// here and nowhere else; comparisons and selections are in frame/lane_masks.h.

// What the instruction set of the build offers. All that follows is in a namespace for each build,
// so that the linker cannot take it from another build.
#ifdef __AVX512F__
inline namespace lanes8 {
constexpr int nativeLanes = 8;
#elif defined(__AVX2__)
inline namespace lanes4 {
constexpr int nativeLanes = 4;
#else
inline namespace lanes2 {
constexpr int nativeLanes = 2;
#endif

template <int N>
struct LaneVector;
template <>
struct LaneVector<2> {
    typedef double type __attribute__((vector_size(16)));
    typedef double inMemory __attribute__((vector_size(16), aligned(1), may_alias));
    static QX_INLINE type broadcast(double x) { return type{x, x}; }
};
template <>
struct LaneVector<4> {
    typedef double type __attribute__((vector_size(32)));
    typedef double inMemory __attribute__((vector_size(32), aligned(1), may_alias));
    static QX_INLINE type broadcast(double x) { return type{x, x, x, x}; }
};
template <>
struct LaneVector<8> {
    typedef double type __attribute__((vector_size(64)));
    typedef double inMemory __attribute__((vector_size(64), aligned(1), may_alias));
    static QX_INLINE type broadcast(double x) { return type{x, x, x, x, x, x, x, x}; }
};

template <int N>
struct LaneInteger;
template <>
struct LaneInteger<1> {
    typedef int64_t type;
};
template <>
struct LaneInteger<2> {
    typedef int64_t type __attribute__((vector_size(16)));
};
template <>
struct LaneInteger<4> {
    typedef int64_t type __attribute__((vector_size(32)));
};
template <>
struct LaneInteger<8> {
    typedef int64_t type __attribute__((vector_size(64)));
};

template <int N>
class Lanes {
public:
    typedef typename LaneVector<N>::type Vector;
    static constexpr int count = N;

    QX_INLINE Lanes() = default;
    // The same value in every lane.
    QX_INLINE explicit Lanes(double value) : v(LaneVector<N>::broadcast(value)) {}
    QX_INLINE explicit Lanes(Vector vector) : v(vector) {}

    // Through a pointer to an unaligned vector type, not std::memcpy, which g++ 12 compiles to a
    // copy on the stack.
    static QX_INLINE Lanes load(const DBL *x) {
        return Lanes(Vector(*reinterpret_cast<const typename LaneVector<N>::inMemory *>(x)));
    }
    QX_INLINE void store(DBL *x) const {
        *reinterpret_cast<typename LaneVector<N>::inMemory *>(x) = v;
    }

    // The first `some` elements, with zeros in the remaining lanes; and the store of those elements
    // only.
    static QX_INLINE Lanes loadFirst(const DBL *x, std::ptrdiff_t some) {
#ifdef __AVX512F__
        if constexpr (N == 8)
            return Lanes(
                __builtin_ia32_loadupd512_mask(reinterpret_cast<const double *>(x), Vector{},
                                               static_cast<unsigned char>((1U << some) - 1)));
#endif
        Vector first = {};
        for (std::ptrdiff_t i = 0; i < some; ++i)
            first[i] = x[i];
        return Lanes(first);
    }
    QX_INLINE void storeFirst(DBL *x, std::ptrdiff_t some) const {
#ifdef __AVX512F__
        if constexpr (N == 8)
            return __builtin_ia32_storeupd512_mask(reinterpret_cast<double *>(x), v,
                                                   static_cast<unsigned char>((1U << some) - 1));
#endif
        for (std::ptrdiff_t i = 0; i < some; ++i)
            x[i] = v[i];
    }

    // Elements 0, stride, 2 stride, ...
    static QX_INLINE Lanes gather(const DBL *x, std::ptrdiff_t stride) {
        if constexpr (N == 2)
            return Lanes(Vector{x[0], x[stride]});
        else if constexpr (N == 4)
            return Lanes(Vector{x[0], x[stride], x[2 * stride], x[3 * stride]});
        else
            return Lanes(Vector{x[0], x[stride], x[2 * stride], x[3 * stride], x[4 * stride],
                                x[5 * stride], x[6 * stride], x[7 * stride]});
    }
    QX_INLINE void scatter(DBL *x, std::ptrdiff_t stride) const {
        for (int i = 0; i < N; ++i)
            x[i * stride] = v[i];
    }

    // The lanes in reverse order.
    QX_INLINE Lanes reversed() const {
        if constexpr (N == 2)
            return Lanes(__builtin_shufflevector(v, v, 1, 0));
        else if constexpr (N == 4)
            return Lanes(__builtin_shufflevector(v, v, 3, 2, 1, 0));
        else
            return Lanes(__builtin_shufflevector(v, v, 7, 6, 5, 4, 3, 2, 1, 0));
    }

    // Evens and Odds take every second value of a followed by b, from the first or the second on.
    // TurnsLow and TurnsHigh interleave the first or the second halves of a and b. (Not for N = 1.)
    friend QX_INLINE Lanes Evens(Lanes a, Lanes b) {
        if constexpr (N == 2)
            return Lanes(__builtin_shufflevector(a.v, b.v, 0, 2));
        else if constexpr (N == 4)
            return Lanes(__builtin_shufflevector(a.v, b.v, 0, 2, 4, 6));
        else
            return Lanes(__builtin_shufflevector(a.v, b.v, 0, 2, 4, 6, 8, 10, 12, 14));
    }
    friend QX_INLINE Lanes Odds(Lanes a, Lanes b) {
        if constexpr (N == 2)
            return Lanes(__builtin_shufflevector(a.v, b.v, 1, 3));
        else if constexpr (N == 4)
            return Lanes(__builtin_shufflevector(a.v, b.v, 1, 3, 5, 7));
        else
            return Lanes(__builtin_shufflevector(a.v, b.v, 1, 3, 5, 7, 9, 11, 13, 15));
    }
    friend QX_INLINE Lanes TurnsLow(Lanes a, Lanes b) {
        if constexpr (N == 2)
            return Lanes(__builtin_shufflevector(a.v, b.v, 0, 2));
        else if constexpr (N == 4)
            return Lanes(__builtin_shufflevector(a.v, b.v, 0, 4, 1, 5));
        else
            return Lanes(__builtin_shufflevector(a.v, b.v, 0, 8, 1, 9, 2, 10, 3, 11));
    }
    friend QX_INLINE Lanes TurnsHigh(Lanes a, Lanes b) {
        if constexpr (N == 2)
            return Lanes(__builtin_shufflevector(a.v, b.v, 1, 3));
        else if constexpr (N == 4)
            return Lanes(__builtin_shufflevector(a.v, b.v, 2, 6, 3, 7));
        else
            return Lanes(__builtin_shufflevector(a.v, b.v, 4, 12, 5, 13, 6, 14, 7, 15));
    }

    // a and b interleaved pair by pair: with lanes numbered from 0, the low half is a0 b0
    // (a2 b2 ...), the high half a1 b1 (a3 b3 ...). Applied again, they restore a and b.
    friend QX_INLINE Lanes PairsLow(Lanes a, Lanes b) {
        if constexpr (N == 2)
            return Lanes(__builtin_shufflevector(a.v, b.v, 0, 2));
        else if constexpr (N == 4)
            return Lanes(__builtin_shufflevector(a.v, b.v, 0, 4, 2, 6));
        else
            return Lanes(__builtin_shufflevector(a.v, b.v, 0, 8, 2, 10, 4, 12, 6, 14));
    }
    friend QX_INLINE Lanes PairsHigh(Lanes a, Lanes b) {
        if constexpr (N == 2)
            return Lanes(__builtin_shufflevector(a.v, b.v, 1, 3));
        else if constexpr (N == 4)
            return Lanes(__builtin_shufflevector(a.v, b.v, 1, 5, 3, 7));
        else
            return Lanes(__builtin_shufflevector(a.v, b.v, 1, 9, 3, 11, 5, 13, 7, 15));
    }

    QX_INLINE double operator[](int lane) const { return v[lane]; }

    friend QX_INLINE Lanes operator+(Lanes a, Lanes b) { return Lanes(a.v + b.v); }
    friend QX_INLINE Lanes operator-(Lanes a, Lanes b) { return Lanes(a.v - b.v); }
    friend QX_INLINE Lanes operator*(Lanes a, Lanes b) { return Lanes(a.v * b.v); }
    friend QX_INLINE Lanes operator/(Lanes a, Lanes b) { return Lanes(a.v / b.v); }
    friend QX_INLINE Lanes operator-(Lanes a) { return Lanes(-a.v); }

    Vector v;
};

template <>
class Lanes<1> {
public:
    static constexpr int count = 1;

    QX_INLINE Lanes() = default;
    QX_INLINE explicit Lanes(double value) : v(value) {}

    static QX_INLINE Lanes load(const DBL *x) { return Lanes(*x); }
    QX_INLINE void store(DBL *x) const { *x = v; }
    static QX_INLINE Lanes gather(const DBL *x, std::ptrdiff_t) { return Lanes(*x); }
    QX_INLINE void scatter(DBL *x, std::ptrdiff_t) const { *x = v; }
    QX_INLINE Lanes reversed() const { return *this; }
    QX_INLINE double operator[](int) const { return v; }

    friend QX_INLINE Lanes operator+(Lanes a, Lanes b) { return Lanes(a.v + b.v); }
    friend QX_INLINE Lanes operator-(Lanes a, Lanes b) { return Lanes(a.v - b.v); }
    friend QX_INLINE Lanes operator*(Lanes a, Lanes b) { return Lanes(a.v * b.v); }
    friend QX_INLINE Lanes operator/(Lanes a, Lanes b) { return Lanes(a.v / b.v); }
    friend QX_INLINE Lanes operator-(Lanes a) { return Lanes(-a.v); }

    double v;
};

// x times the number at `factor`, in every lane.
template <int N>
QX_INLINE Lanes<N> Times(Lanes<N> x, const DBL *factor) {
#if defined(__AVX512F__) && !defined(__clang__)
    // One instruction. g++ would split it where the number is used again, but on AMD's Zen 4 a
    // broadcast to eight lanes takes the place of arithmetic, and reading the number with each
    // product does not.
    if constexpr (N == 8) {
        typename Lanes<N>::Vector product;
        __asm__("vmulpd %2%{1to8%}, %1, %0" : "=v"(product) : "v"(x.v), "m"(*factor));
        return Lanes<N>(product);
    }
#endif
    return Lanes<N>(*factor) * x;
}

// ---- Neighbouring lanes as pairs, such as the parts of complex values ----

// The first, or the second, value of each pair in both places of the pair.
template <int N>
QX_INLINE Lanes<N> FirstsTwice(Lanes<N> x) {
    if constexpr (N == 2)
        return Lanes<N>(__builtin_shufflevector(x.v, x.v, 0, 0));
    else if constexpr (N == 4)
        return Lanes<N>(__builtin_shufflevector(x.v, x.v, 0, 0, 2, 2));
    else
        return Lanes<N>(__builtin_shufflevector(x.v, x.v, 0, 0, 2, 2, 4, 4, 6, 6));
}
template <int N>
QX_INLINE Lanes<N> SecondsTwice(Lanes<N> x) {
    if constexpr (N == 2)
        return Lanes<N>(__builtin_shufflevector(x.v, x.v, 1, 1));
    else if constexpr (N == 4)
        return Lanes<N>(__builtin_shufflevector(x.v, x.v, 1, 1, 3, 3));
    else
        return Lanes<N>(__builtin_shufflevector(x.v, x.v, 1, 1, 3, 3, 5, 5, 7, 7));
}
// The two values of each pair exchanged.
template <int N>
QX_INLINE Lanes<N> Swapped(Lanes<N> x) {
    if constexpr (N == 2)
        return x.reversed();
    else if constexpr (N == 4)
        return Lanes<N>(__builtin_shufflevector(x.v, x.v, 1, 0, 3, 2));
    else
        return Lanes<N>(__builtin_shufflevector(x.v, x.v, 1, 0, 3, 2, 5, 4, 7, 6));
}
// The pairs in reverse order.
template <int N>
QX_INLINE Lanes<N> ReversedPairs(Lanes<N> x) {
    if constexpr (N == 2)
        return x;
    else if constexpr (N == 4)
        return Lanes<N>(__builtin_shufflevector(x.v, x.v, 2, 3, 0, 1));
    else
        return Lanes<N>(__builtin_shufflevector(x.v, x.v, 6, 7, 4, 5, 2, 3, 0, 1));
}

template <int N>
QX_INLINE Lanes<2> FirstPair(Lanes<N> x) {
    return Lanes<2>(__builtin_shufflevector(x.v, x.v, 0, 1));
}
// One pair, repeated in all pairs.
template <int N>
QX_INLINE Lanes<N> InEveryPair(Lanes<2> x) {
    if constexpr (N == 2)
        return x;
    else if constexpr (N == 4)
        return Lanes<N>(__builtin_shufflevector(x.v, x.v, 0, 1, 0, 1));
    else
        return Lanes<N>(__builtin_shufflevector(x.v, x.v, 0, 1, 0, 1, 0, 1, 0, 1));
}
// The first, or the second, values of all pairs with the opposite sign.
template <int N>
QX_INLINE Lanes<N> NegatedInPairs(Lanes<N> x, bool first) {
    const int64_t one = first ? INT64_MIN : 0, other = first ? 0 : INT64_MIN;
    typedef typename LaneInteger<N>::type Bits;
    Bits sign;
    if constexpr (N == 2)
        sign = Bits{one, other};
    else if constexpr (N == 4)
        sign = Bits{one, other, one, other};
    else
        sign = Bits{one, other, one, other, one, other, one, other};
    return Lanes<N>((typename Lanes<N>::Vector)((Bits)x.v ^ sign));
}
// a - b in the first values, a + b in the second ones.
QX_INLINE Lanes<2> MinusPlus(Lanes<2> a, Lanes<2> b) {
#ifdef __SSE3__
    return Lanes<2>(__builtin_shufflevector((a - b).v, (a + b).v, 0, 3));
#else
    return a + NegatedInPairs(b, true);
#endif
}
QX_INLINE Lanes<4> MinusPlus(Lanes<4> a, Lanes<4> b) {
    return Lanes<4>(__builtin_shufflevector((a - b).v, (a + b).v, 0, 5, 2, 7));
}
QX_INLINE Lanes<8> MinusPlus(Lanes<8> a, Lanes<8> b) {
    return Lanes<8>(__builtin_shufflevector((a - b).v, (a + b).v, 0, 9, 2, 11, 4, 13, 6, 15));
}

// Loads pairs from N / 2 places, or stores them there.
template <int N>
QX_INLINE Lanes<N> LoadPairs(const DBL *const *from, std::ptrdiff_t at) {
    const Lanes<2> a = Lanes<2>::load(from[0] + at);
    if constexpr (N == 2)
        return a;
    else if constexpr (N == 4)
        return Lanes<N>(__builtin_shufflevector(a.v, Lanes<2>::load(from[1] + at).v, 0, 1, 2, 3));
    else
        return Lanes<N>(__builtin_shufflevector(
            LoadPairs<4>(from, at).v, LoadPairs<4>(from + 2, at).v, 0, 1, 2, 3, 4, 5, 6, 7));
}
QX_INLINE void StorePairs(Lanes<2> pairs, DBL *const *to, std::ptrdiff_t at) {
    pairs.store(to[0] + at);
}
QX_INLINE void StorePairs(Lanes<4> pairs, DBL *const *to, std::ptrdiff_t at) {
    Lanes<2>(__builtin_shufflevector(pairs.v, pairs.v, 0, 1)).store(to[0] + at);
#ifdef __AVX2__
    // Written as a shuffle, g++ compiles this to a shuffle across lanes and a store.
    Lanes<2>(__builtin_ia32_vextractf128_pd256(pairs.v, 1)).store(to[1] + at);
#else
    Lanes<2>(__builtin_shufflevector(pairs.v, pairs.v, 2, 3)).store(to[1] + at);
#endif
}
QX_INLINE void StorePairs(Lanes<8> pairs, DBL *const *to, std::ptrdiff_t at) {
    StorePairs(Lanes<4>(__builtin_shufflevector(pairs.v, pairs.v, 0, 1, 2, 3)), to, at);
    StorePairs(Lanes<4>(__builtin_shufflevector(pairs.v, pairs.v, 4, 5, 6, 7)), to + 2, at);
}

// ---- Other lanes ----

// Transposes a square block of N vectors: lane j of vector i and lane i of vector j exchange
// places. Interleaves the two halves of the vectors log2(N) times.
template <int N>
QX_INLINE void Transpose(Lanes<N> *block) {
    if constexpr (N == 4) { // within pairs, then pair by pair: a third of the instructions
        const auto low = PairsLow(block[0], block[1]).v, lowBehind = PairsLow(block[2], block[3]).v;
        const auto high = PairsHigh(block[0], block[1]).v;
        const auto highBehind = PairsHigh(block[2], block[3]).v;
        block[0] = Lanes<N>(__builtin_shufflevector(low, lowBehind, 0, 1, 4, 5));
        block[1] = Lanes<N>(__builtin_shufflevector(high, highBehind, 0, 1, 4, 5));
        block[2] = Lanes<N>(__builtin_shufflevector(low, lowBehind, 2, 3, 6, 7));
        block[3] = Lanes<N>(__builtin_shufflevector(high, highBehind, 2, 3, 6, 7));
        return;
    }
    for (int half = N; half > 1; half /= 2) {
        Lanes<N> turned[N];
        for (int i = 0; i < N / 2; ++i) {
            turned[2 * i] = TurnsLow(block[i], block[i + N / 2]);
            turned[2 * i + 1] = TurnsHigh(block[i], block[i + N / 2]);
        }
        for (int i = 0; i < N; ++i)
            block[i] = turned[i];
    }
}

// Makes the compiler load x into a register once, not once per use.
template <int N>
QX_INLINE void KeepInRegister(Lanes<N> &x) {
    asm("" : "+" QX_VECTOR_REGISTER(x.v));
}

// Lane i is the value at the i-th of N places.
template <int N>
QX_INLINE Lanes<N> LoadEach(const DBL *const *from, std::ptrdiff_t at) {
    if constexpr (N == 2)
        return Lanes<N>(typename Lanes<N>::Vector{from[0][at], from[1][at]});
    else if constexpr (N == 4)
        return Lanes<N>(
            typename Lanes<N>::Vector{from[0][at], from[1][at], from[2][at], from[3][at]});
    else
        return Lanes<N>(typename Lanes<N>::Vector{from[0][at], from[1][at], from[2][at],
                                                  from[3][at], from[4][at], from[5][at],
                                                  from[6][at], from[7][at]});
}

// N 32-bit integers as floating-point numbers.
template <int N>
QX_INLINE Lanes<N> OfIntegers(const int32_t *numbers) {
    typedef int32_t Integers __attribute__((vector_size(4 * N)));
    typedef int32_t InMemory __attribute__((vector_size(4 * N), aligned(1), may_alias));
    const Integers all = *reinterpret_cast<const InMemory *>(numbers);
    return Lanes<N>(__builtin_convertvector(all, typename Lanes<N>::Vector));
}

// to[i] = from[i] + offset for i below 8.
QX_INLINE void StoreEightIncreased(const int32_t *from, int32_t offset, int32_t *to) {
    typedef int32_t Eight __attribute__((vector_size(32)));
    typedef int32_t InMemory __attribute__((vector_size(32), aligned(1), may_alias));
    const Eight numbers = *reinterpret_cast<const InMemory *>(from);
    *reinterpret_cast<InMemory *>(to) = numbers + offset;
}

// The sign bits of the lanes, lane 0 in the lowest bit.
QX_INLINE unsigned SignBits(Lanes<2> x) {
#ifdef __SSE2__
    return static_cast<unsigned>(__builtin_ia32_movmskpd(x.v));
#else
    typedef uint64_t Bits __attribute__((vector_size(16)));
    const Bits signs = (Bits)x.v >> 63;
    return static_cast<unsigned>(signs[0] | signs[1] << 1);
#endif
}
QX_INLINE unsigned SignBits(Lanes<4> x) {
#ifdef __AVX2__
    return static_cast<unsigned>(__builtin_ia32_movmskpd256(x.v));
#else
    return SignBits(Lanes<2>(__builtin_shufflevector(x.v, x.v, 0, 1))) |
           SignBits(Lanes<2>(__builtin_shufflevector(x.v, x.v, 2, 3))) << 2;
#endif
}
QX_INLINE unsigned SignBits(Lanes<8> x) {
#ifdef __AVX512DQ__
    typedef long long Eight __attribute__((vector_size(64)));
    return static_cast<unsigned>(__builtin_ia32_cvtq2mask512((Eight)x.v));
#else
    return SignBits(Lanes<4>(__builtin_shufflevector(x.v, x.v, 0, 1, 2, 3))) |
           SignBits(Lanes<4>(__builtin_shufflevector(x.v, x.v, 4, 5, 6, 7))) << 4;
#endif
}

// The full products of the low 32 bits of each lane, as unsigned integers. clang++ compiles the
// plain expression to one instruction, g++ to three multiplications; ARM has no multiplication for
// 64-bit lanes.
template <int N>
QX_INLINE typename LaneInteger<N>::type LowerProducts(typename LaneInteger<N>::type a,
                                                      typename LaneInteger<N>::type b) {
#if defined(__aarch64__)
    if constexpr (N == 2)
        return (typename LaneInteger<N>::type)vmull_u32(vmovn_u64((uint64x2_t)a),
                                                        vmovn_u64((uint64x2_t)b));
#elif !defined(__clang__)
    typedef int FourHalves __attribute__((vector_size(16)));
    if constexpr (N == 2)
        return (typename LaneInteger<N>::type)__builtin_ia32_pmuludq128((FourHalves)a,
                                                                        (FourHalves)b);
#ifdef __AVX2__
    typedef int EightHalves __attribute__((vector_size(32)));
    if constexpr (N == 4)
        return (typename LaneInteger<N>::type)__builtin_ia32_pmuludq256((EightHalves)a,
                                                                        (EightHalves)b);
#endif
#ifdef __AVX512F__
    typedef int SixteenHalves __attribute__((vector_size(64)));
    typedef long long Eight __attribute__((vector_size(64)));
    if constexpr (N == 8)
        return (typename LaneInteger<N>::type)__builtin_ia32_pmuludq512_mask(
            (SixteenHalves)a, (SixteenHalves)b, Eight{}, 0xff);
#endif
#endif
    return (a & 0xffffffff) * (b & 0xffffffff);
}

// N floats, with the few operations that sums of products need. N is 1, 4, 8 or 16.
template <int N>
struct FloatLaneVector;
template <>
struct FloatLaneVector<4> {
    typedef float type __attribute__((vector_size(16)));
    typedef float inMemory __attribute__((vector_size(16), aligned(1), may_alias));
    static QX_INLINE type broadcast(float x) { return type{x, x, x, x}; }
};
template <>
struct FloatLaneVector<8> {
    typedef float type __attribute__((vector_size(32)));
    typedef float inMemory __attribute__((vector_size(32), aligned(1), may_alias));
    static QX_INLINE type broadcast(float x) { return type{x, x, x, x, x, x, x, x}; }
};
template <>
struct FloatLaneVector<16> {
    typedef float type __attribute__((vector_size(64)));
    typedef float inMemory __attribute__((vector_size(64), aligned(1), may_alias));
    static QX_INLINE type broadcast(float x) {
        return type{x, x, x, x, x, x, x, x, x, x, x, x, x, x, x, x};
    }
};

template <int N>
class FloatLanes {
public:
    typedef typename FloatLaneVector<N>::type Vector;
    static constexpr int count = N;

    QX_INLINE FloatLanes() = default;
    QX_INLINE explicit FloatLanes(float value) : v(FloatLaneVector<N>::broadcast(value)) {}
    QX_INLINE explicit FloatLanes(Vector vector) : v(vector) {}
    static QX_INLINE FloatLanes load(const SGL *x) {
        return FloatLanes(
            Vector(*reinterpret_cast<const typename FloatLaneVector<N>::inMemory *>(x)));
    }
    QX_INLINE void store(SGL *x) const {
        *reinterpret_cast<typename FloatLaneVector<N>::inMemory *>(x) = v;
    }

    friend QX_INLINE FloatLanes operator+(FloatLanes a, FloatLanes b) {
        return FloatLanes(a.v + b.v);
    }
    friend QX_INLINE FloatLanes operator*(FloatLanes a, FloatLanes b) {
        return FloatLanes(a.v * b.v);
    }

    Vector v;
};
template <>
class FloatLanes<1> {
public:
    static constexpr int count = 1;

    QX_INLINE FloatLanes() = default;
    QX_INLINE explicit FloatLanes(float value) : v(value) {}
    static QX_INLINE FloatLanes load(const SGL *x) { return FloatLanes(*x); }
    QX_INLINE void store(SGL *x) const { *x = v; }

    friend QX_INLINE FloatLanes operator+(FloatLanes a, FloatLanes b) {
        return FloatLanes(a.v + b.v);
    }
    friend QX_INLINE FloatLanes operator*(FloatLanes a, FloatLanes b) {
        return FloatLanes(a.v * b.v);
    }

    float v;
};
// The number of floats in a register of Lanes<nativeLanes>.
constexpr int nativeFloatLanes = 2 * nativeLanes;

} // inline namespace
} // namespace qx

#endif
