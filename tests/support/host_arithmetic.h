#ifndef QX_TESTS_HOST_ARITHMETIC_H
#define QX_TESTS_HOST_ARITHMETIC_H

#include <cstdint>

namespace qx::test {

// Modes of the floating-point unit, as stored in a control register. On x86 they imply modes of the
// x87 unit: a precision of 24 bits and the same rounding.
typedef uint32_t ArithmeticModes;
struct NamedModes {
    const char *name;
    ArithmeticModes modes;
};
#if defined(__x86_64__) || defined(__i386__)
inline constexpr ArithmeticModes usualArithmetic = 0x1f80, relevantModes = 0xffc0;
inline constexpr NamedModes modesOfHosts[] = {
    {"rounding upward", 0x5f80},
    {"rounding downward", 0x3f80},
    {"rounding toward zero", 0x7f80},
    {"subnormal numbers as zero", 0x9fc0},
    {"exceptions unmasked: invalid, division by zero, overflow", 0x1900},
};
#elif defined(__aarch64__)
inline constexpr ArithmeticModes usualArithmetic = 0, relevantModes = 0x03c00000;
inline constexpr NamedModes modesOfHosts[] = {
    {"rounding upward", 1U << 22},
    {"rounding downward", 2U << 22},
    {"rounding toward zero", 3U << 22},
    {"subnormal numbers as zero", 1U << 24},
};
#endif

inline ArithmeticModes CurrentArithmetic() {
    ArithmeticModes modes;
#if defined(__x86_64__) || defined(__i386__)
    __asm__ volatile("stmxcsr %0" : "=m"(modes)::"memory");
#elif defined(__aarch64__)
    uint64_t all;
    __asm__ volatile("mrs %0, fpcr" : "=r"(all)::"memory");
    modes = static_cast<ArithmeticModes>(all);
#endif
    return modes & relevantModes;
}

__attribute__((noinline)) inline void SetArithmetic(ArithmeticModes modes) {
#if defined(__x86_64__) || defined(__i386__)
    const uint16_t x87 =
        modes == usualArithmetic ? 0x037f : static_cast<uint16_t>(0x007f | (modes >> 3 & 0x0c00));
    __asm__ volatile("ldmxcsr %0\n\tfldcw %1" ::"m"(modes), "m"(x87) : "memory");
#elif defined(__aarch64__)
    const uint64_t all = modes;
    __asm__ volatile("msr fpcr, %0" ::"r"(all) : "memory");
#endif
}

// Sets the modes during its lifetime.
class InArithmetic {
public:
    // If the modes are already set, nothing is written, and the x87 unit keeps its precision.
    explicit InArithmetic(ArithmeticModes modes)
        : before_(CurrentArithmetic()), isAnother_(before_ != modes) {
        if (isAnother_)
            SetArithmetic(modes);
    }
    ~InArithmetic() {
        if (isAnother_)
            SetArithmetic(before_);
    }
    InArithmetic(const InArithmetic &) = delete;
    InArithmetic &operator=(const InArithmetic &) = delete;

private:
    const ArithmeticModes before_;
    const bool isAnother_;
};

} // namespace qx::test

#endif
