#include "frame/workspace.h"

#include "frame/host_binding.h"
#include "frame/platform.h"
#include "frame/scratch.h"

#include <algorithm>
#include <bit>
#include <cstdlib>
#include <cstring>
#include <limits>

namespace qx {

constinit AnalysisWorkspace analysisWorkspace;

namespace {

// The header before a payload. Blocks start at any byte, so no word here can be atomic: a locked
// access that crosses a cache line costs a hundred times as much as one that does not, and kernels
// throttle it. Only the byte is atomic. In a block of units it holds the number of the chunk; in a
// block of the stack it says whether the left neighbour has been released. The neighbour writes
// runStart and then sets the byte; a thread that finds it set may read runStart.
struct __attribute__((packed)) BlockHeader {
    unsigned char mark;
    uint32_t runStart; // start of the run of released blocks that ends at this block
    uint32_t end;      // where the next block starts
};
static_assert(sizeof(BlockHeader) == AnalysisWorkspace::blockOverhead);

constexpr unsigned char inStack = 0;
constexpr unsigned char leftIsReleased = 1;
constexpr unsigned char inChunk = 2; // and above: the chunk's number plus 2

std::atomic_ref<unsigned char> Mark(BlockHeader *header) {
    return std::atomic_ref<unsigned char>(header->mark);
}

// The reservation is longer than the region by one header, because the last block also writes a
// header at its end. The same room is kept below a lowered ceiling.
constexpr uint64_t reservationOverhead = sizeof(BlockHeader);

BlockHeader *HeaderAt(unsigned char *base, uint32_t offset) {
    return reinterpret_cast<BlockHeader *>(base + offset);
}

uint32_t OffsetOfPayload(const unsigned char *base, const void *payload) {
    return static_cast<uint32_t>(static_cast<const unsigned char *>(payload) - base -
                                 AnalysisWorkspace::blockOverhead);
}

// Bits `first` to `first + count - 1`.
constexpr uint64_t MaskOf(uint32_t first, uint32_t count) {
    return (count < 64 ? (uint64_t{1} << count) - 1 : ~uint64_t{0}) << first;
}

// Finds the highest run of `count` zero bits; false if there is none.
bool FindRun(uint64_t used, uint32_t count, uint32_t *first) {
    uint64_t starts = ~used;
    for (uint32_t have = 1; have < count && starts != 0;) {
        const uint32_t more = std::min(have, count - have);
        starts &= starts >> more;
        have += more;
    }
    if (starts == 0)
        return false;
    *first = 63 - static_cast<uint32_t>(std::countl_zero(starts));
    return true;
}

int32_t SweepWorkspace(void *) {
    analysisWorkspace.sweep();
    return 0;
}

} // namespace

int32_t AnalysisWorkspace::liveBlocks() const {
    const State now = unpack(state_.load(std::memory_order_acquire));
    if (now.live == noRegion)
        return -1;
    // Blocks in units are not counted individually; a chunk counts as one.
    uint32_t all = now.live;
    for (const Chunk &chunk : chunks_)
        all += (chunk.usedCells.load(std::memory_order_acquire) & ~isCut) != 0;
    return static_cast<int32_t>(all);
}

uint32_t AnalysisWorkspace::bump() const {
    const State now = unpack(state_.load(std::memory_order_acquire));
    return now.isFull ? limit_.load(std::memory_order_relaxed) : now.bump;
}

ErrorCode AnalysisWorkspace::allocate(int64_t size, void **payload) {
    *payload = nullptr;
    const uint64_t total = static_cast<uint64_t>(size) + blockOverhead;
    const uintptr_t thread = platform::CurrentThread();
    noteThread(thread);
    if (servesMany_.load(std::memory_order_relaxed) && allocateInOwnCells(total, thread, payload))
        return 0;
    // Room that another thread was moving during the search is searched for again, a few times.
    for (int look = 0; look < 8; ++look) {
        const uint64_t seen = state_.load(std::memory_order_acquire);
        const uint64_t seenUnits = usedUnits_.load(std::memory_order_acquire);
        if (unpack(seen).live == noRegion)
            return ErrWorkspaceNotInitialized;
        if (tryAllocate(unpack(seen), total, thread, payload))
            return 0;
        if (state_.load(std::memory_order_acquire) == seen &&
            usedUnits_.load(std::memory_order_acquire) == seenUnits)
            break;
    }
    markFull(total);
    return ErrWorkspaceExhausted;
}

void AnalysisWorkspace::noteThread(uintptr_t thread) {
    uintptr_t first = firstThread_.load(std::memory_order_relaxed);
    if (first == thread || (first == 0 && firstThread_.compare_exchange_strong(first, thread)))
        return;
    if (!servesMany_.load(std::memory_order_relaxed))
        servesMany_.store(true, std::memory_order_relaxed);
}

bool AnalysisWorkspace::tryAllocate(State now, uint64_t total, uintptr_t thread, void **payload) {
    const bool isOurs = now.live == 0 || stackOwner_.load(std::memory_order_relaxed) == thread;
    // With several threads, a long stack gets new blocks only if the units are full, so that it can
    // run empty.
    const bool isLong = servesMany_.load(std::memory_order_relaxed) &&
                        now.bump > limit_.load(std::memory_order_relaxed) / 4;
    const bool stackFirst = isOurs && !isLong;
    return (stackFirst && allocateInStack(total, thread, payload)) ||
           allocateInUnits(total, thread, payload) ||
           (!stackFirst && allocateInStack(total, thread, payload));
}

void *AnalysisWorkspace::place(uint32_t chunk, uint32_t start, uint32_t end) {
    BlockHeader *header = HeaderAt(base_, start);
    Mark(header).store(static_cast<unsigned char>(chunk), std::memory_order_relaxed);
    header->end = end;
    return header + 1;
}

void AnalysisWorkspace::release(void *payload) {
    unsigned char *base = base_;
    const uint32_t block = OffsetOfPayload(base, payload);
    BlockHeader *header = HeaderAt(base, block);
    const unsigned char mark = Mark(header).load(std::memory_order_relaxed);
    if (mark < inChunk) {
        releaseInStack(base, block);
        return;
    }
    const uint32_t index = mark - inChunk;
    const uint32_t unit = limit_.load(std::memory_order_relaxed) / units;
    const uint32_t cell = unit / units;
    if (cell == 0 || header->end - block > cellsGiven * cell) {
        // Its count may be another's once the chunk has ended.
        const uint32_t count = chunks_[index].count.load(std::memory_order_relaxed);
        chunks_[index].usedCells.store(0, std::memory_order_release);
        releaseUnits(index, count);
    } else {
        releaseCells(index, MaskOf((block - index * unit) / cell, (header->end - block) / cell));
    }
}

// ---- The stack ----

// Whether a block may end at `end`. The limit is read anew at each call: before a compare-exchange
// it may be that of a region that no longer exists; after one, the block keeps the region alive.
bool AnalysisWorkspace::fitsStack(uint64_t end, uint32_t ceiling) const {
    const uint32_t limit = limit_.load(std::memory_order_relaxed);
    return ceiling == units ? end < limit
                            : end + blockOverhead <= uint64_t{ceiling} * (limit / units);
}

// Pushes a block onto the stack; *before is set to the previous state.
bool AnalysisWorkspace::push(uint64_t total, State *before) {
    uint64_t seen = state_.load(std::memory_order_acquire);
    State next;
    do {
        next = *before = unpack(seen);
        if (isFull(*before) || before->live >= noRegion - 1 ||
            !fitsStack(before->bump + total, before->ceiling))
            return false;
        next.bump = static_cast<uint32_t>(before->bump + total);
        ++next.live;
    } while (!state_.compare_exchange_weak(seen, pack(next), std::memory_order_acq_rel,
                                           std::memory_order_acquire));
    if (fitsStack(next.bump, next.ceiling))
        return true;
    // The region was replaced by a smaller one between the two checks.
    takeBack(before->bump, next.bump);
    return false;
}

bool AnalysisWorkspace::allocateInStack(uint64_t total, uintptr_t thread, void **payload) {
    State before;
    while (!push(total, &before))
        if (!raiseCeiling())
            return false;
    if (before.live == 0)
        stackOwner_.store(thread, std::memory_order_relaxed);
    *payload = place(inStack, before.bump, static_cast<uint32_t>(before.bump + total));
    return true;
}

namespace {

// The state with one live block less and the top at `bump`; with no live block the stack is idle.
template <class State>
State WithoutOne(State now, uint32_t bump) {
    if (now.live == 1)
        return {0, 0, now.ceiling, false};
    return {bump, now.live - 1, now.ceiling, now.isFull};
}

} // namespace

// Undoes a push before anything was written. A thread that pushed above it after the same outdated
// check is about to do the same.
void AnalysisWorkspace::takeBack(uint32_t start, uint32_t end) {
    uint64_t seen = state_.load(std::memory_order_acquire);
    do {
        while (unpack(seen).bump != end)
            seen = state_.load(std::memory_order_acquire);
    } while (!state_.compare_exchange_weak(seen, pack(WithoutOne(unpack(seen), start)),
                                           std::memory_order_acq_rel, std::memory_order_acquire));
}

void AnalysisWorkspace::releaseInStack(unsigned char *base, uint32_t block) {
    BlockHeader *header = HeaderAt(base, block);
    const uint32_t end = header->end;
    const auto runStart = [&] {
        const bool left = Mark(header).load(std::memory_order_acquire) == leftIsReleased;
        return left ? header->runStart : block;
    };

    bool leftWord = false;
    uint64_t seen = state_.load(std::memory_order_acquire);
    State next;
    do {
        const State now = unpack(seen);
        uint32_t bump = now.bump;
        if (now.live > 1 && !leftWord) {
            if (now.bump == end) {
                bump = runStart();
            } else {
                // `bump` cannot fall below `end` before this block has left the count, so the next
                // block, present or future, starts at `end`.
                BlockHeader *right = HeaderAt(base, end);
                right->runStart = runStart();
                Mark(right).store(leftIsReleased, std::memory_order_release);
                // From here on the right neighbour may release these bytes, and they may belong to
                // another block, so this block may only leave the count.
                leftWord = true;
            }
        }
        next = WithoutOne(now, bump);
    } while (!state_.compare_exchange_weak(seen, pack(next), std::memory_order_acq_rel,
                                           std::memory_order_acquire));
}

// With one thread, a request that does not fit leaves the region full until the last live block is
// released. With several threads there is no such mark, because room becomes free sooner.
void AnalysisWorkspace::markFull(uint64_t total) {
    uint64_t seen = state_.load(std::memory_order_acquire);
    State now;
    do {
        now = unpack(seen);
        if (now.live == 0 || now.live == noRegion || servesMany_.load(std::memory_order_relaxed) ||
            fitsStack(now.bump + total, now.ceiling))
            return;
        now.isFull = true;
    } while (!state_.compare_exchange_weak(seen, pack(now), std::memory_order_acq_rel,
                                           std::memory_order_acquire));
}

// ---- Units and cells ----

// The chunk from which threads with this hash last took cells.
std::atomic<uint8_t> &AnalysisWorkspace::latestOf(uintptr_t thread) {
    return latestChunk_[(thread >> 6 ^ thread >> 12 ^ thread >> 18) % units];
}

// Takes cells of the unit from which the thread took cells before.
bool AnalysisWorkspace::allocateInOwnCells(uint64_t total, uintptr_t thread, void **payload) {
    const uint32_t limit = limit_.load(std::memory_order_relaxed);
    const uint32_t cell = limit / units / units;
    if (total > uint64_t{cell} * cellsGiven)
        return false;
    const uint32_t index = latestOf(thread).load(std::memory_order_relaxed);
    const uint32_t count = total <= cell ? 1 : static_cast<uint32_t>((total + cell - 1) / cell);
    uint32_t first;
    return takeCells(index, count, &first) && placeCells(limit, index, first, count, payload);
}

// From here on the cells taken keep the region alive; it may be another one than that with the limit.
bool AnalysisWorkspace::placeCells(uint32_t limit, uint32_t index, uint32_t first, uint32_t count,
                                   void **payload) {
    if (limit_.load(std::memory_order_relaxed) != limit) {
        releaseCells(index, MaskOf(first, count));
        return false;
    }
    const uint32_t unit = limit / units, cell = unit / units;
    const uint32_t start = index * unit + first * cell;
    *payload = place(index + inChunk, start, start + count * cell);
    return true;
}

bool AnalysisWorkspace::allocateInUnits(uint64_t total, uintptr_t thread, void **payload) {
    const uint32_t limit = limit_.load(std::memory_order_relaxed);
    const uint32_t unit = limit / units;
    const uint32_t cell = unit / units;
    if (unit == 0 || total > uint64_t{unit} * units)
        return false;
    uint32_t index;
    if (total > uint64_t{cell} * cellsGiven) {
        const auto count = static_cast<uint32_t>((total + unit - 1) / unit);
        if (!takeUnits(count, unit, &index))
            return false;
        chunks_[index].count.store(count, std::memory_order_relaxed);
        chunks_[index].usedCells.store(~uint64_t{0}, std::memory_order_release);
        if (limit_.load(std::memory_order_relaxed) != limit) {
            chunks_[index].usedCells.store(0, std::memory_order_release);
            releaseUnits(index, count);
            return false;
        }
        const uint32_t start = index * unit;
        *payload = place(index + inChunk, start, static_cast<uint32_t>(start + total));
        return true;
    }
    const auto count = static_cast<uint32_t>((total + cell - 1) / cell);
    uint32_t first;
    if (!cutUnit(count, unit, false, &index, &first) && !shareUnit(count, &index, &first) &&
        !cutUnit(count, unit, true, &index, &first))
        return false;
    latestOf(thread).store(static_cast<uint8_t>(index), std::memory_order_relaxed);
    return placeCells(limit, index, first, count, payload);
}

// Cuts a unit that no thread uses. While many are free, threads do not share units, so that they do
// not wait for each other.
bool AnalysisWorkspace::cutUnit(uint32_t count, uint32_t unit, bool isNeeded, uint32_t *index,
                                uint32_t *first) {
    const bool areMany = unpack(state_.load(std::memory_order_relaxed)).ceiling > units / 2;
    if (!(isNeeded ? takeUnits(1, unit, index) : areMany && takeFreeUnits(1, unit, index)))
        return false;
    *first = cellsGiven - count;
    chunks_[*index].usedCells.store(isCut | MaskOf(*first, count), std::memory_order_release);
    return true;
}

// Takes cells of any unit that has been cut.
bool AnalysisWorkspace::shareUnit(uint32_t count, uint32_t *index, uint32_t *first) {
    for (uint32_t i = units; i-- > 0;)
        if (takeCells(i, count, first)) {
            *index = i;
            return true;
        }
    return false;
}

// Takes `count` adjacent cells of a unit that has been cut.
bool AnalysisWorkspace::takeCells(uint32_t index, uint32_t count, uint32_t *first) {
    std::atomic<uint64_t> &word = chunks_[index].usedCells;
    uint64_t used = word.load(std::memory_order_acquire);
    do {
        if (used == 0 || !FindRun(used, count, first))
            return false;
    } while (!word.compare_exchange_weak(used, used | MaskOf(*first, count),
                                         std::memory_order_acq_rel, std::memory_order_acquire));
    return true;
}

void AnalysisWorkspace::releaseCells(uint32_t index, uint64_t cells) {
    chunks_[index].usedCells.fetch_and(~cells, std::memory_order_acq_rel);
}

// Whether a unit was cut and all its cells were free: then the caller now holds it.
bool AnalysisWorkspace::makeWhole(uint32_t index) {
    uint64_t onlyCut = isCut;
    return chunks_[index].usedCells.compare_exchange_strong(onlyCut, 0, std::memory_order_acq_rel,
                                                            std::memory_order_relaxed);
}

// Takes `count` adjacent units, if necessary after making those whole that have been cut.
bool AnalysisWorkspace::takeUnits(uint32_t count, uint32_t unit, uint32_t *first) {
    if (takeFreeUnits(count, unit, first))
        return true;
    bool areMore = false;
    for (uint32_t i = 0; i < units; ++i)
        if (makeWhole(i)) {
            releaseUnits(i, 1);
            areMore = true;
        }
    return areMore && takeFreeUnits(count, unit, first);
}

// Takes `count` adjacent units: free ones, or those at the end of the stack.
bool AnalysisWorkspace::takeFreeUnits(uint32_t count, uint32_t unit, uint32_t *first) {
    uint64_t used = usedUnits_.load(std::memory_order_acquire);
    while (FindRun(used, count, first))
        if (usedUnits_.compare_exchange_weak(used, used | MaskOf(*first, count),
                                             std::memory_order_acq_rel, std::memory_order_acquire))
            return true;

    while (count > 1 && raiseCeiling())
        continue;
    uint64_t seen = state_.load(std::memory_order_acquire);
    State next;
    do {
        const State now = unpack(seen);
        if (now.live == noRegion || isFull(now) || now.ceiling < count)
            return false;
        next = now;
        next.ceiling -= count;
        if (now.bump + uint64_t{blockOverhead} > uint64_t{next.ceiling} * unit)
            return false;
    } while (!state_.compare_exchange_weak(seen, pack(next), std::memory_order_acq_rel,
                                           std::memory_order_acquire));
    *first = next.ceiling;
    return true;
}

void AnalysisWorkspace::releaseUnits(uint32_t first, uint32_t count) {
    usedUnits_.fetch_and(~MaskOf(first, count), std::memory_order_acq_rel);
}

// Gives the stack the unit at its end if that is free, or cut and unused. One unit at a time, because
// no other thread can take the units held meanwhile.
bool AnalysisWorkspace::raiseCeiling() {
    const uint32_t from = unpack(state_.load(std::memory_order_acquire)).ceiling;
    if (from == units)
        return false;
    const uint64_t unit = MaskOf(from, 1);
    if ((usedUnits_.fetch_or(unit, std::memory_order_acq_rel) & unit) != 0 && !makeWhole(from))
        return false;
    uint64_t seen = state_.load(std::memory_order_acquire);
    State next;
    do {
        next = unpack(seen);
        if (next.ceiling != from) { // lowered meanwhile
            releaseUnits(from, 1);
            return false;
        }
        ++next.ceiling;
    } while (!state_.compare_exchange_weak(seen, pack(next), std::memory_order_acq_rel,
                                           std::memory_order_acquire));
    return true;
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

// The four operations change the region one at a time: the thread that changes the phase from
// Ready, or None, to Changing has exclusive access, except for requests.

ErrorCode AnalysisWorkspace::reserve(uint32_t size) {
    Phase found = Phase::None;
    if (!phase_.compare_exchange_strong(found, Phase::Changing))
        return ErrWorkspaceAlreadyInitialized;
    const uint64_t reservation = size + reservationOverhead;
    void *region = reservation > std::numeric_limits<std::size_t>::max()
                       ? nullptr
                       : std::malloc(static_cast<std::size_t>(reservation));
    if (region == nullptr) {
        phase_.store(Phase::None);
        return ErrOutOfMemory;
    }
    base_ = static_cast<unsigned char *>(region);
    limit_.store(size, std::memory_order_relaxed);
    usedUnits_.store(~uint64_t{0}, std::memory_order_release);
    firstThread_.store(0, std::memory_order_relaxed);
    servesMany_.store(false, std::memory_order_relaxed);
    state_.store(pack(idle), std::memory_order_release);
    HostRegisterSweep(SweepWorkspace, nullptr, SweepForProcess);
    phase_.store(Phase::Ready);
    return 0;
}

ErrorCode AnalysisWorkspace::giveBack() {
    Phase found = Phase::Ready;
    if (!phase_.compare_exchange_strong(found, Phase::Changing))
        return 0; // there is none, or another thread is making or ending it
    while (raiseCeiling())
        continue;
    ErrorCode status = 0;
    uint64_t expected = pack(idle);
    if (liveBlocks() > 0)
        status = ErrWorkspaceStillInUse;
    else if (enabled_.load())
        status = ErrWorkspaceStillEnabled;
    else if (!state_.compare_exchange_strong(expected, pack(absent)))
        status = ErrWorkspaceStillInUse; // a new block, or a unit that is still in use
    if (status != 0) {
        phase_.store(Phase::Ready);
        return status;
    }
    endRegion();
    return 0;
}

void AnalysisWorkspace::endRegion() {
    HostRegisterSweep(SweepWorkspace, nullptr, SweepWithdraw);
    unsigned char *region = base_;
    base_ = nullptr;
    limit_.store(0, std::memory_order_relaxed);
    std::free(region);
    phase_.store(Phase::None);
}

AnalysisWorkspace::Phase AnalysisWorkspace::settledPhase() const {
    Phase found;
    while ((found = phase_.load()) == Phase::Changing)
        platform::Yield();
    return found;
}

ErrorCode AnalysisWorkspace::setEnabled(bool enable) {
    if (settledPhase() == Phase::None)
        return ErrWorkspaceNotInitialized;
    enabled_.store(enable);
    // A give-back that has begun has either seen the flag and leaves the region, or ends the
    // region.
    if (settledPhase() == Phase::Ready)
        return 0;
    enabled_.store(false);
    return ErrWorkspaceNotInitialized;
}

void AnalysisWorkspace::sweep() {
    Phase found = Phase::Ready;
    if (!phase_.compare_exchange_strong(found, Phase::Changing))
        return;
    enabled_.store(false);
    for (Chunk &chunk : chunks_)
        chunk.usedCells.store(0, std::memory_order_release);
    state_.store(pack(absent), std::memory_order_release);
    endRegion();
}

} // namespace qx
