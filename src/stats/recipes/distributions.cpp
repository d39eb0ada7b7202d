#include "qx/distributions.h"
#include "tests/support/recipe.h"

namespace qx::test {

namespace {

// Probabilities and quantiles that depend on the size.
double Probability(const Call &c) { return (c.n % 97 + 0.5) / 97.0; }
double Point(const Call &c) { return c.n / 16.0 - 3.0; }

std::vector<Recipe> DistributionRecipes() {
    const std::vector<int32_t> sizes = {1, 2, 3, 17, 60, 96, 200, 5000};
    return {
        {"NormDist_head",
         [](Call &c) { return NormDist_head(c.byReference(Point(c)), c.scalar(0)); }, None, sizes},
        {"TDist_head",
         [](Call &c) {
             return TDist_head(c.byReference(Point(c)), c.byReference(c.n), c.scalar(0), c.err());
         },
         None, sizes},
        {"FDist_head",
         [](Call &c) {
             return FDist_head(c.byReference(Point(c)), c.byReference(c.n), c.byReference(7),
                               c.scalar(0), c.err());
         },
         None, sizes},
        {"ChiSquare_head",
         [](Call &c) {
             return ChiSquare_head(c.byReference(0.9 * c.n), c.byReference(c.n), c.scalar(0),
                                   c.err());
         },
         None, sizes},
        {"InvNdist_head",
         [](Call &c) { return InvNdist_head(c.byReference(Probability(c)), c.scalar(0), c.err()); },
         None, sizes},
        {"InvTdist_head",
         [](Call &c) {
             return InvTdist_head(c.byReference(Probability(c)), c.byReference(c.n), c.scalar(0),
                                  c.err());
         },
         None, sizes},
        {"InvFDist_head",
         [](Call &c) {
             return InvFDist_head(c.byReference(Probability(c)), c.byReference(c.n),
                                  c.byReference(12), c.scalar(0), c.err());
         },
         None, sizes},
        {"NormDist2026_head",
         [](Call &c) {
             return NormDist2026_head(c.byReference(Point(c)), c.byReference(c.n % 5), c.scalar(0),
                                      c.err());
         },
         None, sizes},
        {"TDist2026_head",
         [](Call &c) {
             return TDist2026_head(c.byReference(Point(c)), c.byReference(0.37 * c.n),
                                   c.byReference(c.n % 5), c.scalar(0), c.err());
         },
         None, sizes},
        {"FDist2026_head",
         [](Call &c) {
             return FDist2026_head(c.byReference(Point(c) + 3.1), c.byReference(0.37 * c.n),
                                   c.byReference(7.5), c.byReference(c.n % 5), c.scalar(0),
                                   c.err());
         },
         None, sizes},
        {"ChiSquare2026_head",
         [](Call &c) {
             return ChiSquare2026_head(c.byReference(0.9 * c.n), c.byReference(1.1 * c.n),
                                       c.byReference(c.n % 5), c.scalar(0), c.err());
         },
         None, sizes},
        {"InvNdist2026_head",
         [](Call &c) {
             return InvNdist2026_head(c.byReference(Probability(c)), c.byReference(c.n % 2),
                                      c.scalar(0), c.err());
         },
         None, sizes},
        {"InvTdist2026_head",
         [](Call &c) {
             return InvTdist2026_head(c.byReference(Probability(c)), c.byReference(c.n % 2),
                                      c.byReference(0.37 * c.n), c.scalar(0), c.err());
         },
         None, sizes},
        {"InvFDist2026_head",
         [](Call &c) {
             return InvFDist2026_head(c.byReference(Probability(c)), c.byReference(c.n % 2),
                                      c.byReference(0.37 * c.n), c.byReference(12.5), c.scalar(0),
                                      c.err());
         },
         None, sizes},
        {"InvChiSquare2026_head",
         [](Call &c) {
             return InvChiSquare2026_head(c.byReference(Probability(c)), c.byReference(c.n % 2),
                                          c.byReference(0.37 * c.n), c.scalar(0), c.err());
         },
         None, sizes},
        {"InvChiSquare_head",
         [](Call &c) {
             return InvChiSquare_head(c.byReference(Probability(c)), c.byReference(c.n),
                                      c.scalar(0), c.err());
         },
         None, sizes},
    };
}

const RecipeFile file(DistributionRecipes);

} // namespace

} // namespace qx::test
