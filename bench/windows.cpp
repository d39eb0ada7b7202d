#include "bench/timing.h"

#include "windows/cosine_sum.h"
#include "windows/tapers.h"

#include <cmath>
#include <cstdio>
#include <numbers>
#include <vector>

// Cosine-sum windows against one cosine per term and sample, from the same mathematics library.

namespace {

void OneCosinePerTerm(DBL *x, int32_t n, const qx::CosineCoefficients &coefs) {
    for (int32_t i = 0; i < n; ++i) {
        double w = coefs.a[0];
        for (int k = 1; k < coefs.count; ++k) {
            const double term = coefs.a[k] * std::cos(2.0 * std::numbers::pi * k * i / n);
            w += k % 2 == 0 ? term : -term;
        }
        x[i] *= w;
    }
}

} // namespace

int main() {
    struct Window {
        const char *name;
        int32_t selector;
    };
    std::printf("%-32s %10s %12s %8s\n", "window", "samples", "ours ns", "ratio");
    qx::bench::Ratios all("cosine-sum windows");
    for (const Window &window : {Window{"Hanning", 1},
                                 {"Blackman", 5},
                                 {"Blackman-Harris 4", 7},
                                 {"flat top", 6},
                                 {"Blackman-Harris 7", 8}})
        for (const int32_t n : {1000, 10000, 100000, 1000000}) {
            std::vector<double> x(static_cast<std::size_t>(n), 1.0);
            const qx::CosineCoefficients &coefs = qx::CosineWindowCoefs(window.selector);
            const auto [ours, plain] = qx::bench::LeastTimes(
                [&] {
                    qx::ApplyCosineWindowBySelector(qx::RealVector(x.data(), n), window.selector,
                                                    false);
                },
                [&] { OneCosinePerTerm(x.data(), n, coefs); });
            std::printf("%-32s %10d %12.0f %8.3f\n", window.name, n, ours * 1e9, ours / plain);
            all.add(ours / plain, std::string(window.name) + ", n " + std::to_string(n));
        }
    all.summary("one cosine per term and sample");
    return 0;
}
