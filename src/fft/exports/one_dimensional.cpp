#include "fft/half_complex.h"
#include "fft/input_window.h"
#include "fft/plan.h"
#include "fft/plan_slot.h"
#include "fft/shifted_order.h"
#include "frame/finish.h"
#include "frame/scratch.h"
#include "frame/views.h"
#include "qx/fft.h"

namespace qx {
namespace {

typedef In1D<ElementType::DBL> RealIn;
typedef In1D<ElementType::CDB> ComplexIn;
typedef InOut1D<ElementType::DBL> RealInOut;
typedef Out1D<ElementType::CDB> ComplexOut;
// kept: these exports size their output as DBL and empty it as CDB.
typedef Out1D<ElementType::DBL, ElementType::CDB> RealOut;

// Interleaved complex data as the two arrays, of stride 2, that the engine takes.
ErrorCode ForwardInterleaved(const FFTPlan *plan, const CDB *in, CDB *out, int32_t n) {
    return FFTComplexForward(plan, &in->re, &in->im, &out->re, &out->im, 2, 2, n);
}

ErrorCode InverseInterleaved(const FFTPlan *plan, const CDB *in, CDB *out, int32_t n) {
    return FFTComplexInverse(plan, &in->re, &in->im, &out->re, &out->im, 2, 2, n);
}

template <class Keep>
int32_t ComplexForward(ComplexIn in, ComplexOut out, Keep keep, int32_t offset, int32_t size,
                       int32_t shift) {
    // kept: the offset is not checked here, in contrast to the real transform.
    if (const ErrorCode failed =
            FirstFailed({{in.size() < 1, ErrEmptyInput}, {size < 1, ErrFFTSizeNotPositive}}))
        return failed;
    if (const ErrorCode failed = keep.acquire(size))
        return failed;
    InputWindow<ElementType::CDB> window;
    if (const ErrorCode failed = window.take(in.data(), in.size(), offset, size))
        return failed;
    if (const int32_t hostStatus = out.reshape(size))
        return hostStatus;
    ErrorCode status = ForwardInterleaved(keep.plan(), window.data(), out.data(), size);
    if (status == 0 && shift != 0)
        status = RotateToShifted(out.data(), size);
    return Merge(status, window.release());
}

template <class Keep>
int32_t RealForward(RealIn in, ComplexOut out, Keep keep, int32_t offset, int32_t size,
                    int32_t shift) {
    if (const ErrorCode failed =
            FirstFailed({{in.size() < 1, ErrEmptyInput},
                         {offset < 0 || offset >= in.size(), ErrIndexOutOfRange},
                         {size < 1, ErrFFTSizeNotPositive}}))
        return failed;
    if (const ErrorCode failed = keep.acquire(size))
        return failed;
    if (const int32_t hostStatus = out.reshape(size))
        return hostStatus;
    InputWindow<ElementType::DBL> window;
    if (const ErrorCode failed = window.take(in.data(), in.size(), offset, size))
        return failed;
    DBL *const spectrum = &out.data()->re;
    const ErrorCode status =
        FFTRealForward(keep.plan(), window.data(), CompactHalf(spectrum, size, shift), 1, 1, size);
    if (status == 0)
        FFTCompactToFull(spectrum, size, shift);
    return Merge(status, window.release());
}

template <class Keep>
int32_t RealForwardHalfComplex(RealIn in, RealOut out, Keep keep) {
    const int32_t n = in.size();
    if (n < 1)
        return ErrEmptyInput;
    // kept: here the output is sized before the plan is acquired.
    if (const int32_t hostStatus = out.reshape(n))
        return hostStatus;
    if (const ErrorCode failed = keep.acquire(n))
        return failed;
    return FFTRealForward(keep.plan(), in.data(), out.data(), 1, 1, n);
}

template <class Keep>
int32_t ComplexInverse(ComplexIn in, ComplexOut out, Keep keep, int32_t shift) {
    const int32_t n = in.size();
    if (n < 1)
        return ErrEmptyInput;
    if (const ErrorCode failed = keep.acquire(n))
        return failed;
    if (const int32_t hostStatus = out.reshape(n))
        return hostStatus;
    if (shift == 0)
        return InverseInterleaved(keep.plan(), in.data(), out.data(), n);
    Scratch<ElementType::CDB> plain;
    if (const ErrorCode failed = plain.allocate(n))
        return failed;
    RotateFromShifted(in.data(), n, plain.data());
    const ErrorCode status = InverseInterleaved(keep.plan(), plain.data(), out.data(), n);
    return Merge(status, plain.release());
}

template <class Keep>
int32_t RealInverse(ComplexIn in, RealOut out, Keep keep, int32_t shift) {
    const int32_t n = in.size();
    if (n < 1)
        return ErrEmptyInput;
    if (const ErrorCode failed = keep.acquire(n))
        return failed;
    Scratch<ElementType::DBL> half;
    if (const ErrorCode failed = half.allocate(n))
        return failed;
    if (const int32_t hostStatus = out.reshape(n))
        return hostStatus;
    FFTFullToHalf(&in.data()->re, n, shift, half.data());
    const ErrorCode status = FFTRealInverse(keep.plan(), half.data(), out.data(), 1, 1, n);
    return Merge(status, half.release());
}

template <class Keep>
int32_t RealInverseHalfComplex(RealInOut in, RealOut out, Keep keep) {
    const int32_t n = in.size();
    if (n < 1)
        return ErrEmptyInput;
    // kept: here the output is sized before the plan is acquired.
    if (const int32_t hostStatus = out.reshape(n))
        return hostStatus;
    if (const ErrorCode failed = keep.acquire(n))
        return failed;
    // kept: no copy is made, so the caller's array is left scaled by 1/n in Hartley form.
    return FFTRealInverse(keep.plan(), in.data(), out.data(), 1, 1, n);
}

} // namespace
} // namespace qx

