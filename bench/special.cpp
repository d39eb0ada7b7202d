#include "bench/special_rows.h"
#include "bench/timing.h"

#include <cstring>
#include <random>

#ifdef QX_PEER_GSL
#include <gsl/gsl_errno.h>
#endif

// Time per call in nanoseconds over 1000 random arguments, and the ratio ours / peer for each
// peer. Revisions have summaries of their own, against the other libraries and against their elders.
// bench/run special [PART OF A NAME]

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

struct Summaries {
    explicit Summaries(const std::string &name)
        : others(name), revisions(name + ", revisions"), overElders(name + ", revisions") {}
    qx::bench::Ratios others, revisions, overElders;
};

void Compare(const SpecialRow &row, Summaries &group) {
    std::vector<SpecialRow::Function> functions = {row.ours};
    for (const auto &peer : row.peers)
        functions.push_back(peer.second);
    const std::vector<double> times = Times(functions, Draw(row));
    std::printf("%-34s %8.1f ns", row.name.c_str(), times[0]);
    double fastest = 1e300;
    bool isRevision = false;
    for (std::size_t k = 1; k < times.size(); ++k) {
        const char *const peer = row.peers[k - 1].first;
        std::printf("  %s %5.2f", peer, times[0] / times[k]);
        if (peer == qx::bench::kElder) {
            isRevision = true;
            group.overElders.add(times[0] / times[k], row.name);
        } else {
            fastest = std::min(fastest, times[k]);
        }
    }
    std::puts("");
    if (fastest < 1e300)
        (isRevision ? group.revisions : group.others).add(times[0] / fastest, row.name);
}

constexpr char peers[] = "the fastest of GSL, C++ library and Boost";

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
    std::vector<Summaries> summaries;
    for (const auto &[name, rows] : groups) {
        summaries.emplace_back(name);
        for (const SpecialRow &row : rows)
            if (std::strstr(row.name.c_str(), wanted) != nullptr)
                Compare(row, summaries.back());
    }
    for (const Summaries &group : summaries) {
        group.others.summary(peers);
        group.revisions.summary(peers);
        group.overElders.summary("elder");
    }
    return 0;
}
