#ifndef QX_FFT_PLAN_SLOT_H
#define QX_FFT_PLAN_SLOT_H

#include "fft/plan.h"
#include "qx/errors.h"
#include "qx/fft.h"

#include <cstdint>
#include <limits>

namespace qx {

// The plan that a node holds between calls.
struct PlanCell {
    FFTPlan *plan;
};

// What the host's instance-data word of a node points to: a slot for each plan that a transform
// can need. Transforms with one plan use the first.
struct TransformInstance {
    PlanSlot first;
    PlanSlot second;
};

// Makes the slot hold a plan of length n. A plan of that length that is there already is left
// as it is, without a look into the plan cache. 0; ErrInternal for a slot that holds something
// else, which stays; ErrOutOfMemory, with the slot then null.
//
// The first form registers a sweep for the cell with the host; the IDP form registers nothing,
// because the host gives instance data back through TransformUnreserveProc.
ErrorCode PlanSlotAcquire(PlanSlot *slot, int32_t n);
ErrorCode PlanSlotAcquireIDP(PlanSlot *slot, int32_t n);

// Called by the host when it cleans up after an aborted run: gives the plan and the cell back.
// The slot belongs to the object that the host is discarding and is not touched.
int32_t CellSweep(void *cell);

// Makes an instance where the word is null. 0, ErrInternal for a word that holds something else,
// ErrOutOfMemory.
ErrorCode TransformInstanceReserve(InstanceWord *word);
// 0, or ErrInternal for a word that holds something else, which stays.
ErrorCode TransformInstanceRelease(InstanceWord *word);

inline bool IsPlanLength(int64_t n) { return n <= std::numeric_limits<int32_t>::max(); }

inline const FFTPlan *HeldPlan(const PlanSlot *slot) {
    return static_cast<const PlanCell *>(*slot)->plan;
}

// The two ways to keep plans across the calls of a node; a plain export and its _IDP twin differ
// in nothing else. A length beyond int32, which some transforms compute from theirs, is memory
// that cannot be had.

// In words that the caller owns, swept by the host.
class KeepInSlots {
public:
    explicit KeepInSlots(PlanSlot *first, PlanSlot *second = nullptr)
        : first_(first), second_(second) {}
    ErrorCode acquire(int64_t n) const { return acquire(first_, n); }
    // One slot given twice holds one plan.
    ErrorCode acquireSecond(int64_t n) const {
        if (second_ == first_ && plan()->length != n)
            return ErrInternal;
        return acquire(second_, n);
    }
    const FFTPlan *plan() const { return HeldPlan(first_); }
    const FFTPlan *secondPlan() const { return HeldPlan(second_); }

private:
    static ErrorCode acquire(PlanSlot *slot, int64_t n) {
        return IsPlanLength(n) ? PlanSlotAcquire(slot, static_cast<int32_t>(n)) : ErrOutOfMemory;
    }

    PlanSlot *first_;
    PlanSlot *second_;
};

// In the host's instance data, given back through TransformUnreserveProc.
class KeepInInstance {
public:
    explicit KeepInInstance(InstanceWord *word) : word_(word) {}
    ErrorCode acquire(int64_t n) const { return acquire(&TransformInstance::first, n); }
    ErrorCode acquireSecond(int64_t n) const { return acquire(&TransformInstance::second, n); }
    const FFTPlan *plan() const { return HeldPlan(&instance()->first); }
    const FFTPlan *secondPlan() const { return HeldPlan(&instance()->second); }

private:
    TransformInstance *instance() const { return static_cast<TransformInstance *>(*word_); }
    ErrorCode acquire(PlanSlot TransformInstance::*slot, int64_t n) const {
        if (const ErrorCode failed = TransformInstanceReserve(word_))
            return failed;
        return IsPlanLength(n) ? PlanSlotAcquireIDP(&(instance()->*slot), static_cast<int32_t>(n))
                               : ErrOutOfMemory;
    }

    InstanceWord *word_;
};

} // namespace qx

#endif
