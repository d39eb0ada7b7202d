#include "tests/support/recipe.h"

#include <cstdio>
#include <map>
#include <string>

// Prints one hash per export over all its outputs at all the sizes of its recipes: the same on
// every target, compiler and optimisation level, but for the exports that are marked.
int main() {
    std::map<std::string, uint64_t> hashes;
    std::map<std::string, bool> mayDiffer;
    for (const qx::test::Recipe &recipe : qx::test::AllRecipes()) {
        uint64_t &hash = hashes[recipe.name];
        mayDiffer[recipe.name] |= (recipe.quirks & qx::test::BitsMayDiffer) != 0;
        for (int32_t n : recipe.sizes) {
            qx::test::Call call(n);
            qx::test::ResetHost();
            const ErrorCode status = call.status(recipe.run(call));
            hash = hash * 0x9E3779B97F4A7C15U + call.outputHash(status);
        }
    }
    for (const auto &[name, hash] : hashes)
        std::printf("%016llx %s%s\n", static_cast<unsigned long long>(hash), name.c_str(),
                    mayDiffer[name] ? " may-differ" : "");
    return 0;
}
