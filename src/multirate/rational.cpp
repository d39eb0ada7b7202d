#include "multirate/rational.h"

#include "multirate/filtered_sums.h"

#include <bit>
#include <limits>
#include <numeric>

namespace qx {

namespace {

int Bits(int64_t v) { return v < 2 ? 0 : std::bit_width(static_cast<uint64_t>(v - 1)); }

// The first sample in the window of an output at `offset`.
int64_t FirstSample(int64_t offset, int32_t half, int32_t L) {
    const int64_t p = offset - half - 1;
    return p < 0 ? 0 : p / L + 1;
}

} // namespace

ErrorCode RationalOutputCount(int64_t n, int32_t L, int32_t M, const int32_t *offset, int32_t nh,
                              int32_t *count) {
    if (Bits(n) + Bits(L) >= 31)
        return ErrOverflow;
    const int64_t d = n * L - (nh - 1) / 2 - *offset - 1;
    *count = d < 0 ? 0 : static_cast<int32_t>(d / M + 1);
    return 0;
}

template <ElementType Code>
ErrorCode RationalResample(const RationalStream &stream, const typename Element<Code>::type *x,
                           int32_t n, int32_t channels, typename Element<Code>::type *state,
                           typename Element<Code>::type *y, int32_t count) {
    const auto [L, M, h, nh, capacity, offset, stateCount] = stream;
    if (*offset < 0 || *stateCount < 0)
        return ErrNegativeSetting;
    if (L < 1 || M < 1)
        return ErrNotStrictlyPositive;
    if (nh % 2 == 0)
        return ErrBadTapCount;
    if (*stateCount > capacity)
        return ErrOverflow;

    const int32_t half = (nh - 1) / 2;
    const int32_t taps = nh, up = L;
    const int64_t start = *offset, step = M;
    const auto sumOf = [=](int32_t m) {
        const int64_t position = start + m * step;
        const int64_t first = FirstSample(position, half, up);
        const int64_t tap = first * up - position + half;
        const auto terms = tap < taps ? static_cast<int32_t>((taps - 1 - tap) / up + 1) : 0;
        return OutputSum{first, terms > 0 ? static_cast<int32_t>(tap) : 0, terms};
    };
    // The windows of outputs before this one are cut off at the first available sample.
    const auto regular =
        static_cast<int32_t>(start > half ? 0 : std::min<int64_t>(count, (half - start) / M + 1));
    const int32_t common = std::gcd(L, M);
    const Rhythm rhythm{L / common, M / common, L, 1};

    // If the next window lies entirely after the available samples, the stream moves on to the next
    // block and the offset keeps the remaining distance. If the window begins after the position of
    // its own output, which is possible with few taps on a fine grid, the sample before that
    // position is kept, so that the offset does not become negative.
    const int64_t inHand = int64_t{*stateCount} + n;
    const int64_t next = start + int64_t{count} * M;
    int64_t first = std::min({FirstSample(next, half, L), next / L, inHand});
    // kept: a block without outputs is appended to a nonempty state in full if it fits. If the
    // caller has not changed the offset, it would be kept in full anyway.
    if (count < 1 && *stateCount > 0 && inHand <= capacity)
        first = 0;
    if (inHand - first > capacity)
        return ErrOverflow;

    for (int32_t c = 0; c < channels; ++c) {
        auto *kept = state + int64_t{c} * capacity;
        const Samples<Code> samples{kept, *stateCount, x + int64_t{c} * n, n};
        if (const ErrorCode failed = FilteredSums<Code>(samples, h, rhythm, sumOf, L, 0, regular,
                                                        count, y + int64_t{c} * count))
            return failed;
        samples.keepNewest(kept, inHand - first);
    }
    *stateCount = static_cast<int32_t>(inHand - first);
    *offset = static_cast<int32_t>(next - first * L);
    return 0;
}

template ErrorCode RationalResample<ElementType::DBL>(const RationalStream &, const DBL *, int32_t,
                                                      int32_t, DBL *, DBL *, int32_t);
template ErrorCode RationalResample<ElementType::CDB>(const RationalStream &, const CDB *, int32_t,
                                                      int32_t, CDB *, CDB *, int32_t);

} // namespace qx
