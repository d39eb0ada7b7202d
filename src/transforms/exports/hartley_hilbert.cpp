#include "transforms/hartley.h"

#include "fft/plan_slot.h"
#include "frame/export.h"
#include "qx/hartley_hilbert.h"

namespace qx {
namespace {

template <auto Transform, class Keep>
ErrorCode InPlace(InOut<DBL1D> x, Keep keep) {
    if (x.isEmpty())
        return ErrEmptyInput;
    if (const ErrorCode failed = keep.acquire(x.size()))
        return failed;
    return Transform(keep.plan(), x.view());
}

// kept: without a plan the inverse Hartley transform leaves its array untouched; any other failure
// empties it.
template <class Keep>
ErrorCode HartleyInverse(InOut<DBL1D, OnFailure::Keep> x, Keep keep) {
    ErrorCode status = ErrEmptyInput;
    if (!x.isEmpty()) {
        if (const ErrorCode failed = keep.acquire(x.size()))
            return failed;
        status = FastHartleyInverse(keep.plan(), x.view());
    }
    if (status < 0)
        x.empty();
    return status;
}

} // namespace
} // namespace qx

using qx::KeepInInstance;
using qx::KeepInSlots;
using qx::Returned;

ErrorCode FHTH(DBL1D x, PlanSlot *slot) {
    return Returned(qx::InPlace<qx::FastHartley, KeepInSlots>, x, KeepInSlots(slot));
}

ErrorCode FHTH_IDP(DBL1D x, InstanceWord *instance) {
    return Returned(qx::InPlace<qx::FastHartley, KeepInInstance>, x, KeepInInstance(instance));
}

ErrorCode InvFHTH(DBL1D x, PlanSlot *slot) {
    return Returned(qx::HartleyInverse<KeepInSlots>, x, KeepInSlots(slot));
}

ErrorCode InvFHTH_IDP(DBL1D x, InstanceWord *instance) {
    return Returned(qx::HartleyInverse<KeepInInstance>, x, KeepInInstance(instance));
}

ErrorCode FastHilbertTransformH(DBL1D x, PlanSlot *slot) {
    return Returned(qx::InPlace<qx::FastHilbert, KeepInSlots>, x, KeepInSlots(slot));
}

ErrorCode FastHilbertTransformH_IDP(DBL1D x, InstanceWord *instance) {
    return Returned(qx::InPlace<qx::FastHilbert, KeepInInstance>, x, KeepInInstance(instance));
}

ErrorCode InvFastHilbertTransformH(DBL1D x, PlanSlot *slot) {
    return Returned(qx::InPlace<qx::FastHilbertInverse, KeepInSlots>, x, KeepInSlots(slot));
}

ErrorCode InvFastHilbertTransformH_IDP(DBL1D x, InstanceWord *instance) {
    return Returned(qx::InPlace<qx::FastHilbertInverse, KeepInInstance>, x,
                    KeepInInstance(instance));
}
