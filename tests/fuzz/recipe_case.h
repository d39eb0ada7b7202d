#ifndef QX_TESTS_FUZZ_RECIPE_CASE_H
#define QX_TESTS_FUZZ_RECIPE_CASE_H

#include "tests/fuzz/attack.h"
#include "tests/support/recipe.h"

namespace qx::test {

// A call as a recipe makes it, then spoilt: numbers in its arrays, one size, the host, the heap,
// the workspace. So exports are attacked that succeed only with arguments that fit each other, and
// those whose arguments the catalogue cannot describe.
struct RecipeSpoiling {
    int32_t n;
    uint64_t seed;        // of what is put into the arrays
    bool spoilsContent;   // else the arrays are the recipe's
    int input, dimension; // whose size is another
    int32_t size;         // negative for none
    Disturbance disturbance;
};
RecipeSpoiling SomeSpoiling(Random &random, const Recipe &recipe);
// The same each time it is made.
void Spoil(Call &call, const RecipeSpoiling &spoiling);

Outcome RunRecipeCase(Random &random, const Recipe &recipe);

} // namespace qx::test

#endif
