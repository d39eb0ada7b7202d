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
    constexpr int apart = 4; // sums, so that one need not wait for the other
    L used[apart], broken[apart];
    for (int k = 0; k < apart; ++k)
        used[k] = broken[k] = L(0.0);
    int32_t i = 0;
    for (; i + apart * nativeLanes <= n; i += apart * nativeLanes)
        for (int k = 0; k < apart; ++k) {
            const L weight = L::load(w + i + k * nativeLanes);
            used[k] = used[k] + OneWhereUnequal(weight, L(0.0));
            broken[k] = broken[k] + OneWhereUnequal(weight, weight);
        }
    *counts = {0.0, 0.0};
    for (int k = 0; k < apart; ++k)
        for (int lane = 0; lane < nativeLanes; ++lane) {
            counts->used += used[k][lane];
            counts->broken += broken[k][lane];
        }
    for (; i < n; ++i) {
        counts->used += w[i] != 0.0 ? 1.0 : 0.0;
        counts->broken += w[i] != w[i] ? 1.0 : 0.0;
    }
}

double LargestWeight(const DBL *w, int32_t n) {
    typedef Lanes<nativeLanes> L;
    constexpr int apart = 4;
    L held[apart];
    for (L &largest : held)
        largest = L(0.0);
    int32_t i = 0;
    for (; i + apart * nativeLanes <= n; i += apart * nativeLanes)
        for (int k = 0; k < apart; ++k)
            held[k] = Larger(Modulus(L::load(w + i + k * nativeLanes)), held[k]);
    const L all = Larger(Larger(held[0], held[1]), Larger(held[2], held[3]));
    double largest = 0.0;
    for (int lane = 0; lane < nativeLanes; ++lane)
        largest = all[lane] > largest ? all[lane] : largest;
    for (; i < n; ++i) {
        const double size = w[i] < 0.0 ? -w[i] : w[i];
        largest = size > largest ? size : largest;
    }
    return largest;
}

} // namespace qx::QX_WIDTH
