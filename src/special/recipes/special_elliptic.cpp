#include "qx/special_elliptic.h"
#include "tests/support/recipe.h"
#include "tests/support/scalar_recipe.h"

namespace qx::test {

namespace {

std::vector<Recipe> SpecialEllipticRecipes() {
    return {
        OfTwoNumbers("QX_Elliptic1", QX_Elliptic1),
        {"QX_Elliptic1_85",
         [](Call &c) {
             QX_Elliptic1_85(1.0 / c.n, 0.9 * c.n, c.scalar(0), 0);
             QX_Elliptic1_85(1.0 / c.n, 0.9, c.scalar(1), 1);
             return 0;
         },
         NoStatus},
        {"QX_Elliptic1_2026",
         [](Call &c) {
             QX_Elliptic1_2026(1.0 / c.n, 0.9 * c.n, c.scalar(0), 0);
             QX_Elliptic1_2026(1.0 / c.n, 0.9, c.scalar(1), 1);
             QX_Elliptic1_2026(1, 0.3 / c.n, c.scalar(2), 0);
             QX_Elliptic1_2026(1, 1.5 - 0.2 / c.n, c.scalar(3), 0);
             return 0;
         },
         NoStatus},
        OfTwoNumbers("QX_Elliptic2", QX_Elliptic2),
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
    };
}

const RecipeFile file(SpecialEllipticRecipes);

} // namespace

} // namespace qx::test
