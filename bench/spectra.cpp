// The power spectrum, with everything that the export does beside its frame, against the bare
// real transform of the same length.

#include "bench/host_memory.h"
#include "bench/timing.h"
#include "fft/plan.h"
#include "spectra/power_spectrum.h"

#include <cstdint>

namespace {

using namespace qx::bench;

void Compare(int32_t n, Ratios &ratios) {
    const HostMemory in(n);
    const HostMemory out(n);
    const qx::PlanReference plan(n);
    // The spectrum works in place, so the values shrink from call to call; they are set anew
    // often enough to keep clear of denormal numbers, at the same cost on both sides.
    const auto refill = [&] {
        for (int32_t i = 0; i < n; i += 64)
            in.data()[i] = 1.0;
    };
    const auto times = MedianTimes(
        [&] {
            refill();
            qx::PowerSpectrumReal(in.data(), n);
        },
        [&] {
            refill();
            qx::FFTRealForward(plan.get(), in.data(), out.data(), 1, 1, n);
        });
    ratios.add(times[0] / times[1]);
    std::printf("%8d power spectrum %10.3f us, over the bare transform %5.2f\n", n, times[0] * 1e6,
                times[0] / times[1]);
    std::fflush(stdout);
}

} // namespace

int main() {
    Ratios ratios("power spectrum, over the bare transform");
    for (int32_t n : {257, 300, 512, 1000, 1024, 1009, 2048, 4096, 10000, 16384, 65536, 100000,
                      262144, 1000000, 1048576})
        Compare(n, ratios);
    ratios.print();
}
