#include "qx/window_constants.h"
#include "tests/support/recipe.h"

namespace qx::test {

namespace {

constexpr auto DBL = ElementType::DBL;

std::vector<Recipe> WindowConstantRecipes() {
    return {
        {"NumWinConstH",
         [](Call &c) { return NumWinConstH(c.in<DBL>(0), c.record<WindowConstants>(0)); }},
        {"WinConstByNameH",
         [](Call &c) { return WinConstByNameH(c.n, 32, 0.0, c.record<WindowConstants>(0)); }},
        {"WinConstByNameH: with a parameter",
         [](Call &c) { return WinConstByNameH(c.n, 62, 0.2, c.record<WindowConstants>(0)); }},
        {"WinConstByNameH_2016",
         [](Call &c) { return WinConstByNameH_2016(c.n, 61, 45.0, c.record<WindowConstants>(0)); },
         UsesHeap},
    };
}

const RecipeFile file(WindowConstantRecipes);

} // namespace

} // namespace qx::test
