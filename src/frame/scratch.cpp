#include "frame/scratch.h"

#include "frame/workspace.h"

#include <algorithm>
#include <cstdlib>
#include <cstring>

namespace qx {

namespace {

enum Mode : int32_t { TableHeap = 1, Workspace = 2, PlainHeap = 3 };

// Stored directly before the pointer that the caller gets.
struct FrontHeader {
    I32 totalSize; // of header and payload, as first requested
    I32 mode;      // where the block came from
};
constexpr int32_t frontSize = sizeof(FrontHeader);
static_assert(frontSize == 8);

struct HeapTable {
    void *(*allocate)(std::size_t);
    void *(*reallocate)(void *, std::size_t);
    void (*release)(void *);
};

// Empty until process attach. Static initialisers that run before it get blocks from the plain
// heap, and these are returned there.
HeapTable heapTable;
std::atomic<int32_t> defaultMode = 0;

Mode DefaultMode() {
    int32_t mode = defaultMode.load(std::memory_order_relaxed);
    if (mode == 0) {
        mode = PlainHeap;
        defaultMode.store(mode, std::memory_order_relaxed);
    }
    return static_cast<Mode>(mode);
}

Mode ModeOfNewBlock() { return analysisWorkspace.isEnabled() ? Workspace : DefaultMode(); }

bool IsTooLarge(int32_t size) {
    return size < 0 || size > std::numeric_limits<int32_t>::max() - frontSize;
}

// A block from the mode's source, or null. If the region was given back after the mode was chosen,
// the block comes from the heap.
void *TakeFrom(Mode &mode, int32_t total) {
    if (mode == Workspace) {
        // The caller sees exhaustion as a null pointer, like every other failure.
        void *payload;
        if (analysisWorkspace.allocate(total, &payload) != ErrWorkspaceNotInitialized)
            return payload;
        mode = DefaultMode();
    }
    const auto bytes = static_cast<std::size_t>(total);
    return mode == TableHeap ? heapTable.allocate(bytes) : std::malloc(bytes);
}

void GiveBackTo(int32_t mode, void *front) {
    if (mode == TableHeap)
        heapTable.release(front);
    else if (mode == Workspace)
        analysisWorkspace.release(front);
    else
        std::free(front);
}

FrontHeader *HeaderOf(void *block) { return static_cast<FrontHeader *>(block) - 1; }

// Resizes within the block's own source; null on failure. The region has then already released the
// old block.
FrontHeader *ResizeInPlace(FrontHeader *front, int32_t mode, int32_t total) {
    if (mode == Workspace) {
        void *payload = front;
        analysisWorkspace.resize(&payload, total);
        return static_cast<FrontHeader *>(payload);
    }
    // A block that would shrink keeps its size, so that it is never smaller than totalSize.
    if (total <= front->totalSize)
        return front;
    const auto bytes = static_cast<std::size_t>(total);
    void *grown =
        mode == TableHeap ? heapTable.reallocate(front, bytes) : std::realloc(front, bytes);
    return static_cast<FrontHeader *>(grown);
}

} // namespace

void AttachScratchHeap() {
    heapTable = {std::malloc, std::realloc, std::free};
    defaultMode.store(TableHeap, std::memory_order_relaxed);
}

ErrorCode ScratchAlloc(void **block, int32_t size) {
    *block = nullptr;
    if (IsTooLarge(size))
        return ErrOutOfMemory;
    Mode mode = ModeOfNewBlock();
    const int32_t total = size + frontSize;
    auto *front = static_cast<FrontHeader *>(TakeFrom(mode, total));
    if (front == nullptr)
        return ErrOutOfMemory;
    *front = {total, mode};
    *block = front + 1;
    return 0;
}

ErrorCode ScratchAlloc(void **block, int32_t size, int32_t) { return ScratchAlloc(block, size); }

void *ScratchAllocPointer(int32_t size) {
    void *block;
    ScratchAlloc(&block, size);
    return block;
}

ErrorCode ScratchFree(void *block) {
    if (block != nullptr)
        GiveBackTo(HeaderOf(block)->mode, HeaderOf(block));
    return 0;
}

namespace {

// Sets *isLost to whether a failure has released the old block.
ErrorCode Reallocate(void **block, int32_t size, bool *isLost) {
    *isLost = false;
    if (size == 0) {
        ScratchFree(*block);
        *block = nullptr;
        return 0;
    }
    if (*block == nullptr)
        return ScratchAlloc(block, size);
    if (IsTooLarge(size))
        return ErrOutOfMemory;

    FrontHeader *front = HeaderOf(*block);
    const FrontHeader old = *front;
    const Mode mode = ModeOfNewBlock();
    const int32_t total = size + frontSize;
    if (mode == old.mode) {
        FrontHeader *resized = ResizeInPlace(front, mode, total);
        if (resized == nullptr) {
            *isLost = mode == Workspace;
            return ErrOutOfMemory;
        }
        // kept: totalSize remains that of the first request, so a later move to another source
        // copies no more than that.
        *resized = old;
        *block = resized + 1;
        return 0;
    }

    void *moved;
    if (const ErrorCode status = ScratchAlloc(&moved, size))
        return status;
    const int32_t oldTotal = old.totalSize; // a reference would drop the alignment attribute
    std::memcpy(moved, *block, static_cast<std::size_t>(std::min(oldTotal, total) - frontSize));
    GiveBackTo(old.mode, front);
    *block = moved;
    return 0;
}

} // namespace

ErrorCode ScratchRealloc(void **block, int32_t size) {
    bool isLost;
    return Reallocate(block, size, &isLost);
}

ErrorCode ScratchReallocOrFree(void **block, int32_t size) {
    bool isLost;
    const ErrorCode status = Reallocate(block, size, &isLost);
    if (status == 0)
        return 0;
    if (!isLost)
        ScratchFree(*block);
    *block = nullptr;
    return status;
}

ErrorCode ScratchRealloc(void **block, int32_t size, int32_t) {
    return ScratchRealloc(block, size);
}

ErrorCode ScratchParts::takeBlock(int64_t bytes, void **block) {
    bytes += static_cast<int64_t>(sizeof last_);
    if (bytes > std::numeric_limits<int32_t>::max())
        return ErrOutOfMemory;
    void *taken;
    if (const ErrorCode failed = ScratchAlloc(&taken, static_cast<int32_t>(bytes)))
        return failed;
    std::memcpy(taken, &last_, sizeof last_);
    last_ = taken;
    *block = static_cast<char *>(taken) + sizeof last_;
    return 0;
}

ErrorCode ScratchParts::release() {
    ErrorCode status = 0;
    while (last_ != nullptr) {
        void *const block = last_;
        std::memcpy(&last_, block, sizeof last_);
        status = Merge(status, ScratchFree(block));
    }
    return status;
}

} // namespace qx
