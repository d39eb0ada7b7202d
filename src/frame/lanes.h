#ifndef QX_FRAME_LANES_H
#define QX_FRAME_LANES_H

#include "frame/widths.h"
#include "qx/types.h"

#include <cstddef>

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
// Memory need not be aligned. N is 1, 2 or 4.

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

} // inline namespace
} // namespace qx

#endif
