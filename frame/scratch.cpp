#include "frame/scratch.h"

#include <cstdlib>

namespace qx {

ErrorCode ScratchAlloc(void **block, int32_t size) {
    *block = std::malloc(static_cast<std::size_t>(size));
    return *block != nullptr ? 0 : ErrOutOfMemory;
}
ErrorCode ScratchAlloc(void **block, int32_t size, int32_t) { return ScratchAlloc(block, size); }
void *ScratchAllocPointer(int32_t size) { return std::malloc(static_cast<std::size_t>(size)); }
ErrorCode ScratchFree(void *block) {
    std::free(block);
    return 0;
}
ErrorCode ScratchRealloc(void **block, int32_t size) {
    *block = std::realloc(*block, static_cast<std::size_t>(size));
    return 0;
}
void *RawAlloc(int32_t size, int32_t) { return std::malloc(static_cast<std::size_t>(size)); }
void RawFree(void *block) { std::free(block); }

} // namespace qx
