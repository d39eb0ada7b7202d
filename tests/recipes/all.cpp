#include "tests/recipes/families.h"

namespace qx::test {

const std::vector<Recipe> &AllRecipes() {
    static const std::vector<Recipe> all = [] {
        std::vector<Recipe> recipes;
        for (const auto &family : {
                 BasicStatisticsRecipes(),
                 DistributionRecipes(),
                 FFTRecipes(),
                 SpecialBesselRecipes(),
                 SpecialGammaRecipes(),
                 SpecialHypergeometricRecipes(),
                 SpecialIntegralRecipes(),
                 SpectraRecipes(),
                 TransformRecipes(),
                 WindowRecipes(),
             })
            recipes.insert(recipes.end(), family.begin(), family.end());
        return recipes;
    }();
    return all;
}

const std::vector<Exempt> &ExemptExports() {
    static const std::vector<Exempt> exempt = {
        {"InitializeAnalysisWorkspaceH", "no arrays; frame/tests drives the four together"},
        {"EnableAnalysisWorkspaceH", "as above"},
        {"DisableAnalysisWorkspaceH", "as above"},
        {"UninitializeAnalysisWorkspaceH", "as above"},
        {"create_oxfft_table", "gives a plan; fft/tests"},
        {"destroy_oxfft_table", "takes a plan; fft/tests"},
        {"TransformUnreserveProc", "releases the nodes of all others; no arrays"},
        {"SetQXRTModule", "changes the process; frame/tests calls it in a process of its own"},
    };
    return exempt;
}

} // namespace qx::test
