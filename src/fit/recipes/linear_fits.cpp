#include "qx/linear_fits.h"
#include "tests/support/recipe.h"

#include <string>

namespace qx::test {

namespace {

constexpr auto DBL = ElementType::DBL;
constexpr auto I32 = ElementType::I32;

DBL1D Times(Call &c, int number) {
    return c.in<DBL>(number, c.n, [](int32_t i) { return 0.25 * i - 1.0; });
}
DBL1D NoWeights(Call &c, int number) {
    c.mayBeEmpty(number);
    return c.in<DBL>(number, 0);
}
DBL1D Weights(Call &c, int number) {
    c.mayBeEmpty(number);
    return c.in<DBL>(number, c.n, [](int32_t i) { return 0.5 + i % 4; });
}

std::vector<Recipe> LineRecipes() {
    return {
        {"LinFit_head",
         [](Call &c) {
             return LinFit_head(c.inOut<DBL>(0), Times(c, 1), NoWeights(c, 2), c.scalar(0),
                                c.scalar(1), c.scalar(2));
         },
         None,
         {2, 3, 8, 50, 1000}},
        {"LinFit_head: weighted",
         [](Call &c) {
             return LinFit_head(c.inOut<DBL>(0), Times(c, 1), Weights(c, 2), c.scalar(0),
                                c.scalar(1), c.scalar(2));
         },
         None,
         {2, 3, 8, 50, 1000}},
        {"LinFitCoef_head",
         [](Call &c) {
             return LinFitCoef_head(c.in<DBL>(0), Times(c, 1), c.scalar(0), c.scalar(1), c.err());
         },
         None,
         {2, 3, 8, 50, 1000}},
        {"LinFitCoef80_head",
         [](Call &c) {
             return LinFitCoef80_head(c.in<DBL>(0), Times(c, 1), Weights(c, 2), c.scalar(0),
                                      c.scalar(1), c.err());
         },
         None,
         {2, 3, 8, 50, 1000}},
        {"GoodnessOfFit_head",
         [](Call &c) {
             return GoodnessOfFit_head(c.in<DBL>(0), c.in<DBL>(1), Weights(c, 2), 1, c.scalar(0),
                                       c.scalar(1), c.scalar(2));
         },
         None,
         {2, 3, 8, 50, 1000}},
        {"GoodnessOfFit_head: unweighted",
         [](Call &c) {
             return GoodnessOfFit_head(c.in<DBL>(0), c.in<DBL>(1), NoWeights(c, 2), 0, c.scalar(0),
                                       c.scalar(1), c.scalar(2));
         },
         None,
         {3, 8, 50, 1000}},
        {"GetNewCoef_head",
         [](Call &c) {
             return GetNewCoef_head(
                 c.inOut<DBL>(0),
                 c.in2D<DBL>(1, c.n, c.n, [](int32_t i, int32_t j) { return i == j ? 5.0 : 1.0; }),
                 c.in<DBL>(2), c.byReference(0.1), c.err());
         },
         CodeInBoth,
         {1, 2, 3, 8, 50}},
    };
}

std::vector<Recipe> PolynomialRecipes() {
    std::vector<Recipe> recipes = {
        {"PolyFit80_head",
         [](Call &c) {
             c.mayBeEmpty(2);
             c.mayBeEmpty(3);
             return PolyFit80_head(Times(c, 0), c.in<DBL>(1), 2, 0,
                                   c.in<I32>(2, 1, [](int32_t) { return 1; }), c.in<DBL>(3, 1),
                                   c.out<DBL>(0), c.out<DBL>(1), c.scalar(0));
         },
         None,
         {3, 8, 50, 1000}},
        {"PolyFit81_head",
         [](Call &c) {
             c.mayBeEmpty(3);
             c.mayBeEmpty(4);
             return PolyFit81_head(Times(c, 0), c.in<DBL>(1), 3, Weights(c, 2), 1,
                                   c.in<I32>(3, 2, [](int32_t i) { return 2 * i; }),
                                   c.in<DBL>(4, 2), c.out<DBL>(0), c.out<DBL>(1), c.scalar(0));
         },
         None,
         {4, 8, 50, 1000}},
        {"PolyFit2026_head",
         [](Call &c) {
             c.mayBeEmpty(3);
             c.mayBeEmpty(4);
             return PolyFit2026_head(Times(c, 0), c.in<DBL>(1), 3, NoWeights(c, 2), -1.0,
                                     c.in<I32>(3, 0), c.in<DBL>(4, 0), c.out<DBL>(0), c.out<DBL>(1),
                                     c.scalar(0));
         },
         None,
         {4, 8, 50, 1000}},
        {"PolyFit2026_head: fixed terms",
         [](Call &c) {
             c.mayBeEmpty(3);
             c.mayBeEmpty(4);
             return PolyFit2026_head(Times(c, 0), c.in<DBL>(1), 3, Weights(c, 2), 1e-12,
                                     c.in<I32>(3, 2, [](int32_t i) { return 2 * i; }),
                                     c.in<DBL>(4, 2), c.out<DBL>(0), c.out<DBL>(1), c.scalar(0));
         },
         None,
         {4, 8, 50, 1000}},
        {"PolyFit_head: order 30",
         [](Call &c) {
             return PolyFit_head(c.in<DBL>(0, c.n, [&](int32_t i) { return 2.0 * i / c.n - 1.0; }),
                                 c.in<DBL>(1), 30, 0, c.out<DBL>(0), c.out<DBL>(1), c.scalar(0));
         },
         None,
         {40, 1000}},
    };
    for (int32_t algorithm = 0; algorithm < 7; ++algorithm)
        recipes.push_back({"PolyFit_head: algorithm " + std::to_string(algorithm),
                           [algorithm](Call &c) {
                               return PolyFit_head(Times(c, 0), c.in<DBL>(1), 1, algorithm,
                                                   c.out<DBL>(0), c.out<DBL>(1), c.scalar(0));
                           },
                           None,
                           {2, 3, 8, 50, 1000}});
    return recipes;
}

DBL2D Terms(Call &c, int number) {
    return c.in2D<DBL>(number, c.n, 3, [](int32_t i, int32_t j) {
        return j == 0 ? 1.0 : j == 1 ? 0.125 * i : 0.5 * (i * i % 11);
    });
}

std::vector<Recipe> GeneralRecipes() {
    std::vector<Recipe> recipes;
    recipes.push_back({"GenLSFit2026_head",
                       [](Call &c) {
                           return GenLSFit2026_head(Terms(c, 0), c.in<DBL>(1), Weights(c, 2), -1.0,
                                                    1, c.out<DBL>(0), c.out<DBL>(1),
                                                    c.out2D<DBL>(2), c.scalar(0));
                       },
                       None,
                       {3, 8, 50, 1000}});
    recipes.push_back({"GenLSFit2026_head: unweighted",
                       [](Call &c) {
                           return GenLSFit2026_head(Terms(c, 0), c.in<DBL>(1), NoWeights(c, 2), 0.1,
                                                    0, c.out<DBL>(0), c.out<DBL>(1),
                                                    c.out2D<DBL>(2), c.scalar(0));
                       },
                       None,
                       {3, 8, 50, 1000}});
    for (int32_t algorithm = 0; algorithm < 7; ++algorithm) {
        const std::string variant = ": algorithm " + std::to_string(algorithm);
        recipes.push_back({"GenLSFit80_head" + variant,
                           [algorithm](Call &c) {
                               return GenLSFit80_head(Terms(c, 0), c.in<DBL>(1), Weights(c, 2),
                                                      algorithm, 1, c.out<DBL>(0), c.out<DBL>(1),
                                                      c.out2D<DBL>(2), c.scalar(0));
                           },
                           None,
                           {3, 8, 50, 1000}});
        recipes.push_back({"GenLSFit_head" + variant,
                           [algorithm](Call &c) {
                               return GenLSFit_head(Terms(c, 0), c.in<DBL>(1), Weights(c, 2),
                                                    algorithm, algorithm % 2, c.out<DBL>(0),
                                                    c.out<DBL>(1), c.out2D<DBL>(2), c.scalar(0));
                           },
                           None,
                           {3, 8, 50, 1000}});
    }
    return recipes;
}

const RecipeFile line(LineRecipes);
const RecipeFile polynomial(PolynomialRecipes);
const RecipeFile general(GeneralRecipes);

} // namespace

} // namespace qx::test
