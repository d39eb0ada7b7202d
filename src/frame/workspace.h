#ifndef QX_FRAME_WORKSPACE_H
#define QX_FRAME_WORKSPACE_H

#include "frame/elements.h"
#include "qx/errors.h"

#include <atomic>
#include <cstdint>

namespace qx {

// The analysis workspace: one region, reserved once, that serves every scratch request while it
// is enabled, without a lock and without the heap.
//
// A block takes its payload and 9 bytes before it. Blocks lie side by side from `base` upward
// in the order of the requests; `bump` is the end of the last one. A released block gives its
// bytes back at once if it is the last, together with the run of released blocks before it;
// otherwise it stays until such a run reaches it or until no block is live.
//
// `bump` and `liveBlocks` change together, in one compare-exchange on one word. A block thus
// counts as live from the moment it has its bytes to the moment it gives them back, and while
// it is live `bump` cannot fall below its end: no other thread can place a block on top of it.
// With two words that cannot be had. A block that was claimed but not counted could be swept by
// a reset at zero, and one that had left word in its neighbour could fall back a second time.
class AnalysisWorkspace {
public:
    // The result of the four operations of the exports.
    ErrorCode reserve(uint32_t size);
    ErrorCode giveBack();
    ErrorCode setEnabled(bool enable);
    // The host's clean-up after an aborted run: blocks left behind count no more.
    void sweep();

    bool isEnabled() const { return enabled_.load(std::memory_order_relaxed); }

    // A payload of `size` bytes: 0, ErrWorkspaceWrongThread or ErrWorkspaceExhausted with a null
    // payload.
    ErrorCode allocate(int64_t size, void **payload);
    void release(void *payload);
    // Keeps the block where the size fits; otherwise the old block is released in any case,
    // also when there is no room for the new one.
    ErrorCode resize(void **payload, int64_t size);

    // -1 while no region exists.
    int32_t liveBlocks() const { return unpack(state_.load(std::memory_order_acquire)).live; }
    // Offset of the next free byte from the start of the region.
    uint32_t bump() const { return unpack(state_.load(std::memory_order_acquire)).bump; }

    static constexpr int32_t blockOverhead = 9;

private:
    struct State {
        uint32_t bump;
        int32_t live;
    };
    static constexpr uint64_t pack(State state) {
        return uint64_t{static_cast<uint32_t>(state.live)} << 32 | state.bump;
    }
    static constexpr State unpack(uint64_t word) {
        return {static_cast<uint32_t>(word), static_cast<int32_t>(word >> 32)};
    }
    ErrorCode checkOwner() const;

    std::atomic<uint64_t> state_ = pack({0, -1});
    unsigned char *base_ = nullptr;
    uint32_t limit_ = 0; // offset from base_, as every address inside the region
    std::atomic<bool> enabled_ = false;
    std::atomic<uintptr_t> ownerThread_ = 0; // nothing sets it
};

// The one workspace of the process.
extern AnalysisWorkspace analysisWorkspace;

} // namespace qx

#endif
