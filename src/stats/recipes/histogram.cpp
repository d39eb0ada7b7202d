#include "qx/histogram.h"
#include "tests/support/recipe.h"

namespace qx::test {

namespace {

constexpr auto DBL = ElementType::DBL;
constexpr auto I32 = ElementType::I32;

HistInterval1D Intervals(Call &c, int number) {
    static const HistInterval intervals[] = {{-0.9, -0.5, 0}, {-0.5, 0.25, 1}, {0.0, 0.75, 2}};
    return c.inRecords<HistInterval1D>(number, 3, intervals, sizeof intervals);
}

std::vector<Recipe> HistogramRecipes() {
    return {
        {"histgran_head",
         [](Call &c) {
             return histgran_head(c.in<DBL>(0), c.byReference(10), c.out<I32>(0), c.out<DBL>(1),
                                  c.err());
         },
         HostStatusInResult},
        {"GenHistH",
         [](Call &c) {
             return GenHistH(c.in<DBL>(0), Intervals(c, 1), c.out<I32>(0), c.record<HistSummary>(0),
                             c.err());
         },
         TakesEmptyInput},
    };
}

const RecipeFile file(HistogramRecipes);

} // namespace

} // namespace qx::test
