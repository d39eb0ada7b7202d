#include "tests/support/recipe.h"

namespace qx::test {

namespace {

const RecipeFile file = {
    {"InitializeAnalysisWorkspaceH",
     "no arrays; the tests of the workspace drive the four together"},
    {"EnableAnalysisWorkspaceH", "as InitializeAnalysisWorkspaceH"},
    {"DisableAnalysisWorkspaceH", "as InitializeAnalysisWorkspaceH"},
    {"UninitializeAnalysisWorkspaceH", "as InitializeAnalysisWorkspaceH"},
    {"SetQXRTModule", "changes the process; its test calls it in a process of its own"},
};

} // namespace

} // namespace qx::test
