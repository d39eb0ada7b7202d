#include "memory.h"
#include "qx/host.h"

#include <algorithm>
#include <atomic>
#include <cstddef>
#include <cstdint>
#include <cstdlib>
#include <cstring>

namespace {

// A block of memory, from the start: the address that malloc returned, unused bytes, this record,
// the dimension fields, and the elements at a multiple of `elementAlignment`.
struct Front {
    void *memory;
    std::size_t capacity; // bytes from the first dimension field on
    bool reserved;        // no bytes are freed before the array is
};

constexpr std::size_t elementAlignment = 64;
constexpr std::size_t shrinkAbove = 4096; // smaller blocks are never worth a move

std::size_t ElementSize(int32_t typeCode) {
    switch (typeCode) {
    case QXTypeU8:
        return 1;
    case QXTypeI32:
    case QXTypeU32:
    case QXTypeSGL:
        return 4;
    case QXTypeDBL:
    case QXTypeCSG:
        return 8;
    case QXTypeCDB:
        return 16;
    default:
        return 0;
    }
}

constexpr std::size_t FieldsSize(int32_t numDims) {
    return sizeof(int32_t) * static_cast<std::size_t>(numDims);
}

void Reserve(void *block) {
    Front front;
    std::memcpy(&front, static_cast<char *>(block) - sizeof front, sizeof front);
    front.reserved = true;
    std::memcpy(static_cast<char *>(block) - sizeof front, &front, sizeof front);
}

Front FrontOf(const void *block) {
    Front front;
    std::memcpy(&front, static_cast<const char *>(block) - sizeof front, sizeof front);
    return front;
}

// Large blocks are granted only if the machine has the memory: otherwise the system grants more
// than there is, and ends some program, or stalls, when the memory is touched. Memory that was
// granted but is not yet touched still counts as available to the system, so the sum of the large
// blocks is limited as well.
constexpr std::size_t largeFrom = std::size_t{256} << 20;
constexpr uint64_t partKept = 16; // share left for the work of the call and for others
std::atomic<std::size_t> largeBlocks{0};

bool TakeLarge(std::size_t size) {
    const qx::host::Memory memory = qx::host::PhysicalMemory();
    const uint64_t kept = memory.total / partKept;
    const uint64_t all = largeBlocks.fetch_add(size, std::memory_order_relaxed) + size;
    if (all <= memory.total - kept && size <= memory.available - std::min(kept, memory.available))
        return true;
    largeBlocks.fetch_sub(size, std::memory_order_relaxed);
    return false;
}

void GiveLarge(std::size_t size) { largeBlocks.fetch_sub(size, std::memory_order_relaxed); }

// The address of the dimension fields of a block of `count` elements, or null.
void *NewBlock(int32_t numDims, uint64_t count, std::size_t elementSize, bool cleared) {
    const std::size_t fields = FieldsSize(numDims);
    const std::size_t overhead = sizeof(Front) + fields + elementAlignment;
    if (count > (PTRDIFF_MAX - overhead) / elementSize)
        return nullptr;
    const std::size_t size = static_cast<std::size_t>(count) * elementSize;
    const bool isLarge = fields + size >= largeFrom;
    if (isLarge && !TakeLarge(fields + size))
        return nullptr;
    void *memory = cleared ? std::calloc(1, overhead + size) : std::malloc(overhead + size);
    if (memory == nullptr) {
        if (isLarge)
            GiveLarge(fields + size);
        return nullptr;
    }
    const auto start = reinterpret_cast<uintptr_t>(memory) + sizeof(Front) + fields;
    const uintptr_t elements = (start + elementAlignment - 1) / elementAlignment * elementAlignment;
    char *block =
        static_cast<char *>(memory) + (elements - fields) - reinterpret_cast<uintptr_t>(memory);
    const Front front = {memory, fields + size, false};
    std::memcpy(block - sizeof front, &front, sizeof front);
    return block;
}

void FreeBlock(void *block) {
    const Front front = FrontOf(block);
    std::free(front.memory);
    if (front.capacity >= largeFrom)
        GiveLarge(front.capacity);
}

void *NewArray(int32_t numDims, std::size_t elementSize, const int32_t *sizes,
               const void *elements) {
    uint64_t count = 1;
    for (int32_t i = 0; i < numDims; ++i) {
        if (sizes[i] < 0)
            return nullptr;
        count *= static_cast<uint64_t>(sizes[i]);
    }
    if (elementSize == 0 || count > INT32_MAX)
        return nullptr;
    void *block = NewBlock(numDims, count, elementSize, elements == nullptr);
    auto *handle = block != nullptr ? static_cast<void **>(std::malloc(sizeof(void *))) : nullptr;
    if (handle == nullptr) {
        if (block != nullptr)
            FreeBlock(block);
        return nullptr;
    }
    std::memcpy(block, sizes, FieldsSize(numDims));
    if (elements != nullptr && count > 0)
        std::memcpy(static_cast<char *>(block) + FieldsSize(numDims), elements,
                    static_cast<std::size_t>(count) * elementSize);
    *handle = block;
    return handle;
}

Array1DHandle New1D(std::size_t elementSize, int32_t count, const void *elements) {
    return static_cast<Array1DHandle>(NewArray(1, elementSize, &count, elements));
}

Array2DHandle New2D(std::size_t elementSize, int32_t rows, int32_t cols, const void *elements) {
    const int32_t sizes[2] = {rows, cols};
    return static_cast<Array2DHandle>(NewArray(2, elementSize, sizes, elements));
}

// The size of the dimension fields and of the elements that they count.
std::size_t UsedBytes(const void *block, int32_t numDims, std::size_t elementSize) {
    int32_t sizes[2] = {1, 1};
    std::memcpy(sizes, block, FieldsSize(numDims));
    const uint64_t count = sizes[0] < 0 || sizes[1] < 0
                               ? 0
                               : static_cast<uint64_t>(sizes[0]) * static_cast<uint64_t>(sizes[1]);
    const std::size_t capacity = FrontOf(block).capacity;
    const std::size_t room = (capacity - FieldsSize(numDims)) / elementSize;
    return FieldsSize(numDims) +
           static_cast<std::size_t>(std::min<uint64_t>(count, room)) * elementSize;
}

} // namespace

