#include "tests/support/recipe.h"

#include <cstdio>

// Prints one hash per export over all its outputs at all the sizes of its recipes. The hashes are
// the same for every target, compiler and optimisation level.
int main() {
    for (const auto &[name, hash] : qx::test::HashEveryExport())
        std::printf("%s %s\n", qx::test::HashText(hash).c_str(), name.c_str());
    return 0;
}
