#include "qx/convolution_2d.h"

#include "tests/support/recipe.h"

namespace qx::test {

namespace {

constexpr auto DBL = ElementType::DBL;
constexpr auto CDB = ElementType::CDB;

std::vector<Recipe> MatrixConvolutionRecipes() {
    std::vector<Recipe> recipes;
    for (const int32_t algorithm : {0, 1}) {
        // The first checks leave the output unchanged.
        const unsigned quirks = MayKeepArrayOnFailure | (algorithm == 0 ? None : UsesHeap);
        const std::string by = algorithm == 0 ? ": direct" : ": by transforms";
        const std::vector<int32_t> sizes = {1, 2, 3, 8, 30};
        for (const int32_t outputSize : {0, 1, 2}) {
            const std::string size = std::string(", size ") + "012"[outputSize];
            recipes.push_back({"Convolve_2DH" + by + size,
                               [=](Call &c) {
                                   return Convolve_2DH(c.in2D<DBL>(0, c.n + 3, c.n),
                                                       c.in2D<DBL>(1, 4, c.n / 2 + 1),
                                                       c.out2D<DBL>(0), outputSize, algorithm);
                               },
                               quirks, sizes});
            recipes.push_back({"CxConvolve_2DH" + by + size,
                               [=](Call &c) {
                                   return CxConvolve_2DH(c.in2D<CDB>(0, c.n + 3, c.n),
                                                         c.in2D<CDB>(1, c.n / 2 + 2, c.n / 2 + 1),
                                                         c.out2D<CDB>(0), outputSize, algorithm);
                               },
                               quirks, sizes});
        }
        recipes.push_back({"Correlation_2DH" + by,
                           [=](Call &c) {
                               return Correlation_2DH(c.in2D<DBL>(0, 3, c.n),
                                                      c.in2D<DBL>(1, c.n, 5), c.out2D<DBL>(0),
                                                      algorithm);
                           },
                           quirks, sizes});
        recipes.push_back({"CxCorrelation_2DH" + by,
                           [=](Call &c) {
                               return CxCorrelation_2DH(c.in2D<CDB>(0, 3, c.n),
                                                        c.in2D<CDB>(1, c.n, 5), c.out2D<CDB>(0),
                                                        algorithm);
                           },
                           quirks, sizes});
    }
    return recipes;
}

const RecipeFile file(MatrixConvolutionRecipes);

} // namespace

} // namespace qx::test
