#ifndef QX_FRAME_HEAP_BLOCK_H
#define QX_FRAME_HEAP_BLOCK_H

#include "frame/elements.h"
#include "qx/errors.h"

#include <cstddef>
#include <cstdint>
#include <cstdlib>
#include <limits>

namespace qx {

// Elements allocated directly on the heap and freed at the end of the scope, for work memory that
// the analysis workspace never serves. Unlike a scratch block, it may exceed the range of int32.
template <ElementType Code>
class HeapBlock {
public:
    typedef typename Element<Code>::type T;

    HeapBlock() = default;
    ~HeapBlock() {
        if (block_)
            std::free(block_);
    }
    HeapBlock(const HeapBlock &) = delete;
    HeapBlock &operator=(const HeapBlock &) = delete;

    ErrorCode allocate(int64_t count) {
        return take(count, [](std::size_t n) { return std::malloc(n * sizeof(T)); });
    }
    ErrorCode allocateCleared(int64_t count) {
        return take(count, [](std::size_t n) { return std::calloc(n, sizeof(T)); });
    }

    T *data() const { return static_cast<T *>(block_); }
    T &operator[](std::ptrdiff_t i) const { return data()[i]; }

private:
    template <class Allocate>
    ErrorCode take(int64_t count, Allocate allocateElements) {
        constexpr int64_t limit = std::numeric_limits<std::ptrdiff_t>::max() / int64_t{sizeof(T)};
        std::free(block_);
        block_ = nullptr;
        if (count < 0 || count > limit)
            return ErrOutOfMemory;
        // At least one element, so that null always means failure.
        block_ = allocateElements(count > 0 ? static_cast<std::size_t>(count) : 1);
        return block_ ? 0 : ErrOutOfMemory;
    }

    void *block_ = nullptr;
};

} // namespace qx

#endif
