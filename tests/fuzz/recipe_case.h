#ifndef QX_TESTS_FUZZ_RECIPE_CASE_H
#define QX_TESTS_FUZZ_RECIPE_CASE_H

#include "tests/fuzz/attack.h"
#include "tests/support/recipe.h"

#include <optional>

namespace qx::test {

// A call as a recipe makes it, then spoilt: numbers in its arrays, one size, which may be negative,
// an array in two places of the call, the host, the heap, the workspace. So exports are attacked
// that succeed only with arguments that fit each other, and those whose arguments the catalogue
// cannot describe.
struct RecipeSpoiling {
    int32_t n;
    uint64_t seed;        // of what is put into the arrays
    bool spoilsContent;   // else the arrays are the recipe's
    int input, dimension; // whose size is another
    int32_t size;         // negative for none
    Disturbance disturbance;
    int32_t claimed = 0; // what the block says of that size, or of both, where it is negative
    bool claimsBoth = false;
    std::optional<std::pair<Call::Pair, Call::Meeting>> shared = {};
};
RecipeSpoiling SomeSpoiling(Random &random, const Recipe &recipe);
// How a call is made: the second time with what no result may depend on (Manner).
enum class Made { AsSpoilt, Otherwise };
// The same each time it is made.
void Spoil(Call &call, const RecipeSpoiling &spoiling, Made made = Made::AsSpoilt);

Outcome RunRecipeCase(Random &random, const Recipe &recipe);
// A call, and with each pair of its arrays as one; while resizes, allocations and the workspace
// refuse.
Outcome RunRecipeMeetings(Random &random, const Recipe &recipe);
Outcome RunRecipeHonesty(Random &random, const Recipe &recipe);

} // namespace qx::test

#endif
