#include "multirate/polyphase.h"

#include "frame/export.h"
#include "qx/polyphase.h"

#include <limits>

namespace qx {
namespace {

enum Mode : int32_t { SameRate, Interpolate, Decimate, Rational, ModeCount };

struct MultirateRequest {
    int32_t mode;
    int32_t L;
    int32_t M;
    bool reset;
    bool removeDelay;

    bool countsInputs() const { return mode == Decimate || mode == Rational; }
    int32_t stateSize(int32_t taps) const {
        switch (mode) {
        case SameRate:
            return taps - 1;
        case Decimate:
            return (taps - 1) / M + 2;
        default:
            return (taps - 1) / L + 1;
        }
    }
};

// Checks the arguments and, on a reset, sets the delay and the phase with which a stream begins.
ErrorCode CheckMultirateArgs(const MultirateRequest &request, int32_t taps, int32_t *delayLeft,
                             int32_t *phase) {
    const int32_t order = taps - 1;
    if (const ErrorCode bad =
            FirstFailed({{order < 0, ErrOrderNotPositive},
                         {request.L < 1 || request.M < 1, ErrNotStrictlyPositive},
                         {request.mode < 0 || request.mode >= ModeCount, ErrInvalidSelector},
                         {!request.reset && *delayLeft < 0, ErrNegativeSetting},
                         {request.reset && request.removeDelay && order % 2 != 0, ErrBadTapCount}}))
        return bad;
    if (!request.reset)
        return 0;
    *delayLeft = 0;
    *phase = 0;
    if (request.removeDelay) {
        const int32_t groupDelay = order / 2;
        *delayLeft = request.countsInputs() ? groupDelay / request.M : groupDelay;
        *phase = request.countsInputs() ? Modulo(-int64_t{groupDelay}, request.M) : 0;
    }
    return 0;
}

template <class Array, class Taps>
struct Multirate {
    static constexpr ElementType code = HandleTraits<Array>::code;
    typedef RealOf<code> Real;

    static Outcome Run(In<Array> x, Out<Array> y, InOut<Array> state, int32_t mode, int32_t L,
                       int32_t M, In<Taps> h, Real gain, const uint8_t *reset,
                       const uint8_t *removeDelay, OutI32 delayLeft, OutI32 phase) {
        const MultirateRequest request{mode, L, M, *reset != 0 || state.isEmpty(),
                                       *removeDelay != 0};
        const int32_t n = x.size();
        if (const ErrorCode bad =
                CheckMultirateArgs(request, h.size(), delayLeft.address(), phase.address()))
            return bad;
        if (const Outcome bad = prepareState(request, state, h.size()))
            return bad;

        const bool stuffed = mode == Interpolate || mode == Rational;
        const int32_t first = request.countsInputs() ? Modulo(-int64_t{*phase.address()}, M) : 0;
        const int64_t positions = int64_t{n} * (stuffed ? L : 1);
        const OutputRange outputs(positions, first, request.countsInputs() ? M : 1,
                                  *delayLeft.address());
        if (outputs.count > std::numeric_limits<int32_t>::max())
            return ErrOutOfMemory;
        if (const Outcome bad = y.resize(static_cast<int32_t>(outputs.count)))
            return bad;

        const FIRBlock<code> block{x.data(), n, h.data(), h.size()};
        const ErrorCode status =
            RunMode(request, block, first, gain, outputs, state.data(), y.data());
        delayLeft = outputs.delayLeft;
        if (request.countsInputs())
            phase = Modulo(*phase.address() + positions, M);
        return status != 0 ? status : n > 0 ? 0 : WarnEmptyResult;
    }

private:
    static Outcome prepareState(const MultirateRequest &request, InOut<Array> &state,
                                int32_t taps) {
        const int32_t size = request.stateSize(taps);
        if (!request.reset)
            return state.size() == size ? 0 : ErrStateSizeMismatch;
        if (const Outcome bad = state.resize(size))
            return bad;
        ClearSamples<code>(state.data(), size);
        return 0;
    }

    static ErrorCode RunMode(const MultirateRequest &request, const FIRBlock<code> &block,
                             int32_t first, Real gain, OutputRange outputs,
                             typename Element<code>::type *state, typename Element<code>::type *y) {
        switch (request.mode) {
        case SameRate:
            return PolyphaseSameRate<code>(block, gain, outputs, state, y);
        case Interpolate:
            return PolyphaseInterpolate<code>(block, request.L, gain, outputs, state, y);
        case Decimate: // kept: the gain is not applied here
            return PolyphaseDecimate<code>(block, request.M, first, outputs, state, y);
        default:
            return PolyphaseRational<code>(block, request.L, request.M, first, gain, outputs, state,
                                           y);
        }
    }
};

} // namespace
} // namespace qx

using qx::Multirate;
using qx::Returned;

ErrorCode ppMultiRateFIRH_DBL(DBL1D x, DBL1D y, DBL1D state, int32_t mode, int32_t L, int32_t M,
                              DBL1D h, double gain, const uint8_t *reset,
                              const uint8_t *removeDelay, int32_t *delayLeft, int32_t *phase) {
    return Returned(Multirate<DBL1D, DBL1D>::Run, x, y, state, mode, L, M, h, gain, reset,
                    removeDelay, delayLeft, phase);
}

ErrorCode ppMultiRateFIRH_SGL(SGL1D x, SGL1D y, SGL1D state, int32_t mode, int32_t L, int32_t M,
                              SGL1D h, float gain, const uint8_t *reset, const uint8_t *removeDelay,
                              int32_t *delayLeft, int32_t *phase) {
    return Returned(Multirate<SGL1D, SGL1D>::Run, x, y, state, mode, L, M, h, gain, reset,
                    removeDelay, delayLeft, phase);
}

ErrorCode ppMultiRateFIRH_CDB(CDB1D x, CDB1D y, CDB1D state, int32_t mode, int32_t L, int32_t M,
                              DBL1D h, double gain, const uint8_t *reset,
                              const uint8_t *removeDelay, int32_t *delayLeft, int32_t *phase) {
    return Returned(Multirate<CDB1D, DBL1D>::Run, x, y, state, mode, L, M, h, gain, reset,
                    removeDelay, delayLeft, phase);
}

ErrorCode ppMultiRateFIRH_CSG(CSG1D x, CSG1D y, CSG1D state, int32_t mode, int32_t L, int32_t M,
                              SGL1D h, float gain, const uint8_t *reset, const uint8_t *removeDelay,
                              int32_t *delayLeft, int32_t *phase) {
    return Returned(Multirate<CSG1D, SGL1D>::Run, x, y, state, mode, L, M, h, gain, reset,
                    removeDelay, delayLeft, phase);
}
