#include "filters/zero_phase.h"

#include "filters/direct_form.h"
#include "frame/scratch.h"

#include <algorithm>
#include <cstddef>
#include <cstring>
#include <limits>

namespace qx {
namespace {

// Both passes over a padded copy; pass(values, state) filters in place.
template <class State, class Pass>
ErrorCode ThereAndBack(RealVector x, int64_t pad, State forward, State backward, Pass pass) {
    const int64_t count = x.size() + 2 * pad;
    Scratch<ElementType::DBL> memory;
    if (count > std::numeric_limits<int32_t>::max())
        return ErrOutOfMemory;
    if (const ErrorCode failed = memory.allocate(count))
        return failed;
    const auto zeros = static_cast<std::ptrdiff_t>(pad);
    const RealVector padded(memory.data(), static_cast<std::ptrdiff_t>(count));
    DBL *const middle = padded.data() + zeros;
    const std::size_t size = sizeof(DBL) * static_cast<std::size_t>(x.size());
    Fill(padded.data(), zeros, 0.0);
    std::memcpy(middle, x.data(), size);
    Fill(middle + x.size(), zeros, 0.0);
    for (const State state : {forward, backward}) {
        if (const ErrorCode failed = pass(padded, state))
            return failed;
        Reverse(padded.data(), padded.size());
    }
    std::memcpy(x.data(), middle, size);
    return memory.release();
}

// The length of a section's response according to its coefficients: all of them, or all but the
// upper half if that is zero.
int64_t ResponseLength(const DBL *coefficients, int32_t order, int64_t base) {
    const int32_t half = order / 2;
    for (int32_t k = 0; k < half; ++k)
        if (coefficients[-k] != 0.0)
            return base + half;
    return base;
}

} // namespace

ErrorCode ZeroPhaseDirect(ConstRealVector a, ConstRealVector b, DirectPassState forward,
                          DirectPassState backward, RealVector x) {
    typedef DirectForm<ElementType::DBL, ElementType::DBL> Filter;
    return ThereAndBack(x, std::max(a.size(), b.size()), forward, backward,
                        [=](RealVector values, DirectPassState state) {
                            return a.isEmpty()
                                       ? Filter::fir(b, values, state.x, values)
                                       : Filter::iir(b, state.x, a, state.y, values, values);
                        });
}

ErrorCode ZeroPhaseCascade(const CascadeCoefficients &filter, RealVector forward,
                           RealVector backward, RealVector x) {
    const int32_t order = SectionOrder(filter.form);
    if (order == 0)
        return ErrInvalidSelector;
    if (filter.a.size() < order || filter.b.size() < order + 1)
        return ErrCoefficientSizes;
    // Based on the upper coefficients of the first section.
    const int64_t base = int64_t{filter.a.size()} / order * order - order / 2;
    const int64_t pad = std::max(ResponseLength(filter.a.data() + (order - 1), order, base),
                                 ResponseLength(filter.b.data() + order, order, base)) +
                        1;
    return ThereAndBack(x, pad, forward, backward, [&](RealVector values, RealVector state) {
        return FilterIIRCascade(filter, state, values);
    });
}

} // namespace qx
