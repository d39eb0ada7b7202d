#include "qx/dct_dst.h"
#include "tests/support/recipe.h"

namespace qx::test {

namespace {

constexpr auto DBL = ElementType::DBL;
constexpr unsigned Transform = HostStatusPassesThrough | UsesHeap;

void **Instance(Call &c) { return c.instance(TransformUnreserveProc); }

int32_t Rows(const Call &c) { return c.n / 4 + 1; }
constexpr int32_t Cols = 7;

std::vector<Recipe> CosineAndSineRecipes() {
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

const RecipeFile file(CosineAndSineRecipes);

} // namespace

} // namespace qx::test
