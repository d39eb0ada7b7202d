#include "bench/special_rows.h"
#include "bench/timing.h"

#include <cstring>
#include <random>

#ifdef QX_PEER_GSL
#include <gsl/gsl_errno.h>
#endif

// Time per call in nanoseconds over 1000 random arguments, and the ratio ours / peer for each
// peer. bench/run special [PART OF A NAME]

namespace {

using qx::bench::Keep;
using qx::bench::SpecialRow;

struct Arguments {
    std::vector<double> first, second;
};

Arguments Draw(const SpecialRow &row) {
    constexpr int count = 1000;
    std::mt19937_64 engine(7);
    std::uniform_real_distribution<double> first(row.firstLow, row.firstHigh);
    std::uniform_real_distribution<double> second(row.secondLow, row.secondHigh);
    Arguments arguments;
    for (int i = 0; i < count; ++i) {
        const double a = first(engine);
        const double b = row.secondLow < row.secondHigh ? second(engine) : row.secondLow;
        arguments.first.push_back(row.firstIsInteger ? std::floor(a) : a);
        arguments.second.push_back(row.secondIsInteger ? std::floor(b) : b);
    }
    return arguments;
}

// Nanoseconds per call: the minimum of a few runs, each peer interleaved with ours.
std::vector<double> Times(const std::vector<SpecialRow::Function> &functions, const Arguments &at) {
    std::vector<double> best(functions.size(), 1e300);
    for (int round = 0; round < 7; ++round) {
        for (std::size_t k = 0; k < functions.size(); ++k) {
            const double seconds = qx::bench::SecondsOf(1, [&] {
                double sum = 0;
                for (std::size_t i = 0; i < at.first.size(); ++i)
                    sum += functions[k](at.first[i], at.second[i]);
                Keep(sum);
            });
            best[k] = std::min(best[k], seconds * 1e9 / static_cast<double>(at.first.size()));
        }
    }
    return best;
}

} // namespace

int main(int argc, char **argv) {
    const char *wanted = argc > 1 ? argv[1] : "";
#ifdef QX_PEER_GSL
    gsl_set_error_handler_off();
#endif
    const std::pair<const char *, std::vector<SpecialRow>> groups[] = {
        {"Bessel functions and their kin", qx::bench::SpecialBesselRows()},
        {"gamma family, distributions", qx::bench::SpecialGammaRows()},
        {"hypergeometric functions", qx::bench::SpecialHypergeometricRows()},
        {"error function, integrals", qx::bench::SpecialIntegralsRows()},
    };
    std::vector<qx::bench::Ratios> ratios;
    for (const auto &[name, rows] : groups) {
        ratios.emplace_back(name);
        for (const SpecialRow &row : rows) {
            if (std::strstr(row.name.c_str(), wanted) == nullptr)
                continue;
            std::vector<SpecialRow::Function> functions = {row.ours};
            for (const auto &peer : row.peers)
                functions.push_back(peer.second);
            const std::vector<double> times = Times(functions, Draw(row));
            std::printf("%-28s %8.1f ns", row.name.c_str(), times[0]);
            double fastest = 1e300;
            for (std::size_t k = 1; k < times.size(); ++k) {
                std::printf("  %s %5.2f", row.peers[k - 1].first, times[0] / times[k]);
                fastest = std::min(fastest, times[k]);
            }
            std::puts("");
            if (times.size() > 1)
                ratios.back().add(times[0] / fastest, row.name);
        }
    }
    for (const auto &group : ratios)
        group.summary("the fastest of GSL, C++ library and Boost");
    return 0;
}
