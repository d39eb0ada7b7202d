#include "fft/plan_slot.h"

#include "frame/host_binding.h"
#include "frame/node_cell.h"

namespace qx {
namespace {

PlanCell *CellOf(PlanSlot slot) { return static_cast<PlanCell *>(slot); }

void ReleaseSlot(PlanSlot *slot) {
    if (!*slot)
        return;
    CellSweep(*slot);
    *slot = nullptr;
}

template <CellKind Kind>
ErrorCode Acquire(PlanSlot *slot, int32_t n) {
    constexpr bool isSwept = Kind == CellKind::Plan;
    if (const ErrorCode failed = ReserveCell<PlanCell>(slot, Kind))
        return failed;
    PlanCell *const cell = CellOf(*slot);
    if (cell->plan && cell->plan->length == n)
        return 0;

    const bool isNew = !cell->plan;
    qx::destroy_oxfft_table(cell->plan);
    cell->plan = qx::create_oxfft_table(n);
    // If the clean-up cannot be registered, treat it as a failed allocation.
    if (cell->plan && isSwept && isNew && HostRegisterSweep(CellSweep, cell, SweepForObject) != 0) {
        qx::destroy_oxfft_table(cell->plan);
        cell->plan = nullptr;
    }
    if (cell->plan)
        return 0;
    if (isSwept && !isNew)
        HostRegisterSweep(CellSweep, cell, SweepWithdraw);
    FreeCell(cell);
    *slot = nullptr;
    return ErrOutOfMemory;
}

} // namespace

ErrorCode PlanSlotAcquire(PlanSlot *slot, int32_t n) { return Acquire<CellKind::Plan>(slot, n); }

ErrorCode PlanSlotAcquireIDP(PlanSlot *slot, int32_t n) {
    return Acquire<CellKind::PlanOfInstance>(slot, n);
}

int32_t CellSweep(void *cell) {
    qx::destroy_oxfft_table(CellOf(cell)->plan);
    FreeCell(cell);
    return 0;
}

ErrorCode TransformInstanceReserve(InstanceWord *word) {
    return ReserveCell<TransformInstance>(word, CellKind::TransformInstance);
}

ErrorCode TransformInstanceRelease(InstanceWord *word) {
    if (!word || !*word)
        return 0;
    if (!IsCell(*word, CellKind::TransformInstance))
        return ErrInternal;
    auto *const instance = static_cast<TransformInstance *>(*word);
    ReleaseSlot(&instance->first);
    ReleaseSlot(&instance->second);
    FreeCell(instance);
    *word = nullptr;
    return 0;
}

} // namespace qx
