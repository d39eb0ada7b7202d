#include "spectra/power_spectrum.h"

#include "fft/plan_slot.h"
#include "frame/finish.h"
#include "frame/views.h"
#include "qx/spectra.h"

namespace qx {
namespace {

typedef Out1D<ElementType::DBL> RealOut;
typedef Out1D<ElementType::CDB> ComplexOut;

// Interleaved values as the bare array that the inner routines take.
const DBL *Values(const In1D<ElementType::CDB> &in) { return &in.data()->re; }

// In all frames here the kept plan only holds the length in the cache: the inner routines take
// a reference of their own.

template <class Keep>
ErrorCode RealPower(InOut1D<ElementType::DBL> x, Keep keep) {
    const int32_t n = x.size();
    if (n < 1)
        return ErrEmptyInput;
    if (const ErrorCode failed = keep.acquire(n))
        return failed;
    return PowerSpectrumReal(x.data(), n);
}

template <class Keep>
ErrorCode ComplexPower(In1D<ElementType::CDB> x, RealOut spectrum, Keep keep) {
    const int32_t n = x.size();
    if (n < 1)
        return ErrEmptyInput;
    // kept: here the plan comes before the resize, the reverse of the cross spectra.
    if (const ErrorCode failed = keep.acquire(n))
        return failed;
    if (const ErrorCode failed = spectrum.resize(n))
        return failed;
    return PowerSpectrumComplex(Values(x), spectrum.data(), n);
}

ErrorCode CheckPair(int32_t nx, int32_t ny) {
    return FirstFailed({{nx < 1 || ny < 1, ErrEmptyInput}, {nx != ny, ErrSizeMismatch}});
}

template <class Keep>
int32_t RealCross(In1D<ElementType::DBL> x, In1D<ElementType::DBL> y, ComplexOut cross, Keep keep) {
    const int32_t n = x.size();
    if (const ErrorCode failed = CheckPair(n, y.size()))
        return failed;
    // kept: the host's own status is passed on, and a positive one leaves the output alone.
    if (const int32_t hostStatus = cross.reshape(n))
        return hostStatus;
    if (const ErrorCode failed = keep.acquire(n))
        return failed;
    CDB *const out = cross.data();
    return CrossSpectrumReal(x.data(), y.data(), 1, n, &out->re, &out->im, 2);
}

template <class Keep>
ErrorCode ComplexCross(In1D<ElementType::CDB> x, In1D<ElementType::CDB> y, ComplexOut cross,
                       Keep keep) {
    const int32_t n = x.size();
    if (const ErrorCode failed = CheckPair(n, y.size()))
        return failed;
    // kept: any host status is translated here, in contrast to the real cross spectrum.
    if (const ErrorCode failed = cross.resize(n))
        return failed;
    if (const ErrorCode failed = keep.acquire(n))
        return failed;
    return CrossSpectrumComplex(Values(x), Values(y), n, &cross.data()->re);
}

} // namespace
} // namespace qx

using namespace qx;

ErrorCode SpectrumH(DBL1D x, PlanSlot *slot) {
    const InOut1D<ElementType::DBL> spectrum(x);
    return Finish(RealPower(spectrum, KeepInSlots(slot)), spectrum);
}

ErrorCode SpectrumH_IDP(DBL1D x, InstanceWord *instance) {
    const InOut1D<ElementType::DBL> spectrum(x);
    return Finish(RealPower(spectrum, KeepInInstance(instance)), spectrum);
}

ErrorCode CxSpectrumH(CDB1D x, DBL1D spectrum, PlanSlot *slot) {
    const RealOut out(spectrum);
    return Finish(ComplexPower(In1D<ElementType::CDB>(x), out, KeepInSlots(slot)), out);
}

ErrorCode CxSpectrumH_IDP(CDB1D x, DBL1D spectrum, InstanceWord *instance) {
    const RealOut out(spectrum);
    return Finish(ComplexPower(In1D<ElementType::CDB>(x), out, KeepInInstance(instance)), out);
}

ErrorCode CrossSpectrumH(DBL1D x, DBL1D y, CDB1D cross, PlanSlot *slot) {
    const ComplexOut out(cross);
    return Finish(
        RealCross(In1D<ElementType::DBL>(x), In1D<ElementType::DBL>(y), out, KeepInSlots(slot)),
        out);
}

ErrorCode CrossSpectrumH_IDP(DBL1D x, DBL1D y, CDB1D cross, InstanceWord *instance) {
    const ComplexOut out(cross);
    return Finish(RealCross(In1D<ElementType::DBL>(x), In1D<ElementType::DBL>(y), out,
                            KeepInInstance(instance)),
                  out);
}

ErrorCode CxCrossSpectrumH(CDB1D x, CDB1D y, CDB1D cross, PlanSlot *slot) {
    const ComplexOut out(cross);
    return Finish(
        ComplexCross(In1D<ElementType::CDB>(x), In1D<ElementType::CDB>(y), out, KeepInSlots(slot)),
        out);
}

ErrorCode CxCrossSpectrumH_IDP(CDB1D x, CDB1D y, CDB1D cross, InstanceWord *instance) {
    const ComplexOut out(cross);
    return Finish(ComplexCross(In1D<ElementType::CDB>(x), In1D<ElementType::CDB>(y), out,
                               KeepInInstance(instance)),
                  out);
}
