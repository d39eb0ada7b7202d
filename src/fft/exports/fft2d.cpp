#include "fft/two_dimensional.h"

#include "fft/plan_slot.h"
#include "frame/export.h"
#include "qx/fft2d.h"

namespace qx {
namespace {

// The plan for the length of the rows is in the first of a node's two slots.
template <class Keep>
ErrorCode AcquirePlans(Keep &keep, int32_t rows, int32_t cols) {
    const ErrorCode failed = keep.acquire(cols);
    return failed ? failed : keep.acquireSecond(rows);
}

// The inner routine reports negative starts, after all other checks.
ErrorCode CheckRegion(const MatrixRegion &region) {
    return FirstFailed(
        {{region.matrixRows < 1 || region.matrixCols < 1, ErrEmptyInput},
         {region.rowStart >= region.matrixRows || region.colStart >= region.matrixCols,
          ErrIndexOutOfRange},
         {region.rows < 1 || region.cols < 1, ErrSizesDisagree}});
}

ErrorCode Run(const FFTPlan *rowPlan, const FFTPlan *columnPlan, const DBL *in,
              const MatrixRegion &region, int32_t shift, CDB *out) {
    return FFT2DRealForward(rowPlan, columnPlan, in, region, shift, out);
}
ErrorCode Run(const FFTPlan *rowPlan, const FFTPlan *columnPlan, const CDB *in,
              const MatrixRegion &region, int32_t shift, CDB *out) {
    return FFT2DComplexForward(rowPlan, columnPlan, in, region, shift, out);
}

template <class Matrix, class Keep>
Outcome Forward(In<Matrix> in, int32_t rowStart, int32_t colStart, int32_t rows, int32_t cols,
                int32_t shift, Out<CDB2D> out, Keep keep) {
    const MatrixRegion region{in.rows(), in.cols(), rowStart, colStart, rows, cols};
    if (const ErrorCode failed = CheckRegion(region))
        return failed;
    if (!out.mayHave(rows, cols)) // before plans of these lengths are built
        return ErrOutOfMemory;
    if (const ErrorCode failed = AcquirePlans(keep, rows, cols))
        return failed;
    if (const Outcome bad = out.resize(rows, cols))
        return bad;
    return Run(keep.plan(), keep.secondPlan(), in.data(), region, shift, out.data());
}

ErrorCode Run(const FFTPlan *rowPlan, const FFTPlan *columnPlan, const CDB *in, int32_t rows,
              int32_t cols, int32_t shift, DBL *out) {
    return FFT2DRealInverse(rowPlan, columnPlan, in, rows, cols, shift, out);
}
ErrorCode Run(const FFTPlan *rowPlan, const FFTPlan *columnPlan, const CDB *in, int32_t rows,
              int32_t cols, int32_t shift, CDB *out) {
    return FFT2DComplexInverse(rowPlan, columnPlan, in, rows, cols, shift, out);
}

template <class Matrix, class Keep>
Outcome Inverse(In<CDB2D> in, int32_t shift, Out<Matrix> out, Keep keep) {
    if (in.isEmpty())
        return ErrEmptyInput;
    const int32_t rows = in.rows();
    const int32_t cols = in.cols();
    if (const ErrorCode failed = AcquirePlans(keep, rows, cols))
        return failed;
    if (const Outcome bad = out.resize(rows, cols))
        return bad;
    return Run(keep.plan(), keep.secondPlan(), in.data(), rows, cols, shift, out.data());
}

} // namespace
} // namespace qx

using qx::KeepInInstance;
using qx::KeepInSlots;
using qx::ReturnedWithHost;

ErrorCode CxFFT2D_H(CDB2D in, int32_t rowStart, int32_t colStart, int32_t rows, int32_t cols,
                    int32_t shift, CDB2D out, PlanSlot *slotCols, PlanSlot *slotRows) {
    return ReturnedWithHost(qx::Forward<CDB2D, KeepInSlots>, in, rowStart, colStart, rows, cols,
                            shift, out, KeepInSlots(slotCols, slotRows));
}

ErrorCode CxFFT2D_H_IDP(CDB2D in, int32_t rowStart, int32_t colStart, int32_t rows, int32_t cols,
                        int32_t shift, CDB2D out, InstanceWord *instance) {
    return ReturnedWithHost(qx::Forward<CDB2D, KeepInInstance>, in, rowStart, colStart, rows, cols,
                            shift, out, KeepInInstance(instance));
}

ErrorCode ReFFT2D_H(DBL2D in, int32_t rowStart, int32_t colStart, int32_t rows, int32_t cols,
                    int32_t shift, CDB2D out, PlanSlot *slotCols, PlanSlot *slotRows) {
    return ReturnedWithHost(qx::Forward<DBL2D, KeepInSlots>, in, rowStart, colStart, rows, cols,
                            shift, out, KeepInSlots(slotCols, slotRows));
}

ErrorCode ReFFT2D_H_IDP(DBL2D in, int32_t rowStart, int32_t colStart, int32_t rows, int32_t cols,
                        int32_t shift, CDB2D out, InstanceWord *instance) {
    return ReturnedWithHost(qx::Forward<DBL2D, KeepInInstance>, in, rowStart, colStart, rows, cols,
                            shift, out, KeepInInstance(instance));
}

ErrorCode CxInvFFT2D_H(CDB2D in, int32_t shift, CDB2D out, PlanSlot *slotCols, PlanSlot *slotRows) {
    return ReturnedWithHost(qx::Inverse<CDB2D, KeepInSlots>, in, shift, out,
                            KeepInSlots(slotCols, slotRows));
}

ErrorCode CxInvFFT2D_H_IDP(CDB2D in, int32_t shift, CDB2D out, InstanceWord *instance) {
    return ReturnedWithHost(qx::Inverse<CDB2D, KeepInInstance>, in, shift, out,
                            KeepInInstance(instance));
}

ErrorCode ReInvFFT2D_H(CDB2D in, int32_t shift, DBL2D out, PlanSlot *slotCols, PlanSlot *slotRows) {
    return ReturnedWithHost(qx::Inverse<DBL2D, KeepInSlots>, in, shift, out,
                            KeepInSlots(slotCols, slotRows));
}

ErrorCode ReInvFFT2D_H_IDP(CDB2D in, int32_t shift, DBL2D out, InstanceWord *instance) {
    return ReturnedWithHost(qx::Inverse<DBL2D, KeepInInstance>, in, shift, out,
                            KeepInInstance(instance));
}
