#include "qx/resampling.h"
#include "tests/support/recipe.h"

namespace qx::test {

namespace {

constexpr auto DBL = ElementType::DBL;
constexpr auto CDB = ElementType::CDB;

double Bell(int32_t i) {
    const double t = (i - 80) / 80.0;
    return (1 - t * t) * (1 - t * t) / 10;
}
double Ascending(int32_t i) { return i * 0.625 + i % 3 * 0.125; }

// The members of a state that are not arrays.
struct StateNumbers {
    double tapScale, ratio, fraction;
    int32_t historyCount, leftTaps, rightTaps, mode;
    int64_t position;
};

template <class State, ElementType Code, class Function>
Recipe AtConstantSpacing(const char *name, Function *function, int32_t mode, int32_t reset) {
    return {name, [=](Call &c) {
                c.mayBeEmpty(0);
                c.mayBeEmpty(1);
                if (reset != 0) {
                    c.mayBeEmpty(2);
                    c.mayBeEmpty(3);
                }
                auto *design = c.recordWithHandles<ResampleDesign>(0);
                *design = {1.3, mode, 0.4, c.in<DBL>(1, 161, Bell), 10};
                auto *state = c.recordWithHandles<State>(1);
                *state = {c.inOut<Code>(2, 30), 5, c.inOut<DBL>(3, 40), 0, 0, 0, mode, 1.3, 0.4, 3};
                const auto status = function(c.in<Code>(0), state, design, reset, c.out<Code>(0),
                                             c.integer(0), mode);
                *c.record<StateNumbers>(0) = {
                    state->tapScale, state->ratio,     state->fraction, state->historyCount,
                    state->leftTaps, state->rightTaps, state->mode,     state->position};
                return status;
            }};
}

template <ElementType Code>
struct AscendingTimes;
template <>
struct AscendingTimes<DBL> {
    static double at(int32_t i) { return Ascending(i); }
};
template <>
struct AscendingTimes<CDB> {
    static ::CDB at(int32_t i) { return {Ascending(i), 0}; }
};

VariableDesign *DesignOf(Call &c, uint8_t antiAlias) {
    auto *design = c.recordWithHandles<VariableDesign>(0);
    *design = {0, antiAlias, c.in<DBL>(2, 161, Bell), 10};
    return design;
}

template <ElementType Code, class Function>
Recipe AtTimes(const char *name, Function *function, uint8_t antiAlias) {
    return {name,
            [=](Call &c) {
                auto *design = DesignOf(c, antiAlias);
                const auto status =
                    function(c.in<Code>(0), c.inOut<Code>(1, c.n + 9, AscendingTimes<Code>::at),
                             design, c.record<double>(1), c.integer(0), c.integer(1));
                return status;
            },
            TakesEmptyInput};
}

template <ElementType Code, class Function>
Recipe ChannelsAtTimes(const char *name, Function *function, uint8_t antiAlias) {
    return {name,
            [=](Call &c) {
                auto *design = DesignOf(c, antiAlias);
                const auto status = function(c.in2D<Code>(0, 3, c.n), c.out2D<Code>(0),
                                             c.inOut<DBL>(1, c.n + 9, Ascending), design,
                                             c.record<double>(1), c.integer(0), c.integer(1));
                return status;
            },
            TakesEmptyInput};
}

std::vector<Recipe> ResamplingRecipes() {
    return {
        AtConstantSpacing<ResampleState, DBL>("Resample_Const: reset", Resample_Const, 0, 1),
        AtConstantSpacing<ResampleState, DBL>("Resample_Const: in a stream", Resample_Const, 1, 0),
        AtConstantSpacing<CxResampleState, CDB>("CxResample_Const: reset", CxResample_Const, 0, 1),
        AtConstantSpacing<CxResampleState, CDB>("CxResample_Const: in a stream", CxResample_Const,
                                                1, 0),
        AtTimes<DBL>("Resample_Variable", Resample_Variable, 0),
        AtTimes<CDB>("CxResample_Variable", CxResample_Variable, 1),
        ChannelsAtTimes<DBL>("Resample_Variable_MultiCh", Resample_Variable_MultiCh, 1),
        ChannelsAtTimes<CDB>("CxResample_Variable_MultiCh", CxResample_Variable_MultiCh, 0),
    };
}

const RecipeFile file(ResamplingRecipes);

} // namespace

} // namespace qx::test
