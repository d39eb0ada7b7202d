#include "qx/pulses.h"
#include "tests/support/recipe.h"

namespace qx::test {

namespace {

constexpr auto DBL = ElementType::DBL;

// Trapezoids of 20 samples with a little ringing, rising or falling first.
double Pulses(int32_t i) {
    constexpr double shape[] = {0, 0.01, 0, -0.02, 0.25, 0.75, 1.25, 0.9, 1.0, 1.02,
                                1, 0.99, 1, 1,     0.7,  0.2,  -0.1, 0,   0,   0.01};
    return 3 * shape[i % 20] - 1;
}

constexpr int32_t usualSize = 85;

DBL1D Waveform(Call &c, int number = 0) { return c.in<DBL>(number, c.n + usualSize, Pulses); }

ReferenceLevels *Percent(Call &c, int number) {
    auto *levels = c.record<ReferenceLevels>(number);
    // Field by field: a copy of the whole record would include meaningless padding bytes.
    levels->high = 90;
    levels->mid = 50;
    levels->low = 10;
    levels->percent = 1;
    return levels;
}

HistogramOptions *Bins(Call &c, int number, uint32_t method) {
    auto *options = c.record<HistogramOptions>(number);
    *options = {method, 40};
    return options;
}

// Measured numbers are 0 after a failure; the tests of the family check this.
double *Number(Call &c, int number) { return c.record<double>(10 + number); }

void **Slot(Call &c) { return c.slot(0); }
void **Instance(Call &c) { return c.instance(MeasurementUnreserveProc); }
typedef void **(*Word)(Call &);

template <class Function>
Recipe Levels(const char *name, Function *function, Word word, int32_t method) {
    return {name,
            [=](Call &c) {
                return function(Waveform(c), 0.5, 0.01, method, 40, word(c), Number(c, 0),
                                Number(c, 1), Number(c, 2), 0);
            },
            UsesHeap};
}

template <class Function>
Recipe Pulse(const char *name, Function *function, Word word, uint16_t polarity, uint16_t partial) {
    return {name,
            [=](Call &c) {
                return function(Waveform(c), 0.5, 0.01, polarity, partial, 2, Percent(c, 0),
                                Bins(c, 1, 2), word(c), Number(c, 0), Number(c, 1), Number(c, 2),
                                Number(c, 3), Number(c, 4), Number(c, 5), Number(c, 6), 0);
            },
            UsesHeap};
}

Recipe WholePulse(const char *name, uint16_t polarity) {
    return {name,
            [=](Call &c) {
                return PulseMeas(Waveform(c), 0.5, 0.01, polarity, 1, Percent(c, 0), Bins(c, 1, 0),
                                 Slot(c), Number(c, 0), Number(c, 1), Number(c, 2), Number(c, 3),
                                 Number(c, 4), Number(c, 5), Number(c, 6), 0);
            },
            UsesHeap};
}

template <class Function>
Recipe Transition(const char *name, Function *function, Word word, uint16_t polarity,
                  uint32_t method) {
    return {name,
            [=](Call &c) {
                return function(Waveform(c), 0.5, 0.01, polarity, 2, Percent(c, 0),
                                Bins(c, 1, method), word(c), Number(c, 0), Number(c, 1),
                                Number(c, 2), Number(c, 3), Number(c, 4), Number(c, 5),
                                Number(c, 6), Number(c, 7), Number(c, 8), Number(c, 9),
                                Number(c, 10), polarity);
            },
            UsesHeap};
}

template <class Function>
Recipe Cycle(const char *name, Function *function, Word word) {
    return {name,
            [=](Call &c) {
                return function(Waveform(c), 0.5, 0.01, 2, Percent(c, 0), Bins(c, 1, 0), word(c),
                                Number(c, 0), Number(c, 1), Number(c, 2), Number(c, 3),
                                Number(c, 4), Number(c, 5), Number(c, 6), 0);
            },
            UsesHeap};
}

std::vector<Recipe> PulseRecipes() {
    return {
        Levels("StateLevels: by histogram", StateLevels, Slot, 0),
        Levels("StateLevels: automatic", StateLevels, Slot, 2),
        Levels("StateLevels_IDP", StateLevels_IDP, Instance, 1),
        Pulse("PulseMeasEx", PulseMeasEx, Slot, 0, 0),
        Pulse("PulseMeasEx: partial", PulseMeasEx, Slot, 1, 1),
        Pulse("PulseMeasEx_IDP", PulseMeasEx_IDP, Instance, 1, 0),
        Pulse("PulseMeasEx_IDP: low", PulseMeasEx_IDP, Instance, 0, 0),
        WholePulse("PulseMeas", 1),
        WholePulse("PulseMeas: low", 0),
        Transition("TransMeas: rising", TransMeas, Slot, 1, 0),
        Transition("TransMeas: falling, by peaks", TransMeas, Slot, 0, 1),
        Transition("TransMeas_IDP", TransMeas_IDP, Instance, 1, 2),
        Cycle("CycleRMSAverage", CycleRMSAverage, Slot),
        Cycle("CycleRMSAverage_IDP", CycleRMSAverage_IDP, Instance),
        {"PulseParameters",
         [](Call &c) {
             return PulseParameters(Waveform(c), Number(c, 0), Number(c, 1), Number(c, 2),
                                    Number(c, 3), Number(c, 4), Number(c, 5), Number(c, 6),
                                    Number(c, 7), Number(c, 8), Number(c, 9), c.err());
         }},
        {"measurements_create",
         [](Call &) {
             measurements_create();
             return 0;
         },
         NoStatus},
        {"measurements_destroy",
         [](Call &) {
             measurements_destroy();
             return 0;
         },
         NoStatus},
        {"measurements_clear",
         [](Call &) {
             measurements_clear();
             return 0;
         },
         NoStatus},
    };
}

const RecipeFile file(PulseRecipes);
const RecipeFile exempt({
    {"MeasurementUnreserveProc", "releases the nodes of the others; no arrays"},
});

} // namespace

} // namespace qx::test
