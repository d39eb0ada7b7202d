#ifndef QX_TESTS_HEAP_PROBE_H
#define QX_TESTS_HEAP_PROBE_H

#include <cstddef>
#include <cstdint>
#include <limits>

namespace qx::test {

// Watches the heap calls of the calling thread, including those of the module, and can make one of
// them fail. Works where malloc can be replaced: on Linux without sanitizers.
class HeapProbe {
public:
    static bool works();

    // Watches from construction to destruction. Allocation number `failAt` fails (0: none fails),
    // and so does each allocation of more than `largest` bytes. New blocks are filled with the byte
    // `fresh` unless it is negative.
    explicit HeapProbe(int32_t failAt = 0,
                       std::size_t largest = std::numeric_limits<std::size_t>::max(),
                       int fresh = -1);
    ~HeapProbe();
    HeapProbe(const HeapProbe &) = delete;
    HeapProbe &operator=(const HeapProbe &) = delete;

    // Calls `hook` before allocation number `hookAt`, which then proceeds.
    HeapProbe(int32_t hookAt, void (*hook)());

    int32_t allocations() const;     // malloc, calloc and realloc, failed ones included
    int32_t liveAllocations() const; // allocations less frees
    int32_t refusals() const;        // failed allocations
    int64_t peakBytes() const;       // the peak of the bytes in use

    // While a Pause exists, heap calls are not watched; it is used for those of the host.
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