int32_t gQXRTVersion = 1;

void *QXHostNew1D(int32_t typeCode, int32_t count) {
    return New1D(ElementSize(typeCode), count, nullptr);
}

void *QXHostNew2D(int32_t typeCode, int32_t rows, int32_t cols) {
    return New2D(ElementSize(typeCode), rows, cols, nullptr);
}

void *QXHostCopy1D(int32_t typeCode, int32_t count, const void *elements) {
    return New1D(ElementSize(typeCode), count, elements);
}

void *QXHostCopy2D(int32_t typeCode, int32_t rows, int32_t cols, const void *elements) {
    return New2D(ElementSize(typeCode), rows, cols, elements);
}

void *QXHostCopy3D(int32_t typeCode, int32_t first, int32_t second, int32_t third,
                   const void *elements) {
    const int32_t sizes[3] = {first, second, third};
    return NewArray(3, ElementSize(typeCode), sizes, elements);
}

void *QXHostCopyRecords(int32_t recordSize, int32_t count, const void *records) {
    return New1D(recordSize > 0 ? static_cast<std::size_t>(recordSize) : 0, count, records);
}

void QXHostFree(void *handle) {
    if (handle == nullptr)
        return;
    FreeBlock(*static_cast<void **>(handle));
    std::free(handle);
}

int32_t QXHostReserve1D(void *array, int32_t typeCode, int32_t count) {
    const std::size_t elementSize = ElementSize(typeCode);
    if (elementSize == 0 || count < 0 || array == nullptr)
        return QXHostBadArgument;
    auto *const handle = static_cast<Array1DHandle>(array);
    if (FieldsSize(1) + static_cast<uint64_t>(count) * elementSize > FrontOf(*handle).capacity)
        if (const int32_t refused = HostBlockReshape(typeCode, 1, &array, count))
            return refused;
    Reserve(*handle);
    return QXHostDone;
}

int32_t HostBlockReshape(int32_t typeCode, int32_t numDims, void *handleAddress, int32_t count) {
    const std::size_t elementSize = ElementSize(typeCode);
    if (elementSize == 0 || count < 0 || numDims < 1 || numDims > 2 || handleAddress == nullptr)
        return QXHostBadArgument;
    void **handle = *static_cast<void ***>(handleAddress);
    if (handle == nullptr)
        return QXHostBadArgument;

    const auto wanted = static_cast<uint64_t>(count);
    const uint64_t size = FieldsSize(numDims) + wanted * elementSize;
    const Front front = FrontOf(*handle);
    const std::size_t capacity = front.capacity;
    const bool fits = size <= capacity;
    const std::size_t used = std::min<uint64_t>(UsedBytes(*handle, numDims, elementSize), size);
    void *moved = nullptr;
    if (!fits || (!front.reserved && capacity > shrinkAbove && size < capacity / 2))
        moved = NewBlock(numDims, wanted, elementSize, true);
    if (moved != nullptr) {
        std::memcpy(moved, *handle, used);
        FreeBlock(*handle);
        *handle = moved;
        if (front.reserved)
            Reserve(moved);
    } else if (fits)
        std::memset(static_cast<char *>(*handle) + used, 0, static_cast<std::size_t>(size) - used);
    return moved != nullptr || fits ? QXHostDone : QXHostNoMemory;
}
