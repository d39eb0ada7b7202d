#ifndef QX_FRAME_SCRATCH_H
#define QX_FRAME_SCRATCH_H

#include "frame/elements.h"
#include "qx/errors.h"

#include <cstdint>
#include <limits>
#include <utility>

namespace qx {

// The one front of all temporary memory. A request is served by the analysis workspace while
// that is enabled, else by the heap; every block remembers its source, so it is given back
// correctly whatever has changed since. Blocks may start at any byte and are not cleared.

// 0, or ErrOutOfMemory with *block null.
ErrorCode ScratchAlloc(void **block, int32_t size);
ErrorCode ScratchAlloc(void **block, int32_t size, int32_t ignored);
// The block, or null.
void *ScratchAllocPointer(int32_t size);
// Always 0; null is allowed.
ErrorCode ScratchFree(void *block);
// 0, or ErrOutOfMemory. Size 0 frees and sets *block to null; a null *block allocates. A failure
// leaves *block alone, and its memory too, unless that lies in the workspace: then it is lost.
ErrorCode ScratchRealloc(void **block, int32_t size);
ErrorCode ScratchRealloc(void **block, int32_t size, int32_t ignored);

// The same where a failure frees the block in any case and sets *block to null.
ErrorCode ScratchReallocOrFree(void **block, int32_t size);

// Straight from the heap, with no header. The alignment is ignored.
void *RawAlloc(int32_t size, int32_t alignment);
void RawFree(void *block);

// At process attach: from here on the table of heap functions serves what the workspace does
// not. Blocks taken earlier go back to where they came from.
void AttachScratchHeap();

// The rule for a clean-up status: a failure stands, a failing clean-up replaces success and
// warnings, a positive clean-up status replaces success only.
inline ErrorCode Merge(ErrorCode status, ErrorCode cleanUp) {
    const bool replaces = status == 0 || (status > 0 && cleanUp < 0);
    return replaces ? cleanUp : status;
}

// A scratch block of bytes that is given back with the scope, or by whom it is moved to.
class ScratchBytes {
public:
    ScratchBytes() = default;
    ~ScratchBytes() {
        if (block_ != nullptr)
            ScratchFree(block_);
    }
    ScratchBytes(ScratchBytes &&other) noexcept : block_(std::exchange(other.block_, nullptr)) {}
    ScratchBytes &operator=(ScratchBytes &&other) noexcept {
        void *const taken = std::exchange(other.block_, nullptr);
        ScratchFree(std::exchange(block_, taken));
        return *this;
    }

    // Takes `bytes`; a size that int32 cannot hold is a failure like any other.
    ErrorCode allocate(int64_t bytes) {
        release();
        if (bytes < 0 || bytes > std::numeric_limits<int32_t>::max())
            return ErrOutOfMemory;
        return ScratchAlloc(&block_, static_cast<int32_t>(bytes));
    }

    // Changes the size and keeps what fits; grows from nothing, too. A failure gives the block up.
    ErrorCode resize(int64_t bytes) {
        if (bytes < 0 || bytes > std::numeric_limits<int32_t>::max()) {
            release();
            return ErrOutOfMemory;
        }
        return ScratchReallocOrFree(&block_, static_cast<int32_t>(bytes));
    }

    // Gives the block back early; the status is meant for Merge.
    ErrorCode release() {
        void *block = block_;
        block_ = nullptr;
        return ScratchFree(block);
    }

    void *bytes() const { return block_; }

private:
    void *block_ = nullptr;
};

// A scratch block of `count` elements: Scratch<ElementType::DBL> work; work.allocate(n);
template <ElementType Code>
class Scratch {
public:
    typedef typename Element<Code>::type T;

    ErrorCode allocate(int64_t count) { return block_.allocate(bytesOf(count)); }
    ErrorCode resize(int64_t count) { return block_.resize(bytesOf(count)); }
    ErrorCode release() { return block_.release(); }

    T *data() const { return static_cast<T *>(block_.bytes()); }
    T &operator[](std::ptrdiff_t i) const { return data()[i]; }

private:
    // Too many count as a size that cannot be had.
    static int64_t bytesOf(int64_t count) {
        constexpr int64_t limit = std::numeric_limits<int32_t>::max() / int64_t{sizeof(T)};
        return count < 0 || count > limit ? -1 : count * int64_t{sizeof(T)};
    }

    ScratchBytes block_;
};

} // namespace qx

#endif
