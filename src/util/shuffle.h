#ifndef QX_UTIL_SHUFFLE_H
#define QX_UTIL_SHUFFLE_H

#include "frame/elements.h"
#include "signal/counter_noise.h"
#include "signal/random.h"

#include <algorithm>

#include <cstdint>

namespace qx {

// Calls exchange(i, j) for the pairs of a shuffle of n elements.
template <class Exchange>
void Shuffle(int32_t n, bool isUnbiased, RandomState &state, const Exchange &exchange) {
    RandomStream stream(state, n);
    if (isUnbiased) {
        for (int32_t i = n - 1; i > 0; --i)
            exchange(i, static_cast<int32_t>(stream.next() * (i + 1.0)));
    } else {
        // kept: each element is exchanged with any element, which is biased.
        for (int32_t i = 0; i < n; ++i)
            exchange(i, static_cast<int32_t>(stream.next() * n));
    }
}

// The same without bias, with a counter-based generator: element i, from the last down to 1, is
// exchanged with one of the elements 0 to i, which the block at position + i selects.
template <class Exchange>
void CounterShuffle(int32_t n, const NoisePlace &place, const Exchange &exchange) {
    constexpr int32_t atOnce = 256;
    uint64_t a[atOnce], b[atOnce];
    for (int32_t last = n - 1; last > 0;) {
        const int32_t first = std::max(1, last - atOnce + 1);
        NoisePlace piece = place;
        piece.position += static_cast<uint64_t>(first);
        PhiloxBlocks(piece, 0, last - first + 1, a, b);
        for (int32_t i = last; i >= first; --i) {
            const auto count = static_cast<uint32_t>(i) + 1;
            const uint32_t j = CounterIndex(a[i - first], count, place, static_cast<uint64_t>(i));
            exchange(i, static_cast<int32_t>(j));
        }
        last = first - 1;
    }
}

} // namespace qx

#endif
