#ifndef QX_UTIL_SHUFFLE_H
#define QX_UTIL_SHUFFLE_H

#include "frame/elements.h"
#include "signal/random.h"

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
        // kept: every element changes places with any, which is biased.
        for (int32_t i = 0; i < n; ++i)
            exchange(i, static_cast<int32_t>(stream.next() * n));
    }
}

} // namespace qx

#endif
