#include "tests/support/recipe.h"

#include <gtest/gtest.h>

#include <set>

#define WIN32_LEAN_AND_MEAN
#include <windows.h>

// Calls every export from callers that differ in what the platform leaves unspecified: the
// alignment of the stack, the state of the x87 unit, the thread. The results must be the same to
// the bit.

namespace qx::test {

namespace {

typedef std::map<std::string, uint64_t> Hashes;

void ExpectEqual(const Hashes &expected, const Hashes &got, const std::string &caller) {
    ASSERT_GT(expected.size(), 0u);
    for (const auto &[name, found] : expected)
        EXPECT_EQ(got.at(name), found) << name << " called " << caller;
}

struct Job {
    const Recipe &recipe;
    Call &call;
};
int32_t Run(Job *job) { return job->recipe.run(job->call); }

// Calls with the stack at `offset` modulo 16. All code between here and the export is built to keep
// only 4-byte alignment, so over the four offsets each export is entered at every alignment.
int32_t RunOnStackAt(uint32_t offset, Job *job) {
    int32_t result;
    __asm__ volatile("movl %%esp, %%ebx\n\t"
                     "andl $-16, %%esp\n\t"
                     "subl %[offset], %%esp\n\t"
                     "pushl %[job]\n\t"
                     "call *%[run]\n\t"
                     "movl %%ebx, %%esp"
                     : "=a"(result)
                     : [offset] "S"(offset), [job] "D"(job), [run] "a"(Run)
                     : "ebx", "ecx", "edx", "memory", "cc", "xmm0", "xmm1", "xmm2", "xmm3", "xmm4",
                       "xmm5", "xmm6", "xmm7", "st", "st(1)", "st(2)", "st(3)", "st(4)", "st(5)",
                       "st(6)", "st(7)");
    return result;
}

int32_t StackAlignment(Call &) {
    uint32_t stack;
    __asm__("movl %%esp, %0" : "=r"(stack));
    return static_cast<int32_t>(stack % 16);
}

TEST(Caller, MayAlignTheStackToFourBytesOnly) {
    std::set<int32_t> alignments;
    for (const uint32_t offset : {0, 4, 8, 12}) {
        const Recipe recipe = {"", StackAlignment};
        Call call(0);
        Job job = {recipe, call};
        alignments.insert(RunOnStackAt(offset, &job));
    }
    ASSERT_EQ(alignments.size(), 4u) << "the offsets do not reach the export";

    const Hashes expected = HashEveryExport();
    for (const uint32_t offset : {0, 4, 8, 12})
        ExpectEqual(expected, HashEveryExport([offset](const Recipe &recipe, Call &call) {
                        Job job = {recipe, call};
                        return RunOnStackAt(offset, &job);
                    }),
                    "on a stack at " + std::to_string(offset) + " modulo 16");
}

struct FloatingPointState {
    uint16_t x87;
    uint32_t sse;

    static FloatingPointState Read() {
        FloatingPointState state;
        __asm__ volatile("fnstcw %0" : "=m"(state.x87));
        __asm__ volatile("stmxcsr %0" : "=m"(state.sse));
        state.sse &= ~uint32_t{0x3f}; // the sticky exception flags
        return state;
    }
    bool operator==(const FloatingPointState &) const = default;
};

void SetX87(uint16_t control) { __asm__ volatile("fldcw %0" : : "m"(control)); }

TEST(Caller, MaySetThePrecisionOfTheX87Unit) {
    const Hashes expected = HashEveryExport();
    const uint16_t before = FloatingPointState::Read().x87;
    // 64 bits, 53 bits (the default of the platform), 24 bits (what 3-D graphics used to set).
    for (const uint16_t precision : {0x300, 0x200, 0x000}) {
        const auto control = static_cast<uint16_t>((before & ~0x300) | precision);
        const Hashes got = HashEveryExport([control](const Recipe &recipe, Call &call) {
            const uint16_t own = FloatingPointState::Read().x87;
            SetX87(control);
            const FloatingPointState at = FloatingPointState::Read();
            const int32_t result = recipe.run(call);
            EXPECT_TRUE(FloatingPointState::Read() == at) << recipe.name;
            SetX87(own);
            return result;
        });
        ExpectEqual(expected, got, "with x87 control word " + std::to_string(control));
    }
}

DWORD WINAPI HashInThread(LPVOID hashes) {
    *static_cast<Hashes *>(hashes) = HashEveryExport();
    return 0;
}

TEST(Caller, MayBeAThreadThatTheModuleHasNotSeen) {
    const Hashes expected = HashEveryExport();
    Hashes got[2];
    HANDLE threads[2];
    for (int i = 0; i < 2; ++i)
        threads[i] = CreateThread(nullptr, 0, HashInThread, &got[i], 0, nullptr);
    EXPECT_EQ(WaitForMultipleObjects(2, threads, TRUE, 120000), WAIT_OBJECT_0);
    for (int i = 0; i < 2; ++i) {
        CloseHandle(threads[i]);
        ExpectEqual(expected, got[i], "in a thread");
    }
}

} // namespace

} // namespace qx::test
