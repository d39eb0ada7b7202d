#include "qx/bounded_fits.h"
#include "tests/support/recipe.h"

namespace qx::test {

namespace {

constexpr auto DBL = ElementType::DBL;
constexpr double inf = std::numeric_limits<double>::infinity();

double Position(int32_t i) { return 0.25 * (i % 16) + 0.5; }
double Disturbance(int32_t i) { return 0.03125 * (i % 5 - 2) + 0.25 * (i % 11 == 7); }
double Rising(int32_t i) { return 1.5 * Position(i) + 0.5 + Disturbance(i); }
double Falling(int32_t i) { return 8.0 / (1.0 + Position(i)) + 1.0 + Disturbance(i); }
double Peak(int32_t i) {
    const double z = Position(i) - 2.5;
    return 4.0 / (1.0 + z * z) + Disturbance(i);
}

DBL1D Positions(Call &c, int number) { return c.in<DBL>(number, c.n, Position); }
DBL1D Weights(Call &c, int number) {
    c.mayBeEmpty(number);
    return c.in<DBL>(number, c.n, [](int32_t i) { return 0.5 + i % 4; });
}
// An array of any values, which may be empty.
DBL1D Values(Call &c, int number, std::initializer_list<double> values) {
    c.mayBeEmpty(number);
    return c.in<DBL>(number, static_cast<int32_t>(values.size()), [values](int32_t i) {
        return i < static_cast<int32_t>(values.size()) ? values.begin()[i] : 0.0;
    });
}
int32_t *Limit(Call &c) {
    int32_t *const iterations = c.integer(0);
    *iterations = 200;
    return iterations;
}

const std::vector<int32_t> sizes = {4, 8, 50, 1000};
const char *const methods[] = {"least squares", "least absolute residuals", "bisquare"};

std::vector<Recipe> LineRecipes() {
    std::vector<Recipe> recipes = {
        {"BoundLinearFit_head",
         [](Call &c) {
             return BoundLinearFit_head(c.inOut<DBL>(0, c.n, Rising), Positions(c, 1),
                                        Weights(c, 2), Values(c, 3, {-1.0, 0.75}),
                                        Values(c, 4, {1.25, inf}), c.scalar(0), c.scalar(1),
                                        c.scalar(2));
         },
         None, sizes},
        {"BoundLinearFit_head: unbounded",
         [](Call &c) {
             return BoundLinearFit_head(c.inOut<DBL>(0, c.n, Rising), Positions(c, 1),
                                        Weights(c, 2), Values(c, 3, {}), Values(c, 4, {}),
                                        c.scalar(0), c.scalar(1), c.scalar(2));
         },
         None, sizes},
    };
    for (const double highest : {1.25, inf}) {
        const std::string variant = highest < inf ? "" : ": unbounded";
        recipes.push_back({"BoundLinearFitLAR_head" + variant,
                           [highest](Call &c) {
                               return BoundLinearFitLAR_head(c.inOut<DBL>(0, c.n, Rising),
                                                             Positions(c, 1), Weights(c, 2), 1e-4,
                                                             Limit(c), Values(c, 3, {-inf, 0.75}),
                                                             Values(c, 4, {highest, inf}),
                                                             c.scalar(0), c.scalar(1), c.scalar(2));
                           },
                           None, sizes});
        recipes.push_back({"BoundLinearFitBi_head" + variant,
                           [highest](Call &c) {
                               return BoundLinearFitBi_head(c.inOut<DBL>(0, c.n, Rising),
                                                            Positions(c, 1), Weights(c, 2), 1e-4,
                                                            Limit(c), Values(c, 3, {-inf, 0.75}),
                                                            Values(c, 4, {highest, inf}),
                                                            c.scalar(0), c.scalar(1), c.scalar(2));
                           },
                           None, sizes});
    }
    return recipes;
}

std::vector<Recipe> ModelRecipes() {
    std::vector<Recipe> recipes;
    for (uint16_t method = 0; method < 3; ++method) {
        const std::string variant = std::string(": ") + methods[method];
        recipes.push_back({"BoundExpFit_head" + variant,
                           [method](Call &c) {
                               return BoundExpFit_head(
                                   c.inOut<DBL>(0, c.n, Falling), Positions(c, 1), Weights(c, 2),
                                   1e-6, Limit(c), Values(c, 3, {}), Values(c, 4, {0.0, -inf, 1.5}),
                                   Values(c, 5, {inf, 0.0, 1.75}), method, c.scalar(0), c.scalar(1),
                                   c.scalar(2), c.scalar(3));
                           },
                           None, sizes});
        recipes.push_back({"BoundPowerFit_head" + variant,
                           [method](Call &c) {
                               return BoundPowerFit_head(
                                   c.inOut<DBL>(0, c.n, Falling), Positions(c, 1), Weights(c, 2),
                                   1e-6, Limit(c), Values(c, 3, {4.0, -0.5, 1.0}),
                                   Values(c, 4, {0.0, -inf, 0.5}), Values(c, 5, {4.5, 0.0, inf}),
                                   method, c.scalar(0), c.scalar(1), c.scalar(2), c.scalar(3));
                           },
                           None, sizes});
        recipes.push_back({"BoundLogFit_head" + variant,
                           [method](Call &c) {
                               return BoundLogFit_head(
                                   c.inOut<DBL>(0, c.n, Falling), Positions(c, 1), Weights(c, 2),
                                   10.0, Limit(c), Values(c, 3, {}), Values(c, 4, {-4.0, 0.0}),
                                   Values(c, 5, {inf, inf}), method, 1e-6, c.scalar(0), c.scalar(1),
                                   c.scalar(2));
                           },
                           None, sizes});
        recipes.push_back({"BoundGaussianFit_head" + variant,
                           [method](Call &c) {
                               return BoundGaussianFit_head(
                                   c.inOut<DBL>(0, c.n, Peak), Positions(c, 1), Weights(c, 2), 1e-6,
                                   Limit(c), Values(c, 3, {3.0, 2.25, 1.0, 0.5}),
                                   Values(c, 4, {0.0, 0.0, 0.125, 0.25}),
                                   Values(c, 5, {inf, 5.0, 5.0, inf}), method, c.scalar(0),
                                   c.scalar(1), c.scalar(2), c.scalar(3), c.scalar(4));
                           },
                           None, sizes});
    }
    for (uint16_t method = 0; method < 3; ++method)
        for (const bool isGuessed : {false, true})
            recipes.push_back({std::string("BoundGaussianFit2026_head: ") + methods[method] +
                                   (isGuessed ? ", guess" : ""),
                               [method, isGuessed](Call &c) {
                                   const auto guess = isGuessed
                                                          ? Values(c, 3, {3.0, 2.25, 1.0, 0.5})
                                                          : Values(c, 3, {});
                                   return BoundGaussianFit2026_head(
                                       c.inOut<DBL>(0, c.n, Peak), Positions(c, 1), Weights(c, 2),
                                       1e-6, Limit(c), guess, Values(c, 4, {0.0, 0.0, 0.125, 0.25}),
                                       Values(c, 5, {inf, 5.0, 5.0, inf}), method, c.scalar(0),
                                       c.scalar(1), c.scalar(2), c.scalar(3), c.scalar(4));
                               },
                               None, sizes});
    recipes.push_back({"BoundGaussianFit_head: own start",
                       [](Call &c) {
                           return BoundGaussianFit_head(
                               c.inOut<DBL>(0, c.n, Peak), Positions(c, 1), Weights(c, 2), 0.0,
                               Limit(c), Values(c, 3, {}), Values(c, 4, {}), Values(c, 5, {}), 0,
                               c.scalar(0), c.scalar(1), c.scalar(2), c.scalar(3), c.scalar(4));
                       },
                       None, sizes});
    recipes.push_back({"BoundPowerFit_head: own start",
                       [](Call &c) {
                           return BoundPowerFit_head(
                               c.inOut<DBL>(0, c.n, Falling), Positions(c, 1), Weights(c, 2), 0.0,
                               Limit(c), Values(c, 3, {}), Values(c, 4, {}), Values(c, 5, {}), 0,
                               c.scalar(0), c.scalar(1), c.scalar(2), c.scalar(3));
                       },
                       None, sizes});
    return recipes;
}

const RecipeFile lines(LineRecipes);
const RecipeFile models(ModelRecipes);

} // namespace

} // namespace qx::test
