#include "qx/rational_resampling.h"
#include "tests/support/recipe.h"

namespace qx::test {

namespace {

constexpr auto DBL = ElementType::DBL;
constexpr auto CDB = ElementType::CDB;

int32_t *Number(Call &c, int number, int32_t value) {
    int32_t *integer = c.record<int32_t>(number);
    *integer = value;
    return integer;
}

template <ElementType Code, class Function>
Recipe OneChannel(const char *name, Function *function, int32_t L, int32_t M, int32_t reset) {
    return {name, [=](Call &c) {
                c.mayBeEmpty(0);
                c.mayBeEmpty(2);
                return function(c.in<Code>(0), L, M, reset, Number(c, 0, 2), c.in<DBL>(1, 63),
                                c.inOut<Code>(2, 62 / L + 1), Number(c, 1, 5), c.out<Code>(0));
            }};
}

template <ElementType Code, class Function>
Recipe Channels(const char *name, Function *function, int32_t L, int32_t M, int32_t reset) {
    return {name, [=](Call &c) {
                c.mayBeEmpty(0);
                c.mayBeEmpty(2);
                return function(c.in2D<Code>(0, 3, c.n), L, M, reset, Number(c, 0, 2),
                                c.in<DBL>(1, 63), c.inOut2D<Code>(2, 3, 62 / L + 1),
                                Number(c, 1, 5), c.out2D<Code>(0));
            }};
}

std::vector<Recipe> RationalResamplingRecipes() {
    return {
        OneChannel<DBL>("RationalResample_H: reset", RationalResample_H, 3, 2, 1),
        OneChannel<DBL>("RationalResample_H: in a stream", RationalResample_H, 2, 5, 0),
        OneChannel<CDB>("CxRationalResample_H: reset", CxRationalResample_H, 3, 2, 1),
        OneChannel<CDB>("CxRationalResample_H: in a stream", CxRationalResample_H, 2, 5, 0),
        Channels<DBL>("RationalResampleMultiCh_H: reset", RationalResampleMultiCh_H, 3, 2, 1),
        Channels<DBL>("RationalResampleMultiCh_H: in a stream", RationalResampleMultiCh_H, 2, 5, 0),
        Channels<CDB>("CxRationalResampleMCh_H: reset", CxRationalResampleMCh_H, 3, 2, 1),
        Channels<CDB>("CxRationalResampleMCh_H: in a stream", CxRationalResampleMCh_H, 2, 5, 0),
    };
}

const RecipeFile file(RationalResamplingRecipes);

} // namespace

} // namespace qx::test
