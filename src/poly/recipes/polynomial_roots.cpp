#include "qx/polynomial_roots.h"

#include "tests/support/recipe.h"

namespace qx::test {

namespace {

constexpr auto DBL = ElementType::DBL;
constexpr auto CDB = ElementType::CDB;

const std::vector<int32_t> degrees = {1, 2, 3, 8, 20};

std::vector<Recipe> PolynomialRootsRecipes() {
    return {
        {"PolyRootsNtBst_head",
         [](Call &c) {
             c.mayBeEmpty(0);
             c.mayBeEmpty(1);
             c.mayBeEmpty(2);
             return PolyRootsNtBst_head(c.in<DBL>(0, c.n + 4), c.in<DBL>(1), 50, 1e-12,
                                        c.in<CDB>(2, 6), 60, 1e-12, c.out<CDB>(0));
         }},
        {"CxPolyRoots_head",
         [](Call &c) {
             return CxPolyRoots_head(c.inOut<CDB>(0, c.n + 1), c.byReference(100), c.err());
         },
         None, degrees},
    };
}

const RecipeFile file(PolynomialRootsRecipes);

} // namespace

} // namespace qx::test
