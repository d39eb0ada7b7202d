#include "qx/calculus.h"
#include "tests/support/recipe.h"

#include <cstring>

namespace qx::test {

namespace {

constexpr auto DBL = ElementType::DBL;

// d0 by 5 by 6 elements. The first size is where a block of records has its count, so the rest is
// split into d0 parts of equal length; their last bytes are unused.
DBL3D Volume(Call &c, int number, int32_t d0) {
    constexpr int32_t cols = 5;
    constexpr int32_t planes = 6;
    struct Part {
        unsigned char bytes[cols * planes * sizeof(double) + 8];
    };
    std::vector<Part> parts(static_cast<std::size_t>(d0));
    auto *next = reinterpret_cast<unsigned char *>(parts.data());
    const int32_t others[2] = {cols, planes};
    std::memcpy(next, others, sizeof others);
    next += sizeof others;
    Noise noise(3);
    for (int32_t i = 0; i < d0 * cols * planes; ++i, next += sizeof(double)) {
        const double element = noise.symmetric();
        std::memcpy(next, &element, sizeof element);
    }
    return c.inRecords<DBL3D>(number, d0, parts.data(), parts.size() * sizeof(Part), sizeof others);
}

const std::vector<int32_t> sizes = {5, 6, 7, 8, 9, 100};

template <class Export>
Recipe Planar(const char *name, Export integrate) {
    return {
        name,
        [=](Call &c) { return integrate(c.in2D<DBL>(0, c.n, 7), c.in<DBL>(1, 3), 3, c.scalar(0)); },
        None, sizes};
}

template <class Export>
Recipe Spatial(const char *name, Export integrate) {
    return {name,
            [=](Call &c) {
                const HeapProbe::Pause pause;
                const DBL3D volume = Volume(c, 0, c.n);
                return integrate(volume, c.in<DBL>(1, 4), 2, c.scalar(0));
            },
            UsesHeap, sizes};
}

std::vector<Recipe> IntegrationRecipes() {
    std::vector<Recipe> recipes = {
        Planar("NumerIntegration2D_head", NumerIntegration2D_head),
        Planar("NumerIntegration2D_2017_head", NumerIntegration2D_2017_head),
        Spatial("NumerIntegration3D_head", NumerIntegration3D_head),
        Spatial("NumerIntegration3D_2017_head", NumerIntegration3D_2017_head),
        {"Integral",
         [](Call &c) {
             return Integral(c.inOut<DBL>(0), c.byReference(0.5), c.byReference(-0.5),
                             c.byReference(0.1), c.err());
         }},
        {"Derivative",
         [](Call &c) {
             return Derivative(c.inOut<DBL>(0), c.byReference(0.5), c.byReference(-0.5),
                               c.byReference(0.1), c.err());
         }},
    };
    for (int32_t rule = 0; rule < 6; ++rule) {
        const std::string variant = ": rule " + std::to_string(rule);
        if (rule < 4)
            recipes.push_back({"NumerIntegration_head" + variant,
                               [=](Call &c) {
                                   return NumerIntegration_head(c.in<DBL>(0), c.byReference(0.1),
                                                                c.byReference(rule), c.scalar(0),
                                                                c.err());
                               },
                               None, sizes});
        recipes.push_back({"NumerIntegration_2017_head" + variant,
                           [=](Call &c) {
                               return NumerIntegration_2017_head(c.in<DBL>(0), c.byReference(0.1),
                                                                 c.byReference(rule), c.scalar(0));
                           },
                           None, sizes});
        recipes.push_back({"Integral_2017" + variant,
                           [=](Call &c) { return Integral_2017(c.inOut<DBL>(0), 0.1, rule); }, None,
                           sizes});
        recipes.push_back({"Integral90" + variant, [=](Call &c) {
                               c.mayBeEmpty(1);
                               c.mayBeEmpty(2);
                               return Integral90(c.inOut<DBL>(0), c.in<DBL>(1, 2), c.in<DBL>(2, 2),
                                                 0.1, rule);
                           }});
        if (rule < 4)
            recipes.push_back({"Derivative85" + variant, [=](Call &c) {
                                   c.mayBeEmpty(1);
                                   c.mayBeEmpty(2);
                                   return Derivative85(c.inOut<DBL>(0), c.in<DBL>(1, 2),
                                                       c.in<DBL>(2, 2), c.byReference(0.1), rule);
                               }});
    }
    return recipes;
}

const RecipeFile file(IntegrationRecipes);

} // namespace

} // namespace qx::test
