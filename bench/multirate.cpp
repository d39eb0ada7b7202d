// Streams at changed rates against liquid-dsp and libsamplerate, and moving sums against the bus.
//
// bench_multirate [GROUP...]: rates, sums; both by default. Ours is the inner routine on a block in
// the middle of a stream, in single precision if the peer is. The time of liquid-dsp is that of its
// fastest object for the ratio, with as many taps per output. libsamplerate has its own
// filters; its shortest has about 38 taps per output if the rate rises, and ours has 39.

#include "bench/host_memory.h"
#include "bench/timing.h"
#include "multirate/moving_sums.h"
#include "multirate/polyphase.h"
#include "multirate/rational.h"

#include <cstdint>
#include <cstring>
#include <optional>

#ifdef QX_PEER_LIQUID
#include <liquid/liquid.h>
#endif
#ifdef QX_PEER_SAMPLERATE
#include <samplerate.h>
#endif

namespace {

using qx::ElementType;
using qx::bench::HostMemory;
using qx::bench::Keep;
using qx::bench::LeastTimes;
using qx::bench::Ratios;

constexpr int32_t blockSize = 20000;

struct Ratio {
    const char *name;
    int32_t L, M;
};
const Ratio ratios[] = {
    {"2/1", 2, 1}, {"1/2", 1, 2}, {"3/2", 3, 2}, {"160/147", 160, 147}, {"147/160", 147, 160}};

// Multiples of M, so that each block has the same number of outputs.
int32_t InputsOf(const Ratio &ratio, int32_t n) { return std::max(1, n / ratio.M) * ratio.M; }

// Input, taps and output of one kind of sample.
template <ElementType Code>
struct Filtering {
    typedef typename qx::Element<Code>::type T;
    typedef qx::RealOf<Code> Real;

    // `terms` taps for each output.
    Filtering(const Ratio &itsRatio, int32_t terms, int32_t inputs)
        : ratio(itsRatio), n(InputsOf(itsRatio, inputs)), taps(terms * itsRatio.L),
          outputs(static_cast<int32_t>(int64_t{n} * itsRatio.L / itsRatio.M)),
          memory(static_cast<std::size_t>(n + taps + outputs + taps + 8) * sizeof(T) / 8) {
        x = reinterpret_cast<T *>(memory.data());
        for (int64_t i = 0; i < n * qx::SampleParts<Code>::count; ++i)
            qx::Reals<Code>(x)[i] = static_cast<Real>(i * 7919 % 1024) / 512 - 1;
        h = reinterpret_cast<Real *>(x + n);
        for (int32_t i = 0; i < taps; ++i)
            h[i] = static_cast<Real>(i % 13) / 16;
        state = reinterpret_cast<T *>(h + taps);
        std::memset(state, 0, static_cast<std::size_t>(terms + taps) * sizeof(Real));
        y = state + taps;
    }

    // Modes 1 to 3 of the multirate filter.
    void polyphase() {
        const qx::FIRBlock<Code> block{x, n, h, taps};
        const qx::OutputRange range(int64_t{n} * ratio.L, 0, ratio.M, 0);
        if (ratio.L == 1)
            qx::PolyphaseDecimate<Code>(block, ratio.M, 0, range, state, y);
        else
            qx::PolyphaseRational<Code>(block, ratio.L, ratio.M, 0, 1, range, state, y);
        Keep(*y);
    }

