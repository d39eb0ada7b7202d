#include "qx/chirp_z.h"

#include "tests/support/recipe.h"

namespace qx::test {

namespace {

constexpr auto DBL = ElementType::DBL;
constexpr auto CDB = ElementType::CDB;

// A spiral a little off the unit circle: about a turn, whatever the size.
const ::CDB start = {0.96, 0.28};
::CDB Step(int32_t n) { return {1.0 - 1.0 / (n + 3.0), -5.0 / (n + 3.0)}; }

std::vector<Recipe> ChirpZRecipes() {
    const std::vector<int32_t> sizes = {1, 2, 3, 8, 50, 200};
    std::vector<Recipe> recipes;
    for (const uint32_t method : {0U, 1U}) {
        const unsigned heap = method == 0 ? None : UsesHeap;
        const std::string by = method == 0 ? ": direct" : ": by convolution";
        recipes.push_back({"ChirpZT_head" + by,
                           [method](Call &c) {
                               const ::CDB w = Step(c.n);
                               return ChirpZT_head(c.in<DBL>(0), &start, &w, c.n / 2 + 3, method,
                                                   c.out<CDB>(0));
                           },
                           heap, sizes});
        recipes.push_back({"CxChirpZT_head" + by,
                           [method](Call &c) {
                               const ::CDB w = Step(c.n);
                               return CxChirpZT_head(c.in<CDB>(0), &start, &w, 0, method,
                                                     c.out<CDB>(0));
                           },
                           heap, sizes});
    }
    recipes.push_back({"InvChirpZT_head: all points",
                       [](Call &c) {
                           const ::CDB w = Step(c.n);
                           return InvChirpZT_head(c.in<CDB>(0), &start, &w, 0, c.out<CDB>(0));
                       },
                       None, sizes});
    recipes.push_back({"InvChirpZT_head: some points",
                       [](Call &c) {
                           const ::CDB w = Step(c.n);
                           return InvChirpZT_head(c.in<CDB>(0), &start, &w, c.n / 2 + 1,
                                                  c.out<CDB>(0));
                       },
                       None, sizes});
    return recipes;
}

const RecipeFile file(ChirpZRecipes);

} // namespace

} // namespace qx::test
