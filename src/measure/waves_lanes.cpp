#include "measure/waves.h"

#include "frame/lanes.h"

namespace qx::QX_WIDTH {
namespace {

typedef Lanes<nativeLanes> L;
constexpr int32_t sumsOfEach = 4;
constexpr int32_t parts = sumsOfEach / nativeLanes;

// Four partial sums, each of every fourth term.
struct Fourfold {
    L sums[parts];

    QX_INLINE Fourfold() {
        for (L &sum : sums)
            sum = L(0.0);
    }
    QX_INLINE double total() const {
        double each[sumsOfEach];
        for (int32_t i = 0; i < sumsOfEach; ++i)
            each[i] = sums[i / nativeLanes][i % nativeLanes];
        return (each[0] + each[2]) + (each[1] + each[3]);
    }
};

} // namespace

void SubtractWave(const BlockWave &wave, const DBL *table, DBL *waves, DBL *left) {
    const L c(wave.cosAtStart), s(wave.sinAtStart), a(wave.cosine), b(wave.sine);
    for (int32_t j = 0; j < waveBlock; j += nativeLanes) {
        const L tableCos = L::load(table + j);
        const L tableSin = L::load(table + waveBlock + j);
        const L cosine = c * tableCos - s * tableSin;
        const L sine = s * tableCos + c * tableSin;
        cosine.store(waves + j);
        sine.store(waves + waveBlock + j);
        (L::load(left + j) - (a * cosine + b * sine)).store(left + j);
    }
}

void SumByWave(const DBL *waves, const DBL *left, double *sums) {
    Fourfold cosines, sines, placedCosines, placedSines;
    L place[parts];
    for (int32_t p = 0; p < parts; ++p) {
        double first[nativeLanes];
        for (int i = 0; i < nativeLanes; ++i)
            first[i] = p * nativeLanes + i;
        place[p] = L::load(first);
    }
    for (int32_t j = 0; j < waveBlock; j += sumsOfEach)
        for (int32_t p = 0; p < parts; ++p) {
            const int32_t at = j + p * nativeLanes;
            const L here = L::load(left + at);
            const L cosine = here * L::load(waves + at);
            const L sine = here * L::load(waves + waveBlock + at);
            cosines.sums[p] = cosines.sums[p] + cosine;
            sines.sums[p] = sines.sums[p] + sine;
            placedCosines.sums[p] = placedCosines.sums[p] + place[p] * cosine;
            placedSines.sums[p] = placedSines.sums[p] + place[p] * sine;
            place[p] = place[p] + L(sumsOfEach);
        }
    sums[0] = cosines.total();
    sums[1] = sines.total();
    sums[2] = placedCosines.total();
    sums[3] = placedSines.total();
}

void SumOfBlock(const DBL *left, double *sums) {
    Fourfold values, squares;
    for (int32_t j = 0; j < waveBlock; j += sumsOfEach)
        for (int32_t p = 0; p < parts; ++p) {
            const L here = L::load(left + j + p * nativeLanes);
            values.sums[p] = values.sums[p] + here;
            squares.sums[p] = squares.sums[p] + here * here;
        }
    sums[0] = values.total();
    sums[1] = squares.total();
}

double SumOfProducts(const DBL *a, const DBL *b, int32_t n) {
    Fourfold products;
    int32_t i = 0;
    for (; n - i >= sumsOfEach; i += sumsOfEach)
        for (int32_t p = 0; p < parts; ++p) {
            const int32_t at = i + p * nativeLanes;
            products.sums[p] = products.sums[p] + L::load(a + at) * L::load(b + at);
        }
    double sum = products.total();
    for (; i < n; ++i)
        sum += a[i] * b[i];
    return sum;
}

} // namespace qx::QX_WIDTH
