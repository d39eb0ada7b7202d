#ifndef QX_MATHLIB_LANE_FUNCTIONS_H
#define QX_MATHLIB_LANE_FUNCTIONS_H

#include "frame/lane_masks.h"

// Elementary functions over lanes, with the bits of the module's sin, cos, atan2 and hypot: the
// same operations in the same order, with masks instead of branches. Arguments for which the scalar
// functions take a special branch (far from 0, close to a multiple of pi/2, zeros, infinities, NaN,
// numbers near the ends of the range) are marked in `rare`, and the results of these lanes are
// meaningless: the scalar function must be called for them.
//
//     LaneMask<L> rare = {};
//     const SineAndCosine<L> both = SineCosine(L::load(x), rare);
//     if (!Any(rare)) ...
//
// The reduction by pi/2 and the two polynomials of sine and cosine are those of K. C. Ng in fdlibm
// (Sun Microsystems, 1993); the other two functions are described with the scalar ones.

namespace qx {

template <class L>
struct LanePair {
    L hi, lo;
};

// The arithmetic of pair.h.
template <class L>
QX_INLINE LanePair<L> QuickSum(L a, L b) {
    const L sum = a + b;
    return {sum, b - (sum - a)};
}
template <class L>
QX_INLINE LanePair<L> ExactProduct(L a, L b) {
    const L splitter(0x1p27 + 1);
    const L aScaled = splitter * a, bScaled = splitter * b;
    const L aHigh = aScaled - (aScaled - a), bHigh = bScaled - (bScaled - b);
    const L aLow = a - aHigh, bLow = b - bHigh;
    const L product = a * b;
    return {product, ((aHigh * bHigh - product) + aHigh * bLow + aLow * bHigh) + aLow * bLow};
}
template <class L>
QX_INLINE LanePair<L> PairSum(LanePair<L> a, LanePair<L> b) {
    const L sum = a.hi + b.hi;
    const L bPart = sum - a.hi;
    const L rest = (a.hi - (sum - bPart)) + (b.hi - bPart);
    return QuickSum(sum, rest + (a.lo + b.lo));
}
template <class L>
QX_INLINE LanePair<L> PairQuotient(LanePair<L> a, LanePair<L> b) {
    const L quotient = a.hi / b.hi;
    const LanePair<L> back = ExactProduct(quotient, b.hi);
    const L rest = ((a.hi - back.hi) - back.lo) + (a.lo - quotient * b.lo);
    return QuickSum(quotient, rest / b.hi);
}
template <class L>
QX_INLINE LanePair<L> Select(LaneMask<L> where, LanePair<L> a, LanePair<L> b) {
    return {Select(where, a.hi, b.hi), Select(where, a.lo, b.lo)};
}

// 2^k for a normal number from 2^k to 2^(k + 1); 0 for smaller numbers.
template <class L>
QX_INLINE L PowerOfTwo(L x) {
    return OfBits<L>(ToBits(x) & 0x7ff0000000000000);
}

// An angle minus a multiple of pi/2, as y + tail between -pi/4 and pi/4. The two lowest bits of
// `quadrant` are those of the multiple.
template <class L>
struct ReducedAngle {
    L y, tail, quadrant;
    LaneMask<L> isSmall; // |x| below pi/4: not reduced
};

template <class L>
QX_INLINE ReducedAngle<L> Reduced(L x, LaneMask<L> &rare) {
    const L toInteger(0x1.8p52);
    const L high(0x1.921fb544p+0), highTail(0x1.0b4611a626331p-34);
    const L middle(0x1.0b4611a6p-34), middleTail(0x1.3198a2e037073p-69);
    const L size = Magnitude(x);
    const L shifted = x * L(0x1.45f306dc9c883p-1) + toInteger;
    const L multiple = shifted - toInteger;
    const L left = x - multiple * high;
    const L tail = multiple * highTail;
    const L once = left - tail;
    // Where more than 16 bits cancel, the next part of the multiple is subtracted, too.
    const LaneMask<L> cancels = PowerOfTwo(once) <= PowerOfTwo(size) * L(0x1p-17);
    const L again = multiple * middle;
    const L leftAgain = left - again;
    const L tailAgain = multiple * middleTail - ((left - leftAgain) - again);
    const L twice = leftAgain - tailAgain;

    // Beyond 2^20 pi/2 the scalar function uses another reduction, and close to odd multiples of
    // pi/4 another multiple. Up to 9/4 pi its second round depends on the distance from a multiple
    // of pi/2, and a third round follows where 49 bits cancel.
    const LaneMask<L> isMedium = size < L(0x1.921fbp+20);
    const LaneMask<L> isSmall = size < L(0x1.921fcp-1);
    const L y = Select(cancels, twice, once);
    rare = rare | !isMedium | (L(0x1.921fp-1) < Magnitude(once)) |
           (cancels & !isSmall &
            ((size < L(0x1.c463cp+2)) | (PowerOfTwo(twice) <= PowerOfTwo(size) * L(0x1p-49))));
    return {y, Select(cancels, (leftAgain - twice) - tailAgain, (left - once) - tail), shifted,
            isSmall};
}

template <class L>
QX_INLINE L SinePolynomial(const ReducedAngle<L> &x) {
    const L square = x.y * x.y;
    const L fourth = square * square;
    const L rest =
        L(0x1.111111110f8a6p-7) +
        square * (L(-0x1.a01a019c161d5p-13) + square * L(0x1.71de357b1fe7dp-19)) +
        square * fourth * (L(-0x1.ae5e68a2b9cebp-26) + square * L(0x1.5d93a5acfd57cp-33));
    const L cube = square * x.y;
    const L third(-0x1.5555555555549p-3);
    const L small = Select(Magnitude(x.y) < L(0x1p-26), x.y, x.y + cube * (third + square * rest));
    const L reduced = x.y - ((square * (L(0.5) * x.tail - cube * rest) - x.tail) - cube * third);
    return Select(x.isSmall, small, reduced);
}

template <class L>
QX_INLINE L CosinePolynomial(const ReducedAngle<L> &x) {
    const L square = x.y * x.y;
    const L fourth = square * square;
    const L rest =
        square * (L(0x1.555555555554cp-5) +
                  square * (L(-0x1.6c16c16c15177p-10) + square * L(0x1.a01a019cb1590p-16))) +
        fourth * fourth *
            (L(-0x1.27e4f809c52adp-22) +
             square * (L(0x1.1ee9ebdb4b1c4p-29) + square * L(-0x1.8fae9be8838d4p-37)));
    const L half = L(0.5) * square;
    const L one = L(1.0) - half;
    return one + (((L(1.0) - one) - half) + (square * rest - x.y * x.tail));
}

// In odd quadrants sine and cosine are exchanged. In two of four quadrants the sign changes: of
// sines if bit 1 of the number of the quadrant is set, of cosines if exactly one of the bits 0 and
// 1 is set.
template <class L>
QX_INLINE LaneMask<L> IsOdd(L quadrant) {
    const L one(1.0);
    return !(OfBits<L>((ToBits(quadrant) & 1) | ToBits(one)) == one);
}
template <class L>
QX_INLINE L Signed(L value, BitsOf<L> quadrant) {
    return OfBits<L>(ToBits(value) ^ ((quadrant << 62) & laneSign));
}

template <class L>
struct SineAndCosine {
    L sine, cosine;
};
template <class L>
QX_INLINE SineAndCosine<L> SineCosine(L x, LaneMask<L> &rare) {
    const ReducedAngle<L> angle = Reduced(x, rare);
    const L sine = SinePolynomial(angle), cosine = CosinePolynomial(angle);
    const LaneMask<L> isOdd = IsOdd(angle.quadrant);
    const BitsOf<L> quadrant = ToBits(angle.quadrant);
    return {Signed(Select(isOdd, cosine, sine), quadrant),
            Signed(Select(isOdd, sine, cosine), quadrant ^ (quadrant << 1))};
}

// The exact product by 0, 1/2, 1 or 3/2: with such factors all these differences are exact.
template <class L>
QX_INLINE LanePair<L> ProductByPiece(L c, L x) {
    const L product = c * x;
    return {product, (x - product) + (c - L(1.0)) * x};
}

// The angle of (x, y) in the first quadrant, in the pieces of atan2.c.
template <class L>
QX_INLINE LanePair<L> FirstQuadrant(L y, L x) {
    const L zero(0.0);
    const LaneMask<L> below[4] = {y < L(0.4375) * x, y < L(0.6875) * x, y < L(1.1875) * x,
                                  y < L(2.4375) * x};
    LanePair<L> angle = {L(0x1.f730bd281f69bp-1), L(0x1.007887af0cbbdp-56)};
    L c(1.5);
    angle = Select(below[2], {L(0x1.921fb54442d18p-1), L(0x1.1a62633145c07p-55)}, angle);
    c = Select(below[2], L(1.0), c);
    angle = Select(below[1], {L(0x1.dac670561bb4fp-2), L(0x1.a2b7f222f65e2p-56)}, angle);
    c = Select(below[1], L(0.5), c);
    angle = Select(below[0], {zero, zero}, angle);
    c = Select(below[0], zero, c);

    const LaneMask<L> isSteep = !below[3];
    angle = Select(isSteep, {L(0x1.921fb54442d18p+0), L(0x1.1a62633145c07p-54)}, angle);
    const LanePair<L> ofX = ProductByPiece(c, x), ofY = ProductByPiece(c, y);
    const LanePair<L> top =
        Select(isSteep, {-x, zero}, PairSum({y, zero}, LanePair<L>{-ofX.hi, -ofX.lo}));
    const LanePair<L> bottom = Select(isSteep, {y, zero}, PairSum({x, zero}, ofY));
    const LanePair<L> t = PairQuotient(top, bottom);

    const L square = t.hi * t.hi;
    const L s2 = square * square, s4 = s2 * s2;
    const L low = (L(-0x1.5555555555555p-2) + L(0x1.99999999998c5p-3) * square) +
                  (L(-0x1.2492492485503p-3) + L(0x1.c71c71bd2b8bcp-4) * square) * s2;
    const L middle = (L(-0x1.745d154c84f7ap-4) + L(0x1.3b1375ce5bdc6p-4) * square) +
                     (L(-0x1.110c9ce7b0572p-4) + L(0x1.e170800a46210p-5) * square) * s2;
    const L high = (L(-0x1.ab59b417b2d3fp-5) + L(0x1.7001816fd063fp-5) * square) +
                   (L(-0x1.0f62bba6a2558p-5) + L(0x1.e4167464d3de8p-7) * square) * s2;
    const L cubic = t.hi * square * (low + (middle + high * s4) * s4);
    return PairSum(angle, QuickSum(t.hi, cubic + t.lo * (L(1.0) - square)));
}

template <class L>
QX_INLINE L ArcTangent(L y, L x, LaneMask<L> &rare) {
    const L height = Magnitude(y), width = Magnitude(x), zero(0.0);
    const LaneMask<L> isHigh = width < height;
    const L larger = Select(isHigh, height, width), smaller = Select(isHigh, width, height);
    // NaN is neither below nor above. Factors that are powers of 2 cause no rounding here.
    const L power = PowerOfTwo(larger);
    rare = rare | !(larger < L(0x1p1000)) | !(L(0x1p-900) <= larger) | (height == width) |
           !(power * L(0x1p-64) <= PowerOfTwo(smaller)) | !(zero < smaller);
    const L scale = OfBits<L>(0x7fe0000000000000 - ToBits(power)); // 1 / power
    const LanePair<L> quadrant = FirstQuadrant(height * scale, width * scale);
    const LanePair<L> halfTurn = {L(0x1.921fb54442d18p+1), L(0x1.1a62633145c07p-53)};
    const LanePair<L> angle =
        Select(x < zero, PairSum(halfTurn, LanePair<L>{-quadrant.hi, -quadrant.lo}), quadrant);
    return CopySign(angle.hi + angle.lo, y);
}

template <class L>
struct LaneSquare {
    L hi, lo;
    QX_INLINE explicit LaneSquare(L x) {
        const L scaled = x * L(0x1p27 + 1);
        const L high = x - scaled + scaled;
        const L low = x - high;
        hi = x * x;
        lo = high * high - hi + L(2.0) * high * low + low * low;
    }
};

template <class L>
QX_INLINE L Hypotenuse(L x, L y, LaneMask<L> &rare) {
    const L width = Magnitude(x), height = Magnitude(y), zero(0.0);
    const LaneMask<L> isHigh = width < height;
    const L larger = Select(isHigh, height, width), smaller = Select(isHigh, width, height);
    const LaneMask<L> isZero = smaller == zero;
    rare = rare | !(larger < L(0x1p511)) | !((L(0x1p-450) <= smaller) | isZero);
    const LaneMask<L> isTiny = PowerOfTwo(smaller) * L(0x1p64) < PowerOfTwo(larger);
    const LaneSquare<L> big(larger), little(smaller);
    const L root = Sqrt(little.lo + big.lo + little.hi + big.hi);
    return Select(isTiny | isZero, larger + smaller, root);
}

// Calls lanes(at) for all whole groups of lanes, and one(at) for the remaining elements and for
// each element of a group for which lanes(at) returned false because it had rare arguments.
template <int N, class OfLanes, class OfOne>
QX_INLINE void ForEachOrRare(int32_t n, OfLanes lanes, OfOne one) {
    int32_t i = 0;
    for (; n - i >= N; i += N)
        if (!lanes(i))
            for (int32_t k = i; k < i + N; ++k)
                one(k);
    for (; i < n; ++i)
        one(i);
}

} // namespace qx

#endif
