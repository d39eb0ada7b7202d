#ifndef QX_FFT_QUARTER_WAVE_H
#define QX_FFT_QUARTER_WAVE_H

#include "fft/plan.h"
#include "qx/types.h"

#include <atomic>

namespace qx {

// The pairs cos, sin of pi k / (2 N) for k from 0 to N/2, with N the plan's length: the twiddles
// of the cosine transforms. They are built at the plan's first use in such a transform and live
// as long as the plan. Null if memory ran out. Safe to call from any number of threads. Inline,
// because a call takes 1 of the 30 ns of a short transform.
const DBL *BuildQuarterWave(const FFTPlan *plan); // for QuarterWave
inline const DBL *QuarterWave(const FFTPlan *plan) {
    const DBL *const wave = plan->quarterWave.load(std::memory_order_acquire);
    return wave != nullptr ? wave : BuildQuarterWave(plan);
}

} // namespace qx

#endif
