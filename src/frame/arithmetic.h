#ifndef QX_FRAME_ARITHMETIC_H
#define QX_FRAME_ARITHMETIC_H

#include <cstdint>

namespace qx {

// The modes of the processor's floating-point unit are the calling thread's own, and hosts change them:
// another rounding, numbers below the normal ones taken for zero or results flushed to it (what a library
// that is linked with fast-math does to its whole process), exceptions that end in a signal. From its
// construction to its end there are the modes in which all results are defined: rounding to nearest, gradual
// underflow, no exception unmasked. Then the caller has its own again. The frame of every export holds one
// (frame/export.h); where the modes are right, it costs reading a register: 3 ns on AMD's Zen 4.
//
// What the caller's flags say of exceptions after a call is left open.
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
    // A port adds the type of its register, the value with the modes above, the bits that say
    // something of them, and how the register is read and written.
#if defined(__x86_64__) || defined(__i386__)
    typedef uint32_t Modes; // MXCSR. The x87 unit has its own, and none of our arithmetic
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
