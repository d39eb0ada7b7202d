#include "tests/support/recipe.h"

namespace qx::test {

std::map<std::string, ExportHash> HashEveryExport(const Caller &caller) {
    std::map<std::string, ExportHash> hashes;
    for (const Recipe &recipe : AllRecipes()) {
        ExportHash &found = hashes[recipe.name];
        found.mayDiffer |= (recipe.quirks & BitsMayDiffer) != 0;
        for (const int32_t n : recipe.sizes) {
            Call call(n);
            ResetHost();
            const ErrorCode status = call.status(caller(recipe, call));
            found.hash = found.hash * 0x9E3779B97F4A7C15U + call.outputHash(status);
        }
    }
    return hashes;
}

} // namespace qx::test
