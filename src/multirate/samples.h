#ifndef QX_MULTIRATE_SAMPLES_H
#define QX_MULTIRATE_SAMPLES_H

#include "frame/elements.h"

#include <algorithm>
#include <cstdint>
#include <cstring>

namespace qx {

// A sample type as reals: filters with real taps treat both parts of a complex sample alike.
template <ElementType Code>
struct SampleParts {
    static constexpr ElementType real = Code;
    static constexpr int count = 1;
};
template <>
struct SampleParts<ElementType::CSG> {
    static constexpr ElementType real = ElementType::SGL;
    static constexpr int count = 2;
};
template <>
struct SampleParts<ElementType::CDB> {
    static constexpr ElementType real = ElementType::DBL;
    static constexpr int count = 2;
};
template <ElementType Code>
using RealOf = typename Element<SampleParts<Code>::real>::type;

template <ElementType Code>
RealOf<Code> *Reals(typename Element<Code>::type *samples) {
    return reinterpret_cast<RealOf<Code> *>(samples);
}
template <ElementType Code>
const RealOf<Code> *Reals(const typename Element<Code>::type *samples) {
    return reinterpret_cast<const RealOf<Code> *>(samples);
}

template <ElementType Code>
void CopySamples(typename Element<Code>::type *to, const typename Element<Code>::type *from,
                 int64_t count) {
    if (count > 0)
        std::memmove(to, from, static_cast<std::size_t>(count) * sizeof *to);
}
template <ElementType Code>
void ClearSamples(typename Element<Code>::type *samples, int64_t count) {
    if (count > 0)
        std::memset(samples, 0, static_cast<std::size_t>(count) * sizeof *samples);
}

// `value` modulo `modulus`, in 0 to modulus - 1.
inline int32_t Modulo(int64_t value, int32_t modulus) {
    return static_cast<int32_t>((value % modulus + modulus) % modulus);
}

// The available samples of a stream, oldest first: those kept in its state, then the block.
template <ElementType Code>
struct Samples {
    typedef typename Element<Code>::type T;

    const T *kept;
    int32_t keptCount;
    const T *block;
    int32_t blockCount;

    int64_t count() const { return int64_t{keptCount} + blockCount; }
    const T *at(int64_t i) const { return i < keptCount ? kept + i : block + (i - keptCount); }

    // to[i] = sample first + i stride, for i below `number`.
    void gather(int64_t first, int64_t stride, int64_t number, T *to) const {
        int64_t i = 0;
        for (; i < number && first < keptCount; ++i, first += stride)
            to[i] = kept[first];
        if (stride == 1) {
            CopySamples<Code>(to + i, block + (first - keptCount), number - i);
        } else {
            const T *from = block + (first - keptCount);
            const int64_t left = number - i;
            if (stride == 2) // known to the compiler, this stride becomes shuffles
                for (int64_t k = 0; k < left; ++k)
                    to[i + k] = from[2 * k];
            else
                for (int64_t k = 0; k < left; ++k)
                    to[i + k] = from[k * stride];
        }
    }

    // Stores the `number` newest samples in `state`, which may overlap the kept samples.
    void keepNewest(T *state, int64_t number) const {
        const int64_t fromBlock = std::min<int64_t>(number, blockCount);
        const int64_t fromKept = number - fromBlock;
        CopySamples<Code>(state, kept + (keptCount - fromKept), fromKept);
        CopySamples<Code>(state + fromKept, block + (blockCount - fromBlock), fromBlock);
    }
};

} // namespace qx

#endif
