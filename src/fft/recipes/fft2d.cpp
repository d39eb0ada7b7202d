#include "qx/fft2d.h"
#include "tests/support/recipe.h"

namespace qx::test {

namespace {

constexpr auto DBL = ElementType::DBL;
constexpr auto CDB = ElementType::CDB;
constexpr unsigned Transform = HostStatusPassesThrough | UsesHeap;

void **Instance(Call &c) { return c.instance(TransformUnreserveProc); }

// Matrices of size/4 + 1 by 7 values, of which a padded region is taken.
int32_t Rows(const Call &c) { return c.n / 4 + 1; }
constexpr int32_t Cols = 7;

// A failed column transform of an inverse is not reported.
constexpr unsigned Inverse2D = Transform | MemoryFailureMayPass;

std::vector<Recipe> FFT2DRecipes() {
    return {
        {"CxFFT2D_H",
         [](Call &c) {
             return CxFFT2D_H(c.in2D<CDB>(0, Rows(c), Cols), 0, 2, Rows(c) + 1, 6, 1,
                              c.out2D<CDB>(0), c.slot(0), c.slot(1));
         },
         Transform},
        {"CxFFT2D_H_IDP",
         [](Call &c) {
             return CxFFT2D_H_IDP(c.in2D<CDB>(0, Rows(c), Cols), 0, 0, Rows(c), Cols, 0,
                                  c.out2D<CDB>(0), Instance(c));
         },
         Transform},
        {"ReFFT2D_H",
         [](Call &c) {
             return ReFFT2D_H(c.in2D<DBL>(0, Rows(c), Cols), 0, 2, Rows(c) + 1, 6, 1,
                              c.out2D<CDB>(0), c.slot(0), c.slot(1));
         },
         Transform},
        {"ReFFT2D_H_IDP",
         [](Call &c) {
             return ReFFT2D_H_IDP(c.in2D<DBL>(0, Rows(c), Cols), 0, 0, Rows(c), Cols, 0,
                                  c.out2D<CDB>(0), Instance(c));
         },
         Transform},
        {"CxInvFFT2D_H",
         [](Call &c) {
             return CxInvFFT2D_H(c.in2D<CDB>(0, Rows(c), Cols), 1, c.out2D<CDB>(0), c.slot(0),
                                 c.slot(1));
         },
         Inverse2D},
        {"CxInvFFT2D_H_IDP",
         [](Call &c) {
             return CxInvFFT2D_H_IDP(c.in2D<CDB>(0, Rows(c), Cols), 0, c.out2D<CDB>(0),
                                     Instance(c));
         },
         Inverse2D},
        {"ReInvFFT2D_H",
         [](Call &c) {
             return ReInvFFT2D_H(c.in2D<CDB>(0, Rows(c), Cols), 1, c.out2D<DBL>(0), c.slot(0),
                                 c.slot(1));
         },
         Inverse2D},
        {"ReInvFFT2D_H_IDP",
         [](Call &c) {
             return ReInvFFT2D_H_IDP(c.in2D<CDB>(0, Rows(c), Cols), 0, c.out2D<DBL>(0),
                                     Instance(c));
         },
         Inverse2D},
    };
}

const RecipeFile file(FFT2DRecipes);

} // namespace

} // namespace qx::test
