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

// One call for each region.
Recipe GaussRegions() {
    return {"QX_Gauss_2026",
            [](Call &c) {
                const double b = 0.3 * c.n;
                const double arguments[][4] = {
                    {-0.8, 0.7, b, 2.25},    {0.1, 0.7, b, 2.25},     {0.97, 0.7, b, 2.26},
                    {0.97, 0.5, b, 1.5 + b}, {0.5, -4, b, 0.8},       {-30, 2.5, b, 0.5},
                    {-30, b, b + 1, 1.3},    {0.8, -40.5, 60 + b, 3}, {0.3, 2.5 + b, 0.7, 1.5 + b},
                    {1, 0.25, b, 4 + b},     {-1, -60, 30 + b, -80},  {kNaN, 1, b, 2}};
                int output = 0;
                for (const auto &a : arguments)
                    QX_Gauss_2026(a[0], a[1], a[2], a[3], c.scalar(output++));
                return 0;
            },
            NoStatus};
}

Recipe ConfluentRegions(const char *name, void (*function)(double, double, double, double *)) {
    return {name,
            [function](Call &c) {
                const double x = c.n;
                const double arguments[][3] = {
                    {0.3 * x, 1.3, 0.7}, {-x, 2.2, 1.4},        {70 + x, 0.4, 3.1},
                    {-70 - x, 0.4, 3.1}, {40 + x, -60.5, 9.25}, {-40 - x, 30.5, 20},
                    {0.4 / x, 0.5, 2},   {0.7 * x, -0.6, 2.5},  {2 + x, 25.5, 60},
                    {2 + x, -25, 40.5},  {x, -6.5, -20.25},     {0, -2.5, 0.25}};
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
        GaussRegions(),
        Confluent("QX_Kummer", QX_Kummer),
        Confluent("QX_Tricomi", QX_Tricomi),
        ConfluentRegions("QX_Kummer_2026", QX_Kummer_2026),
        ConfluentRegions("QX_Tricomi_2026", QX_Tricomi_2026),
    };
}

const RecipeFile file(SpecialHypergeometricRecipes);

} // namespace

} // namespace qx::test
