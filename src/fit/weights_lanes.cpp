#include "fit/weights.h"

#include "frame/lanes.h"

namespace qx::QX_WIDTH {

namespace {

template <class L>
QX_INLINE L Modulus(L x) {
    return L(x.v < L(0.0).v ? -x.v : x.v);
}
template <class L>
QX_INLINE L Larger(L a, L b) {
    return L(a.v > b.v ? a.v : b.v);
}
template <class L>
QX_INLINE L OneWhereUnequal(L a, L b) {
    return L(a.v != b.v ? L(1.0).v : L(0.0).v);
}

} // namespace

// The counts are doubles, which are exact and need no conversion.
void CountWeights(const DBL *w, int32_t n, WeightCounts *counts) {
    typedef Lanes<nativeLanes> L;
    L used(0.0), broken(0.0);
    int32_t i = 0;
    for (; i + nativeLanes <= n; i += nativeLanes) {
        const L weight = L::load(w + i);
        used = used + OneWhereUnequal(weight, L(0.0));
        broken = broken + OneWhereUnequal(weight, weight);
    }
    *counts = {0.0, 0.0};
    for (int lane = 0; lane < nativeLanes; ++lane) {
        counts->used += used[lane];
        counts->broken += broken[lane];
    }
    for (; i < n; ++i) {
        counts->used += w[i] != 0.0 ? 1.0 : 0.0;
        counts->broken += w[i] != w[i] ? 1.0 : 0.0;
    }
}

double LargestWeight(const DBL *w, int32_t n) {
    typedef Lanes<nativeLanes> L;
    constexpr int32_t step = 2 * nativeLanes;
    L first(0.0), second(0.0);
    int32_t i = 0;
    for (; i + step <= n; i += step) {
        first = Larger(Modulus(L::load(w + i)), first);
        second = Larger(Modulus(L::load(w + i + nativeLanes)), second);
    }
    const L both = Larger(first, second);
    double largest = 0.0;
    for (int lane = 0; lane < nativeLanes; ++lane)
        largest = both[lane] > largest ? both[lane] : largest;
    for (; i < n; ++i) {
        const double size = w[i] < 0.0 ? -w[i] : w[i];
        largest = size > largest ? size : largest;
    }
    return largest;
}

} // namespace qx::QX_WIDTH
