#include "qx/noise.h"
#include "tests/support/recipe.h"

namespace qx::test {

namespace {

constexpr auto DBL = ElementType::DBL;
constexpr auto U32 = ElementType::U32;

RandomState *State(Call &c) {
    auto *state = c.record<RandomState>(0);
    *state = {c.n, 2, 3};
    return state;
}

Recipe Gamma(const char *name, int32_t order, int32_t seed) {
    return {name, [=](Call &c) { return GammaNoiseH(c.out<DBL>(0), c.n, order, seed, State(c)); }};
}
Recipe Poisson(const char *name, double mean) {
    return {name, [=](Call &c) { return PoissonNoiseH(c.out<DBL>(0), c.n, mean, 7, State(c)); }};
}
Recipe Binomial(const char *name, int32_t trials, double p) {
    return {name, [=](Call &c) {
                return BinomialNoiseH(c.out<U32>(0), c.n, trials, p, c.n, State(c),
                                      c.record<BinomialCache>(1));
            }};
}
Recipe Gaussian(const char *name, int32_t seed) {
    return {name,
            [=](Call &c) {
                auto *spare = c.record<GaussSpare>(1);
                spare->hasSpare = 1;
                spare->spare = 0.25;
                return Gauss(c.out<DBL>(0), c.byReference(c.n), c.byReference(2.0),
                             c.byReference(seed), c.err(), State(c), spare);
            },
            HostStatusInResult};
}

std::vector<Recipe> NoiseRecipes() {
    return {
        {"white",
         [](Call &c) {
             return white(c.out<DBL>(0), c.byReference(c.n), c.byReference(1.5),
                          c.byReference(c.n % 3 - 1), c.err(), State(c));
         },
         HostStatusInResult},
        Gaussian("Gauss: seeded", 2000000000),
        Gaussian("Gauss: continued", -1),
        {"PeriodNoise",
         [](Call &c) {
             return PeriodNoise(c.byReference(c.n), c.byReference(0.5), c.byReference(11),
                                c.out<DBL>(0), c.err(), State(c));
         },
         UsesHeap | CodeInBoth | HostStatusInResult},
        Gamma("GammaNoiseH: product", 5, -1),
        Gamma("GammaNoiseH: rejection", 6, 12345),
        Poisson("PoissonNoiseH: counted", 11.5),
        Poisson("PoissonNoiseH: rejection", 12.0),
        Binomial("BinomialNoiseH: trials", 24, 0.7),
        Binomial("BinomialNoiseH: counted", 25, 0.03),
        Binomial("BinomialNoiseH: rejection", 100, 0.6),
        {"White2026", [](Call &c) { return White2026(c.out<DBL>(0), c.n, 1.5, 7, -c.n, 1e10); }},
        {"Gauss2026", [](Call &c) { return Gauss2026(c.out<DBL>(0), c.n, 2.0, -7, c.n, 12.0); }},
        {"Gamma2026", [](Call &c) { return Gamma2026(c.out<DBL>(0), c.n, 2.5, 7, c.n, 12.0); }},
        {"Gamma2026: below 1",
         [](Call &c) { return Gamma2026(c.out<DBL>(0), c.n, 0.3, 7, c.n, 0.0); }},
        {"Poisson2026: sum",
         [](Call &c) { return Poisson2026(c.out<DBL>(0), c.n, 4.5, 7, 1, 0.0); }},
        {"Poisson2026: rejection",
         [](Call &c) { return Poisson2026(c.out<DBL>(0), c.n, 1e6 + 0.25, 7, 1, 3.0); }},
        {"Binomial2026: sum",
         [](Call &c) { return Binomial2026(c.out<DBL>(0), c.n, 30.0, 0.9, 7, 1, 0.0); }},
        {"Binomial2026: rejection",
         [](Call &c) { return Binomial2026(c.out<DBL>(0), c.n, 1e9, 0.3, 7, 1, 3.0); }},
    };
}

const RecipeFile file(NoiseRecipes);

} // namespace

} // namespace qx::test
