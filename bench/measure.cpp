// The window scan of the peak detector, the searches for crossings, triggers and tones.
//
// Peers: for the scan, the three plain dot products per window of the definition; for
// crossings, the time to read and sum the same data, and a plain loop over the
// samples; for triggers, the reading; for tones, one transform of the padded record per tone.

#include "bench/host_memory.h"
#include "bench/timing.h"
#include "fft/plan.h"
#include "measure/crossings.h"
#include "measure/parabolas.h"
#include "measure/peaks.h"
#include "measure/tone_search.h"
#include "measure/trigger.h"

#include <cmath>
#include <cstdint>
#include <numbers>
#include <string>
#include <vector>

namespace {

using qx::bench::HostMemory;
using qx::bench::Keep;
using qx::bench::LeastTimes;
using qx::bench::Ratios;

void Fill(DBL *x, int32_t n, double (*value)(int32_t i)) {
    for (int32_t i = 0; i < n; ++i)
        x[i] = value(i);
}

double Sine(int32_t i) { return std::sin(0.01 * i); }
double Noise(int32_t i) {
    return static_cast<double>(static_cast<uint32_t>(i) * 2654435761U % 1000003U) / 1000003.0;
}

// Only the three dot products, with their results kept.
void PlainScan(const DBL *fitMatrix, int32_t w, const DBL *x, int32_t n) {
    double sum = 0;
    for (int32_t i = 0; i + w <= n; ++i) {
        const qx::Parabola p = qx::FitWindow(fitMatrix, w, x + i);
        sum += p.c0 + p.c1 + p.c2;
    }
    Keep(sum);
}

void Scans() {
    constexpr int32_t n = 100000;
    Ratios over("window scan of the peak detector");
    const HostMemory x(n);
    struct Signal {
        const char *name;
        double (*value)(int32_t i);
    };
    for (const auto &[name, value] : {Signal{"sine", Sine}, {"noise", Noise}}) {
        Fill(x.data(), n, value);
        for (const int32_t w : {3, 4, 5, 9, 33, 101, 1001}) {
            std::vector<double> buffer(static_cast<std::size_t>(qx::PeakBufferLength(w)));
            PeakDState state = {};
            state.width = w;
            qx::PointInto(buffer.data(), w, &state);
            const qx::PeakBlock block{x.data(), n, 0.5, true, true, false, false};
            const auto [ours, plain] = LeastTimes(
                [&] {
                    qx::PeakList found = qx::ListFor(block, state);
                    qx::PeakDetectStep(block, &state, &found);
                    Keep(found.size());
                },
                [&] { PlainScan(state.fitMatrix, w, x.data(), n); });
            std::printf("scan %-6s width %5d %8.3f ns a window  plain dot products %5.2f\n", name,
                        w, ours / n * 1e9, ours / plain);
            over.add(ours / plain, std::string(name) + ", width " + std::to_string(w));
        }
    }
    over.summary("three dot products a window");
}

// The rules of the search, sample by sample.
int32_t PlainCrossings(const DBL *y, int32_t n, double mid, double h, qx::Crossing *list,
                       int32_t limit) {
    int32_t state = 2, count = 0;
    bool isArmed = false;
    for (int32_t i = 0; i < n - 1 && count < limit; ++i) {
        if (y[i] >= mid + h && state != 0) {
            isArmed = true;
            state = 0;
        } else if (y[i] <= mid - h && state != 1) {
            isArmed = true;
            state = 1;
        } else if (!isArmed) {
            continue;
        }
        if ((y[i] - mid) * (y[i + 1] - mid) <= 0) {
            list[count++] = {(y[i] - mid) / (y[i] - y[i + 1]) + i, state};
            isArmed = false;
        }
    }
    return count;
}

// The cost of reading the data: independent sums, so that no addition waits for another.
double SumInVectors(const DBL *x, int32_t n) {
    constexpr int together = 32;
    double sums[together] = {};
    for (int32_t i = 0; i + together <= n; i += together)
        for (int k = 0; k < together; ++k)
            sums[k] += x[i + k];
    double sum = 0;
    for (const double part : sums)
        sum += part;
    return sum;
}

void Crossings() {
    Ratios overMemory("search for crossings"), overPlain("search for crossings");
    for (const int32_t n : {10000, 1000000, 10000000}) {
        const HostMemory y(static_cast<std::size_t>(n));
        std::vector<qx::Crossing> list(static_cast<std::size_t>(n));
        // The number of samples per crossing.
        for (const int32_t every : {20, 300, 10000}) {
            for (int32_t i = 0; i < n; ++i)
                y.data()[i] = std::sin(std::numbers::pi * (i + 0.5) / every) + 1e-3 * Noise(i);
            const auto [ours, plain, reading] = LeastTimes(
                [&] { Keep(qx::FindMidCrossings(0, y.data(), n, 0, 0.5, list.data(), n)); },
                [&] { Keep(PlainCrossings(y.data(), n, 0, 0.5, list.data(), n)); },
                [&] { Keep(SumInVectors(y.data(), n)); });
            std::printf(
                "crossings n %9d, one in %6d %7.3f ns a sample  reading %5.2f  plain %5.2f\n", n,
                every, ours / n * 1e9, ours / reading, ours / plain);
            const std::string name = std::to_string(n) + ", one in " + std::to_string(every);
            overMemory.add(ours / reading, name);
            overPlain.add(ours / plain, name);
        }
    }
    overMemory.summary("sum of the data in vectors");
    overPlain.summary("loop over the samples");
}

void Triggers() {
    Ratios over("search for triggers");
    constexpr int32_t n = 1000000;
    const HostMemory y(n);
    for (const int32_t every : {20, 300, 10000}) {
        for (int32_t i = 0; i < n; ++i)
            y.data()[i] = std::sin(std::numbers::pi * (i + 0.5) / every) + 1e-3 * Noise(i);
        const auto [ours, reading] = LeastTimes(
            [&] {
                TriggerState state = {};
                qx::TriggerHit hit = {-1, 0};
                do
                    qx::FindTrigger(y.data(), n, hit.index + 1, {0, 0.5, qx::EitherSlope, 0}, state,
                                    hit);
                while (hit.index >= 0);
                Keep(hit.index);
            },
            [&] { Keep(SumInVectors(y.data(), n)); });
        std::printf("triggers one in %6d %7.3f ns a sample  reading %5.2f\n", every, ours / n * 1e9,
                    ours / reading);
        over.add(ours / reading, "one in " + std::to_string(every));
    }
    over.summary("sum of the data in vectors");
}

void Tones() {
    Ratios over("search for tones");
    for (const int32_t n : {1024, 65536, 1048576}) {
        const HostMemory y(n), padded(2 * n), spectrum(2 * n);
        Fill(padded.data(), 2 * n, Noise);
        const qx::PlanReference plan(2 * n);
        for (const int32_t count : {1, 3, 10}) {
            for (int32_t i = 0; i < n; ++i) {
                y.data()[i] = 1e-3 * Noise(i);
                for (int32_t k = 0; k < count; ++k)
                    y.data()[i] += std::cos((0.1 + 0.2718 * k) * i) / (k + 1);
            }
            const auto [ours, transforms] = LeastTimes(
                [&] {
                    qx::ToneSearch search;
                    search.begin(y.data(), n);
                    qx::ToneSearch::Step step;
                    while (search.count() < count)
                        search.add(qx::wholeBand, true, step);
                    search.settle();
                    Keep(search[0].frequency);
                },
                [&] {
                    for (int32_t k = 0; k < count; ++k)
                        qx::FFTRealForward(plan.get(), padded.data(), spectrum.data(), 1, 1, 2 * n);
                    Keep(spectrum.data()[1]);
                });
            std::printf("tones n %8d, %2d tones %10.3f ms  transforms %5.2f\n", n, count,
                        ours * 1e3, ours / transforms);
            over.add(ours / transforms,
                     std::to_string(n) + ", " + std::to_string(count) + " tones");
        }
    }
    over.summary("a transform of twice the length for each tone");
}

} // namespace

int main() {
    Scans();
    Crossings();
    Triggers();
    Tones();
    return 0;
}
