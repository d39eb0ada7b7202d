#include "frame/workspace.h"

#include "frame/host_binding.h"
#include "frame/platform.h"
#include "frame/scratch.h"

#include <cstdlib>
#include <cstring>
#include <limits>
#include <type_traits>

namespace qx {

constinit AnalysisWorkspace analysisWorkspace;

namespace {

// What stands before a payload. Blocks start at any byte, so no word here can be an atomic one:
// a locked access that crosses a cache line costs a hundred times as much as one that does not,
// and kernels throttle it. Only the byte is atomic. The left neighbour writes runStart and then
// sets the byte; who finds the byte set may read runStart.
struct __attribute__((packed)) BlockHeader {
    unsigned char leftIsReleased;
    uint32_t runStart; // start of the run of released blocks that ends at this block
    uint32_t end;      // where the next block starts
};
static_assert(sizeof(BlockHeader) == AnalysisWorkspace::blockOverhead);

// The reservation is longer than the region by one header, since the last block, too, leaves
// word at its end.
constexpr uint64_t reservationOverhead = sizeof(BlockHeader);

BlockHeader *HeaderAt(unsigned char *base, uint32_t offset) {
    return reinterpret_cast<BlockHeader *>(base + offset);
}

uint32_t OffsetOfPayload(const unsigned char *base, const void *payload) {
    return static_cast<uint32_t>(static_cast<const unsigned char *>(payload) - base -
                                 AnalysisWorkspace::blockOverhead);
}

int32_t SweepWorkspace(void *) {
    analysisWorkspace.sweep();
    return 0;
}

// Guards the reading of the owner. Made before the process attach has chosen a heap, so the
// memory comes straight from malloc.
class OwnerLock {
public:
    OwnerLock() : section_(ScratchAllocPointer(platform::CriticalSectionSize())) {
        platform::CriticalSectionCreate(section_);
    }
    ~OwnerLock() {
        platform::CriticalSectionDestroy(section_);
        ScratchFree(section_);
    }
    OwnerLock(const OwnerLock &) = delete;
    OwnerLock &operator=(const OwnerLock &) = delete;
    void enter() { platform::CriticalSectionEnter(section_); }
    void leave() { platform::CriticalSectionLeave(section_); }

private:
    void *section_;
};

__attribute__((init_priority(200))) OwnerLock ownerLock;

} // namespace

ErrorCode AnalysisWorkspace::checkOwner() const {
    // Without an owner there is nothing to guard, and the request stays free of locks.
    if (ownerThread_.load(std::memory_order_relaxed) == 0)
        return 0;
    ownerLock.enter();
    const uintptr_t owner = ownerThread_.load(std::memory_order_relaxed);
    ownerLock.leave();
    return owner == 0 || owner == platform::CurrentThread() ? 0 : ErrWorkspaceWrongThread;
}

ErrorCode AnalysisWorkspace::allocate(int64_t size, void **payload) {
    *payload = nullptr;
    if (const ErrorCode status = checkOwner())
        return status;

    uint64_t seen = state_.load(std::memory_order_acquire);
    State now;
    uint64_t end;
    bool fits;
    do {
        now = unpack(seen);
        end = now.bump + static_cast<uint64_t>(size) + blockOverhead;
        fits = end < limit_;
        // A request that does not fit leaves the region full until the last live block goes.
        const State next =
            fits ? State{static_cast<uint32_t>(end), now.live + 1} : State{limit_, now.live};
        if (state_.compare_exchange_weak(seen, pack(next), std::memory_order_acq_rel,
                                         std::memory_order_acquire))
            break;
    } while (true);
    if (!fits)
        return ErrWorkspaceExhausted;

    BlockHeader *header = HeaderAt(base_, now.bump);
    std::atomic_ref<unsigned char>(header->leftIsReleased).store(0, std::memory_order_relaxed);
    header->end = static_cast<uint32_t>(end);
    *payload = header + 1;
    return 0;
}

void AnalysisWorkspace::release(void *payload) {
    const uint32_t block = OffsetOfPayload(base_, payload);
    BlockHeader *header = HeaderAt(base_, block);
    const uint32_t end = header->end;
    const auto runStart = [&] {
        const bool leftIsReleased =
            std::atomic_ref<unsigned char>(header->leftIsReleased).load(std::memory_order_acquire);
        return leftIsReleased ? header->runStart : block;
    };

    bool leftWord = false;
    uint64_t seen = state_.load(std::memory_order_acquire);
    State next;
    do {
        const State now = unpack(seen);
        if (now.live == 1) {
            next = {0, 0};
        } else if (now.bump == end && !leftWord) {
            next = {runStart(), now.live - 1};
        } else {
            if (!leftWord) {
                // Nobody can go below `end` before this block has left the count, so the next
                // block, there or to come, starts at `end`.
                BlockHeader *right = HeaderAt(base_, end);
                right->runStart = runStart();
                std::atomic_ref<unsigned char>(right->leftIsReleased)
                    .store(1, std::memory_order_release);
                // From here on the right neighbour may give these bytes back, and they may
                // belong to another block: this one may only leave the count.
                leftWord = true;
            }
            next = {now.bump, now.live - 1};
        }
    } while (!state_.compare_exchange_weak(seen, pack(next), std::memory_order_acq_rel,
                                           std::memory_order_acquire));
}

ErrorCode AnalysisWorkspace::resize(void **payload, int64_t size) {
    if (*payload == nullptr)
        return allocate(size, payload);
    if (size == 0) {
        release(*payload);
        *payload = nullptr;
        return 0;
    }
    const uint32_t block = OffsetOfPayload(base_, *payload);
    const int64_t capacity = int64_t{HeaderAt(base_, block)->end} - block - blockOverhead;
    if (size <= capacity)
        return 0;

    void *grown;
    const ErrorCode status = allocate(size, &grown);
    if (status == 0)
        std::memcpy(grown, *payload, static_cast<std::size_t>(capacity));
    release(*payload);
    *payload = grown;
    return status;
}

ErrorCode AnalysisWorkspace::reserve(uint32_t size) {
    if (liveBlocks() != -1)
        return ErrWorkspaceAlreadyInitialized;
    const uint64_t reservation = size + reservationOverhead;
    if (reservation > std::numeric_limits<std::size_t>::max())
        return ErrOutOfMemory;
    void *region = std::malloc(static_cast<std::size_t>(reservation));
    if (region == nullptr)
        return ErrOutOfMemory;
    base_ = static_cast<unsigned char *>(region);
    limit_ = size;
    state_.store(pack({0, 0}), std::memory_order_release);
    HostRegisterSweep(SweepWorkspace, nullptr, SweepForProcess);
    return 0;
}

ErrorCode AnalysisWorkspace::giveBack() {
    const int32_t live = liveBlocks();
    if (live == -1)
        return 0;
    if (live > 0)
        return ErrWorkspaceStillInUse;
    if (isEnabled())
        return ErrWorkspaceStillEnabled;
    HostRegisterSweep(SweepWorkspace, nullptr, SweepWithdraw);
    unsigned char *region = base_;
    base_ = nullptr;
    limit_ = 0;
    state_.store(pack({0, -1}), std::memory_order_release);
    std::free(region);
    return 0;
}

ErrorCode AnalysisWorkspace::setEnabled(bool enable) {
    if (liveBlocks() == -1)
        return ErrWorkspaceNotInitialized;
    enabled_.store(enable, std::memory_order_relaxed);
    return 0;
}

void AnalysisWorkspace::sweep() {
    if (liveBlocks() == -1)
        return;
    enabled_.store(false, std::memory_order_relaxed);
    state_.store(pack({0, 0}), std::memory_order_release);
    giveBack();
}

} // namespace qx
