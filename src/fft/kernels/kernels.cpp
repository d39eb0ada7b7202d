#include "fft/kernels/kernels.h"

namespace qx {

using std::ptrdiff_t;

int64_t ComplexLanesSize(const LanesPasses &passes, int32_t p, int32_t m) {
    return int64_t{m / (passes.complexLanes / 2)} * passes.complexLanes * (p - 1);
}

// The last column that runs in lanes: in eight lanes the middle one too (RealWideTwiddle).
static ptrdiff_t LastInLanes(const LanesPasses &passes, ptrdiff_t m) {
    return passes.realLanes == 8 ? m / 2 : (m - 1) / 2;
}

int64_t RealLanesSize(const LanesPasses &passes, int32_t p, int32_t m) {
    return int64_t{LastInLanes(passes, m) / passes.realLanes} * passes.realLanes * 2 * (p - 1);
}

void FillComplexLanes(const FFTStage &stage, int32_t p, int32_t m, DBL *table) {
    const int lanes = stage.passes.complexLanes;
    const int packedColumns = lanes / 2;
    const ptrdiff_t pitch = p - 1;
    for (ptrdiff_t block = 0; block + packedColumns <= m; block += packedColumns) {
        for (int column = 0; column < packedColumns; ++column) {
            const ptrdiff_t k = block + column;
            const ptrdiff_t entry = (k - 1) * pitch;
            for (ptrdiff_t j = 0; j < pitch; ++j) {
                DBL *const packed = table + j * lanes + 2 * column;
                packed[0] = k == 0 ? 1.0 : stage.twiddleCos[entry + j];
                packed[1] = k == 0 ? 0.0 : stage.twiddleSin[entry + j];
            }
        }
        table += pitch * lanes;
    }
}

void FillRealLanes(const FFTStage &stage, int32_t p, int32_t m, DBL *table) {
    const int lanes = stage.passes.realLanes;
    const ptrdiff_t pitch = p - 1;
    const ptrdiff_t last = LastInLanes(stage.passes, m);
    for (ptrdiff_t block = 1; block + lanes - 1 <= last; block += lanes) {
        for (int lane = 0; lane < lanes; ++lane) {
            const ptrdiff_t entry = (block + lane - 1) * pitch;
            for (ptrdiff_t j = 0; j < pitch; ++j) {
                table[2 * j * lanes + lane] = stage.twiddleCos[entry + j];
                table[(2 * j + 1) * lanes + lane] = stage.twiddleSin[entry + j];
            }
        }
        table += 2 * pitch * lanes;
    }
}

} // namespace qx
