// The cosine transform of even lengths against FFTW's REDFT10, and its inverse against REDFT01;
// one thread, plans made outside the timed loop.
//
// bench_transforms [LENGTH...]

#include "bench/fftw_plan.h"
#include "bench/host_memory.h"
#include "bench/timing.h"
#include "fft/plan.h"
#include "transforms/dct.h"

#include <cstdint>
#include <cstdlib>
#include <vector>

namespace {

using qx::bench::HostMemory;
using qx::bench::LeastTimes;
using qx::bench::Ratios;

#ifdef QX_PEER_FFTW3
using qx::bench::FFTWPlan;

FFTWPlan Peer(int32_t n, fftw_r2r_kind kind, unsigned effort) {
    return {std::size_t(n),
            [=](double *in, double *out) { return fftw_plan_r2r_1d(n, in, out, kind, effort); }};
}
#endif

struct Totals {
    Ratios forwardEstimate{"cosine transform"};
    Ratios forwardMeasure{"cosine transform"};
    Ratios inverseMeasure{"inverse cosine transform"};
};

void Compare(int32_t n, [[maybe_unused]] Totals &totals) {
    const HostMemory in(n);
    const HostMemory out(n);
    const HostMemory work(qx::DCTInverseWork(n));
    const qx::PlanReference plan(static_cast<int32_t>(qx::DCTPlanLength(n)));
    const auto forward = [&] {
        qx::DCTForward(plan.get(), {in.data(), n}, {out.data(), n}, work.data());
    };
    const auto inverse = [&] {
        qx::DCTInverse(plan.get(), {in.data(), n}, {out.data(), n}, work.data());
    };
#ifdef QX_PEER_FFTW3
    const FFTWPlan estimate = Peer(n, FFTW_REDFT10, FFTW_ESTIMATE);
    const FFTWPlan measure = Peer(n, FFTW_REDFT10, FFTW_MEASURE);
    const FFTWPlan inverseMeasure = Peer(n, FFTW_REDFT01, FFTW_MEASURE);
    const auto times = LeastTimes(forward, estimate, measure);
    const auto inverseTimes = LeastTimes(inverse, inverseMeasure);
    const std::string name = std::to_string(n);
    totals.forwardEstimate.add(times[0] / times[1], name);
    totals.forwardMeasure.add(times[0] / times[2], name);
    totals.inverseMeasure.add(inverseTimes[0] / inverseTimes[1], name);
    std::printf("%8d DCT %10.3f us %5.2f %5.2f   inverse %10.3f us %5.2f\n", n, times[0] * 1e6,
                times[0] / times[1], times[0] / times[2], inverseTimes[0] * 1e6,
                inverseTimes[0] / inverseTimes[1]);
#else
    const auto times = LeastTimes(forward, inverse);
    std::printf("%8d DCT %10.3f us   inverse %10.3f us\n", n, times[0] * 1e6, times[1] * 1e6);
#endif
    std::fflush(stdout);
}

} // namespace

int main(int argc, char **argv) {
    Totals totals;
    std::vector<int32_t> lengths = {8,     16,    32,    50,     64,     100,     128,
                                    256,   360,   512,   1000,   1024,   2048,    4096,
                                    10000, 16384, 65536, 100000, 262144, 1000000, 1048576};
    if (argc > 1)
        lengths.clear();
    for (int i = 1; i < argc; ++i)
        lengths.push_back(std::atoi(argv[i]));
    std::printf("our time; ratios to FFTW with FFTW_ESTIMATE and FFTW_MEASURE\n");
    for (const int32_t n : lengths)
        Compare(n, totals);
    totals.forwardEstimate.summary("FFTW, FFTW_ESTIMATE");
    totals.forwardMeasure.summary("FFTW, FFTW_MEASURE");
    totals.inverseMeasure.summary("FFTW, FFTW_MEASURE");
}
