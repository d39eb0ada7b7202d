#include "frame/widths.h"

#include <cstdlib>
#include <cstring>

namespace qx {

int32_t lanesInUse = 2;

#ifdef QX_HAS_AVX2_BUILD
namespace {

bool BaselineIsForced() {
    const char *const width = std::getenv("QX_WIDTH");
    return width != nullptr && std::strcmp(width, "2") == 0;
}

} // namespace

// Looks at the processor and at which registers the operating system saves.
__attribute__((constructor(101))) static void ChooseWidth() {
    __builtin_cpu_init();
    if (__builtin_cpu_supports("avx2") && !BaselineIsForced())
        lanesInUse = 4;
}
#endif

} // namespace qx
