#ifndef QX_TESTS_FUZZ_RECIPE_CASE_H
#define QX_TESTS_FUZZ_RECIPE_CASE_H

#include "tests/fuzz/attack.h"
#include "tests/support/recipe.h"

namespace qx::test {

// A call as a recipe makes it, then spoilt: numbers in its arrays, one size, the host, the heap,
// the workspace. So exports are attacked that succeed only with arguments that fit each other, and
// those whose arguments the catalogue cannot describe.
Outcome RunRecipeCase(Random &random, const Recipe &recipe);

} // namespace qx::test

#endif
