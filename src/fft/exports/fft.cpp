#include "qx/fft.h"
#include "fft/half_complex.h"
#include "fft/input_window.h"
#include "fft/plan.h"
#include "fft/plan_slot.h"
#include "fft/shifted_order.h"
#include "frame/export.h"

namespace qx {
namespace {

// kept: these exports size their output as DBL and empty it as CDB.
typedef Out<DBL1D, OnFailure::Empty, ElementType::CDB> RealOut;

// Passes interleaved complex data to the engine as two arrays of stride 2.
ErrorCode ForwardInterleaved(const FFTPlan *plan, const CDB *in, CDB *out, int32_t n) {
    return FFTComplexForward(plan, &in->re, &in->im, &out->re, &out->im, 2, 2, n);
}

ErrorCode InverseInterleaved(const FFTPlan *plan, const CDB *in, CDB *out, int32_t n) {
    return FFTComplexInverse(plan, &in->re, &in->im, &out->re, &out->im, 2, 2, n);
}

template <class Keep>
Outcome ComplexForward(In<CDB1D> in, Out<CDB1D> out, Keep keep, int32_t offset, int32_t size,
                       int32_t shift) {
    // kept: any offset is taken here, in contrast to the real transform.
    if (const ErrorCode failed =
            FirstFailed({{in.isEmpty(), ErrEmptyInput}, {size < 1, ErrFFTSizeNotPositive}}))
        return failed;
    if (const ErrorCode failed = keep.acquire(size))
        return failed;
    InputWindow<ElementType::CDB> window;
    if (const ErrorCode failed = window.take(in.data(), in.size(), offset, size))
        return failed;
    if (const Outcome bad = out.resize(size))
        return bad;
    ErrorCode status = ForwardInterleaved(keep.plan(), window.data(), out.data(), size);
    if (status == 0 && shift != 0)
        status = RotateToShifted(out.data(), size);
    return Merge(status, window.release());
}

template <class Keep>
Outcome RealForward(In<DBL1D> in, Out<CDB1D> out, Keep keep, int32_t offset, int32_t size,
                    int32_t shift) {
    if (const ErrorCode failed =
            FirstFailed({{in.isEmpty(), ErrEmptyInput},
                         {offset < 0 || offset >= in.size(), ErrIndexOutOfRange},
                         {size < 1, ErrFFTSizeNotPositive}}))
        return failed;
    if (const ErrorCode failed = keep.acquire(size))
        return failed;
    if (const Outcome bad = out.resize(size))
        return bad;
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
Outcome RealForwardHalfComplex(In<DBL1D> in, RealOut out, Keep keep) {
    const int32_t n = in.size();
    if (in.isEmpty())
        return ErrEmptyInput;
    // kept: here the output is sized before the plan is acquired.
    if (const Outcome bad = out.resize(n))
        return bad;
    if (const ErrorCode failed = keep.acquire(n))
        return failed;
    return FFTRealForward(keep.plan(), in.data(), out.data(), 1, 1, n);
}

template <class Keep>
Outcome ComplexInverse(In<CDB1D> in, Out<CDB1D> out, Keep keep, int32_t shift) {
    const int32_t n = in.size();
    if (in.isEmpty())
        return ErrEmptyInput;
    if (const ErrorCode failed = keep.acquire(n))
        return failed;
    if (const Outcome bad = out.resize(n))
        return bad;
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
Outcome RealInverse(In<CDB1D> in, RealOut out, Keep keep, int32_t shift) {
    const int32_t n = in.size();
    if (in.isEmpty())
        return ErrEmptyInput;
    if (const ErrorCode failed = keep.acquire(n))
        return failed;
    Scratch<ElementType::DBL> half;
    if (const ErrorCode failed = half.allocate(n))
        return failed;
    if (const Outcome bad = out.resize(n))
        return bad;
    FFTFullToHalf(&in.data()->re, n, shift, half.data());
    const ErrorCode status = FFTRealInverse(keep.plan(), half.data(), out.data(), 1, 1, n);
    return Merge(status, half.release());
}

template <class Keep>
Outcome RealInverseHalfComplex(Spoiled<DBL1D> in, RealOut out, Keep keep) {
    const int32_t n = in.size();
    if (in.isEmpty())
        return ErrEmptyInput;
    // kept: here the output is sized before the plan is acquired.
    if (const Outcome bad = out.resize(n))
        return bad;
    if (const ErrorCode failed = keep.acquire(n))
        return failed;
    // kept: no copy is made, so the caller's array is left scaled by 1/n in Hartley form.
    return FFTRealInverse(keep.plan(), in.data(), out.data(), 1, 1, n);
}

} // namespace
} // namespace qx

using qx::KeepInInstance;
using qx::KeepInSlots;
using qx::ReturnedWithHost;

ErrorCode CxOXFFTH(CDB1D in, CDB1D out, PlanSlot *slot) {
    return CxOXFFTH80(in, out, slot, 0, (*in)->dimSize, 0);
}

ErrorCode CxOXFFTH80(CDB1D in, CDB1D out, PlanSlot *slot, int32_t offset, int32_t size,
                     int32_t shift) {
    return ReturnedWithHost(qx::ComplexForward<KeepInSlots>, in, out, KeepInSlots(slot), offset,
                            size, shift);
}

ErrorCode CxOXFFTH80_IDP(CDB1D in, CDB1D out, InstanceWord *instance, int32_t offset, int32_t size,
                         int32_t shift) {
    return ReturnedWithHost(qx::ComplexForward<KeepInInstance>, in, out, KeepInInstance(instance),
                            offset, size, shift);
}

ErrorCode InvCxOXFFTH(CDB1D in, CDB1D out, PlanSlot *slot) {
    return InvCxOXFFTH80(in, out, slot, 0);
}

ErrorCode InvCxOXFFTH80(CDB1D in, CDB1D out, PlanSlot *slot, int32_t shift) {
    return ReturnedWithHost(qx::ComplexInverse<KeepInSlots>, in, out, KeepInSlots(slot), shift);
}

ErrorCode InvCxOXFFTH80_IDP(CDB1D in, CDB1D out, InstanceWord *instance, int32_t shift) {
    return ReturnedWithHost(qx::ComplexInverse<KeepInInstance>, in, out, KeepInInstance(instance),
                            shift);
}

ErrorCode ReOXFFTH(DBL1D in, CDB1D out, PlanSlot *slot) {
    return ReOXFFTH80(in, out, slot, 0, (*in)->dimSize, 0);
}

ErrorCode ReOXFFTH80(DBL1D in, CDB1D out, PlanSlot *slot, int32_t offset, int32_t size,
                     int32_t shift) {
    return ReturnedWithHost(qx::RealForward<KeepInSlots>, in, out, KeepInSlots(slot), offset, size,
                            shift);
}

ErrorCode ReOXFFTH80_IDP(DBL1D in, CDB1D out, InstanceWord *instance, int32_t offset, int32_t size,
                         int32_t shift) {
    return ReturnedWithHost(qx::RealForward<KeepInInstance>, in, out, KeepInInstance(instance),
                            offset, size, shift);
}

ErrorCode ReOXFFTHCH(DBL1D in, DBL1D out, PlanSlot *slot) {
    return ReturnedWithHost(qx::RealForwardHalfComplex<KeepInSlots>, in, out, KeepInSlots(slot));
}

ErrorCode ReOXFFTHCH_IDP(DBL1D in, DBL1D out, InstanceWord *instance) {
    return ReturnedWithHost(qx::RealForwardHalfComplex<KeepInInstance>, in, out,
                            KeepInInstance(instance));
}

ErrorCode InvReOXFFTH(CDB1D in, DBL1D out, PlanSlot *slot) {
    return InvReOXFFTH80(in, out, slot, 0);
}

ErrorCode InvReOXFFTH80(CDB1D in, DBL1D out, PlanSlot *slot, int32_t shift) {
    return ReturnedWithHost(qx::RealInverse<KeepInSlots>, in, out, KeepInSlots(slot), shift);
}

ErrorCode InvReOXFFTH80_IDP(CDB1D in, DBL1D out, InstanceWord *instance, int32_t shift) {
    return ReturnedWithHost(qx::RealInverse<KeepInInstance>, in, out, KeepInInstance(instance),
                            shift);
}

ErrorCode InvReOXFFTHCH(DBL1D in, DBL1D out, PlanSlot *slot) {
    return ReturnedWithHost(qx::RealInverseHalfComplex<KeepInSlots>, in, out, KeepInSlots(slot));
}

ErrorCode InvReOXFFTHCH_IDP(DBL1D in, DBL1D out, InstanceWord *instance) {
    return ReturnedWithHost(qx::RealInverseHalfComplex<KeepInInstance>, in, out,
                            KeepInInstance(instance));
}

ErrorCode TransformUnreserveProc(InstanceWord *instance) {
    return qx::TransformInstanceRelease(instance);
}

FFTPlan *create_oxfft_table(int32_t length) {
    const qx::DefaultArithmetic arithmetic;
    return qx::create_oxfft_table(length);
}

void destroy_oxfft_table(FFTPlan *plan) { qx::destroy_oxfft_table(plan); }
