#include "qx/decimation.h"
#include "tests/support/recipe.h"

namespace qx::test {

namespace {

constexpr auto DBL = ElementType::DBL;
constexpr auto CDB = ElementType::CDB;
typedef std::vector<Recipe> Recipes;

// Numbers of a stream, which a failure leaves unchanged.
template <class T>
T *Number(Call &c, int number, T value) {
    T *kept = c.record<T>(number);
    *kept = value;
    return kept;
}

template <ElementType Code, class Sum, class Function>
void AddContinuous(Recipes &recipes, const std::string &name, Function *function) {
    for (const int32_t average : {0, 1})
        recipes.push_back({name + (average ? ": mean" : ": pick"),
                           [=](Call &c) {
                               return function(c.inOut<Code>(0), 3, average, Number(c, 0, 1), 0,
                                               Number(c, 1, 2 * average), Number(c, 2, Sum{}));
                           },
                           TakesEmptyInput});
}

template <ElementType Code, class Sum, class Function>
Recipe Groups(const char *name, Function *function) {
    return {name,
            [=](Call &c) {
                return function(c.inOut<Code>(0), 3, Number(c, 0, Sum{}), Number(c, 1, 2), 0,
                                c.integer(0));
            },
            TakesEmptyInput};
}

template <ElementType Code, class Function>
void AddCascade(Recipes &recipes, const std::string &name, Function *function) {
    for (const int32_t reset : {0, 1})
        recipes.push_back({name + (reset ? ": reset" : ": in a stream"),
                           [=](Call &c) {
                               const int32_t stages = 2 + reset;
                               return function(c.inOut<Code>(0), 2, 5, c.inOut<Code>(1, stages),
                                               c.inOut2D<Code>(2, stages, 5), Number(c, 0, 3),
                                               static_cast<int32_t>(reset));
                           },
                           TakesEmptyInput});
}

template <class Function>
void AddCIC(Recipes &recipes, const std::string &name, Function *function, int32_t phases) {
    for (const int16_t alternate : {0, 1})
        for (const int32_t factor : {3, 2})
            recipes.push_back(
                {name + ": factor " + std::to_string(factor) + (alternate ? ", alternate" : ""),
                 [=](Call &c) {
                     c.mayBeEmpty(0);
                     return function(c.in<DBL>(0), c.out<DBL>(0),
                                     c.inOut<DBL>(1, 3 * (factor + 1) + phases), 3, factor, 1,
                                     alternate, 0, Number(c, 0, 4));
                 }});
}

Recipes DecimationRecipes() {
    static const uint8_t no = 0, yes = 1;
    Recipes recipes = {
        {"DecimateCIN: pick",
         [](Call &c) {
             return DecimateCIN(c.inOut<DBL>(0, c.n + 2), c.byReference(3), &no, c.err());
         },
         HostStatusInResult},
        {"DecimateCIN: mean",
         [](Call &c) {
             return DecimateCIN(c.inOut<DBL>(0, c.n + 2), c.byReference(3), &yes, c.err());
         },
         HostStatusInResult},
        {"CxDecimate_H: pick",
         [](Call &c) { return CxDecimate_H(c.inOut<CDB>(0, c.n + 2), 3, 0); }},
        {"CxDecimate_H: mean",
         [](Call &c) { return CxDecimate_H(c.inOut<CDB>(0, c.n + 2), 3, 1); }},
        // With a state of the right size; the resizing by a reset is tested by hand.
        {"InterpolatedFIRH",
         [](Call &c) {
             c.mayBeEmpty(0);
             return InterpolatedFIRH(c.in<DBL>(0), c.out<DBL>(0), 3, 0.5, c.in<DBL>(1, 21),
                                     c.inOut<DBL>(2, 60), 0, Number(c, 0, 2));
         }},
        {"InterpolatorFIRH",
         [](Call &c) {
             c.mayBeEmpty(0);
             c.mayBeEmpty(2);
             return InterpolatorFIRH(c.in<DBL>(0), c.out<DBL>(0), 0.5, 3, c.in<DBL>(1, 21),
                                     c.inOut<DBL>(2, 1), 1, Number(c, 0, 2));
         }},
        {"DecimatorFIRH",
         [](Call &c) {
             c.mayBeEmpty(0);
             c.mayBeEmpty(2);
             return DecimatorFIRH(c.in<DBL>(0), c.out<DBL>(0), 0.5, 3, c.in<DBL>(1, 21),
                                  c.inOut<DBL>(2, 1), 1, 2, Number(c, 0, 2));
         }},
        {"InterpolatorFIRH: in a stream",
         [](Call &c) {
             c.mayBeEmpty(0);
             return InterpolatorFIRH(c.in<DBL>(0), c.out<DBL>(0), 0.5, 3, c.in<DBL>(1, 21),
                                     c.inOut<DBL>(2, 7), 0, Number(c, 0, 2));
         }},
        {"DecimatorFIRH: in a stream",
         [](Call &c) {
             c.mayBeEmpty(0);
             return DecimatorFIRH(c.in<DBL>(0), c.out<DBL>(0), 0.5, 3, c.in<DBL>(1, 21),
                                  c.inOut<DBL>(2, 8), 0, 2, Number(c, 0, 2));
         }},
        Groups<DBL, double>("ReDecimatedMovingAverageH", ReDecimatedMovingAverageH),
        Groups<CDB, ::CDB>("CxDecimatedMovingAverageH", CxDecimatedMovingAverageH),
        {"CxComplexModulatorH",
         [](Call &c) { return CxComplexModulatorH(c.inOut<CDB>(0), 0.3, 2.0, Number(c, 0, 0.7)); },
         TakesEmptyInput},
        {"ReComplexModulatorH",
         [](Call &c) {
             return ReComplexModulatorH(c.in<DBL>(0), 0.3, 2.0, Number(c, 0, 0.7), c.out<CDB>(0));
         },
         TakesEmptyInput},
    };
    AddContinuous<DBL, double>(recipes, "DecimateContinuous_H", DecimateContinuous_H);
    AddContinuous<CDB, ::CDB>(recipes, "CxDecimateContinuous_H", CxDecimateContinuous_H);
    AddCascade<DBL>(recipes, "ReCascadedMovingAverageH", ReCascadedMovingAverageH);
    AddCascade<CDB>(recipes, "CxCascadedMovingAverageH", CxCascadedMovingAverageH);
    AddCIC(recipes, "CICDecimatorByMovH", CICDecimatorByMovH, 1);
    AddCIC(recipes, "CICInterpolatorByMovH", CICInterpolatorByMovH, 0);
    return recipes;
}

const RecipeFile file(DecimationRecipes);

} // namespace

} // namespace qx::test
