#include "fft/two_dimensional.h"

#include "fft/plan_slot.h"
#include "frame/finish.h"
#include "frame/views.h"
#include "qx/fft.h"

namespace qx {
namespace {

typedef In2D<ElementType::DBL> RealIn;
typedef In2D<ElementType::CDB> ComplexIn;
typedef Out2D<ElementType::DBL> RealOut;
typedef Out2D<ElementType::CDB> ComplexOut;

// The plan of the rows' length stands first in a node's two slots.
template <class Keep>
ErrorCode AcquirePlans(Keep keep, int32_t rows, int32_t cols) {
    const ErrorCode failed = keep.acquire(cols);
    return failed ? failed : keep.acquireSecond(rows);
}

// The inner routine catches negative starts, after all else has been tried.
ErrorCode CheckRegion(const MatrixRegion &region) {
    return FirstFailed(
        {{region.matrixRows < 1 || region.matrixCols < 1, ErrEmptyInput},
         {region.rowStart >= region.matrixRows || region.colStart >= region.matrixCols,
          ErrIndexOutOfRange},
         {region.rows < 1 || region.cols < 1, ErrSizesDisagree}});
}

ErrorCode Run(const FFTPlan *rowPlan, const FFTPlan *columnPlan, RealIn in,
              const MatrixRegion &region, int32_t shift, ComplexOut out) {
    return FFT2DRealForward(rowPlan, columnPlan, in.data(), region, shift, out.data());
}
ErrorCode Run(const FFTPlan *rowPlan, const FFTPlan *columnPlan, ComplexIn in,
              const MatrixRegion &region, int32_t shift, ComplexOut out) {
    return FFT2DComplexForward(rowPlan, columnPlan, in.data(), region, shift, out.data());
}

template <class In, class Keep>
int32_t Forward(In in, int32_t rowStart, int32_t colStart, int32_t rows, int32_t cols,
                int32_t shift, ComplexOut out, Keep keep) {
    const MatrixRegion region{in.rows(), in.cols(), rowStart, colStart, rows, cols};
    if (const ErrorCode failed = CheckRegion(region))
        return failed;
    if (const ErrorCode failed = AcquirePlans(keep, rows, cols))
        return failed;
    if (const int32_t hostStatus = out.reshape(rows, cols))
        return hostStatus;
    return Run(keep.plan(), keep.secondPlan(), in, region, shift, out);
}

ErrorCode Run(const FFTPlan *rowPlan, const FFTPlan *columnPlan, ComplexIn in, int32_t shift,
              RealOut out) {
    return FFT2DRealInverse(rowPlan, columnPlan, in.data(), in.rows(), in.cols(), shift,
                            out.data());
}
ErrorCode Run(const FFTPlan *rowPlan, const FFTPlan *columnPlan, ComplexIn in, int32_t shift,
              ComplexOut out) {
    return FFT2DComplexInverse(rowPlan, columnPlan, in.data(), in.rows(), in.cols(), shift,
                               out.data());
}

template <class Out, class Keep>
int32_t Inverse(ComplexIn in, int32_t shift, Out out, Keep keep) {
    if (in.isEmpty())
        return ErrEmptyInput;
    if (const ErrorCode failed = AcquirePlans(keep, in.rows(), in.cols()))
        return failed;
    if (const int32_t hostStatus = out.reshape(in.rows(), in.cols()))
        return hostStatus;
    return Run(keep.plan(), keep.secondPlan(), in, shift, out);
}

} // namespace
} // namespace qx

using namespace qx;

ErrorCode CxFFT2D_H(CDB2D in, int32_t rowStart, int32_t colStart, int32_t rows, int32_t cols,
                    int32_t shift, CDB2D out, PlanSlot *slotCols, PlanSlot *slotRows) {
    const ComplexOut spectrum(out);
    return FinishTransform(Forward(ComplexIn(in), rowStart, colStart, rows, cols, shift, spectrum,
                                   KeepInSlots(slotCols, slotRows)),
                           spectrum);
}

ErrorCode CxFFT2D_H_IDP(CDB2D in, int32_t rowStart, int32_t colStart, int32_t rows, int32_t cols,
                        int32_t shift, CDB2D out, InstanceWord *instance) {
    const ComplexOut spectrum(out);
    return FinishTransform(Forward(ComplexIn(in), rowStart, colStart, rows, cols, shift, spectrum,
                                   KeepInInstance(instance)),
                           spectrum);
}

ErrorCode ReFFT2D_H(DBL2D in, int32_t rowStart, int32_t colStart, int32_t rows, int32_t cols,
                    int32_t shift, CDB2D out, PlanSlot *slotCols, PlanSlot *slotRows) {
    const ComplexOut spectrum(out);
    return FinishTransform(Forward(RealIn(in), rowStart, colStart, rows, cols, shift, spectrum,
                                   KeepInSlots(slotCols, slotRows)),
                           spectrum);
}

ErrorCode ReFFT2D_H_IDP(DBL2D in, int32_t rowStart, int32_t colStart, int32_t rows, int32_t cols,
                        int32_t shift, CDB2D out, InstanceWord *instance) {
    const ComplexOut spectrum(out);
    return FinishTransform(Forward(RealIn(in), rowStart, colStart, rows, cols, shift, spectrum,
                                   KeepInInstance(instance)),
                           spectrum);
}

ErrorCode CxInvFFT2D_H(CDB2D in, int32_t shift, CDB2D out, PlanSlot *slotCols, PlanSlot *slotRows) {
    const ComplexOut matrix(out);
    return FinishTransform(Inverse(ComplexIn(in), shift, matrix, KeepInSlots(slotCols, slotRows)),
                           matrix);
}

ErrorCode CxInvFFT2D_H_IDP(CDB2D in, int32_t shift, CDB2D out, InstanceWord *instance) {
    const ComplexOut matrix(out);
    return FinishTransform(Inverse(ComplexIn(in), shift, matrix, KeepInInstance(instance)), matrix);
}

ErrorCode ReInvFFT2D_H(CDB2D in, int32_t shift, DBL2D out, PlanSlot *slotCols, PlanSlot *slotRows) {
    const RealOut matrix(out);
    return FinishTransform(Inverse(ComplexIn(in), shift, matrix, KeepInSlots(slotCols, slotRows)),
                           matrix);
}

ErrorCode ReInvFFT2D_H_IDP(CDB2D in, int32_t shift, DBL2D out, InstanceWord *instance) {
    const RealOut matrix(out);
    return FinishTransform(Inverse(ComplexIn(in), shift, matrix, KeepInInstance(instance)), matrix);
}
