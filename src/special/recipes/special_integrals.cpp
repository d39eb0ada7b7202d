#include "qx/special_integrals.h"
#include "tests/support/recipe.h"
#include "tests/support/scalar_recipe.h"

namespace qx::test {

namespace {

std::vector<Recipe> SpecialIntegralRecipes() {
    return {
        OfNumber("QX_Erf", QX_Erf),
        OfNumber("QX_ErfC", QX_ErfC),
        {"QX_ExpI",
         [](Call &c) {
             int output = 0;
             const double arguments[] = {0.9 / c.n, 0.6 * c.n};
             for (const int32_t n : {0, 1, 2, 7, 200, 6000})
                 for (const double x : arguments)
                     QX_ExpI(x, n, c.scalar(output++));
             return 0;
         },
         NoStatus},
        {"QX_ExpI_2026",
         [](Call &c) {
             int output = 0;
             const double arguments[] = {0.3 / c.n, 0.9 / c.n, 0.6 * c.n, 5.5 * c.n, 710.0 + c.n};
             for (const int32_t n : {0, 1, 2, 7})
                 for (const double x : arguments)
                     QX_ExpI_2026(x, n, c.scalar(output++));
             return 0;
         },
         NoStatus},
        OfNumber("QX_SinI", QX_SinI),
        OfNumber("QX_CosI", QX_CosI),
        OfNumber("QX_SinhI", QX_SinhI),
        OfNumber("QX_CoshI", QX_CoshI),
        OfNumber("QX_Diln", QX_Diln),
        OfNumber("QX_Dawson", QX_Dawson),
        {"QX_FresnelIntegrals",
         [](Call &c) {
             QX_FresnelIntegrals(0.3 * c.n, c.scalar(0), c.scalar(1));
             QX_FresnelIntegrals(-7.7 * c.n, c.scalar(2), c.scalar(3));
             return 0;
         },
         NoStatus},
    };
}

const RecipeFile file(SpecialIntegralRecipes);

} // namespace

} // namespace qx::test
