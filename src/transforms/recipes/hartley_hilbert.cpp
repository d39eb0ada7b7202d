#include "qx/hartley_hilbert.h"
#include "tests/support/recipe.h"

namespace qx::test {

namespace {

constexpr auto DBL = ElementType::DBL;

void **Instance(Call &c) { return c.instance(TransformUnreserveProc); }

std::vector<Recipe> HartleyAndHilbertRecipes() {
    return {
        {"FHTH", [](Call &c) { return FHTH(c.inOut<DBL>(0), c.slot(0)); }, UsesHeap},
        {"FHTH_IDP", [](Call &c) { return FHTH_IDP(c.inOut<DBL>(0), Instance(c)); }, UsesHeap},
        {"InvFHTH", [](Call &c) { return InvFHTH(c.inOut<DBL>(0), c.slot(0)); },
         UsesHeap | MayKeepArrayOnFailure},
        {"InvFHTH_IDP", [](Call &c) { return InvFHTH_IDP(c.inOut<DBL>(0), Instance(c)); },
         UsesHeap | MayKeepArrayOnFailure},
        {"FastHilbertTransformH",
         [](Call &c) { return FastHilbertTransformH(c.inOut<DBL>(0), c.slot(0)); }, UsesHeap},
        {"FastHilbertTransformH_IDP",
         [](Call &c) { return FastHilbertTransformH_IDP(c.inOut<DBL>(0), Instance(c)); }, UsesHeap},
        {"InvFastHilbertTransformH",
         [](Call &c) { return InvFastHilbertTransformH(c.inOut<DBL>(0), c.slot(0)); }, UsesHeap},
        {"InvFastHilbertTransformH_IDP",
         [](Call &c) { return InvFastHilbertTransformH_IDP(c.inOut<DBL>(0), Instance(c)); },
         UsesHeap},
    };
}

const RecipeFile file(HartleyAndHilbertRecipes);

} // namespace

} // namespace qx::test
