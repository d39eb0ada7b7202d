// The power spectrum, with everything that the export does except its frame, against the bare
// real transform of the same length.

#include "bench/host_memory.h"
#include "bench/timing.h"
#include "fft/plan.h"
#include "spectra/power_spectrum.h"

#include <cstdint>
#include <cstring>

namespace {

using qx::bench::HostMemory;
using qx::bench::Keep;
using qx::bench::LeastTimes;
using qx::bench::Ratios;

// The spectrum works in place, so the signal is copied for each call, at the same cost on both sides,
// and the time of the copy is subtracted. (A call on the previous result would read
// data that the processor is still storing.)
void Compare(int32_t n, Ratios &ratios) {
    const HostMemory signal(n);
    const HostMemory in(n);
    const HostMemory out(n);
    const qx::PlanReference plan(n);
    const auto refill = [&] {
        std::memcpy(in.data(), signal.data(), sizeof(double) * n);
        Keep(in);
    };
    const auto times = LeastTimes(
        [&] {
            refill();
            qx::PowerSpectrumReal(in.data(), n);
        },
        [&] {
            refill();
            qx::FFTRealForward(plan.get(), in.data(), out.data(), 1, 1, n);
        },
        refill);
    const double ratio = (times[0] - times[2]) / (times[1] - times[2]);
    ratios.add(ratio, std::to_string(n));
    std::printf("%8d power spectrum %10.3f us, over the bare transform %5.2f\n", n,
                (times[0] - times[2]) * 1e6, ratio);
    std::fflush(stdout);
}

} // namespace

int main() {
    Ratios ratios("power spectrum");
    for (int32_t n : {257, 300, 512, 1000, 1024, 1009, 2048, 4096, 10000, 16384, 65536, 100000,
                      262144, 1000000, 1048576})
        Compare(n, ratios);
    ratios.summary("our bare real transform");
}
