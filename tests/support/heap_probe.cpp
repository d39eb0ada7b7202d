#include "tests/support/heap_probe.h"

#include <algorithm>
#include <cerrno>
#include <cstddef>
#include <cstring>

#ifdef __linux__
#include <malloc.h>
#endif

#if defined(__linux__) && !defined(__SANITIZE_ADDRESS__) && !defined(__SANITIZE_THREAD__)
#define QX_HEAP_PROBE 1
#if defined(__has_feature)
#if __has_feature(address_sanitizer) || __has_feature(thread_sanitizer)
#undef QX_HEAP_PROBE
#endif
#endif
#endif

namespace qx::test {

namespace {

struct Watch {
    bool on;
    int32_t failAt;
    std::size_t largest;
    int32_t allocations;
    int32_t live;
    void (*hook)(); // called instead of failing
    int32_t refusals;
    int fresh; // the byte that fills new blocks; negative for none
    int64_t liveBytes, peakBytes;
};
// Uses the initial-exec model, so that reading it never allocates.
__attribute__((tls_model("initial-exec"))) thread_local Watch watch;

} // namespace

HeapProbe::HeapProbe(int32_t failAt, std::size_t largest, int fresh) {
    watch = {true, failAt, largest, 0, 0, nullptr, 0, fresh, 0, 0};
}
HeapProbe::HeapProbe(int32_t hookAt, void (*hook)()) {
    watch = {true, hookAt, std::numeric_limits<std::size_t>::max(), 0, 0, hook, 0, -1, 0, 0};
}
HeapProbe::~HeapProbe() { watch.on = false; }
int32_t HeapProbe::allocations() const { return watch.allocations; }
int32_t HeapProbe::liveAllocations() const { return watch.live; }
int32_t HeapProbe::refusals() const { return watch.refusals; }
int64_t HeapProbe::peakBytes() const { return watch.peakBytes; }
HeapProbe::Pause::Pause() : wasWatching_(watch.on) { watch.on = false; }
HeapProbe::Pause::~Pause() { watch.on = wasWatching_; }

#ifdef QX_HEAP_PROBE

bool HeapProbe::works() { return true; }

namespace {

bool Refuses(std::size_t size) {
    if (!watch.on)
        return false;
    const bool isMeant = ++watch.allocations == watch.failAt;
    if (isMeant && watch.hook != nullptr) {
        const HeapProbe::Pause pause;
        watch.hook();
        return false;
    }
    if (isMeant || size > watch.largest) {
        errno = ENOMEM;
        ++watch.refusals;
        return true;
    }
    return false;
}

// Counts allocated bytes, or freed bytes if the number is negative.
void CountBytes(int64_t bytes) {
    watch.liveBytes += bytes;
    watch.peakBytes = std::max(watch.peakBytes, watch.liveBytes);
}

int64_t BytesOf(void *block) { return static_cast<int64_t>(malloc_usable_size(block)); }

void *Granted(void *block) {
    if (watch.on && block != nullptr) {
        ++watch.live;
        CountBytes(BytesOf(block));
    }
    if (watch.on && block == nullptr)
        ++watch.refusals;
    return block;
}

// Fills the block from byte `from` to the end of its usable size.
void *Fresh(void *block, std::size_t from = 0) {
    if (watch.on && watch.fresh >= 0 && block != nullptr) {
        const std::size_t room = malloc_usable_size(block);
        if (room > from)
            std::memset(static_cast<unsigned char *>(block) + from, watch.fresh, room - from);
    }
    return block;
}

} // namespace

#else
bool HeapProbe::works() { return false; }
#endif

} // namespace qx::test

#ifdef QX_HEAP_PROBE

extern "C" {
void *__libc_malloc(std::size_t);
void *__libc_calloc(std::size_t, std::size_t);
void *__libc_realloc(void *, std::size_t);
void __libc_free(void *);

__attribute__((visibility("default"))) void *malloc(std::size_t size) {
    return qx::test::Refuses(size) ? nullptr
                                   : qx::test::Fresh(qx::test::Granted(__libc_malloc(size)));
}
__attribute__((visibility("default"))) void *calloc(std::size_t count, std::size_t size) {
    return qx::test::Refuses(count * size) ? nullptr
                                           : qx::test::Granted(__libc_calloc(count, size));
}
__attribute__((visibility("default"))) void *realloc(void *block, std::size_t size) {
    if (qx::test::Refuses(size))
        return nullptr;
    const std::size_t before = block == nullptr ? 0 : malloc_usable_size(block);
    void *grown = qx::test::Fresh(__libc_realloc(block, size), before);
    if (block == nullptr)
        return qx::test::Granted(grown);
    if (qx::test::watch.on && grown != nullptr)
        qx::test::CountBytes(qx::test::BytesOf(grown) - static_cast<int64_t>(before));
    return grown;
}
__attribute__((visibility("default"))) void free(void *block) {
    if (qx::test::watch.on && block != nullptr) {
        --qx::test::watch.live;
        qx::test::CountBytes(-qx::test::BytesOf(block));
    }
    __libc_free(block);
}
}

#endif
