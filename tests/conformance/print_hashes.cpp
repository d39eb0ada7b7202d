#include "tests/support/recipe.h"

#include <cstdio>

// Prints one hash per export over all its outputs at all the sizes of its recipes: the same on
// every target, compiler and optimisation level, but for the exports that are marked.
int main() {
    for (const auto &[name, found] : qx::test::HashEveryExport())
        std::printf("%016llx %s%s\n", static_cast<unsigned long long>(found.hash), name.c_str(),
                    found.mayDiffer ? " may-differ" : "");
    return 0;
}
