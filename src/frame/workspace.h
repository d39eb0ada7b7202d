#ifndef QX_FRAME_WORKSPACE_H
#define QX_FRAME_WORKSPACE_H

#include "frame/elements.h"
#include "qx/errors.h"

#include <atomic>
#include <cstdint>

namespace qx {

// The analysis workspace: one region, reserved once, that serves every scratch request while it is
// enabled, without a lock and without the heap.
//
// While a single thread makes requests, its blocks form a stack from the bottom of the region. A
// block consists of its payload and 9 bytes before it, and blocks are adjacent in the order of the
// requests; `bump` is the end of the last one. Releasing the last block frees its bytes
// immediately, together with the run of released blocks before it; the bytes of any other block
// stay in use until such a run reaches it or until no block is live.
//
// This rule does not suit several threads, because the blocks of one would keep those of all
// others. From the first request of a second thread on, the region serves several: the stack
// belongs to one thread from its first live block to its last, and other threads take their blocks
// from the top of the region: in units, which are 64ths of the region, and cells, which are 64ths
// of a unit. One bit for each says whether it is used. They are free again as soon as they are
// released, wherever they lie. A unit that was cut into cells stays cut when all of them are free, so
// that the next request of its thread writes no word that other threads use; it becomes a whole unit
// again when one is needed. The stack ends below the lowest unit in use.
//
// `bump` and `live` of the stack change together, in one compare-exchange on one word. A block
// thus counts as live from the moment it has its bytes to the moment it gives them back, and while
// it is live `bump` cannot fall below its end: no other thread can place a block on top of it.
// A live block or a used unit also keeps the region from being given back.
class AnalysisWorkspace {
public:
    // The result of the four operations of the exports. Any thread may call any of them at any
    // time, even while other threads hold blocks.
    ErrorCode reserve(uint32_t size);
    ErrorCode giveBack();
    ErrorCode setEnabled(bool enable);
    // The host's clean-up after an aborted run: blocks that were left behind no longer count.
    void sweep();

    bool isEnabled() const { return enabled_.load(std::memory_order_relaxed); }

    // Sets *payload to `size` bytes and returns 0. On failure *payload is null and the result is
    // ErrWorkspaceExhausted, or ErrWorkspaceNotInitialized if the region has just been given back.
    ErrorCode allocate(int64_t size, void **payload);
    void release(void *payload);
    // Keeps the block if the size fits. Otherwise the old block is always released, even if there
    // is no room for the new one.
    ErrorCode resize(void **payload, int64_t size);

    // -1 while no region exists.
    int32_t liveBlocks() const;
    // Offset of the next free byte of the stack from the start of the region.
    uint32_t bump() const;

    static constexpr int32_t blockOverhead = 9;

private:
    static constexpr uint32_t units = 64;      // of a region, and cells of a unit
    static constexpr uint32_t cellsGiven = 63; // of those
    static constexpr uint64_t isCut = uint64_t{1} << 63;

    struct State {
        uint32_t bump;
        uint32_t live;
        uint32_t ceiling; // the units below it belong to the stack
        bool isFull;      // a request was refused; lasts until no block is live
    };
    static constexpr uint32_t noRegion = 0x7FFFFF; // in place of the number of live blocks
    static constexpr uint64_t pack(State state) {
        return uint64_t{state.isFull} << 62 | uint64_t{state.ceiling} << 55 |
               uint64_t{state.live} << 32 | state.bump;
    }
    static constexpr State unpack(uint64_t word) {
        return {static_cast<uint32_t>(word), static_cast<uint32_t>(word >> 32) & noRegion,
                static_cast<uint32_t>(word >> 55) & 0x7F, (word >> 62 & 1) != 0};
    }
    static constexpr State idle = {0, 0, units, false};
    static constexpr State absent = {0, noRegion, units, false};

    // Units that are used together: one unit whose cells serve many blocks, or one or several units
    // for one block, with all cell bits set. The last cell of a unit that is cut is never handed out,
    // and its bit stays set. A chunk without any bit does not exist, and no thread may set one in it.
    struct alignas(64) Chunk {
        std::atomic<uint64_t> usedCells;
        std::atomic<uint32_t> count; // number of its units
    };

    enum class Phase { None, Changing, Ready };

    void noteThread(uintptr_t thread);
    bool isFull(State now) const {
        return now.isFull && !servesMany_.load(std::memory_order_relaxed);
    }
    bool tryAllocate(State now, uint64_t total, uintptr_t thread, void **payload);
    bool fitsStack(uint64_t end, uint32_t ceiling) const;
    bool push(uint64_t total, State *before);
    bool allocateInStack(uint64_t total, uintptr_t thread, void **payload);
    void takeBack(uint32_t start, uint32_t end);
    void releaseInStack(unsigned char *base, uint32_t block);
    void markFull(uint64_t total);
    bool allocateInUnits(uint64_t total, uintptr_t thread, void **payload);
    std::atomic<uint8_t> &latestOf(uintptr_t thread);
    bool allocateInOwnCells(uint64_t total, uintptr_t thread, void **payload);
    bool placeCells(uint32_t limit, uint32_t index, uint32_t first, uint32_t count, void **payload);
    bool cutUnit(uint32_t count, uint32_t unit, bool isNeeded, uint32_t *index, uint32_t *first);
    bool shareUnit(uint32_t count, uint32_t *index, uint32_t *first);
    bool takeCells(uint32_t index, uint32_t count, uint32_t *first);
    bool takeUnits(uint32_t count, uint32_t unit, uint32_t *first);
    bool takeFreeUnits(uint32_t count, uint32_t unit, uint32_t *first);
    bool makeWhole(uint32_t index);
    void releaseCells(uint32_t index, uint64_t cells);
    void releaseUnits(uint32_t first, uint32_t count);
    bool raiseCeiling();
    void *place(uint32_t chunk, uint32_t start, uint32_t end);
    void endRegion();
    Phase settledPhase() const;

    // What many threads read and few write lies in other cache lines than what they write.
    alignas(64) std::atomic<uint64_t> state_ = pack(absent);
    std::atomic<uintptr_t> stackOwner_ = 0;
    alignas(64) std::atomic<uint64_t> usedUnits_ = ~uint64_t{0}; // units of the stack count as used
    Chunk chunks_[units] = {};                                   // indexed by their first unit
    alignas(64) std::atomic<uint8_t> latestChunk_[units] = {};   // of the threads with a hash
    std::atomic<uintptr_t> firstThread_ = 0;                     // that has asked this region
    std::atomic<bool> servesMany_ = false;                       // other threads have asked, too
    std::atomic<uint32_t> limit_ = 0;                            // offset from base_
    unsigned char *base_ = nullptr;
    std::atomic<Phase> phase_ = Phase::None;
    std::atomic<bool> enabled_ = false;
};

// The one workspace of the process.
extern AnalysisWorkspace analysisWorkspace;

} // namespace qx

#endif
