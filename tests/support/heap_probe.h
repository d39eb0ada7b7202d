#ifndef QX_TESTS_HEAP_PROBE_H
#define QX_TESTS_HEAP_PROBE_H

#include <cstddef>
#include <cstdint>
#include <limits>

namespace qx::test {

// Watches the heap calls of the calling thread, those of the module included, and can make one
// of them fail. Works where malloc can be replaced: on Linux without sanitizers.
class HeapProbe {
public:
    static bool works();

    // Watches from construction to destruction; the n-th allocation fails (0 for none), and so does
    // each of more than `largest` bytes. New blocks hold the byte `fresh`, if that is not negative.
    explicit HeapProbe(int32_t failAt = 0,
                       std::size_t largest = std::numeric_limits<std::size_t>::max(),
                       int fresh = -1);
    ~HeapProbe();
    HeapProbe(const HeapProbe &) = delete;
    HeapProbe &operator=(const HeapProbe &) = delete;

    // Calls `hook` in place of a failure at the n-th allocation, which then goes on.
    HeapProbe(int32_t hookAt, void (*hook)());

    int32_t allocations() const;     // malloc, calloc and realloc, failed ones included
    int32_t liveAllocations() const; // allocations less frees
    int32_t refusals() const;        // those that failed
    int64_t peakBytes() const;       // the most that was held at one time

    // While one exists, heap calls are not watched: the host's own.
    class Pause {
    public:
        Pause();
        ~Pause();
        Pause(const Pause &) = delete;
        Pause &operator=(const Pause &) = delete;

    private:
        bool wasWatching_;
    };
};

} // namespace qx::test

#endif
