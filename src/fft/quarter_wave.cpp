#include "fft/quarter_wave.h"
#include "frame/constants.h"

#include <atomic>
#include <cmath>
#include <cstddef>
#include <cstdint>
#include <cstdlib>
#include <limits>

namespace qx {
namespace {

double *QuarterWaveOf(int32_t length) {
    const int64_t entries = int64_t{length} / 2 + 1;
    if (entries > std::numeric_limits<std::ptrdiff_t>::max() / int64_t{2 * sizeof(double)})
        return nullptr;
    auto *const wave =
        static_cast<double *>(std::malloc(static_cast<std::size_t>(entries) * 2 * sizeof(double)));
    if (!wave)
        return nullptr;
    for (std::ptrdiff_t k = 0; k < entries; ++k) {
        const double angle = kPi * static_cast<double>(k) / (2.0 * length);
        wave[2 * k] = std::cos(angle);
        wave[2 * k + 1] = std::sin(angle);
    }
    return wave;
}

} // namespace

const DBL *BuildQuarterWave(const FFTPlan *plan) {
    double *const built = QuarterWaveOf(plan->length);
    const double *wave = nullptr;
    // If several threads build the table at the same time, the first one is kept.
    if (plan->quarterWave.compare_exchange_strong(wave, built, std::memory_order_acq_rel))
        return built;
    std::free(built);
    return wave;
}

} // namespace qx
