#ifndef QX_TESTS_FUZZ_RECIPE_CASE_H
#define QX_TESTS_FUZZ_RECIPE_CASE_H

#include "tests/fuzz/attack.h"
#include "tests/support/recipe.h"

#include <optional>

namespace qx::test {

// The call of a recipe, and the changes made to it: the numbers in its arrays, one size, which may
// be negative, an array in two places of the call, the host, the heap, the workspace. This covers
// exports that succeed only with matching arguments, and those whose arguments the catalogue cannot
// describe.
struct RecipeSpoiling {
    int32_t n;
    uint64_t seed;        // of the content of the arrays
    bool spoilsContent;   // otherwise the arrays are the recipe's
    int input, dimension; // the dimension whose size changes
    int32_t size;         // negative for no change
    Disturbance disturbance;
    int32_t claimed = 0; // if negative, the size that the block claims for it, or for both
    bool claimsBoth = false;
    std::optional<std::pair<Call::Pair, Call::Meeting>> shared = {};
};
RecipeSpoiling SomeSpoiling(Random &random, const Recipe &recipe);
// The way in which a call is made: the second way changes what no result may depend on (Manner).
enum class Made { AsSpoilt, Otherwise };
// Spoils a call in the same way each time.
void Spoil(Call &call, const RecipeSpoiling &spoiling, Made made = Made::AsSpoilt);

Outcome RunRecipeCase(Random &random, const Recipe &recipe);
// A call, and calls with each pair of its arrays as one array; and calls in which resizes,
// allocations and the workspace refuse.
Outcome RunRecipeMeetings(Random &random, const Recipe &recipe);
Outcome RunRecipeHonesty(Random &random, const Recipe &recipe);

} // namespace qx::test

#endif