    const Ratio ratio;
    const int32_t n, taps, outputs;
    HostMemory memory;
    T *x, *state, *y;
    Real *h;
};

#ifdef QX_PEER_LIQUID
// The seconds of the fastest liquid-dsp object, interleaved with ours.
std::array<double, 2> AgainstLiquid(Filtering<ElementType::SGL> &ours, int32_t terms) {
    const std::vector<float> x(ours.x, ours.x + ours.n);
    std::vector<float> h(ours.h, ours.h + ours.taps);
    std::vector<float> y(static_cast<std::size_t>(ours.outputs));
    const auto L = static_cast<unsigned>(ours.ratio.L), M = static_cast<unsigned>(ours.ratio.M);
    const auto n = static_cast<unsigned>(ours.n);
    auto *input = const_cast<float *>(x.data());

    h.resize(static_cast<std::size_t>(terms) * L);
    const auto resampler = rresamp_rrrf_create(L, M, static_cast<unsigned>(terms) / 2, h.data());
    auto times = LeastTimes([&] { ours.polyphase(); },
                            [&] {
                                rresamp_rrrf_execute_block(resampler, input, n / M, y.data());
                                Keep(y[0]);
                            });
    rresamp_rrrf_destroy(resampler);
    const auto keepFastest = [&](const std::array<double, 2> &others) {
        times[0] = std::min(times[0], others[0]);
        times[1] = std::min(times[1], others[1]);
    };
    if (M == 1) {
        const auto interpolator =
            firinterp_rrrf_create(L, h.data(), static_cast<unsigned>(ours.taps));
        keepFastest(LeastTimes([&] { ours.polyphase(); },
                               [&] {
                                   firinterp_rrrf_execute_block(interpolator, input, n, y.data());
                                   Keep(y[0]);
                               }));
        firinterp_rrrf_destroy(interpolator);
    }
    if (L == 1) {
        const auto decimator = firdecim_rrrf_create(M, h.data(), static_cast<unsigned>(ours.taps));
        keepFastest(LeastTimes([&] { ours.polyphase(); },
                               [&] {
                                   firdecim_rrrf_execute_block(decimator, input, n / M, y.data());
                                   Keep(y[0]);
                               }));
        firdecim_rrrf_destroy(decimator);
    }
    return times;
}
#endif

#ifdef QX_PEER_SAMPLERATE
std::array<double, 2> AgainstSamplerate(Filtering<ElementType::SGL> &ours) {
    const std::vector<float> x(ours.x, ours.x + ours.n);
    std::vector<float> y(static_cast<std::size_t>(ours.outputs) + 100);
    int error = 0;
    SRC_STATE *state = src_new(SRC_SINC_FASTEST, 1, &error);
    SRC_DATA data{};
    data.src_ratio = static_cast<double>(ours.ratio.L) / ours.ratio.M;
    const auto times = LeastTimes([&] { ours.polyphase(); },
                                  [&] {
                                      data.data_in = x.data();
                                      data.input_frames = ours.n;
                                      data.data_out = y.data();
                                      data.output_frames = static_cast<long>(y.size());
                                      src_process(state, &data);
                                      Keep(y[0]);
                                  });
    src_delete(state);
    return times;
}
#endif

void Rates() {
    Ratios liquid("rational rates, single precision");
    Ratios smallBlocks("the same in blocks of 512 samples");
    Ratios samplerate("rational rates, 39 taps, single precision");
    Ratios precision("single precision");
    Ratios complexData("complex data");
    for (const Ratio &ratio : ratios)
        for (const int32_t terms : {8, 16, 32, 64}) {
            const std::string name =
                std::string(ratio.name) + ", " + std::to_string(terms) + " taps";
            Filtering<ElementType::SGL> single(ratio, terms, blockSize);
            Filtering<ElementType::DBL> real(ratio, terms, blockSize);
            Filtering<ElementType::CDB> complex(ratio, terms, blockSize);
            const auto times = LeastTimes([&] { single.polyphase(); }, [&] { real.polyphase(); },
                                          [&] { complex.polyphase(); });
            const double perTap = times[1] / real.outputs / terms * 1e9;
            std::printf("%-18s double %6.3f ns a tap  single/double %5.2f  complex/real %5.2f",
                        name.c_str(), perTap, times[0] / times[1], times[2] / times[1]);
            precision.add(times[0] / times[1], name);
            complexData.add(times[2] / times[1], name);
#ifdef QX_PEER_LIQUID
            const auto large = AgainstLiquid(single, terms);
            Filtering<ElementType::SGL> few(ratio, terms, 512);
            const auto small = AgainstLiquid(few, terms);
            liquid.add(large[0] / large[1], name);
            smallBlocks.add(small[0] / small[1], name);
            std::printf("  liquid-dsp %5.2f, small blocks %5.2f", large[0] / large[1],
                        small[0] / small[1]);
#endif
            std::printf("\n");
            std::fflush(stdout);
        }
#ifdef QX_PEER_SAMPLERATE
    for (const Ratio &ratio : ratios) {
        Filtering<ElementType::SGL> single(ratio, 39, blockSize);
        const auto times = AgainstSamplerate(single);
        std::printf("%-18s libsamplerate, fastest sinc %5.2f\n", ratio.name, times[0] / times[1]);
        samplerate.add(times[0] / times[1], ratio.name);
    }
#endif
    liquid.summary("liquid-dsp");
    smallBlocks.summary("liquid-dsp");
    samplerate.summary("libsamplerate, fastest sinc");
    precision.summary("ours, double precision");
    complexData.summary("ours, real data");
}

// A moving sum adds twice to a running value for each sample, in a fixed order; the limit is
// the latency of these two additions.
void Chain(int32_t n, double term) {
    double sum = 0;
    for (int32_t i = 0; i < n; ++i) {
        asm volatile("" : "+" QX_VECTOR_REGISTER(term));
        sum = sum + term - 0.5;
    }
    Keep(sum);
}

void Sums() {
    Ratios bandwidth("moving sums");
    Ratios latency("moving sums, a stage");
    for (const int32_t n : {4096, 1000000})
        for (const int32_t stages : {1, 2, 4, 8}) {
            constexpr int32_t width = 64;
            HostMemory x(static_cast<std::size_t>(n)), to(static_cast<std::size_t>(n));
            HostMemory rings(static_cast<std::size_t>((width + 1) * stages));
            qx::MovingSumState<ElementType::DBL> state{
                rings.data(), width + 1, rings.data() + width, width + 1, stages, width, 0};
            const auto times = LeastTimes(
                [&] {
                    std::memset(rings.data(), 0,
                                8 * static_cast<std::size_t>((width + 1) * stages));
                    qx::MovingSumStages(state, qx::MovingSum::Plain, 1.0 / width, x.data(), n);
                    Keep(x.data()[0]);
                },
                [&] {
                    std::memcpy(to.data(), x.data(), 8 * static_cast<std::size_t>(n));
                    Keep(to.data()[0]);
                },
                [&] { Chain(n, 0.25); });
            const std::string name = "n " + std::to_string(n) + ", " + std::to_string(stages) +
                                     (stages > 1 ? " stages" : " stage");
            std::printf("moving sums %-22s %6.3f ns a sample and stage; copy %5.2f, two additions "
                        "%5.2f\n",
                        name.c_str(), times[0] / n / stages * 1e9, times[0] / times[1],
                        times[0] / times[2] / stages);
            bandwidth.add(times[0] / times[1], name);
            latency.add(times[0] / times[2] / stages, name);
        }
    bandwidth.summary("memcpy");
    latency.summary("latency of two additions");
}

} // namespace

int main(int argc, char **argv) {
    const auto wanted = [&](const char *group) {
        return argc < 2 || std::any_of(argv + 1, argv + argc, [&](const char *argument) {
                   return std::strcmp(argument, group) == 0;
               });
    };
    if (wanted("rates"))
        Rates();
    if (wanted("sums"))
        Sums();
    return 0;
}
