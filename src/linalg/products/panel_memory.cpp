#include "linalg/products/panel_memory.h"

#include "frame/platform.h"

#include <atomic>

namespace qx {

namespace {

constexpr std::size_t bytes = PanelMemory::size * sizeof(double);
constexpr int mostBlocks = sizeof(void *) == 8 ? 64 : 16;

struct Slot {
    std::atomic<bool> isTaken = false;
    // Belongs to the product that has taken the slot.
    void *block = nullptr;
};

struct Blocks {
    ~Blocks() {
        for (const Slot &slot : slots)
            if (slot.block != nullptr)
                platform::UnmapPages(slot.block, bytes);
    }
    Slot slots[mostBlocks];
} blocks;

} // namespace

PanelMemory::PanelMemory() : data_(nullptr), slot_(0) {
    while (slot_ < mostBlocks && blocks.slots[slot_].isTaken.exchange(true))
        ++slot_;
    if (slot_ == mostBlocks)
        return;
    void *&block = blocks.slots[slot_].block;
    if (block == nullptr)
        block = platform::MapPages(bytes);
    data_ = static_cast<DBL *>(block);
}

DBL *PanelMemory::data() const { return data_; }

PanelMemory::~PanelMemory() {
    if (slot_ < mostBlocks)
        blocks.slots[slot_].isTaken = false;
}

} // namespace qx
