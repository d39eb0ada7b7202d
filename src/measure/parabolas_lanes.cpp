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

// The test of the vertices of narrow windows, |c1| < reach * sign * c2 with more than rounding could
// hide. Within the reach the amplitude differs from c0 by less than |c1|, and rounding preserves the
// order.
struct VertexTest {
    double reach, towards, level; // towards * amplitude > level

    explicit QX_INLINE VertexTest(const VertexLimits &limits)
        : reach(limits.sign * limits.centre * (1 + 1e-9)), towards(-limits.sign),
          level(-limits.sign * limits.threshold) {}

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

// The numbers of the bits that are set in a byte.
struct ByteBits {
    int32_t numbers[256][8];
    constexpr ByteBits() : numbers() {
        for (int byte = 0; byte < 256; ++byte)
            for (int bit = 0, at = 0; bit < 8; ++bit)
                if (byte >> bit & 1)
                    numbers[byte][at++] = bit;
    }
};
constexpr ByteBits byteBits;

// The windows whose bits are set, by their numbers, and behind them the last one for the rest of a
// vector. Without a branch for each bit, which would be hard to predict.
template <class WordOf>
QX_INLINE int32_t PlacesOf(const WordOf &wordOf, int32_t count, int32_t *places) {
    constexpr int few = 4;
    constexpr uint64_t none = uint64_t{1} << (maskWidth - 1); // whose number is never read
    int32_t found = 0;
    for (int32_t i = 0; i < count; ++i) {
        const uint64_t word = wordOf(i);
        if (word == 0)
            continue;
        const int32_t bits = __builtin_popcountll(word);
        if (bits <= few) {
            uint64_t left = word;
            for (int k = 0; k < few; ++k, left &= left - 1)
                places[found + k] = i * maskWidth + __builtin_ctzll(left | none);
            found += bits;
            continue;
        }
        for (int32_t bit = 0; bit < maskWidth; bit += 8) {
            const auto byte = static_cast<unsigned>(word >> bit & 0xff);
            StoreEightIncreased(byteBits.numbers[byte], i * maskWidth + bit, places + found);
            found += __builtin_popcount(byte);
        }
    }
    for (int k = 0; found > 0 && k < nativeLanes; ++k)
        places[found + k] = places[found - 1];
    return found;
}

// The vertices of the windows at nativeLanes places.
struct Vertices {
    L c2, t, y, d; // curvature, place from the centre, amplitude, second derivative

