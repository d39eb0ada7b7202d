#include "fit/robust.h"

#include "fit/general.h"
#include "fit/sequential_qr.h"

#include <cmath>
#include <utility>

namespace qx {

namespace {

class RobustFit {
public:
    RobustFit(const LinearModel &model, FitNorm norm)
        : model_(model), state_{norm, model.k, weightsOf(model)} {}

    ErrorCode allocate() {
        const int32_t leverages = state_.norm == bisquare ? model_.k : 0;
        if (const ErrorCode failed =
                memory_.take(Sized(earlier_, model_.n), Sized(covariance_, leverages, leverages)))
            return failed;
        return state_.take(model_.n);
    }

    // Computes the least-squares solution and, for bisquare, the leverages.
    ErrorCode start(DBL *c) {
        const bool needsLeverages = state_.norm == bisquare;
        DBL *const covariance = needsLeverages ? covariance_.data() : nullptr;
        if (const ErrorCode failed = SolveLinearModel(model_, bySVD, c, covariance))
            return failed;
        if (needsLeverages)
            if (const ErrorCode failed = findLeverages())
                return failed;
        return findResiduals(c);
    }

    ErrorCode step(DBL *c) {
        if (const ErrorCode failed = state_.findWeights())
            return failed;
        const LinearModel reweighted = {model_.rows, model_.n, model_.k, state_.weights.data()};
        if (const ErrorCode failed = SolveLinearModel(reweighted, bySVD, c, nullptr))
            return failed;
        std::swap(earlier_, state_.residuals);
        return findResiduals(c);
    }

    double size() const {
        double sum = 0.0;
        for (const double residual : state_.residuals)
            sum += std::fabs(residual);
        return sum / model_.n;
    }
    double change() const {
        double sum = 0.0;
        for (int32_t i = 0; i < model_.n; ++i)
            sum += std::fabs(state_.residuals[i] - earlier_[i]);
        return sum / model_.n;
    }

private:
    static ConstRealVector weightsOf(const LinearModel &model) {
        return {model.w, model.w == nullptr ? 0 : model.n};
    }

    ErrorCode findResiduals(const DBL *c) {
        RowStream stream;
        if (const ErrorCode failed = stream.open(model_))
            return failed;
        RowBlock block;
        while (stream.next(&block)) {
            const RealVector rest = state_.residuals.part(block.first, block.count);
            for (int32_t i = 0; i < block.count; ++i)
                rest[i] = block.column(model_.k)[i];
            for (int32_t j = 0; j < model_.k; ++j)
                for (int32_t i = 0; i < block.count; ++i)
                    rest[i] -= c[j] * block.column(j)[i];
        }
        return 0;
    }

    // h = |w| times row C row^T with the covariance C.
    ErrorCode findLeverages() {
        RowStream stream;
        if (const ErrorCode failed = stream.open(model_))
            return failed;
        RowBlock block;
        while (stream.next(&block))
            for (int32_t i = 0; i < block.count; ++i) {
                double form = 0.0;
                for (int32_t j = 0; j < model_.k; ++j)
                    for (int32_t l = 0; l < model_.k; ++l)
                        form += block.column(j)[i] * covariance_(j, l) * block.column(l)[i];
                const std::ptrdiff_t at = block.first + i;
                state_.factors[at] = model_.w == nullptr ? form : form * std::fabs(model_.w[at]);
            }
        state_.setLeverages();
        return 0;
    }

    const LinearModel &model_;
    Reweighting state_;
    RealVector earlier_; // residuals of the step before
    RealMatrix covariance_;
    ScratchParts memory_;
};

} // namespace

ErrorCode SolveRobustly(const LinearModel &model, FitNorm norm, const FitLimits &given, DBL *c) {
    if (norm == leastSquares || model.k < 1 || model.n < model.k)
        return SolveLinearModel(model, bySVD, c, nullptr);
    const FitLimits limits = given.settled();
    RobustFit fit(model, norm);
    if (const ErrorCode failed = fit.allocate())
        return failed;
    if (const ErrorCode failed = fit.start(c))
        return failed;
    for (int32_t i = 0; i < limits.iterations && fit.size() > limits.floor; ++i) {
        if (const ErrorCode failed = fit.step(c))
            return failed;
        if (fit.change() <= limits.tolerance * fit.size())
            break;
    }
    return 0;
}

} // namespace qx
