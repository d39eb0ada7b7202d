#include "filters/zero_phase.h"

#include "filters/direct_form.h"
#include "frame/scratch.h"

#include <algorithm>
#include <cstddef>
#include <cstring>
#include <limits>

namespace qx {
namespace {

// The two passes over a padded copy; pass(values, count, state) filters in place.
template <class State, class Pass>
ErrorCode ThereAndBack(DBL *x, int32_t n, int64_t pad, State forward, State backward, Pass pass) {
    const int64_t count = n + 2 * pad;
    Scratch<ElementType::DBL> memory;
    if (count > std::numeric_limits<int32_t>::max())
        return ErrOutOfMemory;
    if (const ErrorCode failed = memory.allocate(count))
        return failed;
    DBL *const padded = memory.data();
    DBL *const middle = padded + pad;
    const std::size_t size = sizeof(DBL) * static_cast<std::size_t>(n);
    Fill(padded, static_cast<std::ptrdiff_t>(pad), 0.0);
    std::memcpy(middle, x, size);
    Fill(middle + n, static_cast<std::ptrdiff_t>(pad), 0.0);
    for (const State state : {forward, backward}) {
        if (const ErrorCode failed = pass(padded, static_cast<int32_t>(count), state))
            return failed;
        Reverse(padded, static_cast<std::ptrdiff_t>(count));
    }
    std::memcpy(x, middle, size);
    return memory.release();
}

// The length of a section's response as its coefficients tell it: all of them, or without the upper
// half where that is zero.
int64_t ResponseLength(const DBL *coefficients, int32_t order, int64_t base) {
    const int32_t half = order / 2;
    for (int32_t k = 0; k < half; ++k)
        if (coefficients[-k] != 0.0)
            return base + half;
    return base;
}

} // namespace

ErrorCode ZeroPhaseDirect(const DBL *a, int32_t na, const DBL *b, int32_t nb,
                          DirectPassState forward, DirectPassState backward, DBL *x, int32_t n) {
    typedef DirectForm<ElementType::DBL, ElementType::DBL> Filter;
    return ThereAndBack(x, n, std::max(na, nb), forward, backward,
                        [=](DBL *values, int32_t count, DirectPassState state) {
                            return na < 1 ? Filter::fir(b, nb, values, count, state.x, values)
                                          : Filter::iir(b, nb, state.x, a, na, state.y, values,
                                                        count, values);
                        });
}

ErrorCode ZeroPhaseCascade(const CascadeCoefficients &filter, DBL *forward, DBL *backward, DBL *x,
                           int32_t n) {
    const int32_t order = SectionOrder(filter.form);
    if (order == 0)
        return ErrInvalidSelector;
    if (filter.aCount < order || filter.bCount < order + 1)
        return ErrCoefficientSizes;
    // By the upper coefficients of the first section.
    const int64_t base = int64_t{filter.aCount} / order * order - order / 2;
    const int64_t pad = std::max(ResponseLength(filter.a + (order - 1), order, base),
                                 ResponseLength(filter.b + order, order, base)) +
                        1;
    struct State {
        DBL *values;
    };
    return ThereAndBack(
        x, n, pad, State{forward}, State{backward}, [&](DBL *values, int32_t count, State state) {
            return FilterIIRCascade(filter, state.values, filter.aCount, values, count);
        });
}

} // namespace qx
