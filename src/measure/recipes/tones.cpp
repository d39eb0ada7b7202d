#include "qx/tones.h"
#include "tests/support/recipe.h"

namespace qx::test {

namespace {

constexpr auto DBL = ElementType::DBL;

// Periods of 16 and of 10 samples with harmonics. The values are exact; none comes from an
// elementary function.
double Waves(int32_t i) {
    constexpr double slow[] = {0, 3, 5, 7, 8, 7, 6, 3, 0, -3, -5, -7, -8, -7, -6, -3};
    constexpr double fast[] = {0, 6, 9, 9, 5, 0, -5, -9, -9, -6};
    return 1 + slow[i % 16] / 8 + fast[i % 10] / 64;
}

std::vector<Recipe> ToneRecipes() {
    const auto tones = [](int32_t count, int32_t order) {
        return [=](Call &c) {
            return MultipleToneMeasurements(c.in<DBL>(0, c.n + 40, Waves), 0.01, count, order,
                                            c.out<DBL>(0), c.out<DBL>(1), c.out<DBL>(2),
                                            c.scalar(0));
        };
    };
    const auto single = [](double centre, double halfWidth) {
        return [=](Call &c) {
            return SingleToneMeasurement(c.in<DBL>(0, c.n + 40, Waves), 0.01, centre, halfWidth,
                                         c.scalar(0), c.scalar(1), c.scalar(2), c.scalar(3),
                                         c.scalar(4));
        };
    };
    const auto harmonics = [](double fundamental, int32_t highest, double fullScale) {
        return [=](Call &c) {
            return HarmonicAnalysis(c.in<DBL>(0, c.n + 40, Waves), 0.01, fundamental, highest,
                                    fullScale, c.out<DBL>(0), c.out<DBL>(1), c.out<DBL>(2),
                                    c.scalar(0), c.scalar(1), c.scalar(2), c.scalar(3), c.scalar(4),
                                    c.scalar(5));
        };
    };
    return {
        {"MultipleToneMeasurements: by amplitude", tones(3, 0), UsesHeap},
        {"MultipleToneMeasurements: by frequency", tones(6, 1), UsesHeap},
        {"SingleToneMeasurement", single(0, 0), UsesHeap},
        {"SingleToneMeasurement: in a band", single(10, 2), UsesHeap},
        {"HarmonicAnalysis", harmonics(0, 3, 0), UsesHeap},
        {"HarmonicAnalysis: aliased", harmonics(6.25, 15, 4), UsesHeap},
    };
}

const RecipeFile file(ToneRecipes);

} // namespace

} // namespace qx::test
