#ifndef QX_TRANSFORMS_STRIDED_WINDOW_H
#define QX_TRANSFORMS_STRIDED_WINDOW_H

#include "frame/heap_block.h"
#include "qx/errors.h"
#include "qx/types.h"

#include <cstddef>
#include <cstdint>

namespace qx {

// The first n values of a strided input: the input itself where it is long enough, else a heap
// copy with zeros behind its end.
struct StridedWindow {
    const DBL *data;
    std::ptrdiff_t stride;
    HeapBlock<ElementType::DBL> copy;

    ErrorCode take(const DBL *in, int32_t inCount, int32_t inStride, int32_t n) {
        data = in;
        stride = inStride;
        if (n <= inCount)
            return 0;
        if (const ErrorCode failed = copy.allocateCleared(n))
            return failed;
        for (int32_t j = 0; j < inCount; ++j)
            copy[j] = in[j * stride];
        data = copy.data();
        stride = 1;
        return 0;
    }
};

} // namespace qx

#endif
