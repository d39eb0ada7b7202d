#ifndef QX_BENCH_TIMING_H
#define QX_BENCH_TIMING_H

#include "frame/lanes.h"

#include <algorithm>
#include <array>
#include <chrono>
#include <cmath>
#include <cstddef>
#include <cstdio>
#include <limits>
#include <string>
#include <vector>

// Shared by all benchmarks.
//
// LeastTimes times contestants by the shortest of interleaved runs: each runs once in each round, so that
// disturbances of the machine affect all of them alike, and the minimum leaves the disturbances out.
//
// Ratios collects ours/peer over the cases of a group, each with its name:
//
//     Ratios over("DCT, even lengths");
//     over.add(ours / theirs, "n 1024");
//     over.print();                      // a readable line
//     over.summary("FFTW, estimate");    // a line of the summary, with the name of the peer
//
// A program prints one summary for each peer (or kind of task), at its end. bench/run --all
// collects them in docs/speed.md, whose rows are named by the group and the peer. The summary of empty
// Ratios reports a peer that is not installed, so always print it; bench/run names the package.
// Cell formats a ratio, or its absence.

namespace qx::bench {

inline double Median(std::vector<double> values) {
    std::nth_element(values.begin(), values.begin() + values.size() / 2, values.end());
    return values[values.size() / 2];
}

template <class Work>
double SecondsOf(std::size_t repeats, const Work &work) {
    const auto start = std::chrono::steady_clock::now();
    for (std::size_t i = 0; i < repeats; ++i)
        work();
    return std::chrono::duration<double>(std::chrono::steady_clock::now() - start).count();
}

// The number of repeats for which a run takes about `seconds`; caches are warm afterwards.
template <class Work>
std::size_t RepeatsFor(double seconds, const Work &work) {
    for (std::size_t repeats = 1;; repeats *= 2) {
        const double taken = SecondsOf(repeats, work);
        if (taken > seconds / 4)
            return std::max<std::size_t>(1, static_cast<std::size_t>(repeats * seconds / taken));
    }
}

// The seconds that one call of each contestant takes.
template <class... Work>
std::array<double, sizeof...(Work)> LeastTimes(const Work &...contestants) {
    constexpr double runSeconds = 1e-4;
    constexpr int rounds = 25;
    constexpr double longEnough = 1.0; // for long work, three rounds are enough
    const std::array<std::size_t, sizeof...(Work)> repeats = {
        RepeatsFor(runSeconds, contestants)...};
    std::array<double, sizeof...(Work)> least;
    least.fill(std::numeric_limits<double>::infinity());
    double taken = 0;
    for (int round = 0; round < rounds && (round < 3 || taken < longEnough); ++round) {
        std::size_t i = 0;
        const auto run = [&](const auto &work) {
            const double seconds = SecondsOf(repeats[i], work);
            taken += seconds;
            least[i] = std::min(least[i], seconds / static_cast<double>(repeats[i]));
            ++i;
        };
        (run(contestants), ...);
    }
    return least;
}

#ifdef QX_HAS_AVX2_BUILD
inline const char *WidthInUse() {
    return lanesInUse == 8 ? "AVX-512" : lanesInUse == 4 ? "AVX2" : "SSE2";
}
#else
inline const char *WidthInUse() { return "NEON"; }
#endif

#ifdef __clang__
inline constexpr char compiler[] = "clang++ " __clang_version__;
#else
inline constexpr char compiler[] = "g++ " __VERSION__;
#endif

// A ratio as a cell of a table; 0 means that the peer is missing.
inline std::string Cell(double ratio) {
    char text[16];
    std::snprintf(text, sizeof text, "%5.2f", ratio);
    return ratio > 0 ? text : "    -";
}

// The ratios ours/peer of a group of cases, with their geometric mean and the worst ratio.
class Ratios {
public:
    explicit Ratios(std::string name) : name_(std::move(name)) {}
    void add(double ratio, const std::string &case_ = "") {
        logarithms_ += std::log(ratio);
        ++count_;
        if (ratio > worst_) {
            worst_ = ratio;
            worstCase_ = case_;
        }
    }
    double mean() const { return count_ > 0 ? std::exp(logarithms_ / count_) : 0; }
    void print() const {
        if (count_ > 0)
            std::printf("%-44s geometric mean %5.2f  worst %5.2f %s (%d)\n", name_.c_str(), mean(),
                        worst_, worstCase_.c_str(), count_);
    }
    void summary(const std::string &peer) const {
        std::printf("summary | %s | %s | ", name_.c_str(), peer.c_str());
        if (count_ > 0)
            std::printf("%.4g | %.4g | %s | %d", mean(), worst_, worstCase_.c_str(), count_);
        else
            std::printf("missing | | | 0");
        std::printf(" | %s | %s\n", WidthInUse(), compiler);
        std::fflush(stdout);
    }

private:
    std::string name_;
    double logarithms_ = 0;
    double worst_ = 0;
    std::string worstCase_;
    int count_ = 0;
};

// Keeps a result, so that the compiler cannot remove the work that produced it.
template <class T>
void Keep(const T &value) {
    asm volatile("" : : "r"(&value) : "memory");
}

} // namespace qx::bench

#endif
