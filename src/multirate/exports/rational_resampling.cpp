#include "multirate/rational.h"

#include "frame/export.h"
#include "qx/rational_resampling.h"

namespace qx {
namespace {

// One channel in arrays, or several channels in the rows of matrices.
template <class Array>
int32_t Channels(const Array &array) {
    if constexpr (requires { array.rows(); })
        return array.rows();
    else
        return 1;
}
template <class Array>
int32_t SamplesPerChannel(const Array &array) {
    if constexpr (requires { array.cols(); })
        return array.cols();
    else
        return array.size();
}
template <class Array>
Outcome Resize(Array &array, int32_t channels, int32_t samples) {
    if constexpr (requires { array.rows(); })
        return array.resize(channels, samples);
    else
        return array.resize(samples);
}

template <class Array>
struct Rational {
    static constexpr ElementType code = HandleTraits<Array>::code;
    static constexpr bool isMultichannel = HandleTraits<Array>::dimensions == 2;

    static Outcome Run(In<Array> x, int32_t L, int32_t M, int32_t reset, int32_t *offset,
                       In<DBL1D> h, InOut<Array> state, int32_t *stateCount, Out<Array> y) {
        if (const ErrorCode bad = FirstFailed({{*offset < 0 || *stateCount < 0, ErrNegativeSetting},
                                               {L < 1 || M < 1, ErrNotStrictlyPositive}}))
            return bad;
        const int32_t channels = Channels(x);
        const int32_t n = SamplesPerChannel(x);
        if (const Outcome bad = prepareState(state, channels, h.size(), L, reset != 0, stateCount))
            return bad;

        int32_t count = 0;
        if (const ErrorCode bad =
                RationalOutputCount(int64_t{n} + *stateCount, L, M, offset, h.size(), &count))
            return bad;
        if (const Outcome bad = Resize(y, channels, count))
            return bad;
        const RationalStream stream{L,      M,         h.data(), h.size(), SamplesPerChannel(state),
                                    offset, stateCount};
        return RationalResample<code>(stream, x.data(), n, channels, state.data(), y.data(), count);
    }

private:
    static Outcome prepareState(InOut<Array> &state, int32_t channels, int32_t taps, int32_t L,
                                bool reset, int32_t *stateCount) {
        // kept: an empty matrix of states also begins a stream, but leaves the count.
        if (reset || (isMultichannel && state.isEmpty())) {
            const int32_t capacity = taps < 1 ? 0 : (taps - 1) / L + 1;
            if (const Outcome bad = Resize(state, channels, capacity))
                return bad;
            ClearSamples<code>(state.data(), int64_t{channels} * capacity);
        }
        if (reset)
            *stateCount = 0;
        if (isMultichannel && Channels(state) != channels && Channels(state) > 0 && channels > 0)
            return ErrSizesDisagree;
        return 0;
    }
};

} // namespace
} // namespace qx

using qx::Rational;
using qx::Returned;

ErrorCode RationalResample_H(DBL1D x, int32_t L, int32_t M, int32_t reset, int32_t *offset, DBL1D h,
                             DBL1D state, int32_t *stateCount, DBL1D y) {
    return Returned(Rational<DBL1D>::Run, x, L, M, reset, offset, h, state, stateCount, y);
}

ErrorCode CxRationalResample_H(CDB1D x, int32_t L, int32_t M, int32_t reset, int32_t *offset,
                               DBL1D h, CDB1D state, int32_t *stateCount, CDB1D y) {
    return Returned(Rational<CDB1D>::Run, x, L, M, reset, offset, h, state, stateCount, y);
}

ErrorCode RationalResampleMultiCh_H(DBL2D x, int32_t L, int32_t M, int32_t reset, int32_t *offset,
                                    DBL1D h, DBL2D state, int32_t *stateCount, DBL2D y) {
    return Returned(Rational<DBL2D>::Run, x, L, M, reset, offset, h, state, stateCount, y);
}

ErrorCode CxRationalResampleMCh_H(CDB2D x, int32_t L, int32_t M, int32_t reset, int32_t *offset,
                                  DBL1D h, CDB2D state, int32_t *stateCount, CDB2D y) {
    return Returned(Rational<CDB2D>::Run, x, L, M, reset, offset, h, state, stateCount, y);
}
