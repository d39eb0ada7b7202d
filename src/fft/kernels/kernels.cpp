#include "fft/kernels/kernels.h"

#include "frame/lanes.h"

namespace qx::QX_WIDTH {
namespace {

using std::ptrdiff_t;

constexpr int packedColumns = nativeLanes / 2;

} // namespace

int64_t ComplexLanesSize(int32_t p, int32_t m) {
    return int64_t{m / packedColumns} * nativeLanes * (p - 1);
}

int64_t RealLanesSize(int32_t p, int32_t m) {
    return int64_t{(m - 1) / 2 / nativeLanes} * nativeLanes * 2 * (p - 1);
}

void FillComplexLanes(const FFTStage &stage, int32_t p, int32_t m, DBL *lanes) {
    const ptrdiff_t pitch = p - 1;
    for (ptrdiff_t block = 0; block + packedColumns <= m; block += packedColumns) {
        for (int column = 0; column < packedColumns; ++column) {
            const ptrdiff_t k = block + column;
            const ptrdiff_t entry = (k - 1) * pitch;
            for (ptrdiff_t j = 0; j < pitch; ++j) {
                DBL *const packed = lanes + j * nativeLanes + 2 * column;
                packed[0] = k == 0 ? 1.0 : stage.twiddleCos[entry + j];
                packed[1] = k == 0 ? 0.0 : stage.twiddleSin[entry + j];
            }
        }
        lanes += pitch * nativeLanes;
    }
}

void FillRealLanes(const FFTStage &stage, int32_t p, int32_t m, DBL *lanes) {
    const ptrdiff_t pitch = p - 1;
    for (ptrdiff_t block = 1; block + nativeLanes - 1 <= (m - 1) / 2; block += nativeLanes) {
        for (int lane = 0; lane < nativeLanes; ++lane) {
            const ptrdiff_t entry = (block + lane - 1) * pitch;
            for (ptrdiff_t j = 0; j < pitch; ++j) {
                lanes[2 * j * nativeLanes + lane] = stage.twiddleCos[entry + j];
                lanes[(2 * j + 1) * nativeLanes + lane] = stage.twiddleSin[entry + j];
            }
        }
        lanes += 2 * pitch * nativeLanes;
    }
}

} // namespace qx::QX_WIDTH
