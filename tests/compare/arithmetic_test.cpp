// arithmetic_test MODULE: calls every export by its recipes in each of the arithmetic modes that a
// host may have set, and compares the bits with those of the usual modes. The modes are set between
// the recipe, which computes its arguments, and the export. Each call must restore the caller's
// modes.

#include "tests/compare/trampolines.h"
#include "tests/support/host_arithmetic.h"
#include "tests/support/recipe.h"

#include <cstdio>
#include <iterator>
#include <map>
#include <string>

extern "C" {
__attribute__((visibility("hidden"))) uint32_t qxModesOfCalls = 0;
}

namespace qx::test {
namespace {

// Prints and counts the exports that give other bits or leave other modes.
int Different(const NamedModes &host, const std::map<std::string, uint64_t> &expected) {
    int different = 0;
    qxModesOfCalls = host.modes;
    const auto found = HashEveryExport([&](const Recipe &recipe, Call &call) {
        const InArithmetic before(usualArithmetic);
        const int32_t result = recipe.run(call);
        if (CurrentArithmetic() != host.modes && ++different != 0)
            std::printf("%s: %s leaves other modes\n", host.name, recipe.name.c_str());
        return result;
    });
    qxModesOfCalls = 0;
    for (const auto &[name, hash] : expected)
        if (found.at(name) != hash && ++different != 0)
            std::printf("%s: %s gives other bits\n", host.name, name.c_str());
    return different;
}

} // namespace
} // namespace qx::test

int main(int count, char **arguments) {
    if (count != 2 || qx::test::BindExports(arguments[1]) == nullptr)
        return 2;
    const auto expected = qx::test::HashEveryExport();
    int different = 0;
    for (const qx::test::NamedModes &host : qx::test::modesOfHosts)
        different += qx::test::Different(host, expected);
    std::printf("%zu exports in %zu modes, %d differences\n", expected.size(),
                std::size(qx::test::modesOfHosts), different);
    return different == 0 && expected.size() > 600 ? 0 : 1;
}
