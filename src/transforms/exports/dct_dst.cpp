#include "transforms/separable.h"

#include "fft/plan_slot.h"
#include "frame/finish.h"
#include "frame/heap_block.h"
#include "frame/views.h"
#include "qx/transforms.h"

namespace qx {
namespace {

typedef In1D<ElementType::DBL> Vector;
typedef Out1D<ElementType::DBL> VectorOut;
typedef In2D<ElementType::DBL> Matrix;
typedef Out2D<ElementType::DBL> MatrixOut;

// What the frames of the cosine and of the sine transform do differently.
// kept: the orders show in which code a short memory gives, and what is left behind.
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
int32_t Forward(Vector in, VectorOut out, int32_t size, Keep keep) {
    if (in.size() < 1)
        return ErrEmptyInput;
    const int32_t n = size < 1 ? in.size() : size;
    if (const int32_t hostStatus = out.reshape(n))
        return hostStatus;
    Work work;
    if (!Transform::planBeforeWork)
        if (const ErrorCode failed = work.allocate(Transform::forwardWork(n)))
            return failed;
    if (const ErrorCode failed = keep.acquire(Transform::planLength(n)))
        return failed;
    if (Transform::planBeforeWork)
        if (const ErrorCode failed = work.allocate(Transform::forwardWork(n)))
            return failed;
    return Transform::forward(keep.plan(), in.data(), in.size(), out.data(), 1, 1, n, work.data());
}

template <class Transform, class Keep>
int32_t Inverse(Vector in, VectorOut out, Keep keep) {
    const int32_t n = in.size();
    if (n < 1)
        return ErrEmptyInput;
    if (const int32_t hostStatus = out.reshape(n))
        return hostStatus;
    Work work;
    if (!Transform::planBeforeWork)
        if (work.allocate(Transform::inverseWork(n)) != 0)
            return Transform::inverseWithoutWork;
    if (const ErrorCode failed = keep.acquire(Transform::planLength(n)))
        return failed;
    if (Transform::planBeforeWork)
        if (work.allocate(Transform::inverseWork(n)) != 0)
            return Transform::inverseWithoutWork;
    return Transform::inverse(in.data(), out.data(), 1, 1, n, work.data(), keep.plan());
}

// Both plans and the output, in the order of the transform.
template <class Transform, class Keep>
int32_t TakePlansAndReshape(Keep keep, MatrixOut out, int32_t rows, int32_t cols) {
    if (!Transform::plansBeforeReshape)
        if (const int32_t hostStatus = out.reshape(rows, cols))
            return hostStatus;
    if (const ErrorCode failed = keep.acquire(Transform::planLength(rows)))
        return failed;
    if (const ErrorCode failed = keep.acquireSecond(Transform::planLength(cols)))
        return failed;
    return Transform::plansBeforeReshape ? out.reshape(rows, cols) : 0;
}

template <class Transform, class Keep>
int32_t Forward2D(Matrix in, MatrixOut out, int32_t rows, int32_t cols, Keep keep) {
    if (in.isEmpty())
        return ErrEmptyInput;
    rows = rows < 1 ? in.rows() : rows;
    cols = cols < 1 ? in.cols() : cols;
    MatrixWindow window;
    if (const ErrorCode failed = window.take(in.data(), in.rows(), in.cols(), rows, cols))
        return failed;
    if (const int32_t failed = TakePlansAndReshape<Transform>(keep, out, rows, cols))
        return failed;
    return SeparableForward<typename Transform::Routines>(keep.plan(), keep.secondPlan(),
                                                          window.data, out.data(), rows, cols);
}

template <class Transform, class Keep>
int32_t Inverse2D(Matrix in, MatrixOut out, Keep keep) {
    if (in.isEmpty())
        return ErrEmptyInput;
    const int32_t rows = in.rows();
    const int32_t cols = in.cols();
    if (const int32_t failed = TakePlansAndReshape<Transform>(keep, out, rows, cols))
        return failed;
    return SeparableInverse<typename Transform::Routines>(keep.plan(), keep.secondPlan(), in.data(),
                                                          out.data(), rows, cols);
}

} // namespace
} // namespace qx

using namespace qx;

ErrorCode DCT_1DH(DBL1D in, DBL1D out, int32_t size, PlanSlot *slot) {
    const VectorOut result(out);
    return FinishTransform(Forward<Cosine>(Vector(in), result, size, KeepInSlots(slot)), result);
}

