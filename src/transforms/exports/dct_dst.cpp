#include "transforms/separable.h"

#include "fft/plan_slot.h"
#include "frame/export.h"
#include "frame/heap_block.h"
#include "qx/dct_dst.h"

namespace qx {
namespace {

// The differences between the exports of the cosine and of the sine transform.
// kept: the orders determine which code is reported when memory runs out, and what is left in the output.
struct Cosine : CosineTransform {
    typedef CosineTransform Routines;
    static constexpr bool planBeforeWork = true;
    static constexpr bool plansBeforeReshape = true;
    // kept: without work memory the inverse reports success and leaves its output unwritten.
    static constexpr ErrorCode inverseWithoutWork = 0;
};
struct Sine : SineTransform {
    typedef SineTransform Routines;
    static constexpr bool planBeforeWork = false;
    static constexpr bool plansBeforeReshape = false;
    static constexpr ErrorCode inverseWithoutWork = ErrOutOfMemory;
};

typedef HeapBlock<ElementType::DBL> Work;

template <class Transform, class Keep>
Outcome Forward(In<DBL1D> in, Out<DBL1D> out, int32_t size, Keep keep) {
    if (in.isEmpty())
        return ErrEmptyInput;
    const int32_t n = size < 1 ? in.size() : size;
    if (const Outcome bad = out.resize(n))
        return bad;
    Work work;
    if (!Transform::planBeforeWork)
        if (const ErrorCode failed = work.allocate(Transform::forwardWork(n)))
            return failed;
    if (const ErrorCode failed = keep.acquire(Transform::planLength(n)))
        return failed;
    if (Transform::planBeforeWork)
        if (const ErrorCode failed = work.allocate(Transform::forwardWork(n)))
            return failed;
    return Transform::forward(keep.plan(), in.view(), out.view(), work.data());
}

template <class Transform, class Keep>
Outcome Inverse(In<DBL1D> in, Out<DBL1D> out, Keep keep) {
    const int32_t n = in.size();
    if (in.isEmpty())
        return ErrEmptyInput;
    if (const Outcome bad = out.resize(n))
        return bad;
    Work work;
    if (!Transform::planBeforeWork)
        if (work.allocate(Transform::inverseWork(n)) != 0)
            return Transform::inverseWithoutWork;
    if (const ErrorCode failed = keep.acquire(Transform::planLength(n)))
        return failed;
    if (Transform::planBeforeWork)
        if (work.allocate(Transform::inverseWork(n)) != 0)
            return Transform::inverseWithoutWork;
    return Transform::inverse(keep.plan(), in.view(), out.view(), work.data());
}

// Both plans and the output, in the order of the transform.
template <class Transform, class Keep>
Outcome TakePlansAndReshape(Keep &keep, Out<DBL2D> &out, int32_t rows, int32_t cols) {
    if (!Transform::plansBeforeReshape)
        if (const Outcome bad = out.resize(rows, cols))
            return bad;
    if (const ErrorCode failed = keep.acquire(Transform::planLength(rows)))
        return failed;
    if (const ErrorCode failed = keep.acquireSecond(Transform::planLength(cols)))
        return failed;
    return Transform::plansBeforeReshape ? out.resize(rows, cols) : Outcome();
}

template <class Transform, class Keep>
Outcome Forward2D(In<DBL2D> in, Out<DBL2D> out, int32_t rows, int32_t cols, Keep keep) {
    if (in.isEmpty())
        return ErrEmptyInput;
    rows = rows < 1 ? in.rows() : rows;
    cols = cols < 1 ? in.cols() : cols;
    if (!out.mayHave(rows, cols)) // before memory is allocated for so many values
        return ErrOutOfMemory;
    MatrixWindow window;
    if (const ErrorCode failed = window.take(in.view(), rows, cols))
        return failed;
    if (const Outcome bad = TakePlansAndReshape<Transform>(keep, out, rows, cols))
        return bad;
    return SeparableForward<typename Transform::Routines>(keep.plan(), keep.secondPlan(),
                                                          window.view, out.view());
}

template <class Transform, class Keep>
Outcome Inverse2D(In<DBL2D> in, Out<DBL2D> out, Keep keep) {
    if (in.isEmpty())
        return ErrEmptyInput;
    if (const Outcome bad = TakePlansAndReshape<Transform>(keep, out, in.rows(), in.cols()))
        return bad;
    return SeparableInverse<typename Transform::Routines>(keep.plan(), keep.secondPlan(), in.view(),
                                                          out.view());
}

} // namespace
} // namespace qx

