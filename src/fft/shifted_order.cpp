#include "fft/shifted_order.h"

#include "frame/scratch.h"

#include <cstring>

namespace qx {

ErrorCode RotateToShifted(CDB *spectrum, int32_t n) {
    const std::size_t back = static_cast<std::size_t>(n / 2);
    const std::size_t front = static_cast<std::size_t>(n) - back;
    Scratch<ElementType::CDB> saved;
    if (const ErrorCode failed = saved.allocate(static_cast<int64_t>(front)))
        return failed;
    std::memcpy(saved.data(), spectrum, front * sizeof(CDB));
    std::memmove(spectrum, spectrum + front, back * sizeof(CDB));
    std::memcpy(spectrum + back, saved.data(), front * sizeof(CDB));
    return saved.release();
}

void RotateFromShifted(const CDB *shifted, int32_t n, CDB *plain) {
    const std::size_t front = static_cast<std::size_t>(n / 2);
    const std::size_t back = static_cast<std::size_t>(n) - front;
    std::memcpy(plain, shifted + front, back * sizeof(CDB));
    std::memcpy(plain + back, shifted, front * sizeof(CDB));
}

} // namespace qx
