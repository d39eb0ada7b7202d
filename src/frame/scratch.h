#ifndef QX_FRAME_SCRATCH_H
#define QX_FRAME_SCRATCH_H

#include "frame/elements.h"
#include "frame/views.h"
#include "qx/errors.h"

#include <array>
#include <cstdint>
#include <limits>
#include <utility>

namespace qx {

// The single front end of all temporary memory. A request is served by the analysis workspace while
// that is enabled, otherwise by the heap. Every block records its source, so it is returned there
// whatever has changed since. Blocks may start at any byte and are not cleared.

// 0, or ErrOutOfMemory with *block null.
ErrorCode ScratchAlloc(void **block, int32_t size);
ErrorCode ScratchAlloc(void **block, int32_t size, int32_t ignored);
// The block, or null.
void *ScratchAllocPointer(int32_t size);
// Always 0; null is allowed.
ErrorCode ScratchFree(void *block);
// 0, or ErrOutOfMemory. Size 0 frees and sets *block to null; a null *block allocates. After a
// failure *block is unchanged and still valid, unless it lies in the workspace: then its memory has
// been released.
ErrorCode ScratchRealloc(void **block, int32_t size);
ErrorCode ScratchRealloc(void **block, int32_t size, int32_t ignored);

// The same, but any failure frees the block and sets *block to null.
ErrorCode ScratchReallocOrFree(void **block, int32_t size);

// Called at process attach: from here on the table of heap functions serves what the workspace does
// not. Blocks allocated earlier are returned to where they came from.
void AttachScratchHeap();

// How the status of a clean-up is merged: a failure is kept, a failed clean-up replaces success and
// warnings, a positive clean-up status replaces success only.
inline ErrorCode Merge(ErrorCode status, ErrorCode cleanUp) {
    const bool replaces = status == 0 || (status > 0 && cleanUp < 0);
    return replaces ? cleanUp : status;
}

// The bytes of `count` elements of `size`, or -1 if no host block can hold them.
inline int64_t BytesOf(int64_t count, std::size_t size) {
    const int64_t limit = std::numeric_limits<int32_t>::max() / static_cast<int64_t>(size);
    return count < 0 || count > limit ? -1 : count * static_cast<int64_t>(size);
}

// A scratch block of bytes that is freed at the end of the scope, or by the object to which it is
// moved.
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

    // Takes `bytes`; a size that does not fit into int32 is a failure like any other.
    ErrorCode allocate(int64_t bytes) {
        release();
        if (bytes < 0 || bytes > std::numeric_limits<int32_t>::max())
            return ErrOutOfMemory;
        return ScratchAlloc(&block_, static_cast<int32_t>(bytes));
    }

    // Changes the size and keeps what fits; an empty block is allocated. A failure frees the block.
    ErrorCode resize(int64_t bytes) {
        if (bytes < 0 || bytes > std::numeric_limits<int32_t>::max()) {
            release();
            return ErrOutOfMemory;
        }
        return ScratchReallocOrFree(&block_, static_cast<int32_t>(bytes));
    }

    // Frees the block early; the status is meant for Merge.
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
    static int64_t bytesOf(int64_t count) { return BytesOf(count, sizeof(T)); }

    ScratchBytes block_;
};

// Takes several blocks with one statement that gives the size and the place of each:
//     RealVector weights;
//     ComplexMatrix factors;
//     I32 *pivots;
//     ScratchParts memory;
//     if (const ErrorCode failed =
//             memory.take(Sized(weights, n), Sized(factors, n, n), Sized(pivots, n)))
//         return failed;
// The parts live as long as `memory`, or until it takes others. They start at multiples of 8 bytes
// from the start of a block, which may start at any byte.

// A view or a pointer that is to receive memory; `bytes` is negative if no block can hold it.
template <class Place>
struct ScratchPart {
    Place place;
    int64_t bytes;
};

template <ElementType E>
auto Sized(VectorView<E> &view, int64_t count) {
    typedef typename VectorView<E>::T T;
    const auto place = [&view, count](void *at) {
        view = VectorView<E>(static_cast<T *>(at), static_cast<std::ptrdiff_t>(count));
    };
    return ScratchPart<decltype(place)>{place, BytesOf(count, sizeof(T))};
}
template <ElementType E>
auto Sized(MatrixView<E> &view, int32_t rows, int32_t cols) {
    typedef typename MatrixView<E>::T T;
    const auto place = [&view, rows, cols](void *at) {
        view = MatrixView<E>(static_cast<T *>(at), rows, cols);
    };
    return ScratchPart<decltype(place)>{place, BytesOf(int64_t{rows} * cols, sizeof(T))};
}
template <class T>
auto Sized(T *&pointer, int64_t count) {
    const auto place = [&pointer](void *at) { pointer = static_cast<T *>(at); };
    return ScratchPart<decltype(place)>{place, BytesOf(count, sizeof(T))};
}

class ScratchParts {
public:
    ScratchParts() = default;
    ScratchParts(const ScratchParts &) = delete;
    ScratchParts &operator=(const ScratchParts &) = delete;
    ~ScratchParts() {
        if (last_ != nullptr)
            release();
    }

    // On ErrOutOfMemory nothing is taken and no place is set.
    template <class... Places>
    ErrorCode take(const ScratchPart<Places> &...parts) {
        if (last_ != nullptr)
            release();
        if (((parts.bytes < 0) || ...))
            return ErrOutOfMemory;
        if ((wholeWords(parts.bytes) + ...) > sharedUpTo)
            return takeApart(parts...);
        void *block;
        if (const ErrorCode failed = takeBlock((wholeWords(parts.bytes) + ...), &block))
            return failed;
        char *at = static_cast<char *>(block);
        ((parts.place(at), at += wholeWords(parts.bytes)), ...);
        return 0;
    }

    // Frees all parts early; the status is meant for Merge.
    ErrorCode release();

private:
    // Parts that fit into eight mebibytes together share a block: a heap may return the pages of
    // the last of several large blocks to the system at each release, and getting new pages costs
    // more than most routines do with them. Larger parts have a block each, so that the largest
    // contiguous block needed is that of the largest part.
    static constexpr int64_t sharedUpTo = int64_t{1} << 23;
    static int64_t wholeWords(int64_t bytes) { return (bytes + 7) / 8 * 8; }
    template <class... Places>
    ErrorCode takeApart(const ScratchPart<Places> &...parts) {
        std::array<void *, sizeof...(parts)> places;
        std::size_t at = 0;
        if (!((takeBlock(parts.bytes, &places[at++]) == 0) && ...)) {
            release();
            return ErrOutOfMemory;
        }
        at = 0;
        (parts.place(places[at++]), ...);
        return 0;
    }
    // Returns 0 or ErrOutOfMemory.
    ErrorCode takeBlock(int64_t bytes, void **block);

    void *last_ = nullptr; // each block starts with the address of the previous one
};

} // namespace qx

#endif
