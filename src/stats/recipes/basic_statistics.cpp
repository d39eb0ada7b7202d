#include "qx/basic_statistics.h"
#include "tests/support/recipe.h"

namespace qx::test {

namespace {

constexpr auto DBL = ElementType::DBL;
constexpr auto CDB = ElementType::CDB;

std::vector<Recipe> BasicStatisticsRecipes() {
    return {
        {"Mean_head", [](Call &c) { return Mean_head(c.in<DBL>(0), c.scalar(0), c.err()); }},
        {"RMS_head", [](Call &c) { return RMS_head(c.in<DBL>(0), c.scalar(0), c.err()); }},
        {"CxRMS_head", [](Call &c) { return CxRMS_head(c.in<CDB>(0), c.scalar(0)); }},
        {"MSE_head",
         [](Call &c) {
             return MSE_head(c.in<DBL>(0), c.in<DBL>(1, c.n + 1), c.scalar(0), c.err());
         }},
        {"Moment_head",
         [](Call &c) { return Moment_head(c.in<DBL>(0), c.byReference(5), c.scalar(0), c.err()); }},
    };
}

const RecipeFile file(BasicStatisticsRecipes);

} // namespace

} // namespace qx::test
