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

// Makes the slot hold a plan of length n. If it already holds a plan of that length, nothing changes
// and the plan cache is not consulted. Returns 0; ErrInternal for a slot that holds something else,
// which stays; or ErrOutOfMemory, and then the slot is null.
//
// The first form registers a sweep for the cell with the host; the IDP form registers nothing,
// because the host releases instance data through TransformUnreserveProc.
ErrorCode PlanSlotAcquire(PlanSlot *slot, int32_t n);
ErrorCode PlanSlotAcquireIDP(PlanSlot *slot, int32_t n);

// Called by the host when it cleans up after an aborted run: releases the plan and the cell. The slot
// belongs to the object that the host is discarding and is not accessed.
int32_t CellSweep(void *cell);

// Creates an instance if the word is null. Returns 0, ErrInternal for a word that holds something else,
// or ErrOutOfMemory. For KeepInInstance, which is inline because short transforms take 30 ns.
ErrorCode TransformInstanceReserve(InstanceWord *word);
// Returns 0, or ErrInternal for a word that holds something else, which stays.
ErrorCode TransformInstanceRelease(InstanceWord *word);

inline bool IsPlanLength(int64_t n) { return n <= std::numeric_limits<int32_t>::max(); }

inline const FFTPlan *HeldPlan(const PlanSlot *slot) {
    return static_cast<const PlanCell *>(*slot)->plan;
}

// The two ways to keep plans across the calls of a node; a plain export and its _IDP twin differ
// in nothing else. A length beyond int32, which some transforms compute from their own, counts as
// memory that cannot be allocated. The plans are remembered, because the host may change the words
// during a resize.

// In words that the caller owns, cleaned up by the host.
class KeepInSlots {
public:
    explicit KeepInSlots(PlanSlot *first, PlanSlot *second = nullptr)
        : first_(first), second_(second) {}
    ErrorCode acquire(int64_t n) { return acquire(first_, n, &plan_); }
    // One slot given twice holds one plan.
    ErrorCode acquireSecond(int64_t n) {
        if (second_ == first_ && plan_->length != n)
            return ErrInternal;
        return acquire(second_, n, &secondPlan_);
    }
    const FFTPlan *plan() const { return plan_; }
    const FFTPlan *secondPlan() const { return secondPlan_; }

private:
    static ErrorCode acquire(PlanSlot *slot, int64_t n, const FFTPlan **plan) {
        if (!IsPlanLength(n))
            return ErrOutOfMemory;
        if (const ErrorCode failed = PlanSlotAcquire(slot, static_cast<int32_t>(n)))
            return failed;
        *plan = HeldPlan(slot);
        return 0;
    }

    PlanSlot *first_;
    PlanSlot *second_;
    const FFTPlan *plan_ = nullptr, *secondPlan_ = nullptr;
};

// In the host's instance data, released through TransformUnreserveProc.
class KeepInInstance {
public:
    explicit KeepInInstance(InstanceWord *word) : word_(word) {}
    ErrorCode acquire(int64_t n) { return acquire(&TransformInstance::first, n, &plan_); }
    ErrorCode acquireSecond(int64_t n) {
        return acquire(&TransformInstance::second, n, &secondPlan_);
    }
    const FFTPlan *plan() const { return plan_; }
    const FFTPlan *secondPlan() const { return secondPlan_; }

private:
    ErrorCode acquire(PlanSlot TransformInstance::*which, int64_t n, const FFTPlan **plan) const {
        if (const ErrorCode failed = TransformInstanceReserve(word_))
            return failed;
        if (!IsPlanLength(n))
            return ErrOutOfMemory;
        PlanSlot *const slot = &(static_cast<TransformInstance *>(*word_)->*which);
        if (const ErrorCode failed = PlanSlotAcquireIDP(slot, static_cast<int32_t>(n)))
            return failed;
        *plan = HeldPlan(slot);
        return 0;
    }

    InstanceWord *word_;
    const FFTPlan *plan_ = nullptr, *secondPlan_ = nullptr;
};

} // namespace qx

#endif
