#include "transforms/dzt.h"

#include "fft/plan_slot.h"
#include "frame/finish.h"
#include "frame/views.h"
#include "qx/transforms.h"

namespace qx {
namespace {

typedef Out1D<ElementType::CDB> Band;

template <ElementType Code, class Keep>
int32_t BandFrame(InOut1D<Code> in, int32_t sections, int32_t subLength, int32_t start,
                  int32_t size, Band out, Keep keep) {
    if (const ErrorCode failed = FirstFailed({{sections < 1, ErrOrderNotPositive},
                                              {size < 1 || subLength < 1, ErrFFTSizeNotPositive}}))
        return Finish(failed, out);
    // kept: an empty input is no failure here.
    if (in.size() < 1) {
        out.empty();
        return 0;
    }
    if (const ErrorCode failed = keep.acquire(subLength))
        return Finish(failed, out);
    if (const int32_t hostStatus = out.reshape(size))
        return Finish(hostStatus, out);
    return Finish(BandTransform<Code>(keep.plan(), in.data(), in.size(), sections, subLength, start,
                                      size, out.data()),
                  out);
}

typedef InOut1D<ElementType::DBL> RealSignal;
typedef InOut1D<ElementType::CDB> ComplexSignal;

} // namespace
} // namespace qx

using namespace qx;

ErrorCode ReDZTH(DBL1D in, int32_t S, int32_t N, int32_t start, int32_t size, CDB1D out,
                 PlanSlot *slot) {
    return BandFrame(RealSignal(in), S, N, start, size, Band(out), KeepInSlots(slot));
}

ErrorCode ReDZTH_IDP(DBL1D in, int32_t S, int32_t N, int32_t start, int32_t size, CDB1D out,
                     InstanceWord *instance) {
    return BandFrame(RealSignal(in), S, N, start, size, Band(out), KeepInInstance(instance));
}

ErrorCode CxDZTH(CDB1D in, int32_t S, int32_t N, int32_t start, int32_t size, CDB1D out,
                 PlanSlot *slot) {
    return BandFrame(ComplexSignal(in), S, N, start, size, Band(out), KeepInSlots(slot));
}

ErrorCode CxDZTH_IDP(CDB1D in, int32_t S, int32_t N, int32_t start, int32_t size, CDB1D out,
                     InstanceWord *instance) {
    return BandFrame(ComplexSignal(in), S, N, start, size, Band(out), KeepInInstance(instance));
}
