#ifndef QX_LINALG_ALIGNED_H
#define QX_LINALG_ALIGNED_H

#include "frame/scratch.h"

#include <cstdint>

namespace qx {

// A part of scratch memory that begins at a multiple of 64 bytes, for LAPACK: its compiled code may
// rely on the alignment of its elements, which scratch memory does not guarantee.
//     memory.take(Aligned(Sized(band, rows, n)), Aligned(Sized(pivots, n)))
template <class Place>
auto Aligned(const ScratchPart<Place> &part) {
    constexpr std::uintptr_t alignment = 64;
    const auto place = [given = part.place](void *at) {
        const auto address = reinterpret_cast<std::uintptr_t>(at);
        given(reinterpret_cast<void *>((address + alignment - 1) & ~(alignment - 1)));
    };
    const int64_t bytes = part.bytes < 0 ? part.bytes : part.bytes + int64_t{alignment} - 1;
    return ScratchPart<decltype(place)>{place, bytes};
}

} // namespace qx

#endif
