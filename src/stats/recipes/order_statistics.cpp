#include "qx/order_statistics.h"
#include "tests/support/recipe.h"

namespace qx::test {

namespace {

constexpr auto DBL = ElementType::DBL;

double Repeating(int32_t i) { return i % 7 - 3.0; }

std::vector<Recipe> OrderStatisticsRecipes() {
    return {
        {"Median_head", [](Call &c) { return Median_head(c.in<DBL>(0), c.scalar(0), c.err()); }},
        {"ModeH",
         [](Call &c) { return ModeH(c.in<DBL>(0, c.n, Repeating), c.n % 3 * 4, c.out<DBL>(0)); }},
    };
}

const RecipeFile file(OrderStatisticsRecipes);

} // namespace

} // namespace qx::test
