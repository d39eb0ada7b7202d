#include "qx/waveforms.h"
#include "tests/support/recipe.h"

#include <array>

namespace qx::test {

namespace {

constexpr auto DBL = ElementType::DBL;

double *Kept(Call &c, int number, double value) {
    auto *kept = c.record<double>(number);
    *kept = value;
    return kept;
}
double *Phase(Call &c) { return Kept(c, 0, -30.0); }
const double *Number(Call &c, double value) { return c.byReference(value); }
const int32_t *Count(Call &c) { return c.byReference(c.n); }

std::vector<Recipe> WaveRecipes() {
    std::vector<Recipe> recipes = {
        {"SineWaveCIN",
         [](Call &c) {
             return SineWaveCIN(c.out<DBL>(0), Count(c), Number(c, 1.5), Number(c, 0.0123),
                                Phase(c), c.err());
         }},
        {"SquareWaveCIN",
         [](Call &c) {
             return SquareWaveCIN(c.out<DBL>(0), Count(c), Number(c, 1.5), Number(c, 0.0123),
                                  Phase(c), Number(c, 30.0), c.err());
         }},
        {"TriangleWaveCIN",
         [](Call &c) {
             return TriangleWaveCIN(c.out<DBL>(0), Count(c), Number(c, 1.5), Number(c, -0.0123),
                                    Phase(c), c.err());
         }},
        {"SawtoothWaveCIN",
         [](Call &c) {
             return SawtoothWaveCIN(c.out<DBL>(0), Count(c), Number(c, 1.5), Number(c, 0.0123),
                                    Phase(c), c.err());
         }},
        {"SawtoothWaveCIN: phases beyond the lanes' remainder",
         [](Call &c) {
             return SawtoothWaveCIN(c.out<DBL>(0), Count(c), Number(c, 1.5), Number(c, 1.23e20),
                                    Phase(c), c.err());
         }},
        {"ChirpCIN",
         [](Call &c) {
             return ChirpCIN(c.out<DBL>(0), Count(c), Number(c, 1.5), Number(c, 0.01),
                             Number(c, 0.3), c.err());
         }},
    };
    for (const int32_t interpolate : {0, 1})
        recipes.push_back({interpolate ? "ArbitraryWaveCIN: interpolated" : "ArbitraryWaveCIN",
                           [=](Call &c) {
                               return ArbitraryWaveCIN(c.out<DBL>(0), Count(c), Number(c, 1.5),
                                                       Number(c, 0.0123), Phase(c), c.in<DBL>(0),
                                                       c.byReference(interpolate), c.err());
                           },
                           TakesEmptyInput});
    for (Recipe &recipe : recipes)
        recipe.quirks |= HostStatusInResult;
    return recipes;
}

std::vector<Recipe> PatternRecipes() {
    std::vector<Recipe> recipes = {
        {"SinePtrn",
         [](Call &c) {
             return SinePtrn(c.out<DBL>(0), Count(c), Number(c, 2.0), Number(c, 45.0),
                             Number(c, 2.5), c.err());
         }},
        {"Square",
         [](Call &c) {
             return Square(c.out<DBL>(0), Count(c), Number(c, 2.0), Number(c, 40.0),
                           Number(c, 0.3 * c.n), c.err());
         },
         None,
         {2, 3, 8, 50, 1000}},
        {"PulsePtrn",
         [](Call &c) {
             return PulsePtrn(c.out<DBL>(0), Count(c), Number(c, 2.0), c.byReference(c.n / 3),
                              c.byReference(c.n / 4), c.err());
         }},
        {"ImpulsePtrn",
         [](Call &c) {
             return ImpulsePtrn(c.out<DBL>(0), Count(c), Number(c, 2.0), c.byReference(c.n / 3),
                                c.err());
         }},
        {"SincWave",
         [](Call &c) {
             return SincWave(c.out<DBL>(0), Count(c), Number(c, 2.0), Number(c, 1.25),
                             Number(c, 0.125), c.err());
         }},
        {"RampPtrn",
         [](Call &c) {
             return RampPtrn(c.out<DBL>(0), Count(c), Number(c, -1.0),
                             Number(c, c.n > 1 ? 2.3 : -1.0), c.err());
         }},
    };
    for (Recipe &recipe : recipes)
        recipe.quirks |= HostStatusInResult;
    return recipes;
}

std::vector<Recipe> RampRecipes() {
    return {
        {"RampPtrn80", [](Call &c) { return RampPtrn80(c.out<DBL>(0), c.n, -1.0, 2.3, 1); }},
        {"RampPtrn85: linear",
         [](Call &c) { return RampPtrn85(c.out<DBL>(0), c.n, -1.0, 2.3, 1, 0); }},
        {"RampPtrn85: in equal ratios",
         [](Call &c) { return RampPtrn85(c.out<DBL>(0), c.n, 0.1, 70.0, c.n < 2, 1); }},
    };
}

// Each pulse at uniform times and at times of the caller.
template <class Export>
void AddPulse(std::vector<Recipe> &recipes, const std::string &name, const Export &call) {
    recipes.push_back({name + ": uniform times",
                       [=](Call &c) { return call(c.inOut<DBL>(0, 0), c.n); }, TakesEmptyInput});
    recipes.push_back({name + ": given times", [=](Call &c) { return call(c.inOut<DBL>(0), -1); }});
}

std::vector<Recipe> PulseRecipes() {
    std::vector<Recipe> recipes;
    AddPulse(recipes, "GaussPulseH",
             [](DBL1D x, int32_t n) { return GaussPulseH(x, n, 1.5, 0.5, 0.125, 2.0, 0.4, 6.0); });
    AddPulse(recipes, "GaussMonopulseH",
             [](DBL1D x, int32_t n) { return GaussMonopulseH(x, n, 0.125, 0.5, 1.0, 1.5); });
    AddPulse(recipes, "AperiodTriangleH",
             [](DBL1D x, int32_t n) { return AperiodTriangleH(x, n, 1.5, 0.5, 0.125, 1.0, 0.3); });
    AddPulse(recipes, "PeriodicSincH",
             [](DBL1D x, int32_t n) { return PeriodicSincH(x, n, 1.5, 6, 0.125, 0.5); });
    return recipes;
}

template <class Export>
Recipe Modulator(const char *name, Export modulate) {
    return {name,
            [=](Call &c) {
                auto &y = *c.record<std::array<double, 1000>>(2);
                Noise noise(1);
                for (double &value : y)
                    value = 3.0 * noise.symmetric();
                return modulate(c.n, 0.001, c.scalar(0), 50.0, y.data(), Kept(c, 0, 0.0),
                                Kept(c, 1, 10.0));
            },
            NoStatus};
}

std::vector<Recipe> ModulatorRecipes() {
    return {Modulator("PhasMod", PhasMod), Modulator("FreqMod", FreqMod)};
}

const RecipeFile waves(WaveRecipes);
const RecipeFile patterns(PatternRecipes);
const RecipeFile ramps(RampRecipes);
const RecipeFile pulses(PulseRecipes);
const RecipeFile modulators(ModulatorRecipes);

} // namespace

} // namespace qx::test
