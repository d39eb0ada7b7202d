// How many digits of the certified values the Levenberg-Marquardt iteration finds on the nonlinear
// regression sets of NIST's Statistical Reference Datasets, as the table of
// docs/accuracy/fitting.md. Derivatives are differences; a step counts down to the last bit of the
// cost.
//
// bench_fit_accuracy FILE: nist_nonlinear.dat of src/fit/tests/data by default.

#include "fit/tests/nist_models.h"

#include <cstdio>

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
    return 0;
}
