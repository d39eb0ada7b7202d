#include "filters/remez.h"

#include "frame/lanes.h"

namespace qx::QX_WIDTH {

namespace {

// All places of a group side by side, so that their divisions overlap.
template <int Vectors>
QX_INLINE void InterpolateIn(const Interpolation &polynomial, const DBL *places, DBL *values) {
    typedef Lanes<nativeLanes> L;
    L place[Vectors], above[Vectors], below[Vectors], lost[Vectors];
    for (int i = 0; i < Vectors; ++i) {
        place[i] = L::load(places + i * nativeLanes);
        above[i] = below[i] = lost[i] = L(0.0);
    }
    for (int32_t j = 0; j < polynomial.count; ++j) {
        const L x(polynomial.x[j]), y(polynomial.y[j]), ad(polynomial.ad[j]);
        for (int i = 0; i < Vectors; ++i) {
            const L c = ad / (place[i] - x);
            above[i] = above[i] + c * y;
            const L term = c - lost[i];
            const L sum = below[i] + term;
            lost[i] = (sum - below[i]) - term;
            below[i] = sum;
        }
    }
    for (int i = 0; i < Vectors; ++i)
        (above[i] / below[i]).store(values + i * nativeLanes);
}

} // namespace

void Interpolate(const Interpolation &polynomial, const DBL *places, DBL *values) {
    static_assert(interpolationGroup % nativeLanes == 0);
    InterpolateIn<interpolationGroup / nativeLanes>(polynomial, places, values);
}

} // namespace qx::QX_WIDTH
