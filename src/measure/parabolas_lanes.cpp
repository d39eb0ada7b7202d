#include "measure/parabolas.h"

#include "frame/lane_masks.h"

namespace qx::QX_WIDTH {
namespace {

typedef Lanes<nativeLanes> L;
// Vectors of windows that are processed together: enough independent sums to hide the latency of an
// addition.
constexpr int together = 8;

QX_INLINE uint64_t RisingBits(L c1, L c2) {
    const auto isSteep = c1 > L(smallestSlope);
    const auto isLevel = c1 >= L(-smallestSlope);
    return MaskBits(isSteep | (isLevel & (c2 > L(0.0))));
}

// Whether no lane needs c2.
QX_INLINE bool IsSlopeEnough(L c1) {
    return !Any((c1 >= L(-smallestSlope)) & (c1 <= L(smallestSlope)));
}

// The test of the vertices of narrow windows. Within the reach the amplitude differs from c0 by
// less than |c1|, and rounding preserves the order.
struct VertexTest {
    double reach, towards, level; // towards * amplitude > level

    QX_INLINE uint64_t bits(L c0, L c1, L c2) const {
        const L slope = Magnitude(c1);
        const L highest = L(towards) * c0 + slope;
        return MaskBits((slope < L(reach) * c2) & (highest > L(level)));
    }
    QX_INLINE bool one(double c0, double c1, double c2) const {
        const double slope = c1 < 0 ? -c1 : c1;
        return slope < reach * c2 && towards * c0 + slope > level;
    }
};

// Multiplies one row of the operator by N vectors of windows.
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
    // Rare: the slopes of smooth data are near 0 only at their extremes.
    if (__builtin_expect(!isEnough, 0))
        Product<N>(fitMatrix + 2 * std::ptrdiff_t{w}, w, x, c2);
    uint64_t bits = 0;
    for (int k = 0; k < N; ++k)
        bits |= RisingBits(c1[k], c2[k]) << (k * nativeLanes);
    return bits;
}

// For three samples the operator consists of halves and ones, so the products reduce to this,
// except for NaN and infinities, which are never extremes.
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

// Collects the bits of `count` windows from functions for several vectors, for one vector and for a
// single window.
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

// Windows of three or four samples, one in each lane, and their parabolas.
struct WindowsOfThree {
    L left, middle, right;

    QX_INLINE WindowsOfThree(const DBL *const *from) {
        const L evens = LoadPairs<nativeLanes>(from, 0);
        const L odds = LoadPairs<nativeLanes>(from + nativeLanes / 2, 0);
        left = PairsLow(evens, odds);
        middle = PairsHigh(evens, odds);
        const DBL *inOrder[nativeLanes];
        for (int k = 0; k < nativeLanes; ++k)
            inOrder[k] = from[k / 2 + k % 2 * (nativeLanes / 2)];
        right = LoadEach<nativeLanes>(inOrder, 2);
    }
    // The products come down to this, but for signs of zeros, which do not reach the results, and for
    // NaN and infinities.
    QX_INLINE void fit(const DBL *, L &c0, L &c1, L &c2) const {
        c0 = middle;
        c1 = L(0.5) * right - L(0.5) * left;
        c2 = L(0.5) * left - middle + L(0.5) * right;
    }
};

struct WindowsOfFour {
    L first, second, third, fourth;

