#include "frame/scratch.h"
#include "frame/workspace.h"
#include "tests/support/hostile_host.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <barrier>
#include <cstring>
#include <functional>
#include <limits>
#include <random>
#include <thread>
#include <vector>

namespace qx::test {
namespace {

constexpr int32_t overhead = 17; // of a scratch request in the region, in bytes

int32_t ModeOf(const void *block) {
    int32_t mode;
    std::memcpy(&mode, static_cast<const char *>(block) - 4, sizeof mode);
    return mode;
}

int32_t TotalSizeOf(const void *block) {
    int32_t size;
    std::memcpy(&size, static_cast<const char *>(block) - 8, sizeof size);
    return size;
}

// A region that exists and is enabled during the lifetime of this object.
class EnabledRegion {
public:
    explicit EnabledRegion(uint32_t size) {
        EXPECT_EQ(analysisWorkspace.reserve(size), 0);
        EXPECT_EQ(analysisWorkspace.setEnabled(true), 0);
    }
    ~EnabledRegion() { analysisWorkspace.sweep(); }
};

uint32_t Bump() { return analysisWorkspace.bump(); }

TEST(Scratch, MergeFollowsTheRule) {
    EXPECT_EQ(qx::Merge(0, -20001), -20001);
    EXPECT_EQ(qx::Merge(20004, -20001), -20001);
    EXPECT_EQ(qx::Merge(20004, 20001), 20004);
    EXPECT_EQ(qx::Merge(-20003, -20001), -20003);
    EXPECT_EQ(qx::Merge(0, 20001), 20001);
}

TEST(Scratch, SizesThatInt32CannotHoldAreRefused) {
    constexpr int32_t most = std::numeric_limits<int32_t>::max();
    void *block = &block;
    for (int32_t size : {-1, std::numeric_limits<int32_t>::min(), most, most - 7}) {
        EXPECT_EQ(qx::ScratchAlloc(&block, size), ErrOutOfMemory) << size;
        EXPECT_EQ(block, nullptr);
    }
    qx::Scratch<qx::ElementType::CDB> complexes;
    EXPECT_EQ(complexes.allocate(int64_t{1} << 40), ErrOutOfMemory);
    EXPECT_EQ(complexes.allocate(most / 16 + 1), ErrOutOfMemory);
    EXPECT_EQ(complexes.allocate(-1), ErrOutOfMemory);
    EXPECT_EQ(complexes.resize(most / 16 + 1), ErrOutOfMemory);
}

// The first request of the process fixes the default mode; before the attach that is the plain heap
// (mode 3). The owner lock took its memory at that time, so mode 3 is already in use here.
TEST(Scratch, BlocksReturnToTheirSource) {
    void *beforeAttach = qx::ScratchAllocPointer(10);
    EXPECT_EQ(ModeOf(beforeAttach), 3);
    qx::AttachScratchHeap();
    void *fromHeap = qx::ScratchAllocPointer(10);
    EXPECT_EQ(ModeOf(fromHeap), 1);
    EXPECT_EQ(TotalSizeOf(fromHeap), 18);

    void *fromRegion;
    {
        const EnabledRegion region(1000);
        fromRegion = qx::ScratchAllocPointer(10);
        EXPECT_EQ(ModeOf(fromRegion), 2);
        EXPECT_EQ(analysisWorkspace.liveBlocks(), 1);
        qx::ScratchFree(beforeAttach);
        qx::ScratchFree(fromHeap);
        EXPECT_EQ(analysisWorkspace.liveBlocks(), 1);

        analysisWorkspace.setEnabled(false);
        void *whileDisabled = qx::ScratchAllocPointer(10);
        EXPECT_EQ(ModeOf(whileDisabled), 1);
        qx::ScratchFree(fromRegion);
        EXPECT_EQ(analysisWorkspace.liveBlocks(), 0);
        qx::ScratchFree(whileDisabled);
    }
    EXPECT_EQ(qx::ScratchFree(nullptr), 0);
}

TEST(Scratch, PartsAreTakenTogetherOrNotAtAll) {
    const EnabledRegion region(uint32_t{1} << 24);
    qx::RealVector x;
    qx::ComplexMatrix z;
    I32 *indices = nullptr;
    uint8_t *flags = nullptr;
    qx::ScratchParts memory;
    // In one block, or in a block for each part: 32 rows need less than eight mebibytes, 3000 more.
    for (const int32_t rows : {32, 3000}) {
        ASSERT_EQ(memory.take(qx::Sized(flags, 5), qx::Sized(x, 3), qx::Sized(z, rows, 200),
                              qx::Sized(indices, 7)),
                  0);
        EXPECT_EQ(analysisWorkspace.liveBlocks(), rows == 32 ? 1u : 4u);
        EXPECT_EQ(x.size(), 3);
        EXPECT_EQ(z.rows(), rows);
        EXPECT_EQ(z.stride(), 200);
        std::fill_n(flags, 5, uint8_t{1});
        qx::Fill(x.data(), 3, 2.0);
        for (int64_t i = 0; i < z.count(); ++i)
            z.elements()[i] = CDB{3.0, 3.0};
        for (int i = 0; i < 7; ++i)
            indices[i] = 4;
        EXPECT_EQ(std::count(flags, flags + 5, uint8_t{1}), 5);
        EXPECT_EQ(x[0] + x[1] + x[2], 6.0);
        EXPECT_EQ(z(rows - 1, 199).im + z(0, 0).re, 6.0);
        EXPECT_EQ(indices[0] + indices[6], 8);
    }
    // If the last part does not fit, the parts before it are released, and no pointer is set.
    const double *const before = x.data();
    EXPECT_EQ(memory.take(qx::Sized(x, 1 << 18), qx::Sized(flags, int64_t{1} << 31)),
              ErrOutOfMemory);
    EXPECT_EQ(memory.take(qx::Sized(x, 1 << 18), qx::Sized(z, 1 << 15, 1 << 15)), ErrOutOfMemory);
    EXPECT_EQ(memory.take(qx::Sized(x, 2), qx::Sized(indices, -1)), ErrOutOfMemory);
    EXPECT_EQ(x.data(), before);
    EXPECT_EQ(analysisWorkspace.liveBlocks(), 0u);
}

TEST(Scratch, ABlockMovesGrowsAndShrinksWithItsContent) {
    const EnabledRegion region(1000);
    {
        qx::Scratch<qx::ElementType::I32> first;
        ASSERT_EQ(first.resize(2), 0);
        first[0] = 5;
        first[1] = 6;
        qx::Scratch<qx::ElementType::I32> second = std::move(first);
        EXPECT_EQ(first.data(), nullptr);
        ASSERT_EQ(second.resize(100), 0);
        EXPECT_EQ(+second[1], 6);
        ASSERT_EQ(second.resize(1), 0);
        EXPECT_EQ(+second[0], 5);
        ASSERT_EQ(first.allocate(1), 0);
        first[0] = 7;
        second = std::move(first);
        EXPECT_EQ(+second[0], 7);
        // A failure releases the block, exactly once, wherever it is.
        EXPECT_EQ(second.resize(10000), ErrOutOfMemory) << "more than the size of the region";
        EXPECT_EQ(second.data(), nullptr);
        EXPECT_EQ(analysisWorkspace.liveBlocks(), 0);
    }
    EXPECT_EQ(analysisWorkspace.liveBlocks(), 0);
    analysisWorkspace.setEnabled(false);
    qx::Scratch<qx::ElementType::I32> onHeap;
    ASSERT_EQ(onHeap.allocate(2), 0);
    EXPECT_EQ(onHeap.resize(int64_t{1} << 40), ErrOutOfMemory);
    EXPECT_EQ(onHeap.data(), nullptr);
}

TEST(Workspace, CapacityIsExactToTheByte) {
    for (const auto &[regionSize, request, fits] : {std::tuple{100, 82, true},
                                                    {100, 83, false},
                                                    {100, 84, false},
                                                    {18, 0, true},
                                                    {17, 0, false},
                                                    {1, 0, false}}) {
        const EnabledRegion region(static_cast<uint32_t>(regionSize));
        void *block = qx::ScratchAllocPointer(request);
        EXPECT_EQ(block != nullptr, fits) << regionSize << " " << request;
        qx::ScratchFree(block);
    }
    // The same bound for a sequence: every block takes its size plus the overhead.
    const EnabledRegion region(3 * (100 + overhead) + 1);
    std::vector<void *> blocks;
    while (void *block = qx::ScratchAllocPointer(100))
        blocks.push_back(block);
    EXPECT_EQ(blocks.size(), 3U);
    for (void *block : blocks)
        qx::ScratchFree(block);
}

TEST(Workspace, ExhaustionLastsUntilTheLastLiveBlockIsReleased) {
    const EnabledRegion region(200);
    void *first = qx::ScratchAllocPointer(10);
    void *second = qx::ScratchAllocPointer(10);
    EXPECT_EQ(qx::ScratchAllocPointer(200), nullptr);
    EXPECT_EQ(qx::ScratchAllocPointer(1), nullptr) << "refused although bytes are left";
    EXPECT_EQ(analysisWorkspace.liveBlocks(), 2) << "a refused request is not counted";
    qx::ScratchFree(second);
    EXPECT_EQ(qx::ScratchAllocPointer(1), nullptr);
    qx::ScratchFree(first);
    EXPECT_EQ(Bump(), 0U);
    void *again = qx::ScratchAllocPointer(10);
    EXPECT_EQ(again, first);
    qx::ScratchFree(again);

    void *payload = &payload;
    EXPECT_EQ(analysisWorkspace.allocate(1000, &payload), ErrWorkspaceExhausted);
    EXPECT_EQ(payload, nullptr);
    // There is no live block, so the region is empty again immediately.
    void *afterRefusal = qx::ScratchAllocPointer(10);
    EXPECT_EQ(afterRefusal, first);
    qx::ScratchFree(afterRefusal);
}

TEST(Workspace, ReleasesInAnyOrderFreeTheWholeRegion) {
    constexpr int count = 6;
    std::vector<int> order(count);
    for (int i = 0; i < count; ++i)
        order[static_cast<std::size_t>(i)] = i;
    do {
        const EnabledRegion region(10000);
        void *sentinel = qx::ScratchAllocPointer(5); // keeps the count above zero
        const uint32_t start = Bump();
        std::vector<void *> blocks;
        for (int i = 0; i < count; ++i)
            blocks.push_back(qx::ScratchAllocPointer(3 + i));
        const uint32_t full = Bump();
        std::vector<bool> released(count, false);
        for (int i : order) {
            qx::ScratchFree(blocks[static_cast<std::size_t>(i)]);
            released[static_cast<std::size_t>(i)] = true;
            // Bytes become free when the released blocks reach the end. A run of released blocks is
            // known only to the block directly after it at that time, so blocks in between may stay
            // longer.
            const bool lastIsFree = released[count - 1];
            EXPECT_EQ(Bump() < full, lastIsFree);
            if (i == count - 1) {
                uint32_t expected = start;
                int run = count - 1;
                while (run > 0 && released[static_cast<std::size_t>(run - 1)])
                    --run;
                for (int k = 0; k < run; ++k)
                    expected += static_cast<uint32_t>(3 + k + overhead);
                EXPECT_LE(Bump(), full);
                EXPECT_GE(Bump(), expected);
            }
        }
        qx::ScratchFree(sentinel);
        EXPECT_EQ(Bump(), 0U);
        EXPECT_EQ(analysisWorkspace.liveBlocks(), 0);
    } while (std::next_permutation(order.begin(), order.end()));
}

TEST(Workspace, ForwardAndReverseReleasesFreeTheWholeRun) {
    const EnabledRegion region(1000);
    void *keep = qx::ScratchAllocPointer(1);
    const uint32_t start = Bump();
    for (const bool reverse : {false, true}) {
        void *blocks[4];
        for (void *&block : blocks)
            block = qx::ScratchAllocPointer(20);
        if (reverse)
            std::reverse(std::begin(blocks), std::end(blocks));
        for (void *block : blocks)
            qx::ScratchFree(block);
        EXPECT_EQ(Bump(), start) << "reverse " << reverse;
    }
    qx::ScratchFree(keep);
}

TEST(Workspace, ResizeKeepsContentAndAStaleTotalSize) {
    qx::AttachScratchHeap();
    const auto fill = [](void *block, int32_t n) {
        for (int32_t i = 0; i < n; ++i)
            static_cast<unsigned char *>(block)[i] = static_cast<unsigned char>(i + 1);
    };
    const auto matches = [](const void *block, int32_t n) {
        for (int32_t i = 0; i < n; ++i)
            if (static_cast<const unsigned char *>(block)[i] != static_cast<unsigned char>(i + 1))
                return false;
        return true;
    };

    const EnabledRegion region(1000);
    for (const bool inRegion : {false, true}) {
        analysisWorkspace.setEnabled(inRegion);
        void *block = nullptr;
        ASSERT_EQ(qx::ScratchRealloc(&block, 40), 0);
        fill(block, 40);
        void *const first = block;
        ASSERT_EQ(qx::ScratchRealloc(&block, 24), 0);
        if (inRegion) {
            EXPECT_EQ(block, first) << "a smaller block is not moved";
            ASSERT_EQ(qx::ScratchRealloc(&block, 40), 0);
            EXPECT_EQ(block, first) << "nor is one of its original size";
        }
        ASSERT_EQ(qx::ScratchRealloc(&block, 100), 0);
        EXPECT_TRUE(matches(block, 24));
        EXPECT_EQ(TotalSizeOf(block), 48) << "keeps the size of the first request";
        fill(block, 100);

        // A move to another source copies no more than the stale size.
        analysisWorkspace.setEnabled(!inRegion);
        ASSERT_EQ(qx::ScratchRealloc(&block, 200), 0);
        EXPECT_EQ(ModeOf(block), inRegion ? 1 : 2);
        EXPECT_TRUE(matches(block, 40));
        EXPECT_EQ(TotalSizeOf(block), 208);
        ASSERT_EQ(qx::ScratchRealloc(&block, 0), 0);
        EXPECT_EQ(block, nullptr);
        EXPECT_EQ(analysisWorkspace.liveBlocks(), 0);
    }

    // A move copies the first size or the new one, whichever is smaller, and not a byte more.
    struct Move {
        int32_t first, then, last, moved;
    };
    for (const Move &move : {Move{60, 24, 80, 60}, {60, 60, 24, 24}, {40, 100, 200, 40}})
        for (const bool intoRegion : {false, true}) {
            analysisWorkspace.setEnabled(true);
            void *block = qx::ScratchAllocPointer(300);
            std::memset(block, 0xEE, 300); // the content that the region's next block finds
            qx::ScratchFree(block);
            analysisWorkspace.setEnabled(!intoRegion);
            block = qx::ScratchAllocPointer(move.first);
            ASSERT_EQ(qx::ScratchRealloc(&block, move.then), 0);
            fill(block, move.then);
            analysisWorkspace.setEnabled(intoRegion);
            ASSERT_EQ(qx::ScratchRealloc(&block, move.last), 0);
            EXPECT_TRUE(matches(block, std::min(move.moved, move.then)));
            for (int32_t i = move.moved; intoRegion && i < 200; ++i)
                ASSERT_EQ(static_cast<unsigned char *>(block)[i], 0xEE) << i;
            qx::ScratchFree(block);
        }

    // A resize that the region cannot serve loses the old block.
    analysisWorkspace.setEnabled(true);
    void *block = qx::ScratchAllocPointer(10);
    EXPECT_EQ(qx::ScratchRealloc(&block, 2000), ErrOutOfMemory);
    EXPECT_EQ(analysisWorkspace.liveBlocks(), 0);
}

TEST(Workspace, SweepEndsARunThatWasAborted) {
    const int before = RegisteredSweeps();
    ASSERT_EQ(analysisWorkspace.reserve(1000), 0);
    EXPECT_EQ(RegisteredSweeps(), before + 1);
    EXPECT_EQ(analysisWorkspace.reserve(5), ErrWorkspaceAlreadyInitialized);
    analysisWorkspace.setEnabled(true);
    void *leftBehind = qx::ScratchAllocPointer(10);
    EXPECT_NE(leftBehind, nullptr);
    EXPECT_EQ(analysisWorkspace.giveBack(), ErrWorkspaceStillInUse);
    // The block of a second thread is in a unit outside the stack.
    std::thread([] { EXPECT_NE(qx::ScratchAllocPointer(1), nullptr); }).join();
    EXPECT_EQ(analysisWorkspace.liveBlocks(), 2);
    RunSweeps();
    EXPECT_EQ(analysisWorkspace.liveBlocks(), -1);
    EXPECT_FALSE(analysisWorkspace.isEnabled());
    EXPECT_EQ(RegisteredSweeps(), before);
    EXPECT_EQ(analysisWorkspace.giveBack(), 0);
    ASSERT_EQ(analysisWorkspace.reserve(1000), 0);
    EXPECT_EQ(analysisWorkspace.liveBlocks(), 0) << "nothing remains of the swept region";
    EXPECT_EQ(analysisWorkspace.giveBack(), 0);
}

// Threads allocate, release in random order and resize; every block is filled with a unique
// pattern, so that an overlap of two live blocks or a lost byte is detected.
TEST(Workspace, ThreadsNeverShareAByte) {
    constexpr int threads = 8;
    constexpr int rounds = 60000;
    const EnabledRegion region(1 << 24);
    std::atomic<int> faults = 0;
    std::atomic<int> refusals = 0;
    const auto work = [&](int seed) {
        std::mt19937 random(static_cast<unsigned>(seed));
        struct Held {
            unsigned char *bytes;
            int32_t size;
            unsigned char mark;
        };
        std::vector<Held> held;
        const auto check = [&](const Held &h, int32_t size) {
            for (int32_t i = 0; i < size; ++i)
                if (h.bytes[i] != static_cast<unsigned char>(h.mark + i))
                    ++faults;
        };
        const auto fill = [&](Held &h) {
            h.mark = static_cast<unsigned char>(random());
            for (int32_t i = 0; i < h.size; ++i)
                h.bytes[i] = static_cast<unsigned char>(h.mark + i);
        };
        for (int round = 0; round < rounds; ++round) {
            const auto act = random() % 8;
            if (round % 64 == 63) { // an analysis ends: all blocks are released, in either order
                if (act % 2 == 0)
                    std::reverse(held.begin(), held.end());
                for (const Held &h : held) {
                    check(h, h.size);
                    qx::ScratchFree(h.bytes);
                }
                held.clear();
            }
            if (held.size() < 12 && act < 4) {
                Held h;
                h.size = static_cast<int32_t>(random() % 90);
                h.bytes = static_cast<unsigned char *>(qx::ScratchAllocPointer(h.size));
                if (h.bytes == nullptr) {
                    ++refusals;
                    continue;
                }
                fill(h);
                held.push_back(h);
            } else if (!held.empty() && act < 7) {
                const std::size_t which = act == 4 ? held.size() - 1 : random() % held.size();
                check(held[which], held[which].size);
                qx::ScratchFree(held[which].bytes);
                held.erase(held.begin() + static_cast<std::ptrdiff_t>(which));
            } else if (!held.empty()) {
                Held &h = held[random() % held.size()];
                const auto size = static_cast<int32_t>(1 + random() % 120);
                void *block = h.bytes;
                if (qx::ScratchRealloc(&block, size) != 0) {
                    h = held.back();
                    held.pop_back();
                    ++refusals;
                    continue;
                }
                h.bytes = static_cast<unsigned char *>(block);
                check(h, std::min(h.size, size));
                h.size = size;
                fill(h);
            }
        }
        for (const Held &h : held) {
            check(h, h.size);
            qx::ScratchFree(h.bytes);
        }
    };
    std::vector<std::thread> pool;
    for (int i = 0; i < threads; ++i)
        pool.emplace_back(work, i + 1);
    for (std::thread &thread : pool)
        thread.join();
    EXPECT_EQ(faults, 0);
    EXPECT_EQ(Bump(), 0U);
    EXPECT_EQ(analysisWorkspace.liveBlocks(), 0);
    // A refusal is possible while released runs lie between live blocks, but it must be rare.
    EXPECT_LT(refusals, threads * rounds / 100);
}

// The scratch blocks of one thread: allocates, checks and releases at random, with a unique pattern
// in each block.
class Churn {
public:
    Churn(unsigned seed, std::size_t most, int32_t largest)
        : random_(seed), most_(most), largest_(largest) {}
    ~Churn() {
        for (const Held &held : held_)
            drop(held);
    }
    Churn(const Churn &) = delete;
    Churn &operator=(const Churn &) = delete;