    template <class Windows>
    QX_INLINE static Vertices of(const DBL *fitMatrix, const DBL *x, const int32_t *places) {
        const DBL *from[nativeLanes]; // the even lanes, then the odd ones
        for (int k = 0; k < nativeLanes; ++k)
            from[k / 2 + k % 2 * (nativeLanes / 2)] = x + places[k];
        Vertices v;
        L c0, c1;
        Windows(from).fit(fitMatrix, c0, c1, v.c2);
        v.d = L(2.0) * v.c2;
        v.t = -c1 / v.d;
        v.y = (v.t * v.c2 + c1) * v.t + c0;
        return v;
    }
    QX_INLINE L location(const int32_t *places, const VertexLimits &limits) const {
        return L(limits.position) + OfIntegers<nativeLanes>(places) + L(limits.centre) + t;
    }
    QX_INLINE L amplitude(const VertexLimits &limits) const { return y + L(limits.mean); }
};

template <class Windows>
QX_INLINE bool Find(const DBL *fitMatrix, const DBL *x, const uint64_t *masks, int32_t count,
                    const VertexLimits &limits, FoundVertices *found) {
    const int32_t windows = PlacesOf([=](int32_t i) { return masks[i]; }, count, found->places);
    const L sign(limits.sign), level = sign * L(limits.threshold), none(__builtin_nan(""));
    found->count = windows;
    for (int32_t first = 0; first < windows; first += nativeLanes) {
        const int32_t *const places = found->places + first;
        const Vertices v = Vertices::of<Windows>(fitMatrix, x, places);
        const auto isSought = sign * v.c2 > L(0.0);
        if (Any(isSought & ((Magnitude(v.d) < L(limits.smallestCurvature)) | (v.t < L(-0.5)))))
            return false;
        const auto isCounting =
            isSought & (Magnitude(v.t) <= L(limits.reach)) & (sign * v.y < level);
        Select(isCounting, v.location(places, limits), none).store(found->locations + first);
        v.amplitude(limits).store(found->amplitudes + first);
    }
    return true;
}

// The vertices of all windows whose bits are set.
template <class Windows>
QX_INLINE void StoreAll(const DBL *fitMatrix, const DBL *x, const char *masks, int32_t words,
                        const VertexLimits &limits, const VertexLists &lists) {
    int32_t places[FoundVertices::length], at = 0;
    VertexLimits group = limits;
    for (int32_t word = 0; word < words; word += groupWords) {
        const auto wordOf = [=](int32_t i) {
            uint64_t bits;
            __builtin_memcpy(&bits, masks + (std::ptrdiff_t{word} + i) * 8, sizeof bits);
            return bits;
        };
        const int32_t left = words - word;
        const int32_t windows = PlacesOf(wordOf, left < groupWords ? left : groupWords, places);
        const DBL *const from = x + std::ptrdiff_t{word} * maskWidth;
        group.position = limits.position + static_cast<double>(word) * maskWidth;
        const auto store = [&](int32_t first, DBL *locations, DBL *amplitudes, DBL *curvatures) {
            const Vertices v = Vertices::of<Windows>(fitMatrix, from, places + first);
            v.location(places + first, group).store(locations);
            v.amplitude(group).store(amplitudes);
            v.d.store(curvatures);
        };
        // What a vector has too much is overwritten by the next one.
        int32_t first = 0;
        for (; first < windows && at + first + nativeLanes <= lists.count; first += nativeLanes)
            store(first, lists.locations + at + first, lists.amplitudes + at + first,
                  lists.curvatures + at + first);
        for (; first < windows; first += nativeLanes) {
            DBL last[3][nativeLanes];
            store(first, last[0], last[1], last[2]);
            for (int32_t k = 0; k < nativeLanes && at + first + k < lists.count; ++k) {
                lists.locations[at + first + k] = last[0][k];
                lists.amplitudes[at + first + k] = last[1][k];
                lists.curvatures[at + first + k] = last[2][k];
            }
        }
        at += windows;
    }
}

// ---- Marks ----

QX_INLINE uint64_t FirstBits(int32_t count) { return ~uint64_t{0} >> (maskWidth - count); }

// The bits of the two windows at each end of a group, whose neighbours are in other groups.
QX_INLINE void DoubtEnds(int32_t count, VertexMarks *marks) {
    const int32_t ends[] = {0, 1, count - 2, count - 1};
    for (const int32_t i : ends)
        if (i >= 0 && i < count) {
            const uint64_t bit = uint64_t{1} << i % maskWidth;
            marks->doubtful[i / maskWidth] |= marks->possible[i / maskWidth] & bit;
        }
}

// The windows at whose first sample the data rise or fall by more than `least`.
struct Steps {
    uint64_t rises, falls;
};
QX_INLINE Steps StepsOf(const DBL *x, int32_t count, double least) {
    Steps steps = {};
    const L up(least), down(-least);
    int32_t i = 0;
    for (; i + nativeLanes <= count; i += nativeLanes) {
        const L step = L::load(x + i + 1) - L::load(x + i);
        steps.rises |= uint64_t{MaskBits(step > up)} << i;
        steps.falls |= uint64_t{MaskBits(step < down)} << i;
    }
    for (; i < count; ++i) {
        const double step = x[i + 1] - x[i];
        steps.rises |= uint64_t{step > least} << i;
        steps.falls |= uint64_t{step < -least} << i;
    }
    return steps;
}

QX_INLINE double SumOfMagnitudes(const DBL *x, int32_t n) {
    constexpr int sums = 4;
    constexpr int ahead = groupWidth; // fetches the next group
    L sum[sums];
    for (L &part : sum)
        part = L(0.0);
    int32_t i = 0;
    for (; i + sums * nativeLanes <= n; i += sums * nativeLanes)
        for (int k = 0; k < sums; ++k) {
            if (k * nativeLanes % 8 == 0)
                __builtin_prefetch(x + i + k * nativeLanes + ahead);
            sum[k] = sum[k] + Magnitude(L::load(x + i + k * nativeLanes));
        }
    const L all = (sum[0] + sum[1]) + (sum[2] + sum[3]);
    double total = 0;
    for (int k = 0; k < nativeLanes; ++k)
        total += all[k];
    for (; i < n; ++i)
        total += __builtin_fabs(x[i]);
    return total;
}

} // namespace

bool FindVertices(const DBL *fitMatrix, int32_t w, const DBL *x, const uint64_t *masks,
                  int32_t count, const VertexLimits *limits, FoundVertices *found) {
    return w == 3 ? Find<WindowsOfThree>(fitMatrix, x, masks, count, *limits, found)
                  : Find<WindowsOfFour>(fitMatrix, x, masks, count, *limits, found);
}

