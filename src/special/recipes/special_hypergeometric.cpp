#include "qx/special_hypergeometric.h"
#include "tests/support/recipe.h"

#include <limits>

namespace qx::test {

namespace {

constexpr double kNaN = std::numeric_limits<double>::quiet_NaN();

// One call for each form that the function takes.
Recipe Gauss(const char *name, void (*function)(double, double, double, double, double *)) {
    return {name,
            [function](Call &c) {
                const double b = 0.3 * c.n;
                const double arguments[][4] = {{-0.8, 0.7, b, 2.25},  {0.1, 0.7, b, 2.25},
                                               {0.7, 0.7, b, 2.26},   {0.6, 0.5, b, 1.5 + b},
                                               {0.5, -4, b, 0.8},     {0.9, 2.5, b, 0.5},
                                               {-0.3, 1.2, b, -20.5}, {kNaN, 1, b, 2}};
                int output = 0;
                for (const auto &a : arguments)
                    function(a[0], a[1], a[2], a[3], c.scalar(output++));
                return 0;
            },
            NoStatus};
}

Recipe Confluent(const char *name, void (*function)(double, double, double, double *)) {
    return {name,
            [function](Call &c) {
                const double x = c.n;
                const double arguments[][3] = {{0.3 * x, 1.3, 0.7}, {-x, 2.2, 1.4},
                                               {-5 * x, 0.4, 3.1},  {x, -6.5, 0.25},
                                               {4 * x, 0.5, 2},     {-0.7 * x, -0.6, 2.5}};
                int output = 0;
                for (const auto &a : arguments)
                    function(a[0], a[1], a[2], c.scalar(output++));
                return 0;
            },
            NoStatus};
}

std::vector<Recipe> SpecialHypergeometricRecipes() {
    return {
        Gauss("QX_Gauss", QX_Gauss),
        Gauss("QX_Gauss_2011", QX_Gauss_2011),
        Confluent("QX_Kummer", QX_Kummer),
        Confluent("QX_Tricomi", QX_Tricomi),
    };
}

const RecipeFile file(SpecialHypergeometricRecipes);

} // namespace

} // namespace qx::test
