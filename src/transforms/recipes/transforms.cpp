#include "qx/transforms.h"

#include "tests/support/recipe.h"

namespace qx::test {

namespace {

constexpr auto DBL = ElementType::DBL;
constexpr auto CDB = ElementType::CDB;
constexpr unsigned Transform = HostStatusPassesThrough | UsesHeap;

void **Instance(Call &c) { return c.instance(TransformUnreserveProc); }

int32_t Rows(const Call &c) { return c.n / 4 + 1; }
constexpr int32_t Cols = 7;

std::vector<Recipe> CosineAndSine() {
    return {
        {"DCT_1DH",
         [](Call &c) { return DCT_1DH(c.in<DBL>(0), c.out<DBL>(0), c.n + 1, c.slot(0)); },
         Transform},
        {"DCT_1DH_IDP",
         [](Call &c) { return DCT_1DH_IDP(c.in<DBL>(0), c.out<DBL>(0), 0, Instance(c)); },
         Transform},
        {"InvDCT_1DH", [](Call &c) { return InvDCT_1DH(c.in<DBL>(0), c.out<DBL>(0), c.slot(0)); },
         Transform | MemoryFailureMayPass},
        {"InvDCT_1DH_IDP",
         [](Call &c) { return InvDCT_1DH_IDP(c.in<DBL>(0), c.out<DBL>(0), Instance(c)); },
         Transform | MemoryFailureMayPass},
        {"DST_1DH",
         [](Call &c) { return DST_1DH(c.in<DBL>(0), c.out<DBL>(0), c.n + 1, c.slot(0)); },
         Transform},
        {"DST_1DH_IDP",
         [](Call &c) { return DST_1DH_IDP(c.in<DBL>(0), c.out<DBL>(0), 0, Instance(c)); },
         Transform},
        {"InvDST_1DH", [](Call &c) { return InvDST_1DH(c.in<DBL>(0), c.out<DBL>(0), c.slot(0)); },
         Transform},
        {"InvDST_1DH_IDP",
         [](Call &c) { return InvDST_1DH_IDP(c.in<DBL>(0), c.out<DBL>(0), Instance(c)); },
         Transform},
        {"DCT_2DH",
         [](Call &c) {
             return DCT_2DH(c.in2D<DBL>(0, Rows(c), Cols), c.out2D<DBL>(0), Rows(c) + 1, 6,
                            c.slot(0), c.slot(1));
         },
         Transform},
        {"DCT_2DH_IDP",
         [](Call &c) {
             return DCT_2DH_IDP(c.in2D<DBL>(0, Rows(c), Cols), c.out2D<DBL>(0), 0, 0, Instance(c));
         },
         Transform},
        {"InvDCT_2DH",
         [](Call &c) {
             return InvDCT_2DH(c.in2D<DBL>(0, Rows(c), Cols), c.out2D<DBL>(0), c.slot(0),
                               c.slot(1));
         },
         Transform},
        {"InvDCT_2DH_IDP",
         [](Call &c) {
             return InvDCT_2DH_IDP(c.in2D<DBL>(0, Rows(c), Cols), c.out2D<DBL>(0), Instance(c));
         },
         Transform},
        {"DST_2DH",
         [](Call &c) {
             return DST_2DH(c.in2D<DBL>(0, Rows(c), Cols), c.out2D<DBL>(0), Rows(c) + 1, 6,
                            c.slot(0), c.slot(1));
         },
         Transform},
        {"DST_2DH_IDP",
         [](Call &c) {
             return DST_2DH_IDP(c.in2D<DBL>(0, Rows(c), Cols), c.out2D<DBL>(0), 0, 0, Instance(c));
         },
         Transform},
        {"InvDST_2DH",
         [](Call &c) {
             return InvDST_2DH(c.in2D<DBL>(0, Rows(c), Cols), c.out2D<DBL>(0), c.slot(0),
                               c.slot(1));
         },
         Transform},
        {"InvDST_2DH_IDP",
         [](Call &c) {
             return InvDST_2DH_IDP(c.in2D<DBL>(0, Rows(c), Cols), c.out2D<DBL>(0), Instance(c));
         },
         Transform},
    };
}

std::vector<Recipe> HartleyAndHilbert() {
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

// The band transforms fold a long input in place, a positive status of the host leaves their
// output alone, and only the last short transform's status is reported.
std::vector<Recipe> BandTransforms() {
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

std::vector<Recipe> TransformRecipes() {
    std::vector<Recipe> recipes = CosineAndSine();
    for (const std::vector<Recipe> &more : {HartleyAndHilbert(), BandTransforms()})
        recipes.insert(recipes.end(), more.begin(), more.end());
    return recipes;
}

const RecipeFile file(TransformRecipes);

} // namespace

} // namespace qx::test
