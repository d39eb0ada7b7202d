#include "qx/coordinates.h"
#include "tests/support/recipe.h"

namespace qx::test {

namespace {

constexpr auto DBL = ElementType::DBL;

// A rotation with exact elements, perturbed in the last digits.
DBL2D Direction(Call &c, int number) {
    return c.in2D<DBL>(number, 3, 3, [](int32_t row, int32_t col) {
        static const double exact[] = {0.36, 0.48, -0.8, -0.8, 0.6, 0.0, 0.48, 0.64, 0.6};
        return exact[(3 * row + col) % 9] + (row - col) * 0x1p-40; // of other sizes too
    });
}

std::vector<Recipe> CoordinateRecipes() {
    std::vector<Recipe> recipes = {
        {"CoordRotation2D_head",
         [](Call &c) {
             return CoordRotation2D_head(c.in<DBL>(0), c.in<DBL>(1), 0.7, c.out<DBL>(0),
                                         c.out<DBL>(1));
         },
         TakesEmptyInput},
        {"CoordRotationDirection_head",
         [](Call &c) {
             for (const int points : {0, 1, 2})
                 c.mayBeEmpty(points);
             return CoordRotationDirection_head(c.in<DBL>(0), c.in<DBL>(1), c.in<DBL>(2),
                                                Direction(c, 3), c.out<DBL>(0), c.out<DBL>(1),
                                                c.out<DBL>(2));
         }},
        {"CoordRotationEuler_head",
         [](Call &c) {
             return CoordRotationEuler_head(c.in<DBL>(0), c.in<DBL>(1), c.in<DBL>(2), 0.3, -1.1,
                                            2.5, c.out<DBL>(0), c.out<DBL>(1), c.out<DBL>(2));
         },
         TakesEmptyInput},
        {"Euler2Direction_head",
         [](Call &c) { return Euler2Direction_head(0.1 * c.n, -1.1, 2.5, c.out2D<DBL>(0)); }},
    };
    for (int32_t sequence = 0; sequence < 12; ++sequence) {
        const std::string variant = ": sequence " + std::to_string(sequence);
        recipes.push_back({"CoordRotationEuler2011_head" + variant,
                           [=](Call &c) {
                               return CoordRotationEuler2011_head(
                                   c.in<DBL>(0), c.in<DBL>(1), c.in<DBL>(2), 0.3, -1.1, 2.5,
                                   sequence, c.out<DBL>(0), c.out<DBL>(1), c.out<DBL>(2));
                           },
                           TakesEmptyInput});
        recipes.push_back({"Euler2Direction2011_head" + variant, [=](Call &c) {
                               return Euler2Direction2011_head(0.1 * c.n, -1.1, 2.5, sequence,
                                                               c.out2D<DBL>(0));
                           }});
        recipes.push_back({"Direction2Euler2011_head" + variant, [=](Call &c) {
                               return Direction2Euler2011_head(Direction(c, 0), sequence,
                                                               c.scalar(0), c.scalar(1),
                                                               c.scalar(2));
                           }});
    }
    for (int32_t from = 0; from < 3; ++from)
        for (int32_t to = 0; to < 3; ++to)
            recipes.push_back(
                {"CoordConversion_head: " + std::to_string(from) + " to " + std::to_string(to),
                 [=](Call &c) {
                     return CoordConversion_head(from, to, c.in<DBL>(0), c.in<DBL>(1), c.in<DBL>(2),
                                                 c.out<DBL>(0), c.out<DBL>(1), c.out<DBL>(2));
                 },
                 TakesEmptyInput});
    return recipes;
}

const RecipeFile file(CoordinateRecipes);

} // namespace

} // namespace qx::test
