#include "spectra/power_spectrum.h"

#include "fft/plan_slot.h"
#include "frame/export.h"
#include "qx/power_spectrum.h"

namespace qx {
namespace {

// Interleaved values as the plain array that the inner routines take.
const DBL *Values(const In<CDB1D> &in) { return &in.data()->re; }

// In all frames here the kept plan only keeps its length in the cache: the inner routines take
// their own reference.

template <class Keep>
ErrorCode RealPower(InOut<DBL1D> x, Keep keep) {
    const int32_t n = x.size();
    if (x.isEmpty())
        return ErrEmptyInput;
    if (const ErrorCode failed = keep.acquire(n))
        return failed;
    return PowerSpectrumReal(x.data(), n);
}

template <class Keep>
Outcome ComplexPower(In<CDB1D> x, Out<DBL1D> spectrum, Keep keep) {
    const int32_t n = x.size();
    if (x.isEmpty())
        return ErrEmptyInput;
    // kept: here the plan is acquired before the resize, unlike in the cross spectra.
    if (const ErrorCode failed = keep.acquire(n))
        return failed;
    if (const Outcome bad = spectrum.resize(n))
        return bad;
    return PowerSpectrumComplex(Values(x), spectrum.data(), n);
}

ErrorCode CheckPair(int32_t nx, int32_t ny) {
    return FirstFailed({{nx < 1 || ny < 1, ErrEmptyInput}, {nx != ny, ErrSizeMismatch}});
}

template <class Keep>
ErrorCode RealCross(In<DBL1D> x, In<DBL1D> y, Out<CDB1D> cross, Keep keep) {
    const int32_t n = x.size();
    if (const ErrorCode failed = CheckPair(n, y.size()))
        return failed;
    // kept: the host's own status is returned as a code, and a positive one leaves the output
    // unchanged.
    if (const Outcome bad = cross.resize(n))
        return bad.raw();
    if (const ErrorCode failed = keep.acquire(n))
        return failed;
    CDB *const out = cross.data();
    return CrossSpectrumReal(x.data(), y.data(), 1, n, &out->re, &out->im, 2);
}

template <class Keep>
Outcome ComplexCross(In<CDB1D> x, In<CDB1D> y, Out<CDB1D> cross, Keep keep) {
    const int32_t n = x.size();
    if (const ErrorCode failed = CheckPair(n, y.size()))
        return failed;
    // kept: any host status is translated here, unlike in the real cross spectrum.
    if (const Outcome bad = cross.resize(n))
        return bad;
    if (const ErrorCode failed = keep.acquire(n))
        return failed;
    return CrossSpectrumComplex(Values(x), Values(y), n, &cross.data()->re);
}

} // namespace
} // namespace qx

using qx::KeepInInstance;
using qx::KeepInSlots;
using qx::Returned;

ErrorCode SpectrumH(DBL1D x, PlanSlot *slot) {
    return Returned(qx::RealPower<KeepInSlots>, x, KeepInSlots(slot));
}

ErrorCode SpectrumH_IDP(DBL1D x, InstanceWord *instance) {
    return Returned(qx::RealPower<KeepInInstance>, x, KeepInInstance(instance));
}

ErrorCode CxSpectrumH(CDB1D x, DBL1D spectrum, PlanSlot *slot) {
    return Returned(qx::ComplexPower<KeepInSlots>, x, spectrum, KeepInSlots(slot));
}

ErrorCode CxSpectrumH_IDP(CDB1D x, DBL1D spectrum, InstanceWord *instance) {
    return Returned(qx::ComplexPower<KeepInInstance>, x, spectrum, KeepInInstance(instance));
}

ErrorCode CrossSpectrumH(DBL1D x, DBL1D y, CDB1D cross, PlanSlot *slot) {
    return Returned(qx::RealCross<KeepInSlots>, x, y, cross, KeepInSlots(slot));
}

ErrorCode CrossSpectrumH_IDP(DBL1D x, DBL1D y, CDB1D cross, InstanceWord *instance) {
    return Returned(qx::RealCross<KeepInInstance>, x, y, cross, KeepInInstance(instance));
}

ErrorCode CxCrossSpectrumH(CDB1D x, CDB1D y, CDB1D cross, PlanSlot *slot) {
    return Returned(qx::ComplexCross<KeepInSlots>, x, y, cross, KeepInSlots(slot));
}

ErrorCode CxCrossSpectrumH_IDP(CDB1D x, CDB1D y, CDB1D cross, InstanceWord *instance) {
    return Returned(qx::ComplexCross<KeepInInstance>, x, y, cross, KeepInInstance(instance));
}