using namespace qx;

ErrorCode CxOXFFTH(CDB1D in, CDB1D out, PlanSlot *slot) {
    return CxOXFFTH80(in, out, slot, 0, (*in)->dimSize, 0);
}

ErrorCode CxOXFFTH80(CDB1D in, CDB1D out, PlanSlot *slot, int32_t offset, int32_t size,
                     int32_t shift) {
    const ComplexOut spectrum(out);
    return FinishTransform(
        ComplexForward(ComplexIn(in), spectrum, KeepInSlots(slot), offset, size, shift), spectrum);
}

ErrorCode CxOXFFTH80_IDP(CDB1D in, CDB1D out, InstanceWord *instance, int32_t offset, int32_t size,
                         int32_t shift) {
    const ComplexOut spectrum(out);
    return FinishTransform(
        ComplexForward(ComplexIn(in), spectrum, KeepInInstance(instance), offset, size, shift),
        spectrum);
}

ErrorCode InvCxOXFFTH(CDB1D in, CDB1D out, PlanSlot *slot) {
    return InvCxOXFFTH80(in, out, slot, 0);
}

ErrorCode InvCxOXFFTH80(CDB1D in, CDB1D out, PlanSlot *slot, int32_t shift) {
    const ComplexOut signal(out);
    return FinishTransform(ComplexInverse(ComplexIn(in), signal, KeepInSlots(slot), shift), signal);
}

ErrorCode InvCxOXFFTH80_IDP(CDB1D in, CDB1D out, InstanceWord *instance, int32_t shift) {
    const ComplexOut signal(out);
    return FinishTransform(ComplexInverse(ComplexIn(in), signal, KeepInInstance(instance), shift),
                           signal);
}

ErrorCode ReOXFFTH(DBL1D in, CDB1D out, PlanSlot *slot) {
    return ReOXFFTH80(in, out, slot, 0, (*in)->dimSize, 0);
}

ErrorCode ReOXFFTH80(DBL1D in, CDB1D out, PlanSlot *slot, int32_t offset, int32_t size,
                     int32_t shift) {
    const ComplexOut spectrum(out);
    return FinishTransform(
        RealForward(RealIn(in), spectrum, KeepInSlots(slot), offset, size, shift), spectrum);
}

ErrorCode ReOXFFTH80_IDP(DBL1D in, CDB1D out, InstanceWord *instance, int32_t offset, int32_t size,
                         int32_t shift) {
    const ComplexOut spectrum(out);
    return FinishTransform(
        RealForward(RealIn(in), spectrum, KeepInInstance(instance), offset, size, shift), spectrum);
}

ErrorCode ReOXFFTHCH(DBL1D in, DBL1D out, PlanSlot *slot) {
    const RealOut spectrum(out);
    return FinishTransform(RealForwardHalfComplex(RealIn(in), spectrum, KeepInSlots(slot)),
                           spectrum);
}

ErrorCode ReOXFFTHCH_IDP(DBL1D in, DBL1D out, InstanceWord *instance) {
    const RealOut spectrum(out);
    return FinishTransform(RealForwardHalfComplex(RealIn(in), spectrum, KeepInInstance(instance)),
                           spectrum);
}

ErrorCode InvReOXFFTH(CDB1D in, DBL1D out, PlanSlot *slot) {
    return InvReOXFFTH80(in, out, slot, 0);
}

ErrorCode InvReOXFFTH80(CDB1D in, DBL1D out, PlanSlot *slot, int32_t shift) {
    const RealOut signal(out);
    return FinishTransform(RealInverse(ComplexIn(in), signal, KeepInSlots(slot), shift), signal);
}

ErrorCode InvReOXFFTH80_IDP(CDB1D in, DBL1D out, InstanceWord *instance, int32_t shift) {
    const RealOut signal(out);
    return FinishTransform(RealInverse(ComplexIn(in), signal, KeepInInstance(instance), shift),
                           signal);
}

ErrorCode InvReOXFFTHCH(DBL1D in, DBL1D out, PlanSlot *slot) {
    const RealOut signal(out);
    return FinishTransform(RealInverseHalfComplex(RealInOut(in), signal, KeepInSlots(slot)),
                           signal);
}

ErrorCode InvReOXFFTHCH_IDP(DBL1D in, DBL1D out, InstanceWord *instance) {
    const RealOut signal(out);
    return FinishTransform(RealInverseHalfComplex(RealInOut(in), signal, KeepInInstance(instance)),
                           signal);
}

ErrorCode TransformUnreserveProc(InstanceWord *instance) {
    TransformInstanceRelease(instance);
    return 0;
}
