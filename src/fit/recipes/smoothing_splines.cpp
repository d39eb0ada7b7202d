#include "qx/smoothing_splines.h"
#include "tests/support/recipe.h"

#include <string>

namespace qx::test {

namespace {

constexpr auto DBL = ElementType::DBL;

DBL1D Ascending(Call &c, int number) {
    return c.in<DBL>(number, c.n, [](int32_t i) { return i + 0.25 * (i % 3); });
}
DBL1D Positive(Call &c, int number) {
    c.mayBeEmpty(number);
    return c.in<DBL>(number, c.n, [](int32_t i) { return 0.5 + i % 4; });
}

std::vector<Recipe> SplineRecipes() {
    std::vector<Recipe> recipes;
    for (int32_t method = 0; method < 3; ++method)
        recipes.push_back({"CubicSplineFit_head: method " + std::to_string(method),
                           [=](Call &c) {
                               return CubicSplineFit_head(Ascending(c, 0), c.in<DBL>(1),
                                                          Positive(c, 2), method, 0.05 * c.n,
                                                          c.out<DBL>(0), c.out2D<DBL>(1),
                                                          c.out<DBL>(2), c.scalar(0), c.scalar(1));
                           },
                           None,
                           {2, 3, 8, 50, 1000}});
    for (const int32_t degree : {1, 3, 9})
        recipes.push_back({"BSplineFit_head: degree " + std::to_string(degree),
                           [=](Call &c) {
                               c.mayBeEmpty(3);
                               return BSplineFit_head(Ascending(c, 0), c.in<DBL>(1), Positive(c, 2),
                                                      degree, c.n / 5, c.in<DBL>(3, 0),
                                                      c.out<DBL>(0), c.out<DBL>(1), c.out<DBL>(2),
                                                      c.scalar(0));
                           },
                           None,
                           {16, 50, 1000}});
    recipes.push_back({"BSplineFit_head: given knots",
                       [](Call &c) {
                           c.mayBeEmpty(3);
                           return BSplineFit_head(
                               Ascending(c, 0), c.in<DBL>(1), Positive(c, 2), 2, 0,
                               c.in<DBL>(3, 2, [&](int32_t i) { return (0.25 + 0.375 * i) * c.n; }),
                               c.out<DBL>(0), c.out<DBL>(1), c.out<DBL>(2), c.scalar(0));
                       },
                       None,
                       {16, 50, 1000}});
    return recipes;
}

const RecipeFile file(SplineRecipes);

} // namespace

} // namespace qx::test
