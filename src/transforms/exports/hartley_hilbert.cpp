#include "transforms/hartley.h"

#include "fft/plan_slot.h"
#include "frame/finish.h"
#include "frame/views.h"
#include "qx/transforms.h"

namespace qx {
namespace {

typedef InOut1D<ElementType::DBL> Signal;

// What becomes of the array when no plan can be had.
enum class WithoutPlan { EmptyArray, LeaveArray };

// The kept plan only holds the length in the cache: the inner routines take a reference of their
// own.
template <WithoutPlan OnNoPlan = WithoutPlan::EmptyArray, class Keep>
ErrorCode InPlace(ErrorCode (*transform)(DBL *, int32_t), const Signal &x, Keep keep) {
    const int32_t n = x.size();
    if (n < 1)
        return Finish(ErrEmptyInput, x);
    if (const ErrorCode failed = keep.acquire(n))
        return OnNoPlan == WithoutPlan::LeaveArray ? failed : Finish(failed, x);
    return Finish(transform(x.data(), n), x);
}

} // namespace
} // namespace qx

using namespace qx;

ErrorCode FHTH(DBL1D x, PlanSlot *slot) {
    return InPlace(FastHartley, Signal(x), KeepInSlots(slot));
}

ErrorCode FHTH_IDP(DBL1D x, InstanceWord *instance) {
    return InPlace(FastHartley, Signal(x), KeepInInstance(instance));
}

// kept: without a plan the inverse Hartley transform leaves its array untouched.
ErrorCode InvFHTH(DBL1D x, PlanSlot *slot) {
    return InPlace<WithoutPlan::LeaveArray>(FastHartleyInverse, Signal(x), KeepInSlots(slot));
}

// kept: as in InvFHTH.
ErrorCode InvFHTH_IDP(DBL1D x, InstanceWord *instance) {
    return InPlace<WithoutPlan::LeaveArray>(FastHartleyInverse, Signal(x),
                                            KeepInInstance(instance));
}

ErrorCode FastHilbertTransformH(DBL1D x, PlanSlot *slot) {
    return InPlace(FastHilbert, Signal(x), KeepInSlots(slot));
}

ErrorCode FastHilbertTransformH_IDP(DBL1D x, InstanceWord *instance) {
    return InPlace(FastHilbert, Signal(x), KeepInInstance(instance));
}

ErrorCode InvFastHilbertTransformH(DBL1D x, PlanSlot *slot) {
    return InPlace(FastHilbertInverse, Signal(x), KeepInSlots(slot));
}

ErrorCode InvFastHilbertTransformH_IDP(DBL1D x, InstanceWord *instance) {
    return InPlace(FastHilbertInverse, Signal(x), KeepInInstance(instance));
}
