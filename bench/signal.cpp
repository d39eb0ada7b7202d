// Random numbers and waves against the limits of their recurrences: the sine's chain of products
// and sums, the table's running sum, and a copy of the array for waves without a chain.
// bench/generators.py compares with NumPy.

#include "bench/timing.h"
#include "signal/noise.h"
#include "signal/random.h"
#include "signal/waves.h"

#include <algorithm>
#include <cstdint>
#include <cstdio>
#include <vector>

namespace {

using qx::bench::Keep;
using qx::bench::LeastTimes;
using qx::bench::Ratios;

constexpr int32_t n = 10000;

// The chain on which a sample of the sine depends: a product and a sum each for the cosine and then
// for the sine, two samples in all.
void SineChain(double k) {
    double sine = 0.0;
    double cosine = 1.0;
    for (int32_t i = 0; i < n; i += 2) {
        cosine = cosine - k * sine;
        sine = sine + k * cosine;
    }
    Keep(sine);
}

void AdditionChain(double step) {
    double sum = 0.0;
    for (int32_t i = 0; i < n; ++i) {
        asm volatile("" : "+" QX_VECTOR_REGISTER(step));
        sum += step;
    }
    Keep(sum);
}

template <class Work, class Peer>
void Row(Ratios &ratios, const char *name, const Work &work, const Peer &peer) {
    const auto [ours, theirs] = LeastTimes(work, peer);
    std::printf("%-18s %7.2f ns a sample  ratio %5.2f\n", name, ours / n * 1e9, ours / theirs);
    ratios.add(ours / theirs, name);
}

} // namespace

int main() {
    std::vector<double> x(n);
    std::vector<double> other(n);
    double *y = x.data();
    const qx::RealVector samples(y, n);
    RandomState state = {1, 2, 3};
    GaussSpare spare = {};
    double phase = 0.0;
    const std::vector<double> table(1000, 1.0);

    Ratios numbers("random numbers");
    const auto single = [&] {
        for (double &value : x)
            value = qx::RandomUniform(state);
    };
    Row(
        numbers, "uniform", [&] { qx::RandomUniforms(state, y, n); }, single);
    Row(
        numbers, "Gaussian", [&] { qx::GaussianNoise(samples, 1.0, state, spare); }, single);
    numbers.summary("one uniform number at a time");

    Ratios chains("waves by recurrence");
    Row(
        chains, "sine", [&] { qx::GenSineWave(1.0, 0.01, phase, samples); },
        [] { SineChain(0.01); });
    Row(
        chains, "table",
        [&] {
            qx::GenArbitraryWave(1.0, 0.01, phase, {table.data(), 1000}, 1, samples);
        },
        [] { AdditionChain(0.01); });
    chains.summary("the chain of the recurrence");

    Ratios copies("waves by phase");
    const auto copy = [&] {
        std::copy(x.begin(), x.end(), other.begin());
        Keep(other[0]);
    };
    Row(
        copies, "square", [&] { qx::GenSquareWave(1.0, 0.01, phase, 50.0, samples); }, copy);
    Row(
        copies, "triangle", [&] { qx::GenTriangleWave(1.0, 0.01, phase, samples); }, copy);
    Row(
        copies, "sawtooth", [&] { qx::GenSawtoothWave(1.0, 0.01, phase, samples); }, copy);
    copies.summary("a copy of the array");
    return 0;
}
