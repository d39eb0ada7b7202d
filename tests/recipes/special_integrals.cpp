#include "qx/special_integrals.h"
#include "tests/recipes/families.h"

#include <limits>

namespace qx::test {

namespace {

constexpr double kNaN = std::numeric_limits<double>::quiet_NaN();

// Arguments that reach each of the methods as the size grows.
Recipe Single(const char *name, void (*function)(double, double *)) {
    return {
        name,
        [function](Call &c) {
            int output = 0;
            for (const double x : {0.01 * c.n, 0.3 * c.n, 1.7 * c.n, 3.3 * c.n, -0.7 * c.n, kNaN})
                function(x, c.scalar(output++));
            return 0;
        },
        NoStatus};
}

} // namespace

std::vector<Recipe> SpecialIntegralRecipes() {
    return {
        Single("QX_Erf", QX_Erf),
        Single("QX_ErfC", QX_ErfC),
        {"QX_ExpI",
         [](Call &c) {
             int output = 0;
             for (const int32_t n : {0, 1, 2, 7, 200, 6000})
                 for (const double x : {0.9 / c.n, 0.6 * c.n})
                     QX_ExpI(x, n, c.scalar(output++));
             return 0;
         },
         NoStatus},
        Single("QX_SinI", QX_SinI),
        Single("QX_CosI", QX_CosI),
        Single("QX_SinhI", QX_SinhI),
        Single("QX_CoshI", QX_CoshI),
        Single("QX_Diln", QX_Diln),
    };
}

} // namespace qx::test