    // One request or one release.
    void step() {
        if (held_.empty() || (held_.size() < most_ && random_() % 2 == 0)) {
            const auto size = static_cast<int32_t>(8 + random_() % static_cast<unsigned>(largest_));
            auto *bytes = static_cast<unsigned char *>(qx::ScratchAllocPointer(size));
            if (bytes == nullptr) {
                ++refusals;
                return;
            }
            const auto mark = static_cast<unsigned char>(random_());
            bytes[0] = bytes[size / 2] = bytes[size - 1] = mark;
            held_.push_back({bytes, size, mark});
        } else {
            const std::size_t which = random_() % held_.size();
            drop(held_[which]);
            held_[which] = held_.back();
            held_.pop_back();
        }
    }
    int refusals = 0;
    int faults = 0;

private:
    struct Held {
        unsigned char *bytes;
        int32_t size;
        unsigned char mark;
    };
    void drop(const Held &held) {
        for (const int32_t at : {0, held.size / 2, held.size - 1})
            faults += held.bytes[at] != held.mark;
        qx::ScratchFree(held.bytes);
    }
    std::mt19937 random_;
    const std::size_t most_;
    const int32_t largest_;
    std::vector<Held> held_;
};

void RunThreads(int threads, const std::function<void(int)> &work) {
    std::vector<std::thread> pool;
    for (int i = 0; i < threads; ++i)
        pool.emplace_back(work, i);
    for (std::thread &thread : pool)
        thread.join();
}

// Blocks come and go without ever all being released, in a region four times their size: ten million
// requests and not one refusal.
TEST(Workspace, RoomForFourTimesTheLiveDataNeverRunsOut) {
    constexpr int threads = 8;
    const EnabledRegion region(1 << 20);
    struct Size {
        int blocks;
        int largest;
    };
    for (const Size size : {Size{2, 400}, Size{8, 4000}}) {
        std::atomic<int> refusals = 0;
        std::atomic<int> faults = 0;
        std::barrier start(threads); // a thread that is alone follows the single-thread rule
        RunThreads(threads, [&](int seed) {
            Churn churn(static_cast<unsigned>(seed), static_cast<std::size_t>(size.blocks),
                        size.largest);
            churn.step();
            start.arrive_and_wait();
            for (int i = 0; i < 1250000; ++i) // half of them requests, twice
                churn.step();
            refusals += churn.refusals;
            faults += churn.faults;
        });
        EXPECT_EQ(refusals, 0) << size.blocks << " blocks of up to " << size.largest
                               << " bytes a thread";
        EXPECT_EQ(faults, 0);
        EXPECT_EQ(analysisWorkspace.liveBlocks(), 0);
    }
    // The whole region serves one thread again.
    void *all = qx::ScratchAllocPointer((1 << 20) - overhead - 1);
    EXPECT_NE(all, nullptr);
    qx::ScratchFree(all);
}

// Some threads reserve and release regions of changing sizes, and enable and disable them, while
// others use blocks. No block is lost or shared, and in the end nothing is left.
TEST(Workspace, MayBeReleasedWhileOtherThreadsWork) {
    constexpr int rounds = 1000000 / 8;
    const int sweeps = RegisteredSweeps();
    std::atomic<int> faults = 0;
    std::atomic<int> served = 0;
    std::atomic<int> unexpected = 0;
    std::atomic<int> changing = 4; // threads that still change the region
    RunThreads(8, [&](int seed) {
        std::mt19937 random(static_cast<unsigned>(seed));
        if (seed % 2 == 0) {
            Churn churn(static_cast<unsigned>(seed), 3, 300);
            for (int i = 0; i < rounds || changing > 0; ++i) {
                churn.step();
                served += analysisWorkspace.isEnabled();
            }
            faults += churn.faults;
            return;
        }
        for (int i = 0; i < rounds; ++i) {
            ErrorCode code = 0;
            switch (random() % 4) {
            case 0:
                code = analysisWorkspace.reserve(static_cast<uint32_t>(1 + random() % 20000));
                break;
            case 1:
                code = analysisWorkspace.giveBack();
                break;
            default:
                code = analysisWorkspace.setEnabled(random() % 2 == 0);
            }
            unexpected += code != 0 && code != ErrWorkspaceAlreadyInitialized &&
                          code != ErrWorkspaceStillInUse && code != ErrWorkspaceStillEnabled &&
                          code != ErrWorkspaceNotInitialized;
        }
        --changing;
    });
    EXPECT_EQ(faults, 0);
    EXPECT_EQ(unexpected, 0);
    EXPECT_GT(served, 0) << "the region was never enabled during a request";
    analysisWorkspace.setEnabled(false);
    EXPECT_EQ(analysisWorkspace.giveBack(), 0);
    EXPECT_EQ(analysisWorkspace.liveBlocks(), -1);
    EXPECT_EQ(RegisteredSweeps(), sweeps);
}

} // namespace
} // namespace qx::test
