#include "qx/interpolation.h"
#include "tests/support/recipe.h"

namespace qx::test {

namespace {

constexpr auto DBL = ElementType::DBL;

DBL1D Ascending(Call &c, int number) {
    return c.in<DBL>(number, c.n, [](int32_t i) { return i + 0.25 * (i % 3); });
}
const double *Inside(Call &c) { return c.byReference(0.37 * c.n); }

std::vector<Recipe> InterpolationRecipes() {
    return {
        {"PolyInterp_head",
         [](Call &c) {
             return PolyInterp_head(c.in<DBL>(0), Ascending(c, 1), Inside(c), c.scalar(0),
                                    c.scalar(1), c.err());
         },
         None,
         {1, 2, 3, 8, 50}},
        {"RatInterp_head",
         [](Call &c) {
             return RatInterp_head(c.in<DBL>(0), Ascending(c, 1), Inside(c), c.scalar(0),
                                   c.scalar(1), c.err());
         },
         None,
         {1, 2, 3, 8, 50}},
        {"Spline_head: natural",
         [](Call &c) {
             return Spline_head(c.in<DBL>(0), Ascending(c, 1), c.byReference(1e30),
                                c.byReference(1e30), c.out<DBL>(0), c.err());
         },
         HostStatusInResult},
        {"Spline_head: slopes",
         [](Call &c) {
             return Spline_head(c.in<DBL>(0), Ascending(c, 1), c.byReference(0.5),
                                c.byReference(-1.0), c.out<DBL>(0), c.err());
         },
         HostStatusInResult},
        {"SpInterp_head",
         [](Call &c) {
             return SpInterp_head(c.in<DBL>(0), Ascending(c, 1), c.in<DBL>(2), Inside(c),
                                  c.scalar(0), c.err());
         },
         None,
         {2, 3, 8, 50}},
        {"SpInterp_head: in the middle",
         [](Call &c) {
             return SpInterp_head(c.in<DBL>(0), Ascending(c, 1), c.in<DBL>(2),
                                  c.byReference(c.n / 2 + 0.6), c.scalar(0), c.err());
         },
         None,
         {2, 3, 8, 50}},
    };
}

const RecipeFile file(InterpolationRecipes);

} // namespace

} // namespace qx::test
