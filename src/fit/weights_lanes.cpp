#include "fit/weights.h"

#include "frame/lane_masks.h"

namespace qx::QX_WIDTH {

// Several sums of each kind, so that one need not wait for the other.
void CountWeights(const DBL *w, int32_t n, WeightCounts *counts) {
    typedef Lanes<nativeLanes> L;
    constexpr int apart = 4;
    BitsOf<L> zeros[apart] = {}, numbers[apart]; // all bits set for numbers
    L largest[apart];
    for (int k = 0; k < apart; ++k) {
        numbers[k] = ~zeros[k];
        largest[k] = L(0.0);
    }
    int32_t i = 0;
    for (; i + apart * nativeLanes <= n; i += apart * nativeLanes)
        for (int k = 0; k < apart; ++k) {
            const L weight = L::load(w + i + k * nativeLanes);
            zeros[k] -= (weight == L(0.0)).m;
            numbers[k] &= (weight == weight).m;
            largest[k] = Larger(Magnitude(weight), largest[k]);
        }
    int32_t zero = 0;
    bool areNumbers = true;
    double most = 0.0;
    for (int k = 0; k < apart; ++k)
        for (int lane = 0; lane < nativeLanes; ++lane) {
            zero += static_cast<int32_t>(zeros[k][lane]);
            areNumbers &= numbers[k][lane] != 0;
            most = largest[k][lane] > most ? largest[k][lane] : most;
        }
    for (; i < n; ++i) {
        const double size = __builtin_fabs(w[i]);
        zero += size == 0.0;
        areNumbers &= size == size;
        most = size > most ? size : most;
    }
    *counts = {n - zero, !areNumbers, most};
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
            held[k] = Larger(Magnitude(L::load(w + i + k * nativeLanes)), held[k]);
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