bool KeptOfClose(const DBL *locations, const DBL *amplitudes, int32_t count, double sign,
                 double lastLocation, uint64_t *kept) {
    const uint64_t all = FirstBits(count);
    uint64_t close = 0, better = 0, threeClose = 0, valid = 0, closeToLast = 0;
    const L towards(sign), last(lastLocation);
    for (int32_t i = 0; i < count; i += nativeLanes) {
        const L here = L::load(locations + i), next = L::load(locations + i + 1);
        valid |= uint64_t{MaskBits(here == here)} << i;
        close |= uint64_t{MaskBits(Magnitude(here - next) < L(1.0))} << i;
        threeClose |= uint64_t{MaskBits(Magnitude(here - L::load(locations + i + 2)) < L(1.0))}
                      << i;
        better |= uint64_t{MaskBits(towards * L::load(amplitudes + i + 1) <
                                    towards * L::load(amplitudes + i))}
                  << i;
        if (i < 4)
            closeToLast |= MaskBits(Magnitude(last - here) < L(1.0));
    }
    close &= all >> 1;
    threeClose &= all >> 2;
    *kept = all & valid & ~((close & better) | (close & ~better) << 1);
    return ((close & close << 1) | threeClose | (closeToLast & all)) == 0;
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

void MarkVertices(const DBL *fitMatrix, int32_t w, const DBL *x, int32_t count,
                  const VertexLimits *limits, VertexMarks *marks) {
    const VertexTest test(*limits);
    for (int32_t first = 0; first < count; first += maskWidth) {
        const DBL *const from = x + first;
        const int32_t windows = count - first < maskWidth ? count - first : maskWidth;
        const auto one = [&](int32_t i) {
            return test.one(OneProduct(fitMatrix, w, from + i),
                            OneProduct(fitMatrix + w, w, from + i),
                            OneProduct(fitMatrix + 2 * w, w, from + i));
        };
        const uint64_t bits =
            w == 3
                ? Collect(
                      windows, [&](int32_t i) { return AtVertexOfThree<together>(from + i, test); },
                      [&](int32_t i) { return AtVertexOfThree<1>(from + i, test); }, one)
                : Collect(
                      windows,
                      [&](int32_t i) {
                          constexpr int half = together / 2;
                          return AtVertexOfFour<half>(fitMatrix, from + i, test) |
                                 AtVertexOfFour<half>(fitMatrix, from + i + half * nativeLanes,
                                                      test)
                                     << (half * nativeLanes);
                      },
                      [&](int32_t i) { return AtVertexOfFour<1>(fitMatrix, from + i, test); }, one);
        marks->possible[first / maskWidth] = marks->doubtful[first / maskWidth] = bits;
    }
}

// With steps beyond `least` the comparison of samples decides as that of the coefficients, whose
// rounding errors are less than a hundredth of it. `least` also keeps certain curvatures above the
// smallest one, and certain vertices a sample from all others.
bool MarkBySteps(const DBL *x, int32_t count, const VertexLimits *limits, VertexMarks *marks) {
    constexpr double largest = 1e300; // below it no coefficient overflows
    const double level = -limits->sign * limits->threshold;
    if (!(level < 0))
        return false;
    const double size = SumOfMagnitudes(x, count + 2);
    if (!(size < largest) || !(level < -size))
        return false;
    const double least = limits->smallestCurvature + size * 0x1p-44;
    const int32_t words = (count + maskWidth - 1) / maskWidth;
    Steps steps[groupWords + 1];
    steps[words] = {};
    for (int32_t k = 0; k * maskWidth <= count; ++k) {
        const int32_t left = count + 1 - k * maskWidth;
        steps[k] = StepsOf(x + k * maskWidth, left < maskWidth ? left : maskWidth, least);
    }
    if (limits->sign > 0)
        for (int32_t k = 0; k <= words; ++k)
            steps[k] = {steps[k].falls, steps[k].rises};
    int32_t doubts = 0;
    for (int32_t k = 0; k < words; ++k) {
        const int32_t left = count - k * maskWidth;
        const auto behind = [](uint64_t bits, uint64_t next) {
            return bits >> 1 | next << (maskWidth - 1);
        };
        const uint64_t certain = steps[k].rises & behind(steps[k].falls, steps[k + 1].falls);
        const uint64_t possible = ~(steps[k].falls | behind(steps[k].rises, steps[k + 1].rises)) &
                                  FirstBits(left < maskWidth ? left : maskWidth);
        marks->possible[k] = possible;
        marks->doubtful[k] = possible & ~certain;
        doubts += __builtin_popcountll(marks->doubtful[k]);
    }
    DoubtEnds(count, marks);
    return doubts <= count / 4;
}

void StoreVertices(const DBL *fitMatrix, int32_t w, const DBL *x, const char *masks, int32_t words,
                   const VertexLimits *limits, VertexLists lists) {
    if (w == 3)
        StoreAll<WindowsOfThree>(fitMatrix, x, masks, words, *limits, lists);
    else
        StoreAll<WindowsOfFour>(fitMatrix, x, masks, words, *limits, lists);
}

} // namespace qx::QX_WIDTH
