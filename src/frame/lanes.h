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

// QX_VECTOR_REGISTER is the constraint of assembly for a register of lanes.

// Operations become part of the loop that uses them, at every level of optimisation.
#define QX_INLINE __attribute__((always_inline)) inline

namespace qx {

// SIMD over independent elements: Lanes<N> holds N doubles, and every operation does in each lane
// exactly what it would do to one double. A text written over Lanes thus gives the same bits for
// every N, and an array may be cut into Lanes<nativeLanes> and a rest of Lanes<1> at will.
//
//     template <class L>
//     void ScaleSome(DBL *x, double factor) { (L::load(x) * L(factor)).store(x); }
//
//     for (; i + nativeLanes <= n; i += nativeLanes) ScaleSome<Lanes<nativeLanes>>(x + i, f);
//     for (; i < n; ++i) ScaleSome<Lanes<1>>(x + i, f);
//
// Memory need not be aligned. N is 1, 2 or 4. What depends on the instruction set is here and
// nowhere else; comparisons and choices are in frame/lane_masks.h.

// What the instruction set of the build offers. Each build has its own of all that follows, so that
// none of it can stand in for that of another.
#ifdef __AVX2__
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

template <int N>
struct LaneInteger;
template <>
struct LaneInteger<2> {
    typedef int64_t type __attribute__((vector_size(16)));
};
template <>
struct LaneInteger<4> {
    typedef int64_t type __attribute__((vector_size(32)));
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

    // Through a type of the memory and not std::memcpy, which g++ 12 leads through a copy on the
    // stack.
    static QX_INLINE Lanes load(const DBL *x) {
        return Lanes(Vector(*reinterpret_cast<const typename LaneVector<N>::inMemory *>(x)));
    }
    QX_INLINE void store(DBL *x) const {
        *reinterpret_cast<typename LaneVector<N>::inMemory *>(x) = v;
    }

    // Elements 0, stride, 2 stride, ...
    static QX_INLINE Lanes gather(const DBL *x, std::ptrdiff_t stride) {
        if constexpr (N == 2)
            return Lanes(Vector{x[0], x[stride]});
        else
            return Lanes(Vector{x[0], x[stride], x[2 * stride], x[3 * stride]});
    }
    QX_INLINE void scatter(DBL *x, std::ptrdiff_t stride) const {
        for (int i = 0; i < N; ++i)
            x[i * stride] = v[i];
    }

    // The lanes in the opposite order.
    QX_INLINE Lanes reversed() const {
        if constexpr (N == 2)
            return Lanes(__builtin_shufflevector(v, v, 1, 0));
        else
            return Lanes(__builtin_shufflevector(v, v, 3, 2, 1, 0));
    }

    // Of the values of a, followed by those of b, every second one from the first or from the
    // second on; and the first or the second half of the values of a and b by turns. (Not for N
    // = 1.)
    friend QX_INLINE Lanes Evens(Lanes a, Lanes b) {
        if constexpr (N == 2)
            return Lanes(__builtin_shufflevector(a.v, b.v, 0, 2));
        else
            return Lanes(__builtin_shufflevector(a.v, b.v, 0, 2, 4, 6));
    }
    friend QX_INLINE Lanes Odds(Lanes a, Lanes b) {
        if constexpr (N == 2)
            return Lanes(__builtin_shufflevector(a.v, b.v, 1, 3));
        else
            return Lanes(__builtin_shufflevector(a.v, b.v, 1, 3, 5, 7));
    }
    friend QX_INLINE Lanes TurnsLow(Lanes a, Lanes b) {
        if constexpr (N == 2)
            return Lanes(__builtin_shufflevector(a.v, b.v, 0, 2));
        else
            return Lanes(__builtin_shufflevector(a.v, b.v, 0, 4, 1, 5));
    }
    friend QX_INLINE Lanes TurnsHigh(Lanes a, Lanes b) {
        if constexpr (N == 2)
            return Lanes(__builtin_shufflevector(a.v, b.v, 1, 3));
        else
            return Lanes(__builtin_shufflevector(a.v, b.v, 2, 6, 3, 7));
    }

