// The number of digits of the certified values that the Levenberg-Marquardt iteration of the bounded fits and
// the trust region of NonlinearFit2026 find for the nonlinear regression sets of NIST's Statistical
// Reference Datasets: the tables of docs/accuracy/fitting.md. The former uses differences and continues
// while the cost changes at all; the latter uses derivatives, and then differences.
//
// bench_fit_accuracy FILE: nist_nonlinear.dat of src/fit/tests/data by default.

#include "fit/tests/nist_models.h"

#include <cstdio>

namespace {

void PrintTrustRegion(const char *file) {
    std::puts("| Set | Start 1 | Start 2 | Start 1, differences | Start 2, differences |\n"
              "|---|---|---|---|---|");
    for (const auto &set : qx::test::ReadNistSets(file)) {
        const qx::test::NistProblem problem(set);
        std::printf("| %s |", set.name.c_str());
        for (const bool withDerivatives : {true, false})
            for (int start = 0; start < 2; ++start) {
                std::vector<double> p;
                const auto found = problem.fit(start, withDerivatives, &p);
                if (found.end == qx::FitEnd::Converged)
                    std::printf(" %.1f (%d) |", problem.digits(p), found.iterations);
                else
                    std::printf(" reason %d |", static_cast<int>(found.end));
            }
        std::puts("");
    }
}

} // namespace

int main(int count, char **arguments) {
    const char *const file = count > 1 ? arguments[1] : "src/fit/tests/data/nist_nonlinear.dat";
    std::puts("| Set | Level | Parameters | Start 1 | Start 2 |\n|---|---|---|---|---|");
    for (const auto &set : qx::test::ReadNistSets(file)) {
        const qx::test::NistProblem problem(set);
        std::printf("| %s | %s | %zu |", set.name.c_str(), set.level.c_str(), set.certified.size());
        for (int start = 0; start < 2; ++start) {
            const auto result = problem.solve(start);
            if (result.digits < 1)
                std::printf(" elsewhere, %.3g times the squares |", result.squares / set.squares);
            else
                std::printf(" %.1f (%d) |", result.digits, result.steps);
        }
        std::puts("");
    }
    PrintTrustRegion(file);
    return 0;
}
