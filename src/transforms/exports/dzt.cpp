#include "transforms/dzt.h"

#include "fft/plan_slot.h"
#include "frame/export.h"
#include "qx/dzt.h"

namespace qx {
namespace {

template <class Handle, class Keep>
ErrorCode Band(Spoiled<Handle> in, int32_t sections, int32_t subLength, int32_t start, int32_t size,
               Out<CDB1D> out, Keep keep) {
    if (const ErrorCode failed = FirstFailed({{sections < 1, ErrOrderNotPositive},
                                              {size < 1 || subLength < 1, ErrFFTSizeNotPositive}}))
        return failed;
    // kept: an empty input is not an error here.
    if (in.isEmpty()) {
        out.empty();
        return 0;
    }
    if (const ErrorCode failed = keep.acquire(subLength))
        return failed;
    // kept: the host's own status counts as a code, and a positive one leaves the output alone.
    if (const Outcome bad = out.resize(size))
        return bad.raw();
    return BandTransform<HandleTraits<Handle>::code>(keep.plan(), in.view(), sections, subLength,
                                                     start, out.view());
}

} // namespace
} // namespace qx

using qx::KeepInInstance;
using qx::KeepInSlots;
using qx::Returned;

ErrorCode ReDZTH(DBL1D in, int32_t S, int32_t N, int32_t start, int32_t size, CDB1D out,
                 PlanSlot *slot) {
    return Returned(qx::Band<DBL1D, KeepInSlots>, in, S, N, start, size, out, KeepInSlots(slot));
}

ErrorCode ReDZTH_IDP(DBL1D in, int32_t S, int32_t N, int32_t start, int32_t size, CDB1D out,
                     InstanceWord *instance) {
    return Returned(qx::Band<DBL1D, KeepInInstance>, in, S, N, start, size, out,
                    KeepInInstance(instance));
}

ErrorCode CxDZTH(CDB1D in, int32_t S, int32_t N, int32_t start, int32_t size, CDB1D out,
                 PlanSlot *slot) {
    return Returned(qx::Band<CDB1D, KeepInSlots>, in, S, N, start, size, out, KeepInSlots(slot));
}

ErrorCode CxDZTH_IDP(CDB1D in, int32_t S, int32_t N, int32_t start, int32_t size, CDB1D out,
                     InstanceWord *instance) {
    return Returned(qx::Band<CDB1D, KeepInInstance>, in, S, N, start, size, out,
                    KeepInInstance(instance));
}
