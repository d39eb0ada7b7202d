#include "multirate/polyphase.h"

#include "multirate/filtered_sums.h"

#include <numeric>

namespace qx {

template <ElementType Code>
ErrorCode PolyphaseSameRate(const FIRBlock<Code> &block, RealOf<Code> gain, OutputRange outputs,
                            typename Element<Code>::type *state, typename Element<Code>::type *y) {
    const Samples<Code> samples{state, block.taps - 1, block.x, block.n};
    const auto sumOf = [&](int32_t m) {
        return OutputSum{outputs.dropped + m, block.taps - 1, block.taps};
    };
    const ErrorCode status = FilteredSums<Code>(samples, block.h, Rhythm{1, 1, -1, 1}, sumOf, gain,
                                                0, 0, static_cast<int32_t>(outputs.count), y);
    samples.keepNewest(state, samples.keptCount);
    return status;
}

template <ElementType Code>
ErrorCode PolyphaseSpaced(const FIRBlock<Code> &block, int32_t spacing, RealOf<Code> gain,
                          OutputRange outputs, typename Element<Code>::type *state,
                          typename Element<Code>::type *y) {
    const Samples<Code> samples{state, (block.taps - 1) * spacing, block.x, block.n};
    const auto sumOf = [&](int32_t m) {
        return OutputSum{samples.keptCount + outputs.dropped + m, 0, block.taps};
    };
    const ErrorCode status = FilteredSums<Code>(samples, block.h, Rhythm{1, 1, 1, -spacing}, sumOf,
                                                gain, 0, 0, static_cast<int32_t>(outputs.count), y);
    samples.keepNewest(state, samples.keptCount);
    return status;
}

template <ElementType Code>
ErrorCode PolyphaseRational(const FIRBlock<Code> &block, int32_t L, int32_t M, int32_t first,
                            RealOf<Code> gain, OutputRange outputs,
                            typename Element<Code>::type *state, typename Element<Code>::type *y) {
    const int32_t common = std::gcd(L, M);
    const Samples<Code> samples{state, (block.taps - 1) / L, block.x, block.n};
    const auto sumOf = [&](int32_t m) {
        const int64_t position = first + (outputs.dropped + m) * M;
        const auto phase = static_cast<int32_t>(position % L);
        const int32_t terms = phase < block.taps ? (block.taps - 1 - phase) / L + 1 : 0;
        return OutputSum{samples.keptCount + position / L, phase, terms};
    };
    const ErrorCode status =
        FilteredSums<Code>(samples, block.h, Rhythm{L / common, M / common, L, -1}, sumOf, gain * L,
                           0, 0, static_cast<int32_t>(outputs.count), y);
    samples.keepNewest(state, samples.keptCount);
    return status;
}

namespace {

// Adds the block's contribution to a sum that ends with input `last`, which may be after the end of
// the block.
template <ElementType Code>
void AddWindow(const FIRBlock<Code> &block, int64_t last, typename Element<Code>::type *sum) {
    const int64_t end = std::min<int64_t>(last + 1, block.n);
    for (int64_t i = std::max<int64_t>(0, last - block.taps + 1); i < end; ++i)
        for (int part = 0; part < SampleParts<Code>::count; ++part)
            Reals<Code>(sum)[part] += block.h[last - i] * Reals<Code>(block.x + i)[part];
}

} // namespace

template <ElementType Code>
ErrorCode PolyphaseDecimate(const FIRBlock<Code> &block, int32_t M, int32_t first,
                            OutputRange outputs, typename Element<Code>::type *sums,
                            typename Element<Code>::type *y) {
    typedef typename Element<Code>::type T;
    const int32_t underWay = (block.taps - 1) / M + 1;
    const auto due = static_cast<int32_t>(outputs.dropped + outputs.count);
    const auto lastInput = [&](int64_t m) { return first + m * M; };
    // From output `whole` on, a window lies within the block or after its start.
    const auto begun = (int64_t{block.taps} - 1 - first + M - 1) / M;
    const auto whole = static_cast<int32_t>(std::clamp<int64_t>(begun, 0, due));
    const auto dropped = static_cast<int32_t>(outputs.dropped);

    for (int32_t m = dropped; m < whole; ++m) {
        y[m - dropped] = sums[m];
        AddWindow<Code>(block, lastInput(m), &y[m - dropped]);
    }
    const Samples<Code> samples{nullptr, 0, block.x, block.n};
    const auto sumOf = [&](int32_t m) {
        return OutputSum{lastInput(m) - (block.taps - 1), block.taps - 1, block.taps};
    };
    const int32_t from = std::max(dropped, whole);
    const ErrorCode status = FilteredSums<Code>(samples, block.h, Rhythm{1, M, -1, 1}, sumOf, 1,
                                                from, from, due, y + (from - dropped));
    for (int32_t j = 0; j < underWay; ++j) {
        sums[j] = int64_t{due} + j < underWay ? sums[due + j] : T{};
        AddWindow<Code>(block, lastInput(int64_t{due} + j), &sums[j]);
    }
    return status;
}

#define QX_POLYPHASE(Code)                                                                         \
    template ErrorCode PolyphaseSameRate<Code>(const FIRBlock<Code> &, RealOf<Code>, OutputRange,  \
                                               Element<Code>::type *, Element<Code>::type *);      \
    template ErrorCode PolyphaseSpaced<Code>(const FIRBlock<Code> &, int32_t, RealOf<Code>,        \
                                             OutputRange, Element<Code>::type *,                   \
                                             Element<Code>::type *);                               \
    template ErrorCode PolyphaseRational<Code>(const FIRBlock<Code> &, int32_t, int32_t, int32_t,  \
                                               RealOf<Code>, OutputRange, Element<Code>::type *,   \
                                               Element<Code>::type *);                             \
    template ErrorCode PolyphaseDecimate<Code>(const FIRBlock<Code> &, int32_t, int32_t,           \
                                               OutputRange, Element<Code>::type *,                 \
                                               Element<Code>::type *);
QX_POLYPHASE(ElementType::SGL)
QX_POLYPHASE(ElementType::DBL)
QX_POLYPHASE(ElementType::CSG)
QX_POLYPHASE(ElementType::CDB)
#undef QX_POLYPHASE

} // namespace qx
