#include "fit/line.h"
#include "frame/lane_masks.h"

namespace qx::QX_WIDTH {

// As many samples as a vector has lanes are weighted together. Their terms are then transposed, so
// that the four kinds of sums lie side by side in vectors and take one sample after the other.
void WeightedLineSums(const DBL *x, const DBL *y, const DBL *w, int32_t n, double largest,
                      LineSums *sums) {
    typedef Lanes<nativeLanes> L;
    constexpr int vectors = 4 / nativeLanes;
    L held[vectors];
    for (L &sum : held)
        sum = L(0.0);
    double xx = 0.0;
    int32_t i = 0;
    for (; n - i >= nativeLanes; i += nativeLanes) {
        const L weight = L::load(w + i), atX = L::load(x + i), atY = L::load(y + i);
        L terms[4];
        terms[0] = Select(weight < L(0.0), -weight, weight) / L(largest);
        terms[1] = terms[0] * atX;
        terms[2] = terms[0] * atY;
        terms[3] = terms[1] * atY;
        const L squares = terms[1] * atX;
        for (int v = 0; v < vectors; ++v)
            Transpose(terms + v * nativeLanes);
        for (int lane = 0; lane < nativeLanes; ++lane) {
            for (int v = 0; v < vectors; ++v)
                held[v] = held[v] + terms[v * nativeLanes + lane];
            xx += squares[lane];
        }
    }
    DBL four[4];
    for (int v = 0; v < vectors; ++v)
        held[v].store(four + v * nativeLanes);
    *sums = {four[0], four[1], four[2], four[3], xx};
    for (; i < n; ++i) {
        const double v = (w[i] < 0.0 ? -w[i] : w[i]) / largest;
        const double vx = v * x[i], vy = v * y[i];
        sums->weight += v;
        sums->x += vx;
        sums->y += vy;
        sums->xy += vx * y[i];
        sums->xx += vx * x[i];
    }
}

} // namespace qx::QX_WIDTH
