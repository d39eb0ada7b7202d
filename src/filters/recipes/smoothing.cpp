#include "qx/smoothing.h"

#include "tests/support/recipe.h"

namespace qx::test {

namespace {

constexpr auto DBL = ElementType::DBL;

double Weight(int32_t i) { return i % 3 == 0 ? -0.5 : 1.0 + 0.125 * i; }

// The frame depends on the size, so that every size has ends and a middle.
int32_t Frame(const Call &c) { return c.n / 3 * 2 + 3 > 51 ? 51 : c.n / 3 * 2 + 3; }

Recipe Matrices(const char *name, int32_t order, bool isWeighted, int32_t wantsDifferentiators) {
    return {name, [=](Call &c) {
                c.mayBeEmpty(0);
                const int32_t frame = Frame(c) + order;
                const int32_t odd = frame - (1 - frame % 2);
                return SavitzkyGolayCoefH(order, odd, c.in<DBL>(0, isWeighted ? odd : 0, Weight),
                                          wantsDifferentiators, c.out2D<DBL>(0), c.out2D<DBL>(1));
            }};
}

Recipe Filter(const char *name, int32_t order, bool isWeighted) {
    return {name, [=](Call &c) {
                c.mayBeEmpty(1);
                const int32_t frame = Frame(c);
                return SavitzkyGolayFiltH(c.in<DBL>(0, c.n + frame), order, frame,
                                          c.in<DBL>(1, isWeighted ? frame : 0, Weight),
                                          c.out<DBL>(0));
            }};
}

// Signals whose values include zeros of either sign.
double Coarse(int32_t i) {
    const int32_t value = i * 37 % 11 - 5;
    return value == 0 && i % 2 != 0 ? -0.0 : value / 4 * 0.25;
}

Recipe Median(const std::string &name, int32_t leftRank, int32_t rightRank) {
    return {name,
            [=](Call &c) {
                return MedianFilter81_H(c.inOut<DBL>(0, 4 * c.n + rightRank, Coarse), leftRank,
                                        rightRank);
            },
            TakesEmptyInput};
}

std::vector<Recipe> SmoothingRecipes() {
    return {
        Matrices("SavitzkyGolayCoefH: smoothing alone", 2, false, 0),
        Matrices("SavitzkyGolayCoefH: with differentiators", 2, false, 1),
        Matrices("SavitzkyGolayCoefH: weighted", 3, true, 1),
        Filter("SavitzkyGolayFiltH: equal weights", 2, false),
        Filter("SavitzkyGolayFiltH: weighted", 1, true),
        {"MedianFilterCIN",
         [](Call &c) {
             return MedianFilterCIN(c.inOut<DBL>(0, c.n + 3), c.byReference(3), c.err());
         },
         TakesEmptyInput},
        Median("MedianFilter81_H: odd", 4, 4),
        Median("MedianFilter81_H: even", 0, 5),
        Median("MedianFilter81_H: wide", 200, 100),
    };
}

const RecipeFile file(SmoothingRecipes);

} // namespace

} // namespace qx::test
