#include "measure/parabolas.h"

#include "frame/lane_masks.h"

namespace qx::QX_WIDTH {
namespace {

typedef Lanes<nativeLanes> L;
// Vectors of windows at once: enough independent sums to hide the time of an addition.
constexpr int together = 8;

QX_INLINE uint64_t RisingBits(L c1, L c2) {
    const auto isSteep = c1 > L(smallestSlope);
    const auto isLevel = c1 >= L(-smallestSlope);
    return MaskBits(isSteep | (isLevel & (c2 > L(0.0))));
}

// c2 decides in no lane.
QX_INLINE bool IsSlopeEnough(L c1) {
    return !Any((c1 >= L(-smallestSlope)) & (c1 <= L(smallestSlope)));
}

// What is asked of the vertices of narrow windows. Within the reach the amplitude differs from c0
// by less than |c1|, and rounding keeps the order.
struct VertexTest {
    double reach, towards, level; // towards * amplitude > level

    QX_INLINE uint64_t bits(L c0, L c1, L c2) const {
        const L slope = Select(c1 < L(0.0), -c1, c1);
        const L highest = L(towards) * c0 + slope;
        return MaskBits((slope < L(reach) * c2) & (highest > L(level)));
    }
    QX_INLINE bool one(double c0, double c1, double c2) const {
        const double slope = c1 < 0 ? -c1 : c1;
        return slope < reach * c2 && towards * c0 + slope > level;
    }
};

// One row of the operator with N vectors of windows.
template <int N>
QX_INLINE void Product(const DBL *row, int32_t w, const DBL *x, L (&sum)[N]) {
    const L first(row[0]);
    for (int k = 0; k < N; ++k)
        sum[k] = first * L::load(x + k * nativeLanes);
    for (int32_t j = 1; j < w; ++j) {
        const L factor(row[j]);
        for (int k = 0; k < N; ++k)
            sum[k] = sum[k] + factor * L::load(x + j + k * nativeLanes);
    }
}

template <int N>
QX_INLINE uint64_t Rising(const DBL *fitMatrix, int32_t w, const DBL *x) {
    L c1[N], c2[N];
    Product<N>(fitMatrix + w, w, x, c1);
    bool isEnough = true;
    for (int k = 0; k < N; ++k) {
        isEnough &= IsSlopeEnough(c1[k]);
        c2[k] = L(0.0);
    }
    // Hardly ever: the slopes of smooth data are near 0 at their extremes only.
    if (__builtin_expect(!isEnough, 0))
        Product<N>(fitMatrix + 2 * std::ptrdiff_t{w}, w, x, c2);
    uint64_t bits = 0;
    for (int k = 0; k < N; ++k)
        bits |= RisingBits(c1[k], c2[k]) << (k * nativeLanes);
    return bits;
}

// Three samples have an operator of halves and ones: the products come down to this, but for what
// NaN and infinities do, which are no extremes.
template <int N>
QX_INLINE uint64_t AtVertexOfThree(const DBL *x, const VertexTest &test) {
    uint64_t bits = 0;
    for (int k = 0; k < N; ++k, x += nativeLanes) {
        const L left = L(0.5) * L::load(x);
        const L middle = L::load(x + 1);
        const L right = L(0.5) * L::load(x + 2);
        bits |= test.bits(middle, right - left, left - middle + right) << (k * nativeLanes);
    }
    return bits;
}

template <int N>
QX_INLINE uint64_t AtVertexOfFour(const DBL *fitMatrix, const DBL *x, const VertexTest &test) {
    L c[3][N];
    for (int r = 0; r < 3; ++r)
        Product<N>(fitMatrix + 4 * r, 4, x, c[r]);
    uint64_t bits = 0;
    for (int k = 0; k < N; ++k)
        bits |= test.bits(c[0][k], c[1][k], c[2][k]) << (k * nativeLanes);
    return bits;
}

// The bits of `count` windows from what gives those of whole vectors and of a single window.
template <class Many, class Few, class One>
QX_INLINE uint64_t Collect(int32_t count, const Many &many, const Few &few, const One &one) {
    uint64_t bits = 0;
    int32_t i = 0;
    for (; i + together * nativeLanes <= count; i += together * nativeLanes)
        bits |= many(i) << i;
    for (; i + nativeLanes <= count; i += nativeLanes)
        bits |= few(i) << i;
    for (; i < count; ++i)
        bits |= static_cast<uint64_t>(one(i)) << i;
    return bits;
}

QX_INLINE double OneProduct(const DBL *row, int32_t w, const DBL *x) {
    double sum = row[0] * x[0];
    for (int32_t j = 1; j < w; ++j)
        sum += row[j] * x[j];
    return sum;
}

} // namespace

uint64_t RisingWindows(const DBL *fitMatrix, int32_t w, const DBL *x, int32_t count) {
    return Collect(
        count, [=](int32_t i) { return Rising<together>(fitMatrix, w, x + i); },
        [=](int32_t i) { return Rising<1>(fitMatrix, w, x + i); },
        [=](int32_t i) {
            const double c1 = OneProduct(fitMatrix + w, w, x + i);
            return c1 > smallestSlope ||
                   (c1 >= -smallestSlope &&
                    OneProduct(fitMatrix + 2 * std::ptrdiff_t{w}, w, x + i) > 0);
        });
}

uint64_t NarrowWindowsAtVertex(const DBL *fitMatrix, int32_t w, const DBL *x, int32_t count,
                               double reach, double sign, double threshold) {
    const VertexTest test = {sign * reach, -sign, -sign * threshold};
    const auto one = [&](int32_t i) {
        return test.one(OneProduct(fitMatrix, w, x + i), OneProduct(fitMatrix + w, w, x + i),
                        OneProduct(fitMatrix + 2 * w, w, x + i));
    };
    if (w == 3)
        return Collect(
            count, [&](int32_t i) { return AtVertexOfThree<together>(x + i, test); },
            [&](int32_t i) { return AtVertexOfThree<1>(x + i, test); }, one);
    return Collect(
        count,
        [&](int32_t i) {
            return AtVertexOfFour<4>(fitMatrix, x + i, test) |
                   AtVertexOfFour<4>(fitMatrix, x + i + 4 * nativeLanes, test) << (4 * nativeLanes);
        },
        [&](int32_t i) { return AtVertexOfFour<1>(fitMatrix, x + i, test); }, one);
}

} // namespace qx::QX_WIDTH
