#include "qx/stats.h"
#include "tests/support/recipe.h"

namespace qx::test {

namespace {

constexpr auto DBL = ElementType::DBL;
constexpr auto CDB = ElementType::CDB;
constexpr auto I32 = ElementType::I32;

HistInterval1D Intervals(Call &c, int number) {
    static const HistInterval intervals[] = {{-0.9, -0.5, 0}, {-0.5, 0.25, 1}, {0.0, 0.75, 2}};
    return c.inRecords<HistInterval1D>(number, 3, intervals, sizeof intervals);
}

double Repeating(int32_t i) { return i % 7 - 3.0; }

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
        {"Median_head", [](Call &c) { return Median_head(c.in<DBL>(0), c.scalar(0), c.err()); }},
        {"ModeH",
         [](Call &c) { return ModeH(c.in<DBL>(0, c.n, Repeating), c.n % 3 * 4, c.out<DBL>(0)); }},
    };
}

const RecipeFile file(BasicStatisticsRecipes);

} // namespace

} // namespace qx::test
