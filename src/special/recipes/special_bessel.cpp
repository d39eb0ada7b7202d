#include "qx/special_bessel.h"
#include "tests/support/recipe.h"
#include "tests/support/scalar_recipe.h"

#include <limits>

namespace qx::test {

namespace {

constexpr double kNaN = std::numeric_limits<double>::quiet_NaN();

// Two real arguments.
Recipe Double(const char *name, void (*function)(double, double, double *)) {
    return {name,
            [function](Call &c) {
                const double x = c.n;
                const double arguments[][2] = {{0.3, x},        {x, 2.5},       {-0.6, 0.4 * x},
                                               {2.25, 0.1 * x}, {0.7 * x, 1.5}, {0.5, kNaN}};
                int output = 0;
                for (const auto &a : arguments)
                    function(a[0], a[1], c.scalar(output++));
                return 0;
            },
            NoStatus};
}

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
        Double("QX_BesselJr", QX_BesselJr),
        Double("QX_BesselYr", QX_BesselYr),
        Integer("QX_BesselJs", QX_BesselJs),
        Integer("QX_BesselYs", QX_BesselYs),
        Double("QX_BesselIr", QX_BesselIr),
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
        Double("QX_Struve", QX_Struve),
        Double("QX_ParabolicCylinder", QX_ParabolicCylinder),
        Double("QX_Elliptic1", QX_Elliptic1),
        {"QX_Elliptic1_85",
         [](Call &c) {
             QX_Elliptic1_85(1.0 / c.n, 0.9 * c.n, c.scalar(0), 0);
             QX_Elliptic1_85(1.0 / c.n, 0.9, c.scalar(1), 1);
             return 0;
         },
         NoStatus},
        Double("QX_Elliptic2", QX_Elliptic2),
        {"QX_Elliptic2_85",
         [](Call &c) {
             QX_Elliptic2_85(1.0 / c.n, 0.9 * c.n, c.scalar(0), 0);
             QX_Elliptic2_85(1.0 / c.n, 0.9, c.scalar(1), 1);
             return 0;
         },
         NoStatus},
        {"QX_EllipticJ",
         [](Call &c) {
             QX_EllipticJ(0.8 * c.n, 1.0 / c.n, c.scalar(0), c.scalar(1), c.scalar(2), c.scalar(3));
             QX_EllipticJ(0.8, 1 - 1e-11, c.scalar(4), nullptr, nullptr, nullptr);
             return 0;
         },
         NoStatus},
        OfNumber("QX_Dawson", QX_Dawson),
        {"QX_FresnelIntegrals",
         [](Call &c) {
             QX_FresnelIntegrals(0.3 * c.n, c.scalar(0), c.scalar(1));
             QX_FresnelIntegrals(-7.7 * c.n, c.scalar(2), c.scalar(3));
             return 0;
         },
         NoStatus},
        OfNumber("QX_Zeta", QX_Zeta),
    };
}

const RecipeFile file(SpecialBesselRecipes);

} // namespace

} // namespace qx::test
