// Filters and convolution against the limits of the machine, against our own transforms and against
// liquid-dsp, which filters in single precision. The peers of NumPy and SciPy are in
// bench/scipy_filters.py.

#include "bench/host_memory.h"
#include "bench/own_host.h"
#include "bench/timing.h"
#include "fft/plan.h"
#include "filters/cascade.h"
#include "filters/direct_form.h"
#include "qx/filtering.h"
#include "spectra/convolution.h"

#ifdef QX_PEER_LIQUID
#include <complex>
#include <liquid/liquid.h>
#endif

#include <cstdint>
#include <cstring>
#include <string>
#include <vector>

namespace {

using qx::bench::HostMemory;
using qx::bench::Keep;
using qx::bench::LeastTimes;
using qx::bench::Ratios;

// Multiplications and additions in registers only, twelve sums at a time.
template <int Bytes>
__attribute__((always_inline)) inline void MultiplyAndAdd(int64_t products) {
    typedef double Vector __attribute__((vector_size(Bytes)));
    Vector sums[12] = {};
    Vector factor = Vector{} + 0.5;
    for (int64_t left = products; left > 0; left -= 12 * Bytes / 8) {
#pragma GCC unroll 12
        for (Vector &sum : sums) {
            Vector value = factor;
            asm volatile("" : "+" QX_VECTOR_REGISTER(value));
            sum = sum + value * factor;
        }
    }
    for (Vector &sum : sums)
        asm volatile("" : : QX_VECTOR_REGISTER(sum));
}
#ifdef QX_HAS_AVX2_BUILD
__attribute__((target("avx2"))) void MultiplyAndAddWide(int64_t products) {
    MultiplyAndAdd<32>(products);
}
#else
void MultiplyAndAddWide(int64_t products) { MultiplyAndAdd<16>(products); }
#endif

void DirectAgainstTheMachine() {
    Ratios ratios("direct convolution, 64 taps and more");
    for (const int32_t taps : {64, 100, 256, 1000, 4096}) {
        const int32_t n = 20000;
        const HostMemory x(n), y(static_cast<std::size_t>(taps)),
            out(static_cast<std::size_t>(n + taps));
        const int64_t products = int64_t{n} * taps;
        const auto times = LeastTimes(
            [&] {
                qx::ConvolveReal({x.data(), n}, {y.data(), taps}, qx::ConvolveDirectly,
                                 {out.data(), n + taps - 1});
            },
            [&] {
                if (qx::lanesInUse >= 4)
                    MultiplyAndAddWide(products);
                else
                    MultiplyAndAdd<16>(products);
            });
        std::printf("direct convolution, %5d taps %8.2f ns an output, %5.2f of the machine's "
                    "products\n",
                    taps, times[0] / (n + taps) * 1e9, times[1] / times[0]);
        ratios.add(times[0] / times[1], std::to_string(taps) + " taps");
    }
    ratios.summary("products and sums of registers");
}

void TransformsAgainstTheirTransforms() {
    Ratios ratios("convolution by transforms");
    for (const int32_t n : {1000, 10000, 100000, 1000000}) {
        const HostMemory x(static_cast<std::size_t>(n)), y(static_cast<std::size_t>(n)),
            out(static_cast<std::size_t>(2 * n));
        const int32_t L = qx::NextTransformLength(2 * n - 1);
        const HostMemory a(static_cast<std::size_t>(L)), b(static_cast<std::size_t>(L));
        const qx::PlanReference plan(L);
        const auto times = LeastTimes(
            [&] {
                qx::ConvolveReal({x.data(), n}, {y.data(), n}, qx::ConvolveByTransform,
                                 {out.data(), 2 * n - 1});
            },
            [&] {
                qx::FFTRealForward(plan.get(), a.data(), b.data(), 1, 1, L);
                qx::FFTRealForward(plan.get(), a.data(), b.data(), 1, 1, L);
                qx::FFTRealInverse(plan.get(), b.data(), a.data(), 1, 1, L);
            });
        std::printf("convolution by transforms, n %8d %10.3f us  over its transforms %5.2f\n", n,
                    times[0] * 1e6, times[0] / times[1]);
        ratios.add(times[0] / times[1], "n " + std::to_string(n));
    }
    ratios.summary("its three transforms");
}

constexpr int32_t samples = 10000;

void FIRAgainstLiquid(Ratios &ratios) {
    for (const int32_t taps : {8, 16, 64, 256, 1024}) {
        const HostMemory b(static_cast<std::size_t>(taps)), x(samples), y(samples),
            state(static_cast<std::size_t>(taps));
        const auto ours = [&] {
            qx::DirectForm<qx::ElementType::DBL, qx::ElementType::DBL>::fir(
                {b.data(), taps}, {x.data(), samples}, {state.data(), taps - 1},
                {y.data(), samples});
        };
#ifdef QX_PEER_LIQUID
        std::vector<float> h(b.data(), b.data() + taps), in(x.data(), x.data() + samples), out(in);
        firfilt_rrrf filter = firfilt_rrrf_create(h.data(), static_cast<unsigned>(taps));
        const auto times = LeastTimes(
            ours, [&] { firfilt_rrrf_execute_block(filter, in.data(), samples, out.data()); });
        firfilt_rrrf_destroy(filter);
        ratios.add(times[0] / times[1], std::to_string(taps) + " taps");
        const double ratio = times[0] / times[1];
#else
        const auto times = LeastTimes(ours);
        const double ratio = 0;
#endif
        std::printf("FIR filter, %4d taps %8.2f ns a sample, liquid-dsp (single) %s\n", taps,
                    times[0] / samples * 1e9, qx::bench::Cell(ratio).c_str());
    }
}

// Sections of one kind, with poles well inside the unit circle.
struct Sections {
    std::vector<double> a, b;
    explicit Sections(int32_t count) {
        for (int32_t s = 0; s < count; ++s) {
            a.insert(a.end(), {-0.5, 0.3});
            b.insert(b.end(), {0.5, 0.2, 0.4});
        }
    }
    qx::CascadeCoefficients filter() const {
        return {{a.data(), static_cast<std::ptrdiff_t>(a.size())},
                {b.data(), static_cast<std::ptrdiff_t>(b.size())},
                qx::SecondOrderSections};
    }
};

void CascadeAgainstLiquid(Ratios &ratios) {
    for (const int32_t sections : {2, 4, 8, 16, 64}) {
        const Sections s(sections);
        const HostMemory signal(samples), x(samples), state(2 * static_cast<std::size_t>(sections));
        const auto ours = [&] {
            std::memcpy(x.data(), signal.data(), sizeof(double) * samples);
            qx::FilterIIRCascade<qx::ElementType::DBL>(s.filter(), {state.data(), 2 * sections},
                                                       {x.data(), samples});
        };
#ifdef QX_PEER_LIQUID
        std::vector<float> numerators(s.b.begin(), s.b.end()), denominators;
        for (std::size_t i = 0; i < s.a.size(); i += 2)
            denominators.insert(denominators.end(),
                                {1.0F, static_cast<float>(s.a[i]), static_cast<float>(s.a[i + 1])});
        std::vector<float> in(signal.data(), signal.data() + samples), out(in);
        iirfilt_rrrf filter = iirfilt_rrrf_create_sos(numerators.data(), denominators.data(),
                                                      static_cast<unsigned>(sections));
        const auto times = LeastTimes(
            ours, [&] { iirfilt_rrrf_execute_block(filter, in.data(), samples, out.data()); });
        iirfilt_rrrf_destroy(filter);
        ratios.add(times[0] / times[1], std::to_string(sections) + " sections");
        const double ratio = times[0] / times[1];
#else
        const auto times = LeastTimes(ours);
        const double ratio = 0;
#endif
        std::printf("cascade, %2d sections %8.2f ns a sample, liquid-dsp (single) %s\n", sections,
                    times[0] / samples * 1e9, qx::bench::Cell(ratio).c_str());
    }
}

// A block with the layout of the host and room for its elements.
class Block {
public:
    explicit Block(const std::vector<double> &values) : bytes_(8 * values.size() + 4) {
        const auto count = static_cast<int32_t>(values.size());
        std::memcpy(bytes_.data(), &count, sizeof count);
        std::memcpy(bytes_.data() + 4, values.data(), 8 * values.size());
        block_ = bytes_.data();
    }
    DBL1D handle() { return reinterpret_cast<DBL1D>(&block_); }

private:
    std::vector<char> bytes_;
    void *block_;
};

void OneSample() {
    const Sections s(8);
    Block a(s.a), b(s.b), state(std::vector<double>(16));
    const uint8_t keeps = 0;
    double sample = 0.5;
    const auto times = LeastTimes([&] {
        sample = 0.5;
        IIR_Filter_PtbyPt(&sample, 0, a.handle(), b.handle(), state.handle(), &keeps);
        Keep(sample);
    });
    std::printf("one sample through eight sections, a call of the export %.1f ns\n",
                times[0] * 1e9);
}

} // namespace

int main() {
    DirectAgainstTheMachine();
    TransformsAgainstTheirTransforms();
    OneSample();
    Ratios fir("FIR filter"), cascade("cascade of second-order sections");
    FIRAgainstLiquid(fir);
    CascadeAgainstLiquid(cascade);
    fir.summary("liquid-dsp, single precision");
    cascade.summary("liquid-dsp, single precision");
}
