// The line fit, whose sums have a stated order.
//
// The peer is the best that this order and the memory allow: one pass with a sum of each array in
// one accumulator, and, for values and MSE, another pass that also writes an array. With weights, a pass that
// sums them in eight accumulators comes first, as all are divided by the largest, and
// the next pass sums them, too. Times are the minima of interleaved runs.

#include "bench/timing.h"
#include "fit/line.h"

#include <cstdint>
#include <random>

namespace {

using qx::bench::Keep;
using qx::bench::Ratios;
using qx::bench::RepeatsFor;
using qx::bench::SecondsOf;

std::vector<double> Random(int32_t n, uint64_t seed) {
    std::mt19937_64 random(seed);
    std::vector<double> x(static_cast<std::size_t>(n));
    for (double &value : x)
        value = static_cast<double>(random() >> 11) * 0x1p-53 + 0.1;
    return x;
}

void Sums(const std::vector<double> &x, const std::vector<double> &y) {
    double sumX = 0.0, sumY = 0.0;
    for (std::size_t i = 0; i < x.size(); ++i) {
        sumX += x[i];
        sumY += y[i];
    }
    Keep(sumX);
    Keep(sumY);
}

void WeightedSums(const std::vector<double> &x, const std::vector<double> &y,
                  const std::vector<double> &w) {
    double apart[8] = {};
    for (std::size_t i = 0; i + 8 <= w.size(); i += 8)
        for (std::size_t k = 0; k < 8; ++k)
            apart[k] += w[i + k];
    for (const double sum : apart)
        Keep(sum);
    double sumX = 0.0, sumY = 0.0, sumW = 0.0;
    for (std::size_t i = 0; i < x.size(); ++i) {
        sumX += x[i];
        sumY += y[i];
        sumW += w[i];
    }
    Keep(sumX);
    Keep(sumY);
    Keep(sumW);
}

void SumAndWrite(const std::vector<double> &x, const std::vector<double> &y,
                 std::vector<double> &out) {
    double sum = 0.0;
    for (std::size_t i = 0; i < x.size(); ++i) {
        out[i] = x[i];
        sum += y[i];
    }
    const double result = sum; // its address does not escape from the loop
    Keep(result);
}

template <class... Work>
std::array<double, sizeof...(Work)> LeastTimes(const Work &...contestants) {
    const std::array<std::size_t, sizeof...(Work)> repeats = {RepeatsFor(1e-4, contestants)...};
    std::array<double, sizeof...(Work)> least;
    least.fill(1e9);
    for (int round = 0; round < 30; ++round) {
        std::size_t i = 0;
        ((least[i] = std::min(least[i],
                              SecondsOf(repeats[i], contestants) / static_cast<double>(repeats[i])),
          ++i),
         ...);
    }
    return least;
}

} // namespace

int main() {
    Ratios plain("line fits"), weighted("weighted line fits");
    for (const int32_t n : {100, 1000, 10000, 100000, 1000000, 10000000}) {
        const std::vector<double> x = Random(n, 1), y = Random(n, 2), w = Random(n, 3);
        std::vector<double> fit(x.size());
        qx::Line line;
        double mse;
        const auto fitLine = [&](const double *weights, double *to, double *error) {
            qx::FitLine({{x.data(), n}, {y.data(), n}, {weights, weights == nullptr ? 0 : n}},
                        &line, {{to, to == nullptr ? 0 : n}, error});
            Keep(line.slope);
        };
        const auto times = LeastTimes([&] { Sums(x, y); },
                                      [&] {
                                          Sums(x, y);
                                          SumAndWrite(x, y, fit);
                                      },
                                      [&] { WeightedSums(x, y, w); },
                                      [&] {
                                          WeightedSums(x, y, w);
                                          SumAndWrite(x, y, fit);
                                      },
                                      [&] { fitLine(nullptr, nullptr, nullptr); },
                                      [&] { fitLine(nullptr, fit.data(), &mse); },
                                      [&] { fitLine(w.data(), nullptr, nullptr); },
                                      [&] { fitLine(w.data(), fit.data(), &mse); });
        const double ratios[4] = {times[4] / times[0], times[5] / times[1], times[6] / times[2],
                                  times[7] / times[3]};
        std::printf("line n %9d %7.3f ns a sample; ratios: coefficients %5.2f  with values %5.2f  "
                    "weighted %5.2f  with values %5.2f\n",
                    n, times[4] / n * 1e9, ratios[0], ratios[1], ratios[2], ratios[3]);
        for (const int i : {0, 1})
            plain.add(ratios[i], (i == 0 ? "coefficients, n " : "values, n ") + std::to_string(n));
        for (const int i : {2, 3})
            weighted.add(ratios[i],
                         (i == 2 ? "coefficients, n " : "values, n ") + std::to_string(n));
    }
    plain.summary("as many sums in one accumulator");
    weighted.summary("the passes that weights need");
    return 0;
}