ErrorCode DCT_1DH_IDP(DBL1D in, DBL1D out, int32_t size, InstanceWord *instance) {
    const VectorOut result(out);
    return FinishTransform(Forward<Cosine>(Vector(in), result, size, KeepInInstance(instance)),
                           result);
}

ErrorCode DST_1DH(DBL1D in, DBL1D out, int32_t size, PlanSlot *slot) {
    const VectorOut result(out);
    return FinishTransform(Forward<Sine>(Vector(in), result, size, KeepInSlots(slot)), result);
}

ErrorCode DST_1DH_IDP(DBL1D in, DBL1D out, int32_t size, InstanceWord *instance) {
    const VectorOut result(out);
    return FinishTransform(Forward<Sine>(Vector(in), result, size, KeepInInstance(instance)),
                           result);
}

ErrorCode InvDCT_1DH(DBL1D in, DBL1D out, PlanSlot *slot) {
    const VectorOut result(out);
    return FinishTransform(Inverse<Cosine>(Vector(in), result, KeepInSlots(slot)), result);
}

ErrorCode InvDCT_1DH_IDP(DBL1D in, DBL1D out, InstanceWord *instance) {
    const VectorOut result(out);
    return FinishTransform(Inverse<Cosine>(Vector(in), result, KeepInInstance(instance)), result);
}

ErrorCode InvDST_1DH(DBL1D in, DBL1D out, PlanSlot *slot) {
    const VectorOut result(out);
    return FinishTransform(Inverse<Sine>(Vector(in), result, KeepInSlots(slot)), result);
}

ErrorCode InvDST_1DH_IDP(DBL1D in, DBL1D out, InstanceWord *instance) {
    const VectorOut result(out);
    return FinishTransform(Inverse<Sine>(Vector(in), result, KeepInInstance(instance)), result);
}

ErrorCode DCT_2DH(DBL2D in, DBL2D out, int32_t rows, int32_t cols, PlanSlot *slotA,
                  PlanSlot *slotB) {
    const MatrixOut result(out);
    return FinishTransform(
        Forward2D<Cosine>(Matrix(in), result, rows, cols, KeepInSlots(slotA, slotB)), result);
}

ErrorCode DCT_2DH_IDP(DBL2D in, DBL2D out, int32_t rows, int32_t cols, InstanceWord *instance) {
    const MatrixOut result(out);
    return FinishTransform(
        Forward2D<Cosine>(Matrix(in), result, rows, cols, KeepInInstance(instance)), result);
}

ErrorCode DST_2DH(DBL2D in, DBL2D out, int32_t rows, int32_t cols, PlanSlot *slotA,
                  PlanSlot *slotB) {
    const MatrixOut result(out);
    return FinishTransform(
        Forward2D<Sine>(Matrix(in), result, rows, cols, KeepInSlots(slotA, slotB)), result);
}

ErrorCode DST_2DH_IDP(DBL2D in, DBL2D out, int32_t rows, int32_t cols, InstanceWord *instance) {
    const MatrixOut result(out);
    return FinishTransform(
        Forward2D<Sine>(Matrix(in), result, rows, cols, KeepInInstance(instance)), result);
}

ErrorCode InvDCT_2DH(DBL2D in, DBL2D out, PlanSlot *slotA, PlanSlot *slotB) {
    const MatrixOut result(out);
    return FinishTransform(Inverse2D<Cosine>(Matrix(in), result, KeepInSlots(slotA, slotB)),
                           result);
}

ErrorCode InvDCT_2DH_IDP(DBL2D in, DBL2D out, InstanceWord *instance) {
    const MatrixOut result(out);
    return FinishTransform(Inverse2D<Cosine>(Matrix(in), result, KeepInInstance(instance)), result);
}

ErrorCode InvDST_2DH(DBL2D in, DBL2D out, PlanSlot *slotA, PlanSlot *slotB) {
    const MatrixOut result(out);
    return FinishTransform(Inverse2D<Sine>(Matrix(in), result, KeepInSlots(slotA, slotB)), result);
}

ErrorCode InvDST_2DH_IDP(DBL2D in, DBL2D out, InstanceWord *instance) {
    const MatrixOut result(out);
    return FinishTransform(Inverse2D<Sine>(Matrix(in), result, KeepInInstance(instance)), result);
}