    QX_INLINE WindowsOfFour(const DBL *const *from) {
        const DBL *const *const fromOdds = from + nativeLanes / 2;
        const L evens = LoadPairs<nativeLanes>(from, 0), odds = LoadPairs<nativeLanes>(fromOdds, 0);
        first = PairsLow(evens, odds);
        second = PairsHigh(evens, odds);
        const L evensBehind = LoadPairs<nativeLanes>(from, 2);
        const L oddsBehind = LoadPairs<nativeLanes>(fromOdds, 2);
        third = PairsLow(evensBehind, oddsBehind);
        fourth = PairsHigh(evensBehind, oddsBehind);
    }
    QX_INLINE void fit(const DBL *fitMatrix, L &c0, L &c1, L &c2) const {
        c0 = product(fitMatrix);
        c1 = product(fitMatrix + 4);
        c2 = product(fitMatrix + 8);
    }
    QX_INLINE L product(const DBL *row) const {
        return L(row[0]) * first + L(row[1]) * second + L(row[2]) * third + L(row[3]) * fourth;
    }
};

// The windows whose bits are set, by their numbers, and behind them the last one for the rest of a
// vector.
QX_INLINE int32_t PlacesOf(const uint64_t *masks, int32_t count, int32_t *places) {
    constexpr int atOnce = 4; // the end of a loop is hard to predict
    constexpr uint64_t none = uint64_t{1} << (maskWidth - 1); // whose number is never read
    int32_t found = 0;
    for (int32_t i = 0; i < count; ++i) {
        const int32_t bits = __builtin_popcountll(masks[i]);
        uint64_t left = masks[i];
        for (int32_t first = 0; first < bits; first += atOnce)
            for (int k = 0; k < atOnce; ++k, left &= left - 1)
                places[found + first + k] = i * maskWidth + __builtin_ctzll(left | none);
        found += bits;
    }
    for (int k = 0; found > 0 && k < nativeLanes; ++k)
        places[found + k] = places[found - 1];
    return found;
}

// Keeps those of eight entries from `first` on whose bits are set behind the `kept` ones.
QX_INLINE int32_t Keep(unsigned bits, int32_t first, int32_t kept, FoundVertices *found) {
    for (; bits != 0; bits &= bits - 1, ++kept) {
        const int32_t i = first + __builtin_ctz(bits);
        found->locations[kept] = found->locations[i];
        found->amplitudes[kept] = found->amplitudes[i];
        found->curvatures[kept] = found->curvatures[i];
    }
    return kept;
}

template <class Windows>
QX_INLINE bool Find(const DBL *fitMatrix, const DBL *x, const uint64_t *masks, int32_t count,
                    const VertexLimits &limits, FoundVertices *found) {
    int32_t places[FoundVertices::length];
    const int32_t windows = PlacesOf(masks, count, places);
    const L sign(limits.sign), level = sign * L(limits.threshold);
    int32_t kept = 0;
    for (int32_t first = 0; first < windows; first += nativeLanes) {
        const DBL *from[nativeLanes]; // the even lanes, then the odd ones
        L location, c0, c1, c2;
        for (int k = 0; k < nativeLanes; ++k) {
            from[k / 2 + k % 2 * (nativeLanes / 2)] = x + places[first + k];
            location.v[k] = places[first + k];
        }
        Windows(from).fit(fitMatrix, c0, c1, c2);
        const L d = L(2.0) * c2;
        const L t = -c1 / d;
        const L y = (t * c2 + c1) * t + c0;
        const auto isSought = sign * c2 > L(0.0);
        if (Any(isSought & ((Magnitude(d) < L(limits.smallestCurvature)) | (t < L(-0.5)))))
            return false;
        (L(limits.position) + location + L(limits.centre) + t).store(found->locations + kept);
        (y + L(limits.mean)).store(found->amplitudes + kept);
        d.store(found->curvatures + kept);
        const unsigned inside = windows - first >= nativeLanes ? (1U << nativeLanes) - 1
                                                               : (1U << (windows - first)) - 1;
        const unsigned counting =
            inside & MaskBits(isSought & (Magnitude(t) <= L(limits.reach)) & (sign * y < level));
        if (__builtin_expect(counting == (1U << nativeLanes) - 1, 1))
            kept += nativeLanes;
        else
            kept = Keep(counting, kept, kept, found);
    }
    found->count = kept;
    return true;
}

} // namespace

bool FindVertices(const DBL *fitMatrix, int32_t w, const DBL *x, const uint64_t *masks,
                  int32_t count, const VertexLimits *limits, FoundVertices *found) {
    return w == 3 ? Find<WindowsOfThree>(fitMatrix, x, masks, count, *limits, found)
                  : Find<WindowsOfFour>(fitMatrix, x, masks, count, *limits, found);
}

bool KeptOfClose(const DBL *locations, const DBL *amplitudes, int32_t count, double sign,
                 double lastLocation, uint64_t *kept) {
    if (__builtin_fabs(lastLocation - locations[0]) < 1.0)
        return false;
    uint64_t close = 0, better = 0, threeClose = 0;
    const L towards(sign);
    const int32_t pairs = count - 1;
    for (int32_t i = 0; i < pairs; i += nativeLanes) {
        const L here = L::load(locations + i);
        close |= uint64_t{MaskBits(Magnitude(here - L::load(locations + i + 1)) < L(1.0))} << i;
        threeClose |= uint64_t{MaskBits(Magnitude(here - L::load(locations + i + 2)) < L(1.0))}
                      << i;
        better |= uint64_t{MaskBits(towards * L::load(amplitudes + i + 1) <
                                    towards * L::load(amplitudes + i))}
                  << i;
    }
    const uint64_t all = ~uint64_t{0} >> (maskWidth - count);
    close &= all >> 1;
    threeClose &= all >> 2;
    *kept = all & ~((close & better) | (close & ~better) << 1);
    return ((close & close << 1) | threeClose) == 0;
}

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
