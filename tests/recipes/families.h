#ifndef QX_TESTS_RECIPES_FAMILIES_H
#define QX_TESTS_RECIPES_FAMILIES_H

#include "tests/support/recipe.h"

namespace qx::test {

std::vector<Recipe> BasicStatisticsRecipes();
std::vector<Recipe> DistributionRecipes();
std::vector<Recipe> FFTRecipes();
std::vector<Recipe> SpecialBesselRecipes();
std::vector<Recipe> SpecialGammaRecipes();
std::vector<Recipe> SpecialHypergeometricRecipes();
std::vector<Recipe> SpecialIntegralRecipes();
std::vector<Recipe> SpectraRecipes();
std::vector<Recipe> TransformRecipes();
std::vector<Recipe> WindowRecipes();

} // namespace qx::test

#endif
