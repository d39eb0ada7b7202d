#include "qx/special_gamma.h"
#include "tests/support/recipe.h"
#include "tests/support/scalar_recipe.h"

#include <limits>

namespace qx::test {

namespace {

constexpr double kNaN = std::numeric_limits<double>::quiet_NaN();

Recipe Pair(const char *name, void (*function)(double, double, double *)) {
    return {name,
            [function](Call &c) {
                int output = 0;
                for (const double x : {0.3, 0.9 * c.n, 1.2 * c.n, kNaN})
                    function(0.8 * c.n, x, c.scalar(output++));
                return 0;
            },
            NoStatus};
}

Recipe OfInteger(const char *name, void (*function)(int32_t, double *)) {
    return {name,
            [function](Call &c) {
                function(c.n, c.scalar(0));
                function(c.n + 33, c.scalar(1));
                function(-c.n, c.scalar(2));
                return 0;
            },
            NoStatus};
}

std::vector<Recipe> SpecialGammaRecipes() {
    return {
        {"QX_Beta",
         [](Call &c) {
             QX_Beta(0.4 * c.n, 2.5, 0.3, c.scalar(0));
             QX_Beta(0.4 * c.n, 2.5, 0.95, c.scalar(1));
             QX_Beta(0.4 * c.n, 2.5, kNaN, c.scalar(2));
             return 0;
         },
         NoStatus},
        {"QX_Beta_85",
         [](Call &c) {
             QX_Beta_85(0.3, 1.1 * c.n, 0.2, c.scalar(0), 0);
             QX_Beta_85(0.3, 1.1 * c.n, 0.2, c.scalar(1), 1);
             return 0;
         },
         NoStatus},
        OfInteger("QX_Fact", QX_Fact),
        OfInteger("QX_LnFact", QX_LnFact),
        Pair("QX_Gamma", QX_Gamma),
        {"QX_Gamma_85",
         [](Call &c) {
             QX_Gamma_85(0.6 * c.n, 2.0, c.scalar(0), 0);
             QX_Gamma_85(0.6 * c.n, 2.0, c.scalar(1), 1);
             return 0;
         },
         NoStatus},
        Pair("QX_GammaC", QX_GammaC),
        OfNumber("QX_LnGamma", QX_LnGamma),
        OfNumber("QX_Stirling", QX_Stirling),
        OfNumber("QX_Psi", QX_Psi),
        OfNumber("QX_Zeta", QX_Zeta),
    };
}

const RecipeFile file(SpecialGammaRecipes);

} // namespace

} // namespace qx::test
