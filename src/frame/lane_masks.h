#ifndef QX_FRAME_LANE_MASKS_H
#define QX_FRAME_LANE_MASKS_H

#include "frame/lanes.h"

#include <cstdint>

namespace qx {

// Comparisons of lanes, selection by masks, bit operations, and shifts by one lane. Square roots,
// the bits of masks, and shifts are not for Lanes<1>.

template <class L>
using BitsOf = typename LaneInteger<L::count>::type;

constexpr int64_t laneSign = INT64_MIN;

template <int N>
QX_INLINE typename LaneInteger<N>::type ToBits(Lanes<N> x) {
    if constexpr (N == 1)
        return __builtin_bit_cast(int64_t, x.v);
    else
        return (typename LaneInteger<N>::type)x.v;
}
template <class L>
QX_INLINE L OfBits(BitsOf<L> bits) {
    if constexpr (L::count == 1)
        return L(__builtin_bit_cast(double, bits));
    else
        return L((typename L::Vector)bits);
}
template <int N>
QX_INLINE Lanes<N> Magnitude(Lanes<N> x) {
    return OfBits<Lanes<N>>(ToBits(x) & ~laneSign);
}
template <int N>
QX_INLINE Lanes<N> CopySign(Lanes<N> magnitude, Lanes<N> sign) {
    return OfBits<Lanes<N>>((ToBits(magnitude) & ~laneSign) | (ToBits(sign) & laneSign));
}
template <int N>
QX_INLINE Lanes<N> Sqrt(Lanes<N> x) {
    Lanes<N> root;
    for (int i = 0; i < N; ++i)
        root.v[i] = __builtin_sqrt(x.v[i]);
    return root;
}

// The full products of the low 32 bits of each lane, as unsigned integers.
template <class L>
QX_INLINE BitsOf<L> ProductOfLowerHalves(BitsOf<L> a, BitsOf<L> b) {
    return LowerProducts<L::count>(a, b);
}
// Shifted right, filled with zeros.
template <class L>
QX_INLINE BitsOf<L> ShiftedDown(BitsOf<L> bits, int count) {
    typedef uint64_t Unsigned __attribute__((vector_size(sizeof(BitsOf<L>))));
    return (BitsOf<L>)((Unsigned)bits >> count);
}

// A boolean for each lane. Comparisons with NaN are false.
template <class L>
struct LaneMask {
    BitsOf<L> m; // a lane has all bits set or none
};
template <class L, class Comparison>
QX_INLINE LaneMask<L> MaskOf(Comparison isTrue) {
    if constexpr (L::count == 1)
        return {isTrue ? -1 : 0};
    else
        return {(BitsOf<L>)isTrue};
}

template <int N>
QX_INLINE LaneMask<Lanes<N>> operator<(Lanes<N> a, Lanes<N> b) {
    return MaskOf<Lanes<N>>(a.v < b.v);
}
template <int N>
QX_INLINE LaneMask<Lanes<N>> operator<=(Lanes<N> a, Lanes<N> b) {
    return MaskOf<Lanes<N>>(a.v <= b.v);
}
template <int N>
QX_INLINE LaneMask<Lanes<N>> operator==(Lanes<N> a, Lanes<N> b) {
    return MaskOf<Lanes<N>>(a.v == b.v);
}
template <int N>
QX_INLINE LaneMask<Lanes<N>> operator>(Lanes<N> a, Lanes<N> b) {
    return MaskOf<Lanes<N>>(a.v > b.v);
}
template <int N>
QX_INLINE LaneMask<Lanes<N>> operator>=(Lanes<N> a, Lanes<N> b) {
    return MaskOf<Lanes<N>>(a.v >= b.v);
}
template <class L>
QX_INLINE LaneMask<L> operator&(LaneMask<L> a, LaneMask<L> b) {
    return {a.m & b.m};
}
template <class L>
QX_INLINE LaneMask<L> operator|(LaneMask<L> a, LaneMask<L> b) {
    return {a.m | b.m};
}
template <class L>
QX_INLINE LaneMask<L> operator!(LaneMask<L> a) {
    return {~a.m};
}
template <class L>
QX_INLINE L Select(LaneMask<L> where, L a, L b) {
    return L(where.m ? a.v : b.v);
}
// The larger or the smaller of two values; b if they are equal, zeros of either sign included, or
// if one is NaN.
template <int N>
QX_INLINE Lanes<N> Larger(Lanes<N> a, Lanes<N> b) {
    return Select(a > b, a, b);
}
template <int N>
QX_INLINE Lanes<N> Smaller(Lanes<N> a, Lanes<N> b) {
    return Select(a < b, a, b);
}
// One bit for each lane, that of lane 0 lowest.
template <class L>
QX_INLINE unsigned MaskBits(LaneMask<L> a) {
    return SignBits(OfBits<L>(a.m));
}
template <class L>
QX_INLINE bool Any(LaneMask<L> a) {
    return MaskBits(a) != 0;
}

// The lanes moved up by one, with the last lane of `before` in the first.
template <int N>
QX_INLINE Lanes<N> MovedUp(Lanes<N> before, Lanes<N> value) {
    if constexpr (N == 2)
        return Lanes<N>(__builtin_shufflevector(before.v, value.v, 1, 2));
    else if constexpr (N == 4)
        return Lanes<N>(__builtin_shufflevector(before.v, value.v, 3, 4, 5, 6));
    else
        return Lanes<N>(__builtin_shufflevector(before.v, value.v, 7, 8, 9, 10, 11, 12, 13, 14));
}

} // namespace qx

#endif
