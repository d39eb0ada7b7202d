#include "qx/polyphase.h"
#include "tests/support/recipe.h"

namespace qx::test {

namespace {

typedef std::vector<Recipe> Recipes;

// All modes, each at the beginning and in the middle of a stream.
template <ElementType Code, ElementType Taps, class Function>
void Add(Recipes &recipes, const std::string &name, Function *function) {
    static const uint8_t no = 0, yes = 1;
    for (int32_t mode = 0; mode < 4; ++mode) {
        const std::string of = name + ": mode " + std::to_string(mode);
        const auto run = [function, mode](Call &c, const uint8_t *reset, int32_t stateSize) {
            int32_t *delayLeft = c.integer(0);
            int32_t *phase = c.integer(1);
            *delayLeft = 3;
            *phase = 1;
            return function(c.in<Code>(0), c.out<Code>(0), c.inOut<Code>(1, stateSize), mode, 3, 2,
                            c.in<Taps>(2, 31), 0.75F, reset, &yes, delayLeft, phase);
        };
        recipes.push_back({of, [run](Call &c) {
                               c.mayBeEmpty(0);
                               c.mayBeEmpty(1);
                               return run(c, &yes, 2);
                           }});
        recipes.push_back({of + ", in a stream", [run, mode](Call &c) {
                               static const int32_t sizes[] = {30, 11, 17, 11};
                               c.mayBeEmpty(0);
                               c.mayBeEmpty(1);
                               return run(c, &no, sizes[mode]);
                           }});
    }
}

Recipes PolyphaseRecipes() {
    Recipes recipes;
    Add<ElementType::SGL, ElementType::SGL>(recipes, "ppMultiRateFIRH_SGL", ppMultiRateFIRH_SGL);
    Add<ElementType::DBL, ElementType::DBL>(recipes, "ppMultiRateFIRH_DBL", ppMultiRateFIRH_DBL);
    Add<ElementType::CSG, ElementType::SGL>(recipes, "ppMultiRateFIRH_CSG", ppMultiRateFIRH_CSG);
    Add<ElementType::CDB, ElementType::DBL>(recipes, "ppMultiRateFIRH_CDB", ppMultiRateFIRH_CDB);
    return recipes;
}

const RecipeFile file(PolyphaseRecipes);

} // namespace

} // namespace qx::test