using qx::Cosine;
using qx::KeepInInstance;
using qx::KeepInSlots;
using qx::ReturnedWithHost;
using qx::Sine;

ErrorCode DCT_1DH(DBL1D in, DBL1D out, int32_t size, PlanSlot *slot) {
    return ReturnedWithHost(qx::Forward<Cosine, KeepInSlots>, in, out, size, KeepInSlots(slot));
}

ErrorCode DCT_1DH_IDP(DBL1D in, DBL1D out, int32_t size, InstanceWord *instance) {
    return ReturnedWithHost(qx::Forward<Cosine, KeepInInstance>, in, out, size,
                            KeepInInstance(instance));
}

ErrorCode DST_1DH(DBL1D in, DBL1D out, int32_t size, PlanSlot *slot) {
    return ReturnedWithHost(qx::Forward<Sine, KeepInSlots>, in, out, size, KeepInSlots(slot));
}

ErrorCode DST_1DH_IDP(DBL1D in, DBL1D out, int32_t size, InstanceWord *instance) {
    return ReturnedWithHost(qx::Forward<Sine, KeepInInstance>, in, out, size,
                            KeepInInstance(instance));
}

ErrorCode InvDCT_1DH(DBL1D in, DBL1D out, PlanSlot *slot) {
    return ReturnedWithHost(qx::Inverse<Cosine, KeepInSlots>, in, out, KeepInSlots(slot));
}

ErrorCode InvDCT_1DH_IDP(DBL1D in, DBL1D out, InstanceWord *instance) {
    return ReturnedWithHost(qx::Inverse<Cosine, KeepInInstance>, in, out, KeepInInstance(instance));
}

ErrorCode InvDST_1DH(DBL1D in, DBL1D out, PlanSlot *slot) {
    return ReturnedWithHost(qx::Inverse<Sine, KeepInSlots>, in, out, KeepInSlots(slot));
}

ErrorCode InvDST_1DH_IDP(DBL1D in, DBL1D out, InstanceWord *instance) {
    return ReturnedWithHost(qx::Inverse<Sine, KeepInInstance>, in, out, KeepInInstance(instance));
}

ErrorCode DCT_2DH(DBL2D in, DBL2D out, int32_t rows, int32_t cols, PlanSlot *slotA,
                  PlanSlot *slotB) {
    return ReturnedWithHost(qx::Forward2D<Cosine, KeepInSlots>, in, out, rows, cols,
                            KeepInSlots(slotA, slotB));
}

ErrorCode DCT_2DH_IDP(DBL2D in, DBL2D out, int32_t rows, int32_t cols, InstanceWord *instance) {
    return ReturnedWithHost(qx::Forward2D<Cosine, KeepInInstance>, in, out, rows, cols,
                            KeepInInstance(instance));
}

ErrorCode DST_2DH(DBL2D in, DBL2D out, int32_t rows, int32_t cols, PlanSlot *slotA,
                  PlanSlot *slotB) {
    return ReturnedWithHost(qx::Forward2D<Sine, KeepInSlots>, in, out, rows, cols,
                            KeepInSlots(slotA, slotB));
}

ErrorCode DST_2DH_IDP(DBL2D in, DBL2D out, int32_t rows, int32_t cols, InstanceWord *instance) {
    return ReturnedWithHost(qx::Forward2D<Sine, KeepInInstance>, in, out, rows, cols,
                            KeepInInstance(instance));
}

ErrorCode InvDCT_2DH(DBL2D in, DBL2D out, PlanSlot *slotA, PlanSlot *slotB) {
    return ReturnedWithHost(qx::Inverse2D<Cosine, KeepInSlots>, in, out, KeepInSlots(slotA, slotB));
}

ErrorCode InvDCT_2DH_IDP(DBL2D in, DBL2D out, InstanceWord *instance) {
    return ReturnedWithHost(qx::Inverse2D<Cosine, KeepInInstance>, in, out,
                            KeepInInstance(instance));
}

ErrorCode InvDST_2DH(DBL2D in, DBL2D out, PlanSlot *slotA, PlanSlot *slotB) {
    return ReturnedWithHost(qx::Inverse2D<Sine, KeepInSlots>, in, out, KeepInSlots(slotA, slotB));
}

ErrorCode InvDST_2DH_IDP(DBL2D in, DBL2D out, InstanceWord *instance) {
    return ReturnedWithHost(qx::Inverse2D<Sine, KeepInInstance>, in, out, KeepInInstance(instance));
}
