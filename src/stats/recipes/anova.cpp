#include "qx/anova.h"
#include "tests/support/recipe.h"

namespace qx::test {

namespace {

constexpr auto DBL = ElementType::DBL;
constexpr auto I32 = ElementType::I32;

double ThreeLabels(int32_t i) { return i % 3 - 1; }
double Counts(int32_t i) { return i * 7 % 11 + 1; }

std::vector<Recipe> AnovaRecipes() {
    return {
        {"Contingency_head",
         [](Call &c) {
             return Contingency_head(c.in2D<I32>(0, c.n, c.n + 1, Counts), c.scalar(0), c.scalar(1),
                                     c.err());
         },
         None,
         {2, 3, 50}},
        {"Anova1Way_head",
         [](Call &c) {
             return Anova1Way_head(c.in<DBL>(0), c.in<I32>(1, c.n, ThreeLabels), c.byReference(3),
                                   c.scalar(0), c.scalar(1), c.scalar(2), c.scalar(3), c.scalar(4),
                                   c.scalar(5), c.scalar(6), c.err());
         },
         None,
         {8, 50, 1000}},
        {"Anova1Way_head_2017",
         [](Call &c) {
             return Anova1Way_head_2017(c.in<DBL>(0), c.in<I32>(1, c.n, ThreeLabels),
                                        c.byReference(3), 0.05, c.scalar(0), c.scalar(1),
                                        c.scalar(2), c.scalar(3), c.scalar(4), c.scalar(5),
                                        c.scalar(6), c.scalar(7), c.err());
         },
         None,
         {8, 50, 1000}},
    };
}

const RecipeFile file(AnovaRecipes);

} // namespace

} // namespace qx::test
