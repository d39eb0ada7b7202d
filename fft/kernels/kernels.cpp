#include "fft/kernels/kernels.h"

#include "fft/kernels/transforms.h"

#include <algorithm>

namespace qx {
namespace {

using std::ptrdiff_t;

template <int... P>
const KernelSet &Find(int32_t radix) {
    const KernelSet *found = nullptr;
    ((radix == P ? found = &KernelsFor<P>() : nullptr), ...);
    return *found;
}

int64_t BlocksOf(int64_t columns) { return (columns + nativeLanes - 1) / nativeLanes; }

// Block after block of the columns from `first` to `last`; column(lane) is where a lane's column
// stands in the block.
template <class ColumnOfLane>
void FillLanes(const FFTStage &stage, ptrdiff_t p, ptrdiff_t first, ptrdiff_t last,
               ColumnOfLane column, DBL *lanes) {
    const ptrdiff_t pitch = p - 1;
    for (ptrdiff_t block = first; block <= last; block += nativeLanes) {
        for (int lane = 0; lane < nativeLanes; ++lane) {
            const ptrdiff_t k = std::min(block + column(lane), last);
            const ptrdiff_t entry = (k - 1) * pitch;
            for (ptrdiff_t j = 0; j < pitch; ++j) {
                lanes[2 * j * nativeLanes + lane] = k == 0 ? 1.0 : stage.twiddleCos[entry + j];
                lanes[(2 * j + 1) * nativeLanes + lane] =
                    k == 0 ? 0.0 : stage.twiddleSin[entry + j];
            }
        }
        lanes += 2 * pitch * nativeLanes;
    }
}

} // namespace

const KernelSet &KernelsOf(int32_t radix) {
    return Find<2, 3, 4, 5, 7, 8, 9, 10, 11, 13, 14, 16, 17, 18, 19, 29, 31, 32, 37, 41, 43>(radix);
}

int64_t ComplexLanesSize(int32_t p, int32_t m) { return BlocksOf(m) * nativeLanes * 2 * (p - 1); }

int64_t RealLanesSize(int32_t p, int32_t m) {
    return BlocksOf((m - 1) / 2) * nativeLanes * 2 * (p - 1);
}

void FillComplexLanes(const FFTStage &stage, int32_t p, int32_t m, DBL *lanes) {
    FillLanes(stage, p, 0, m - 1, laneColumn, lanes);
}

void FillRealLanes(const FFTStage &stage, int32_t p, int32_t m, DBL *lanes) {
    FillLanes(
        stage, p, 1, (m - 1) / 2, [](int lane) { return lane; }, lanes);
}

} // namespace qx
