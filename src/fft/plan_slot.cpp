#include "fft/plan_slot.h"

#include "frame/host_binding.h"

#include <cstdlib>

namespace qx {
namespace {

PlanCell *CellOf(PlanSlot slot) { return static_cast<PlanCell *>(slot); }

void ReleaseSlot(PlanSlot *slot) {
    if (!*slot)
        return;
    qx::destroy_oxfft_table(CellOf(*slot)->plan);
    std::free(*slot);
    *slot = nullptr;
}

// `Swept` tells whether the host sweeps the cell.
template <bool Swept>
ErrorCode Acquire(PlanSlot *slot, int32_t n) {
    if (!*slot)
        *slot = std::calloc(1, sizeof(PlanCell));
    if (!*slot)
        return ErrOutOfMemory;
    PlanCell *const cell = CellOf(*slot);
    if (cell->plan && cell->plan->length == n)
        return 0;

    const bool isNew = !cell->plan;
    qx::destroy_oxfft_table(cell->plan);
    cell->plan = qx::create_oxfft_table(n);
    // A plan that nobody would sweep is none.
    if (cell->plan && Swept && isNew &&
        HostRegisterSweep(CellSweep, cell, SweepForObject) != 0) {
        qx::destroy_oxfft_table(cell->plan);
        cell->plan = nullptr;
    }
    if (cell->plan)
        return 0;
    if (Swept && !isNew)
        HostRegisterSweep(CellSweep, cell, SweepWithdraw);
    std::free(cell);
    *slot = nullptr;
    return ErrOutOfMemory;
}

} // namespace

ErrorCode PlanSlotAcquire(PlanSlot *slot, int32_t n) { return Acquire<true>(slot, n); }

ErrorCode PlanSlotAcquireIDP(PlanSlot *slot, int32_t n) { return Acquire<false>(slot, n); }

int32_t CellSweep(void *cell) {
    qx::destroy_oxfft_table(CellOf(cell)->plan);
    std::free(cell);
    return 0;
}

ErrorCode TransformInstanceReserve(InstanceWord *word) {
    if (!*word)
        *word = std::calloc(1, sizeof(TransformInstance));
    return *word ? 0 : ErrOutOfMemory;
}

void TransformInstanceRelease(InstanceWord *word) {
    if (!word || !*word)
        return;
    auto *const instance = static_cast<TransformInstance *>(*word);
    ReleaseSlot(&instance->first);
    ReleaseSlot(&instance->second);
    std::free(instance);
    *word = nullptr;
}

} // namespace qx