    // a and b interleaved pair by pair: with lanes numbered from 0, the low half is a0 b0 (a2 b2),
    // the high half a1 b1 (a3 b3). The same operations take the pairs apart again.
    friend QX_INLINE Lanes PairsLow(Lanes a, Lanes b) {
        if constexpr (N == 2)
            return Lanes(__builtin_shufflevector(a.v, b.v, 0, 2));
        else
            return Lanes(__builtin_shufflevector(a.v, b.v, 0, 4, 2, 6));
    }
    friend QX_INLINE Lanes PairsHigh(Lanes a, Lanes b) {
        if constexpr (N == 2)
            return Lanes(__builtin_shufflevector(a.v, b.v, 1, 3));
        else
            return Lanes(__builtin_shufflevector(a.v, b.v, 1, 5, 3, 7));
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

// ---- Neighbouring lanes as pairs, such as the parts of complex values ----

// The first and the second value of each pair, twice.
template <int N>
QX_INLINE Lanes<N> FirstsTwice(Lanes<N> x) {
    if constexpr (N == 2)
        return Lanes<N>(__builtin_shufflevector(x.v, x.v, 0, 0));
    else
        return Lanes<N>(__builtin_shufflevector(x.v, x.v, 0, 0, 2, 2));
}
template <int N>
QX_INLINE Lanes<N> SecondsTwice(Lanes<N> x) {
    if constexpr (N == 2)
        return Lanes<N>(__builtin_shufflevector(x.v, x.v, 1, 1));
    else
        return Lanes<N>(__builtin_shufflevector(x.v, x.v, 1, 1, 3, 3));
}
// The values of each pair exchanged.
template <int N>
QX_INLINE Lanes<N> Swapped(Lanes<N> x) {
    if constexpr (N == 2)
        return x.reversed();
    else
        return Lanes<N>(__builtin_shufflevector(x.v, x.v, 1, 0, 3, 2));
}
// The pairs in the opposite order.
template <int N>
QX_INLINE Lanes<N> ReversedPairs(Lanes<N> x) {
    if constexpr (N == 2)
        return x;
    else
        return Lanes<N>(__builtin_shufflevector(x.v, x.v, 2, 3, 0, 1));
}
// One pair in the place of all.
template <int N>
QX_INLINE Lanes<N> InEveryPair(Lanes<2> x) {
    if constexpr (N == 2)
        return x;
    else
        return Lanes<N>(__builtin_shufflevector(x.v, x.v, 0, 1, 0, 1));
}
// The first values of all pairs, or the second ones, with the opposite sign.
template <int N>
QX_INLINE Lanes<N> NegatedInPairs(Lanes<N> x, bool first) {
    const int64_t one = first ? INT64_MIN : 0, other = first ? 0 : INT64_MIN;
    typedef typename LaneInteger<N>::type Bits;
    Bits sign;
    if constexpr (N == 2)
        sign = Bits{one, other};
    else
        sign = Bits{one, other, one, other};
    return Lanes<N>((typename Lanes<N>::Vector)((Bits)x.v ^ sign));
}
// a with the first values less those of b, the second ones plus those of b.
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

// Pairs from N / 2 places, and back.
template <int N>
QX_INLINE Lanes<N> LoadPairs(const DBL *const *from, std::ptrdiff_t at) {
    const Lanes<2> a = Lanes<2>::load(from[0] + at);
    if constexpr (N == 2)
        return a;
    else
        return Lanes<N>(__builtin_shufflevector(a.v, Lanes<2>::load(from[1] + at).v, 0, 1, 2, 3));
}
QX_INLINE void StorePairs(Lanes<2> pairs, DBL *const *to, std::ptrdiff_t at) {
    pairs.store(to[0] + at);
}
QX_INLINE void StorePairs(Lanes<4> pairs, DBL *const *to, std::ptrdiff_t at) {
    Lanes<2>(__builtin_shufflevector(pairs.v, pairs.v, 0, 1)).store(to[0] + at);
#ifdef __AVX2__
    // As a shuffle g++ makes it one across lanes and a store.
    Lanes<2>(__builtin_ia32_vextractf128_pd256(pairs.v, 1)).store(to[1] + at);
#else
    Lanes<2>(__builtin_shufflevector(pairs.v, pairs.v, 2, 3)).store(to[1] + at);
#endif
}

// ---- Other lanes ----

// Makes the compiler read x once into a register, not once per use.
template <int N>
QX_INLINE void KeepInRegister(Lanes<N> &x) {
    asm("" : "+" QX_VECTOR_REGISTER(x.v));
}

// One value from each of N places.
template <int N>
QX_INLINE Lanes<N> LoadEach(const DBL *const *from, std::ptrdiff_t at) {
    if constexpr (N == 2)
        return Lanes<N>(typename Lanes<N>::Vector{from[0][at], from[1][at]});
    else
        return Lanes<N>(
            typename Lanes<N>::Vector{from[0][at], from[1][at], from[2][at], from[3][at]});
}

// The sign bits of the lanes, that of lane 0 lowest.
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

// The products of the lower halves of each 64 bits as unsigned integers. clang++ makes one
// instruction of the plain text, g++ three multiplications; ARM has none for lanes of 64 bits.
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
#endif
    return (a & 0xffffffff) * (b & 0xffffffff);
}

// N floats: the few operations that sums of products need. N is 1, 4 or 8.
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
// As many as a register of Lanes<nativeLanes> holds.
constexpr int nativeFloatLanes = 2 * nativeLanes;

} // inline namespace
} // namespace qx

#endif
