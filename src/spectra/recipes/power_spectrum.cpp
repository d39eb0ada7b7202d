#include "qx/power_spectrum.h"

#include "tests/support/recipe.h"

namespace qx::test {

namespace {

std::vector<Recipe> SpectraRecipes() {
    constexpr auto DBL = ElementType::DBL;
    constexpr auto CDB = ElementType::CDB;
    // A positive status of the host leaves the output unchanged.
    constexpr unsigned realCross = HostStatusPassesThrough | MayKeepArrayOnFailure | UsesHeap;
    return {
        {"SpectrumH", [](Call &c) { return SpectrumH(c.inOut<DBL>(0), c.slot(0)); }, UsesHeap},
        {"SpectrumH_IDP",
         [](Call &c) { return SpectrumH_IDP(c.inOut<DBL>(0), c.instance(TransformUnreserveProc)); },
         UsesHeap},
        {"CxSpectrumH", [](Call &c) { return CxSpectrumH(c.in<CDB>(0), c.out<DBL>(0), c.slot(0)); },
         UsesHeap},
        {"CxSpectrumH_IDP",
         [](Call &c) {
             return CxSpectrumH_IDP(c.in<CDB>(0), c.out<DBL>(0),
                                    c.instance(TransformUnreserveProc));
         },
         UsesHeap},
        {"CrossSpectrumH",
         [](Call &c) {
             return CrossSpectrumH(c.in<DBL>(0), c.in<DBL>(1), c.out<CDB>(0), c.slot(0));
         },
         realCross},
        {"CrossSpectrumH_IDP",
         [](Call &c) {
             return CrossSpectrumH_IDP(c.in<DBL>(0), c.in<DBL>(1), c.out<CDB>(0),
                                       c.instance(TransformUnreserveProc));
         },
         realCross},
        {"CxCrossSpectrumH",
         [](Call &c) {
             return CxCrossSpectrumH(c.in<CDB>(0), c.in<CDB>(1), c.out<CDB>(0), c.slot(0));
         },
         UsesHeap},
        {"CxCrossSpectrumH_IDP",
         [](Call &c) {
             return CxCrossSpectrumH_IDP(c.in<CDB>(0), c.in<CDB>(1), c.out<CDB>(0),
                                         c.instance(TransformUnreserveProc));
         },
         UsesHeap},
    };
}

const RecipeFile file(SpectraRecipes);

} // namespace

} // namespace qx::test
