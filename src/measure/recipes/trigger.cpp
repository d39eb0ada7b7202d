#include "qx/trigger.h"
#include "tests/support/recipe.h"

namespace qx::test {

namespace {

constexpr auto DBL = ElementType::DBL;

std::vector<Recipe> TriggerRecipes() {
    std::vector<Recipe> recipes;
    for (int32_t slope = 0; slope < 3; ++slope) {
        const std::string variant = ": slope " + std::to_string(slope);
        // A failure leaves -1 and not 0 in the index.
        recipes.push_back({"Triggerh" + variant, [=](Call &c) {
                               return Triggerh(c.in<DBL>(0), 0.25, slope, c.n / 3,
                                               c.record<int32_t>(0), c.scalar(0));
                           }});
        // All triggers of a block; the last call reports the last one.
        recipes.push_back({"Triggerh_86" + variant, [=](Call &c) {
                               const DBL1D y = c.in<DBL>(0);
                               auto *state = c.record<TriggerState>(0);
                               auto *found = c.record<int32_t>(1);
                               auto *index = c.record<int32_t>(2);
                               double *position = c.scalar(0);
                               *index = -1;
                               ErrorCode status;
                               do {
                                   status = Triggerh_86(y, 0.125, 0.25, slope, *index + 1, 3, state,
                                                        index, position);
                                   *found += *index >= 0;
                               } while (*index >= 0);
                               return status;
                           }});
    }
    return recipes;
}

const RecipeFile file(TriggerRecipes);

} // namespace

} // namespace qx::test
