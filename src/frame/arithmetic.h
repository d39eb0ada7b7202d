#ifndef QX_FRAME_ARITHMETIC_H
#define QX_FRAME_ARITHMETIC_H

#include <cstdint>

namespace qx {

// The modes of the processor's floating-point unit belong to the calling thread, and hosts change
// them: another rounding mode, subnormal numbers read as zero or flushed to zero (which a library
// linked with fast-math does to its whole process), exceptions that raise a signal. While this
// object lives, the modes are those in which all results are defined: rounding to nearest, gradual
// underflow, all exceptions masked. Its destructor restores the caller's modes. The frame of every
// export holds one (frame/export.h). Where the modes are right already, it costs one read of a
// register: 3 ns on AMD's Zen 4.
//
// The state of the caller's exception flags after a call is unspecified.
class DefaultArithmetic {
public:
    __attribute__((always_inline)) DefaultArithmetic() : callers_(Read()) {
        if (__builtin_expect(IsAnother(callers_), 0))
            Write(byDefault);
    }
    __attribute__((always_inline)) ~DefaultArithmetic() {
        if (__builtin_expect(IsAnother(callers_), 0))
            Write(callers_);
    }
    DefaultArithmetic(const DefaultArithmetic &) = delete;
    DefaultArithmetic &operator=(const DefaultArithmetic &) = delete;

private:
    // A port adds the type of its register, the value for the modes above, the mask of the mode
    // bits, and the functions that read and write the register.
#if defined(__x86_64__) || defined(__i386__)
    typedef uint32_t Modes; // MXCSR. The x87 unit has its own register, and none of our arithmetic
    static constexpr Modes byDefault = 0x1f80, relevant = 0xffc0;
    static __attribute__((always_inline)) Modes Read() {
        Modes modes;
        __asm__ volatile("stmxcsr %0" : "=m"(modes)::"memory");
        return modes;
    }
    static __attribute__((noinline, cold)) void Write(Modes modes) {
        __asm__ volatile("ldmxcsr %0" ::"m"(modes) : "memory");
    }
#elif defined(__aarch64__)
    typedef uint64_t Modes; // FPCR
    static constexpr Modes byDefault = 0, relevant = ~Modes{0};
    static __attribute__((always_inline)) Modes Read() {
        Modes modes;
        __asm__ volatile("mrs %0, fpcr" : "=r"(modes)::"memory");
        return modes;
    }
    static __attribute__((noinline, cold)) void Write(Modes modes) {
        __asm__ volatile("msr fpcr, %0" ::"r"(modes) : "memory");
    }
#else
#error "how are the modes of this processor's arithmetic read and written?"
#endif
    static bool IsAnother(Modes modes) { return (modes & relevant) != byDefault; }

    const Modes callers_;
};

} // namespace qx

#endif
