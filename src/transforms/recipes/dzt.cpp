#include "qx/dzt.h"
#include "tests/support/recipe.h"

namespace qx::test {

namespace {

constexpr auto DBL = ElementType::DBL;
constexpr auto CDB = ElementType::CDB;
constexpr unsigned Transform = HostStatusPassesThrough | UsesHeap;

void **Instance(Call &c) { return c.instance(TransformUnreserveProc); }

// The band transforms fold a long input in place, a positive status of the host leaves their
// output alone, and only the last short transform's status is reported.
std::vector<Recipe> BandTransformRecipes() {
    constexpr unsigned band =
        Transform | TakesEmptyInput | MayKeepArrayOnFailure | MemoryFailureMayPass;
    return {
        {"ReDZTH",
         [](Call &c) {
             return ReDZTH(c.spoiled<DBL>(0), 4, c.n / 6 + 1, -3, 10, c.out<CDB>(0), c.slot(0));
         },
         band},
        {"ReDZTH_IDP",
         [](Call &c) {
             return ReDZTH_IDP(c.spoiled<DBL>(0), 3, c.n, 5, 10, c.out<CDB>(0), Instance(c));
         },
         band},
        {"CxDZTH",
         [](Call &c) {
             return CxDZTH(c.spoiled<CDB>(0), 4, c.n / 6 + 1, -3, 10, c.out<CDB>(0), c.slot(0));
         },
         band},
        {"CxDZTH_IDP",
         [](Call &c) {
             return CxDZTH_IDP(c.spoiled<CDB>(0), 3, c.n, 5, 10, c.out<CDB>(0), Instance(c));
         },
         band},
    };
}

const RecipeFile file(BandTransformRecipes);

} // namespace

} // namespace qx::test
