#include "tests/recipes/families.h"

namespace qx::test {

std::vector<Recipe> BasicStatisticsRecipes() { return {}; }

} // namespace qx::test
