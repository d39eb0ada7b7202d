#include "qx/model_fits.h"
#include "tests/support/recipe.h"

namespace qx::test {

namespace {

constexpr auto DBL = ElementType::DBL;

double Position(int32_t i) { return 0.25 * (i % 16) + 0.5; }
// A slow decay with a disturbance of a few percent.
double Decay(int32_t i) { return 8.0 / (1.0 + Position(i)) * (1.0 + 0.03125 * (i % 5 - 2)); }
double Peak(int32_t i) {
    const double z = Position(i) - 2.5;
    return 4.0 / (1.0 + z * z) + 0.0625 * (i % 3);
}

DBL1D Positions(Call &c, int number) { return c.in<DBL>(number, c.n, Position); }
DBL1D Weights(Call &c, int number) {
    c.mayBeEmpty(number);
    return c.in<DBL>(number, c.n, [](int32_t i) { return 0.5 + i % 4; });
}
DBL1D NoGuess(Call &c, int number) {
    c.mayBeEmpty(number);
    return c.in<DBL>(number, 0);
}
DBL1D GuessOfPeak(Call &c, int number) {
    c.mayBeEmpty(number);
    return c.in<DBL>(number, 3, [](int32_t i) { return i == 0 ? 3.0 : i == 1 ? 2.25 : 1.5; });
}
DBL1D GuessOfDecay(Call &c, int number) {
    c.mayBeEmpty(number);
    return c.in<DBL>(number, 2, [](int32_t i) { return i == 0 ? 6.0 : -0.5; });
}
int32_t *Limit(Call &c, int32_t limit) {
    int32_t *const iterations = c.integer(0);
    *iterations = limit;
    return iterations;
}

std::vector<Recipe> ExponentialRecipes() {
    return {
        {"ExpFit_head",
         [](Call &c) {
             return ExpFit_head(c.inOut<DBL>(0, c.n, Decay), Positions(c, 1), Weights(c, 2),
                                c.scalar(0), c.scalar(1), c.scalar(2));
         },
         None,
         {2, 3, 8, 50, 1000}},
        {"ExpFitCoef_head",
         [](Call &c) {
             return ExpFitCoef_head(c.in<DBL>(0, c.n, Decay), Positions(c, 1), c.scalar(0),
                                    c.scalar(1));
         },
         None,
         {2, 3, 8, 50, 1000}},
        {"ExpFit80_head: refined",
         [](Call &c) {
             return ExpFit80_head(c.inOut<DBL>(0, c.n, Decay), Positions(c, 1), Weights(c, 2), 1e-9,
                                  NoGuess(c, 3), 1, c.scalar(0), c.scalar(1), c.scalar(2),
                                  Limit(c, 30), 0.0);
         },
         None,
         {2, 3, 8, 50, 1000}},
        {"ExpFit80_head: log-linear",
         [](Call &c) {
             return ExpFit80_head(c.inOut<DBL>(0, c.n, Decay), Positions(c, 1), Weights(c, 2), 0.0,
                                  NoGuess(c, 3), 0, c.scalar(0), c.scalar(1), c.scalar(2),
                                  Limit(c, 0), 0.0);
         },
         None,
         {2, 3, 8, 50, 1000}},
        {"ExpFitCoef80_head",
         [](Call &c) {
             return ExpFitCoef80_head(c.in<DBL>(0, c.n, Decay), Positions(c, 1), Weights(c, 2), 1,
                                      1e-9, GuessOfDecay(c, 3), c.scalar(0), c.scalar(1),
                                      Limit(c, 30), 0.0);
         },
         None,
         {2, 3, 8, 50, 1000}},
    };
}

std::vector<Recipe> PowerAndLogarithmRecipes() {
    return {
        {"PowerFit_head",
         [](Call &c) {
             return PowerFit_head(c.inOut<DBL>(0, c.n, Decay), Positions(c, 1), Weights(c, 2), 1e-9,
                                  NoGuess(c, 3), c.scalar(0), c.scalar(1), c.scalar(2),
                                  Limit(c, 30), 0.0);
         },
         None,
         {2, 3, 8, 50, 1000}},
        {"PowerFitCoef_head",
         [](Call &c) {
             return PowerFitCoef_head(c.in<DBL>(0, c.n, Decay), Positions(c, 1), Weights(c, 2),
                                      1e-9, GuessOfDecay(c, 3), c.scalar(0), c.scalar(1),
                                      Limit(c, 30), 0.0);
         },
         None,
         {2, 3, 8, 50, 1000}},
        {"LogFit_head",
         [](Call &c) {
             return LogFit_head(c.inOut<DBL>(0, c.n, Decay), Positions(c, 1), Weights(c, 2), 3.0,
                                c.scalar(0), c.scalar(1), c.scalar(2));
         },
         None,
         {2, 3, 8, 50, 1000}},
        {"LogFitCoef_head",
         [](Call &c) {
             return LogFitCoef_head(c.in<DBL>(0, c.n, Decay), Positions(c, 1), Weights(c, 2), 10.0,
                                    c.scalar(0), c.scalar(1));
         },
         None,
         {2, 3, 8, 50, 1000}},
    };
}

std::vector<Recipe> GaussianRecipes() {
    return {
        {"GaussianPeakFit_head",
         [](Call &c) {
             return GaussianPeakFit_head(c.inOut<DBL>(0, c.n, Peak), Positions(c, 1), Weights(c, 2),
                                         1e-6, NoGuess(c, 3), c.scalar(0), c.scalar(1), c.scalar(2),
                                         c.scalar(3), Limit(c, 30), 0.0);
         },
         None,
         {3, 8, 50, 1000}},
        {"GaussianPeakFit2026_head",
         [](Call &c) {
             return GaussianPeakFit2026_head(
                 c.inOut<DBL>(0, c.n, Peak), Positions(c, 1), Weights(c, 2), 0.0, NoGuess(c, 3),
                 c.scalar(0), c.scalar(1), c.scalar(2), c.scalar(3), Limit(c, 300), 0.0);
         },
         None,
         {3, 8, 50, 1000}},
        {"GaussianPeakFit2026_head: guess",
         [](Call &c) {
             return GaussianPeakFit2026_head(c.inOut<DBL>(0, c.n, Peak), Positions(c, 1),
                                             Weights(c, 2), 1e-9, GuessOfPeak(c, 3), c.scalar(0),
                                             c.scalar(1), c.scalar(2), c.scalar(3), Limit(c, 300),
                                             0.0);
         },
         None,
         {3, 8, 50, 1000}},
        {"GaussianPeakFitCoef_head: without a guess",
         [](Call &c) {
             return GaussianPeakFitCoef_head(c.in<DBL>(0, c.n, Peak), Positions(c, 1),
                                             Weights(c, 2), 1e-6, NoGuess(c, 3), c.scalar(0),
                                             c.scalar(1), c.scalar(2), Limit(c, 30), 0.0);
         },
         None,
         {3, 8, 50, 1000}},
        {"GaussianPeakFitCoef_head",
         [](Call &c) {
             return GaussianPeakFitCoef_head(c.in<DBL>(0, c.n, Peak), Positions(c, 1),
                                             Weights(c, 2), 1e-6, GuessOfPeak(c, 3), c.scalar(0),
                                             c.scalar(1), c.scalar(2), Limit(c, 30), 0.0);
         },
         None,
         {3, 8, 50, 1000}},
    };
}

const RecipeFile exponential(ExponentialRecipes);
const RecipeFile powerAndLogarithm(PowerAndLogarithmRecipes);
const RecipeFile gaussian(GaussianRecipes);

} // namespace

} // namespace qx::test
