#include "linalg/blas_memory.h"

#include "frame/platform.h"

#include <atomic>
#include <cstddef>

// What BLAS asks of its own memory module, which is left out: that one takes its blocks from the
// heap and from the system, tries for ever where there is none, and prints where they are too many.
extern "C" {
void *blas_memory_alloc(int);
void blas_memory_free(void *block);
// The table of kernels of this processor, and what chooses it.
void *gotoblas = nullptr;
void gotoblas_dynamic_init();
}

namespace qx {

namespace {

// What the kernels take for granted that a block has, in the build for each target, with a page
// more for the shifts by which they avoid each other's cache sets.
constexpr std::size_t blockSize = (sizeof(void *) == 8 ? std::size_t{32} << 22 : 16 << 20) + 65536;
// Calls at once. A thread takes one block at a time.
constexpr int mostCallers = 512;

class Blocks {
public:
    ~Blocks() {
        for (Slot &slot : slots_)
            if (void *const block = slot.block.load())
                platform::UnmapPages(block, blockSize);
    }

    // Makes sure that there are at least as many blocks as callers.
    bool enter() {
        const int callers = ++callers_;
        while (callers <= mostCallers && blocks_ < callers)
            if (!addBlock())
                break;
        if (callers <= mostCallers && blocks_ >= callers)
            return true;
        --callers_;
        return false;
    }
    void leave() { --callers_; }

    // A free block; there is one, though another thread may be just about to put it here.
    void *take() {
        for (;;)
            for (Slot &slot : slots_) {
                void *const block = slot.block.load();
                if (block != nullptr && !slot.isTaken.exchange(true))
                    return block;
            }
    }
    void giveBack(const void *block) {
        for (Slot &slot : slots_)
            if (slot.block.load() == block) {
                slot.isTaken = false;
                return;
            }
    }

private:
    struct Slot {
        std::atomic<void *> block = nullptr;
        std::atomic<bool> isTaken = false;
    };

    bool addBlock() {
        void *const block = platform::MapPages(blockSize);
        if (block == nullptr)
            return false;
        for (Slot &slot : slots_) {
            void *none = nullptr;
            if (slot.block.compare_exchange_strong(none, block)) {
                ++blocks_;
                return true;
            }
        }
        platform::UnmapPages(block, blockSize);
        return false;
    }

    std::atomic<int> callers_ = 0, blocks_ = 0;
    Slot slots_[mostCallers];
};

Blocks blocks;

__attribute__((constructor)) void ChooseKernels() { gotoblas_dynamic_init(); }

} // namespace

BlasMemory::BlasMemory() : holds_(blocks.enter()) {}
BlasMemory::~BlasMemory() {
    if (holds_)
        blocks.leave();
}

} // namespace qx

void *blas_memory_alloc(int) { return qx::blocks.take(); }
void blas_memory_free(void *block) { qx::blocks.giveBack(block); }
