#include "qx/fit_bounds.h"
#include "tests/support/recipe.h"

namespace qx::test {

namespace {

constexpr auto DBL = ElementType::DBL;

DBL1D Positions(Call &c, int number) {
    return c.in<DBL>(number, c.n, [](int32_t i) { return 0.25 * (i % 16) + 0.5; });
}
DBL1D Weights(Call &c, int number) {
    c.mayBeEmpty(number);
    return c.in<DBL>(number, c.n, [](int32_t i) { return i % 7 == 6 ? 0.0 : 0.5 + i % 4; });
}
DBL1D Coefficients(Call &c, int number, int32_t count) {
    return c.in<DBL>(number, count, [](int32_t i) { return 1.5 - 0.25 * i; });
}
DBL2D Terms(Call &c, int number) {
    return c.in2D<DBL>(number, c.n, 3, [](int32_t i, int32_t j) {
        return j == 0 ? 1.0 : j == 1 ? 0.125 * i : 0.5 * (i * i % 11);
    });
}

std::vector<Recipe> BoundsRecipes() {
    return {
        {"ConfBndLinear_head",
         [](Call &c) {
             return ConfBndLinear_head(Positions(c, 0), c.in<DBL>(1), Weights(c, 2),
                                       Coefficients(c, 3, 2), 0.95, c.out<DBL>(0), c.out<DBL>(1),
                                       c.out<DBL>(2), c.out<DBL>(3));
         },
         None,
         {3, 8, 50, 1000}},
        {"PredBndLinear_head",
         [](Call &c) {
             return PredBndLinear_head(Positions(c, 0), c.in<DBL>(1), Weights(c, 2),
                                       Coefficients(c, 3, 2), 0.9, c.out<DBL>(0), c.out<DBL>(1));
         },
         None,
         {3, 8, 50, 1000}},
        {"ConfBndExp_head",
         [](Call &c) {
             return ConfBndExp_head(Positions(c, 0), c.in<DBL>(1), Weights(c, 2),
                                    Coefficients(c, 3, 2), 0.95, c.out<DBL>(0), c.out<DBL>(1),
                                    c.out<DBL>(2), c.out<DBL>(3));
         },
         None,
         {3, 8, 50, 1000}},
        {"PredBndExp_head",
         [](Call &c) {
             return PredBndExp_head(Positions(c, 0), c.in<DBL>(1), Weights(c, 2),
                                    Coefficients(c, 3, 2), 0.9, c.out<DBL>(0), c.out<DBL>(1));
         },
         None,
         {3, 8, 50, 1000}},
        {"ConfBndPower_head",
         [](Call &c) {
             return ConfBndPower_head(Positions(c, 0), c.in<DBL>(1), Weights(c, 2),
                                      Coefficients(c, 3, 2), 0.95, c.out<DBL>(0), c.out<DBL>(1),
                                      c.out<DBL>(2), c.out<DBL>(3));
         },
         None,
         {3, 8, 50, 1000}},
        {"PredBndPower_head",
         [](Call &c) {
             return PredBndPower_head(Positions(c, 0), c.in<DBL>(1), Weights(c, 2),
                                      Coefficients(c, 3, 2), 0.9, c.out<DBL>(0), c.out<DBL>(1));
         },
         None,
         {3, 8, 50, 1000}},
        {"ConfBndLog_head",
         [](Call &c) {
             return ConfBndLog_head(Positions(c, 0), c.in<DBL>(1), Weights(c, 2),
                                    Coefficients(c, 3, 2), 10.0, 0.95, c.out<DBL>(0), c.out<DBL>(1),
                                    c.out<DBL>(2), c.out<DBL>(3));
         },
         None,
         {3, 8, 50, 1000}},
        {"PredBndLog_head",
         [](Call &c) {
             return PredBndLog_head(Positions(c, 0), c.in<DBL>(1), Weights(c, 2),
                                    Coefficients(c, 3, 2), 10.0, 0.9, c.out<DBL>(0), c.out<DBL>(1));
         },
         None,
         {3, 8, 50, 1000}},
        {"ConfBndGauss_head",
         [](Call &c) {
             return ConfBndGauss_head(Positions(c, 0), c.in<DBL>(1), Weights(c, 2),
                                      Coefficients(c, 3, 3), 0.95, c.out<DBL>(0), c.out<DBL>(1),
                                      c.out<DBL>(2), c.out<DBL>(3));
         },
         None,
         {8, 50, 1000}},
        {"PredBndGauss_head",
         [](Call &c) {
             return PredBndGauss_head(Positions(c, 0), c.in<DBL>(1), Weights(c, 2),
                                      Coefficients(c, 3, 3), 0.9, c.out<DBL>(0), c.out<DBL>(1));
         },
         None,
         {8, 50, 1000}},
        {"ConfBndPoly_head",
         [](Call &c) {
             return ConfBndPoly_head(Positions(c, 0), c.in<DBL>(1), Weights(c, 2),
                                     Coefficients(c, 3, 4), 0.95, c.out<DBL>(0), c.out<DBL>(1),
                                     c.out<DBL>(2), c.out<DBL>(3));
         },
         None,
         {8, 50, 1000}},
        {"PredBndPoly_head",
         [](Call &c) {
             return PredBndPoly_head(Positions(c, 0), c.in<DBL>(1), Weights(c, 2),
                                     Coefficients(c, 3, 4), 0.9, c.out<DBL>(0), c.out<DBL>(1));
         },
         None,
         {8, 50, 1000}},
        {"ConfBndGenLS_head",
         [](Call &c) {
             return ConfBndGenLS_head(Terms(c, 0), c.in<DBL>(1), Weights(c, 2),
                                      Coefficients(c, 3, 3), 0.95, c.out<DBL>(0), c.out<DBL>(1),
                                      c.out<DBL>(2), c.out<DBL>(3));
         },
         None,
         {8, 50, 1000}},
        {"PredBndGenLS_head",
         [](Call &c) {
             return PredBndGenLS_head(Terms(c, 0), c.in<DBL>(1), Weights(c, 2),
                                      Coefficients(c, 3, 3), 0.9, c.out<DBL>(0), c.out<DBL>(1));
         },
         None,
         {8, 50, 1000}},
    };
}

const RecipeFile file(BoundsRecipes);

} // namespace

} // namespace qx::test
