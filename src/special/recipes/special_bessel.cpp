#include "qx/special_bessel.h"
#include "tests/support/recipe.h"
#include "tests/support/scalar_recipe.h"

namespace qx::test {

namespace {

// An order and an argument.
Recipe Integer(const char *name, void (*function)(int32_t, double, double *)) {
    return {name,
            [function](Call &c) {
                int output = 0;
                for (const int32_t n : {0, 1, 3, 60, 250})
                    function(n, 0.7 * c.n, c.scalar(output++));
                return 0;
            },
            NoStatus};
}

std::vector<Recipe> SpecialBesselRecipes() {
    return {
        {"QX_Airy",
         [](Call &c) {
             int output = 0;
             for (const double x : {0.1 * c.n, -0.5 * c.n, 0.7 * c.n}) {
                 QX_Airy(x, c.scalar(output), c.scalar(output + 1), c.scalar(output + 2),
                         c.scalar(output + 3));
                 output += 4;
             }
             return 0;
         },
         NoStatus},
        OfTwoNumbers("QX_BesselJr", QX_BesselJr),
        OfTwoNumbers("QX_BesselYr", QX_BesselYr),
        Integer("QX_BesselJs", QX_BesselJs),
        Integer("QX_BesselYs", QX_BesselYs),
        OfTwoNumbers("QX_BesselIr", QX_BesselIr),
        Integer("QX_BesselKn", QX_BesselKn),
        {"QX_KelvinI",
         [](Call &c) {
             QX_KelvinI(0.4 * c.n, c.n % 5, c.scalar(0), c.scalar(1));
             QX_KelvinI(0.4 * c.n, c.n + 100, c.scalar(2), c.scalar(3));
             return 0;
         },
         NoStatus},
        {"QX_KelvinK",
         [](Call &c) {
             QX_KelvinK(0.4 * c.n, c.n % 5, c.scalar(0), c.scalar(1));
             QX_KelvinK(0.4 * c.n, c.n + 100, c.scalar(2), c.scalar(3));
             return 0;
         },
         NoStatus},
        OfTwoNumbers("QX_Struve", QX_Struve),
        OfTwoNumbers("QX_ParabolicCylinder", QX_ParabolicCylinder),
    };
}

const RecipeFile file(SpecialBesselRecipes);

} // namespace

} // namespace qx::test
