#include "qx/fft.h"
#include "tests/support/recipe.h"

namespace qx::test {

namespace {

constexpr auto DBL = ElementType::DBL;
constexpr auto CDB = ElementType::CDB;
constexpr unsigned Transform = HostStatusPassesThrough | UsesHeap;

void **Instance(Call &c) { return c.instance(TransformUnreserveProc); }

std::vector<Recipe> FFTRecipes() {
    return {
        {"CxOXFFTH", [](Call &c) { return CxOXFFTH(c.in<CDB>(0), c.out<CDB>(0), c.slot(0)); },
         Transform},
        {"CxOXFFTH80",
         [](Call &c) {
             return CxOXFFTH80(c.in<CDB>(0), c.out<CDB>(0), c.slot(0), c.n / 3, c.n, 1);
         },
         Transform},
        {"CxOXFFTH80_IDP",
         [](Call &c) {
             return CxOXFFTH80_IDP(c.in<CDB>(0), c.out<CDB>(0), Instance(c), 0, c.n, 1);
         },
         Transform},
        {"InvCxOXFFTH", [](Call &c) { return InvCxOXFFTH(c.in<CDB>(0), c.out<CDB>(0), c.slot(0)); },
         Transform},
        {"InvCxOXFFTH80",
         [](Call &c) { return InvCxOXFFTH80(c.in<CDB>(0), c.out<CDB>(0), c.slot(0), 1); },
         Transform},
        {"InvCxOXFFTH80_IDP",
         [](Call &c) { return InvCxOXFFTH80_IDP(c.in<CDB>(0), c.out<CDB>(0), Instance(c), 1); },
         Transform},
        {"ReOXFFTH", [](Call &c) { return ReOXFFTH(c.in<DBL>(0), c.out<CDB>(0), c.slot(0)); },
         Transform},
        {"ReOXFFTH80",
         [](Call &c) {
             return ReOXFFTH80(c.in<DBL>(0), c.out<CDB>(0), c.slot(0), c.n / 3, c.n, 1);
         },
         Transform},
        {"ReOXFFTH80_IDP",
         [](Call &c) {
             return ReOXFFTH80_IDP(c.in<DBL>(0), c.out<CDB>(0), Instance(c), 0, c.n, 0);
         },
         Transform},
        {"ReOXFFTHCH", [](Call &c) { return ReOXFFTHCH(c.in<DBL>(0), c.out<DBL>(0), c.slot(0)); },
         Transform},
        {"ReOXFFTHCH_IDP",
         [](Call &c) { return ReOXFFTHCH_IDP(c.in<DBL>(0), c.out<DBL>(0), Instance(c)); },
         Transform},
        {"InvReOXFFTH", [](Call &c) { return InvReOXFFTH(c.in<CDB>(0), c.out<DBL>(0), c.slot(0)); },
         Transform},
        {"InvReOXFFTH80",
         [](Call &c) { return InvReOXFFTH80(c.in<CDB>(0), c.out<DBL>(0), c.slot(0), 1); },
         Transform},
        {"InvReOXFFTH80_IDP",
         [](Call &c) { return InvReOXFFTH80_IDP(c.in<CDB>(0), c.out<DBL>(0), Instance(c), 1); },
         Transform},
        {"InvReOXFFTHCH",
         [](Call &c) { return InvReOXFFTHCH(c.spoiled<DBL>(0), c.out<DBL>(0), c.slot(0)); },
         Transform},
        {"InvReOXFFTHCH_IDP",
         [](Call &c) { return InvReOXFFTHCH_IDP(c.spoiled<DBL>(0), c.out<DBL>(0), Instance(c)); },
         Transform},
    };
}

const RecipeFile file(FFTRecipes);
const RecipeFile exempt = {
    {"create_oxfft_table", "gives a plan; the tests of plans"},
    {"destroy_oxfft_table", "takes a plan; the tests of plans"},
    {"TransformUnreserveProc", "releases the nodes of all others; no arrays"},
};

} // namespace

} // namespace qx::test
