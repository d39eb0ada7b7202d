#ifndef QX_TRANSFORMS_PADDED_INPUT_H
#define QX_TRANSFORMS_PADDED_INPUT_H

#include "frame/heap_block.h"
#include "frame/views.h"
#include "qx/errors.h"

#include <cstdint>

namespace qx {

// The first n values of an input: the input itself if it is long enough, else a heap copy with zeros
// after its end.
struct PaddedInput {
    const DBL *data;
    HeapBlock<ElementType::DBL> copy;

    ErrorCode take(ConstRealVector in, int32_t n) {
        data = in.data();
        if (n <= in.size())
            return 0;
        if (const ErrorCode failed = copy.allocateCleared(n))
            return failed;
        for (std::ptrdiff_t j = 0; j < in.size(); ++j)
            copy[j] = in[j];
        data = copy.data();
        return 0;
    }
};

} // namespace qx

#endif
