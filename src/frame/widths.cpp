#include "frame/widths.h"

#include <cstdlib>
#include <cstring>

namespace qx {

int32_t lanesInUse = 2;

#ifdef QX_HAS_AVX2_BUILD
namespace {

// The largest number of lanes that the environment allows.
int32_t MostLanes() {
    const char *const width = std::getenv("QX_WIDTH");
    if (width != nullptr && (std::strcmp(width, "2") == 0 || std::strcmp(width, "4") == 0))
        return *width - '0';
    return 8;
}

} // namespace

// Checks the processor and which registers the operating system saves.
__attribute__((constructor(101))) static void ChooseWidth() {
    __builtin_cpu_init();
    const int32_t most = MostLanes();
    if (__builtin_cpu_supports("avx2") && most >= 4)
        lanesInUse = 4;
#ifdef QX_HAS_EIGHT_LANES
    if (__builtin_cpu_supports("avx512f") && __builtin_cpu_supports("avx512dq") &&
        __builtin_cpu_supports("avx512bw") && __builtin_cpu_supports("avx512vl") && most >= 8)
        lanesInUse = 8;
#endif
}
#endif

} // namespace qx
