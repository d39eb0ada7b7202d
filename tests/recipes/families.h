#ifndef QX_TESTS_RECIPES_FAMILIES_H
#define QX_TESTS_RECIPES_FAMILIES_H

#include "tests/support/recipe.h"

namespace qx::test {

std::vector<Recipe> BasicStatisticsRecipes();

} // namespace qx::test

#endif
