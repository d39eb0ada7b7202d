// Two-dimensional transforms against FFTW, one thread, plans made outside the timed loop.

#include "bench/fftw_plan.h"
#include "bench/host_memory.h"
#include "bench/timing.h"
#include "fft/plan.h"
#include "fft/two_dimensional.h"

#include <cstdint>

namespace {

using qx::bench::HostMemory;
using qx::bench::LeastTimes;
using qx::bench::Ratios;

#ifdef QX_PEER_FFTW3
using qx::bench::FFTWPlan;

FFTWPlan Peer(int32_t rows, int32_t cols, bool real, unsigned effort) {
    return {2 * std::size_t(rows) * cols, [=](double *in, double *out) {
                fftw_complex *const to = FFTWPlan::Complex(out);
                return real ? fftw_plan_dft_r2c_2d(rows, cols, in, to, effort)
                            : fftw_plan_dft_2d(rows, cols, FFTWPlan::Complex(in), to, FFTW_FORWARD,
                                               effort);
            }};
}
#endif

struct Totals {
    Ratios estimate;
    Ratios measure;
};

template <class Ours>
void Compare(int32_t rows, int32_t cols, bool real, const Ours &ours,
             [[maybe_unused]] Totals &totals) {
    std::printf("%5d x %5d %-8s", rows, cols, real ? "real" : "complex");
#ifdef QX_PEER_FFTW3
    const FFTWPlan estimate = Peer(rows, cols, real, FFTW_ESTIMATE);
    const FFTWPlan measure = Peer(rows, cols, real, FFTW_MEASURE);
    const auto times = LeastTimes(ours, estimate, measure);
    const std::string name = std::to_string(rows) + " x " + std::to_string(cols);
    totals.estimate.add(times[0] / times[1], name);
    totals.measure.add(times[0] / times[2], name);
    std::printf("%12.2f us %5.2f %5.2f\n", times[0] * 1e6, times[0] / times[1],
                times[0] / times[2]);
#else
    std::printf("%12.2f us\n", LeastTimes(ours)[0] * 1e6);
#endif
    std::fflush(stdout);
}

} // namespace

int main() {
    Totals complex{Ratios("complex, two dimensions"), Ratios("complex, two dimensions")};
    Totals real{Ratios("real, two dimensions"), Ratios("real, two dimensions")};
    std::printf("our time; ratios to FFTW with FFTW_ESTIMATE and FFTW_MEASURE\n");
    for (const auto &[rows, cols] : {std::pair{64, 64},
                                     {128, 128},
                                     {100, 120},
                                     {256, 256},
                                     {480, 640},
                                     {512, 512},
                                     {1000, 1000},
                                     {1024, 1024}}) {
        const std::size_t count = std::size_t(rows) * cols;
        const HostMemory in(2 * count);
        const HostMemory out(2 * count);
        const qx::PlanReference rowPlan(cols);
        const qx::PlanReference columnPlan(rows);
        const qx::MatrixRegion whole{rows, cols, 0, 0, rows, cols};
        Compare(
            rows, cols, false,
            [&] {
                qx::FFT2DComplexForward(rowPlan.get(), columnPlan.get(), in.complexData(), whole, 0,
                                        out.complexData());
            },
            complex);
        Compare(
            rows, cols, true,
            [&] {
                qx::FFT2DRealForward(rowPlan.get(), columnPlan.get(), in.data(), whole, 0,
                                     out.complexData());
            },
            real);
    }
    for (const Totals *totals : {&complex, &real}) {
        totals->estimate.summary("FFTW, FFTW_ESTIMATE");
        totals->measure.summary("FFTW, FFTW_MEASURE");
    }
}
