#include "filters/remez.h"

#include "frame/lanes.h"

namespace qx::QX_WIDTH {

namespace {

// All places of a group together, so that their divisions overlap.
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

// The number of factors between two range checks: distances of cosines on the grid are above 1e-9.
constexpr int32_t factorsAtOnce = 16;

QX_INLINE void KeepInRange(DBL &product, I32 &exponent) {
    if (product > -0x1p-512 && product < 0x1p-512) {
        product *= 0x1p512;
        exponent -= 512;
    } else if (product > 0x1p512 || product < -0x1p512) {
        product *= 0x1p-512;
        exponent += 512;
    }
}

template <class L>
QX_INLINE L WithOne(L lanes, int lane) {
    double values[L::count];
    lanes.store(values);
    values[lane] = 1.0;
    return L::load(values);
}

template <class L>
QX_INLINE void MultiplyDistancesOf(int32_t j, const Distances &distances) {
    const DBL *x = distances.x;
    DBL *product = distances.product;
    I32 *exponent = distances.exponent;
    const int32_t count = distances.count;
    const L own = L::load(x + j);
    for (int lane = 0; lane < L::count; ++lane) {
        product[j + lane] = 1.0;
        exponent[j + lane] = 0;
    }
    for (int32_t first = 0; first < count; first += factorsAtOnce) {
        L part = L::load(product + j);
        const int32_t end = first + factorsAtOnce < count ? first + factorsAtOnce : count;
        for (int32_t k = first; k < end; ++k) {
            L distance = own - L(x[k]);
            if (k >= j && k < j + L::count) // the distance of a lane from itself
                distance = WithOne(distance, k - j);
            part = part * distance;
        }
        part.store(product + j);
        for (int lane = 0; lane < L::count; ++lane)
            KeepInRange(product[j + lane], exponent[j + lane]);
    }
}

} // namespace

void MultiplyDistances(const Distances &distances) {
    int32_t j = 0;
    for (; j + nativeLanes <= distances.count; j += nativeLanes)
        MultiplyDistancesOf<Lanes<nativeLanes>>(j, distances);
    for (; j < distances.count; ++j)
        MultiplyDistancesOf<Lanes<1>>(j, distances);
}

void Interpolate(const Interpolation &polynomial, const DBL *places, DBL *values) {
    static_assert(interpolationGroup % nativeLanes == 0);
    InterpolateIn<interpolationGroup / nativeLanes>(polynomial, places, values);
}

} // namespace qx::QX_WIDTH
