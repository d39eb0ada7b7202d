#include "qx/smoothing.h"

#include "filters/median_filter.h"
#include "filters/savitzky_golay.h"
#include "frame/export.h"

namespace qx {
namespace {

ErrorCode CheckFit(int32_t order, int32_t frame, const In<DBL1D> &weights) {
    if (const ErrorCode failed = CheckSavitzkyGolay(order, frame))
        return failed;
    return weights.isEmpty() || weights.size() == frame ? 0 : ErrSizeMismatch;
}
const DBL *DataOrNull(const In<DBL1D> &weights) {
    return weights.isEmpty() ? nullptr : weights.data();
}

// Differentiators that are not requested are left unchanged unless the call fails.
Outcome FitMatrices(int32_t order, int32_t frame, In<DBL1D> weights, bool wantsDifferentiators,
                    Out<DBL2D> smoothing, Out<DBL2D> differentiators) {
    if (const ErrorCode failed = CheckFit(order, frame, weights))
        return failed;
    if (frame % 2 == 0) // before the host is asked for frame^2 values
        return ErrBadTapCount;
    if (const Outcome bad = smoothing.resize(frame, frame))
        return bad;
    if (wantsDifferentiators)
        if (const Outcome bad = differentiators.resize(order + 1, frame))
            return bad;
    return SavitzkyGolayMatrix(order, frame, DataOrNull(weights), smoothing.data(),
                               wantsDifferentiators ? differentiators.data() : nullptr);
}

Outcome SmoothByFit(In<DBL1D> x, int32_t order, int32_t frame, In<DBL1D> weights, Out<DBL1D> y) {
    if (const ErrorCode failed = CheckFit(order, frame, weights))
        return failed;
    if (const Outcome bad = y.resize(x.size()))
        return bad;
    return SavitzkyGolayFilter(x.data(), x.size(), order, frame, DataOrNull(weights), y.data());
}

// A negative right rank means the left rank.
Outcome SmoothByMedian(InOut<DBL1D> x, int32_t leftRank, int32_t rightRank) {
    const int32_t right = rightRank < 0 ? leftRank : rightRank;
    if (const ErrorCode failed =
            FirstFailed({{leftRank < 0, ErrNegativeCount},
                         {!x.isEmpty() && x.size() <= right, ErrSizesDisagree}}))
        return failed;
    return MedianFilterRun(x.view(), leftRank, right, x.view());
}

} // namespace
} // namespace qx

using qx::InErr;
using qx::Returned;

ErrorCode SavitzkyGolayCoefH(int32_t order, int32_t frame, DBL1D weights,
                             int32_t wantDifferentiators, DBL2D smoothing, DBL2D differentiators) {
    return Returned(qx::FitMatrices, order, frame, weights, wantDifferentiators != 0, smoothing,
                    differentiators);
}

ErrorCode SavitzkyGolayFiltH(DBL1D x, int32_t order, int32_t frame, DBL1D weights, DBL1D y) {
    return Returned(qx::SmoothByFit, x, order, frame, weights, y);
}

int32_t MedianFilterCIN(DBL1D x, const int32_t *rank, ErrorCode *err) {
    return InErr(err, qx::SmoothByMedian, x, *rank, *rank);
}

ErrorCode MedianFilter81_H(DBL1D x, int32_t leftRank, int32_t rightRank) {
    return Returned(qx::SmoothByMedian, x, leftRank, rightRank);
}
