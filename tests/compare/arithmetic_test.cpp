// arithmetic_test MODULE: calls every export by its recipes in each of the modes of arithmetic that a host may
// have set, and compares the bits with those of the usual modes. The modes are set between the recipe, which
// computes its arguments, and the export. After a call the caller has its modes again.

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

namespace {

using qx::test::Call;
using qx::test::CurrentArithmetic;
using qx::test::HashEveryExport;
using qx::test::InArithmetic;
using qx::test::modesOfHosts;
using qx::test::NamedModes;
using qx::test::Recipe;
using qx::test::usualArithmetic;

// The exports that give other bits, or leave other modes; each is printed.
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

int main(int count, char **arguments) {
    if (count != 2 || qx::test::BindExports(arguments[1]) == nullptr)
        return 2;
    const auto expected = HashEveryExport();
    int different = 0;
    for (const NamedModes &host : modesOfHosts)
        different += Different(host, expected);
    std::printf("%zu exports in %zu modes, %d differences\n", expected.size(),
                std::size(modesOfHosts), different);
    return different == 0 && expected.size() > 600 ? 0 : 1;
}
