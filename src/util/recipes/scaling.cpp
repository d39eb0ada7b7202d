#include "qx/scaling.h"
#include "tests/support/recipe.h"

namespace qx::test {

namespace {

constexpr auto DBL = ElementType::DBL;

DBL2D Matrix(Call &c) { return c.inOut2D<DBL>(0, c.n, 3); }

std::vector<Recipe> ScalingRecipes() {
    std::vector<Recipe> recipes = {
        {"Scale", [](Call &c) { return Scale(Matrix(c), c.scalar(0), c.scalar(1), c.err()); }},
        {"Scale1DCIN",
         [](Call &c) { return Scale1DCIN(c.inOut<DBL>(0), c.scalar(0), c.scalar(1), c.err()); }},
        {"QScale", [](Call &c) { return QScale(Matrix(c), c.scalar(0), c.err()); }},
        {"QS1D", [](Call &c) { return QS1D(c.inOut<DBL>(0), c.scalar(0), c.err()); }},
        {"Norm1",
         [](Call &c) { return Norm1(c.inOut<DBL>(0), c.scalar(0), c.scalar(1), c.err()); }},
        {"Norm2", [](Call &c) { return Norm2(Matrix(c), c.scalar(0), c.scalar(1), c.err()); }},
        {"Line1",
         [](Call &c) { return Line1(c.inOut<DBL>(0), c.byReference(1.5), c.byReference(-0.3)); }},
        {"LinEv", [](Call &c) { return LinEv(Matrix(c), 1.5, -0.3); }},
        {"unWrap",
         [](Call &c) {
             const auto phase = [](int32_t i) { return i % 5 * 1.3 - i % 3; };
             return unWrap(c.inOut<DBL>(0, c.n, phase), c.err());
         },
         CodeInBoth},
    };
    for (const int32_t mode : {0, 1, 2, 3})
        recipes.push_back({"unWrap85: mode " + std::to_string(mode), [=](Call &c) {
                               const auto phase = [](int32_t i) { return i % 5 * 90.0 - i % 3; };
                               return unWrap85(c.inOut<DBL>(0, c.n, phase), mode);
                           }});
    return recipes;
}

const RecipeFile file(ScalingRecipes);

} // namespace

} // namespace qx::test
