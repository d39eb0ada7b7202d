#include "qx/peaks.h"
#include "tests/support/recipe.h"

namespace qx::test {

namespace {

constexpr auto DBL = ElementType::DBL;
constexpr auto I32 = ElementType::I32;

// The members of a state that are not arrays.
struct StreamNumbers {
    int32_t width, position, historyCount, tailCount, slopeSign, count;
};

double FlatAround1(int32_t i) { return 1.0 + (i % 7 - 3) * 1e-9; }

// One call that begins a stream and, if `calls` is 2, a second call that ends it.
struct Stream {
    int32_t width, polarity, mode;
    int calls;
};

template <class Function>
Recipe OverStream(const char *name, const Function &function, const Stream &stream) {
    return {name,
            [=](Call &c) {
                auto *request = c.recordWithHandles<PeakDRequest>(0);
                *request = {};
                request->data = stream.mode == 1 ? c.spoiled<DBL>(0, c.n + 5, FlatAround1)
                                                 : c.in<DBL>(0, c.n + 5);
                request->threshold = stream.mode == 1 ? 1.0 : 0.125;
                request->width = stream.width;
                request->polarity = stream.polarity;
                request->locations = c.out<DBL>(0);
                request->amplitudes = c.out<DBL>(1);
                request->derivatives = c.out<DBL>(2);
                if (stream.calls == 2) {
                    c.isReadAgain(0);
                    c.isReadAgain(1);
                }
                if (stream.mode == 2)
                    c.mayBeEmpty(0);
                auto *state = c.recordWithHandles<PeakDState>(1);
                DBL1D buffer = c.out<DBL>(3);
                DBL1D source = c.in<DBL>(1, c.n + 6);
                if (stream.mode != 2)
                    c.mayBeEmpty(1);

                request->flags = QXPeakFirstBlock;
                ErrorCode status = function(source, request, state, &buffer, c.err(), stream.mode);
                if (status >= 0 && stream.calls == 2) {
                    request->flags = QXPeakLastBlock;
                    status = function(source, request, state, &buffer, c.err(), stream.mode);
                }
                *c.record<StreamNumbers>(0) = {state->width,        state->position,
                                               state->historyCount, state->tailCount,
                                               state->slopeSign,    request->count};
                return status;
            },
            CodeInBoth};
}

std::vector<Recipe> PeakRecipes() {
    const auto first = [](DBL1D, PeakDRequest *request, PeakDState *state, DBL1D *buffer,
                          ErrorCode *err, int32_t) { return PeakD(request, state, buffer, err); };
    const auto second = [](DBL1D, PeakDRequest *request, PeakDState *state, DBL1D *buffer,
                           ErrorCode *err,
                           int32_t mode) { return PeakD2010(request, state, buffer, err, mode); };
    return {
        {"PeakDetector",
         [](Call &c) {
             return PeakDetector(c.in<DBL>(0, c.n + 5), c.byReference(-0.5), c.byReference(2),
                                 c.out<I32>(0), c.integer(0), c.err());
         },
         CodeInBoth | HostStatusInResult},
        OverStream("PeakD", first, {3, 0, 0, 2}),
        OverStream("PeakD: of one block", first, {6, 1, 0, 1}),
        OverStream("PeakD2010", second, {4, 1, 1, 2}),
        OverStream("PeakD2014: peaks", PeakD2014, {5, 0, 0, 2}),
        OverStream("PeakD2014: in flat blocks", PeakD2014, {5, 0, 1, 2}),
        OverStream("PeakD2014: of a source", PeakD2014, {3, 1, 2, 2}),
    };
}

const RecipeFile file(PeakRecipes);

} // namespace

} // namespace qx::test
