#include "qx/convolution.h"

#include "tests/support/recipe.h"

namespace qx::test {

namespace {

constexpr auto DBL = ElementType::DBL;
constexpr auto CDB = ElementType::CDB;

// Has no zero in its spectrum, because the first value outweighs all others.
double Dominant(int32_t i) { return i == 0 ? 3.0 : 1.0 / (i * i + 1); }
double LateStart(int32_t i) { return i < 2 ? 0.0 : i == 2 ? 2.0 : 0.0; }

std::vector<Recipe> ConvolutionRecipes() {
    std::vector<Recipe> recipes;
    for (const int32_t algorithm : {0, 1}) {
        const unsigned heap = algorithm == 0 ? None : UsesHeap;
        const std::string by = algorithm == 0 ? ": direct" : ": by transforms";
        recipes.push_back({"Convolution" + by,
                           [algorithm](Call &c) {
                               return Convolution(c.in<DBL>(0), c.in<DBL>(1, c.n + 37),
                                                  c.out<DBL>(0), c.byReference(algorithm), c.err());
                           },
                           heap});
        recipes.push_back({"Rxy" + by,
                           [algorithm](Call &c) {
                               return Rxy(c.in<DBL>(0), c.in<DBL>(1, c.n + 37), c.out<DBL>(0),
                                          c.byReference(algorithm), c.err());
                           },
                           heap});
        recipes.push_back({"Rxy80" + by,
                           [algorithm](Call &c) {
                               return Rxy80(c.in<DBL>(0), c.in<DBL>(1, c.n / 2 + 1), c.out<DBL>(0),
                                            c.byReference(algorithm), 1, c.err());
                           },
                           heap});
        for (const int32_t correlate : {0, 1})
            recipes.push_back({"CxConvolution" + by + (correlate == 0 ? "" : ", correlation"),
                               [=](Call &c) {
                                   return CxConvolution(c.in<CDB>(0), c.in<CDB>(1, c.n / 3 + 5),
                                                        c.out<CDB>(0), algorithm, correlate, 2);
                               },
                               heap | HostStatusPassesThrough | MayKeepArrayOnFailure});
    }
    // Only a failed allocation leaves x as it was; a refused resize is not a failure.
    recipes.push_back({"AutoCorrelation80",
                       [](Call &c) { return AutoCorrelation80(c.spoiled<DBL>(0), 1, c.err()); },
                       UsesHeap | RefusalPasses});
    recipes.push_back({"AutoCorrelation",
                       [](Call &c) { return AutoCorrelation(c.spoiled<DBL>(0), c.err()); },
                       UsesHeap | RefusalPasses});
    recipes.push_back({"Deconvolution: of spectra",
                       [](Call &c) {
                           return Deconvolution(c.inOut<DBL>(0),
                                                c.in<DBL>(1, c.n / 2 + 1, Dominant), c.err());
                       },
                       UsesHeap | CodeInBoth | RefusalPasses});
    recipes.push_back({"Deconvolution: of series",
                       [](Call &c) {
                           return Deconvolution(c.inOut<DBL>(0, c.n + 3),
                                                c.in<DBL>(1, 3, LateStart), c.err());
                       },
                       UsesHeap | CodeInBoth | RefusalPasses});
    return recipes;
}

const RecipeFile file(ConvolutionRecipes);

} // namespace

} // namespace qx::test
