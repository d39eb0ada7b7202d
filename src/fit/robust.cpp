#include "fit/robust.h"

#include "fit/elimination.h"
#include "fit/general.h"
#include "frame/scratch.h"

#include <cmath>
#include <cstring>

namespace qx {

namespace {

typedef Scratch<ElementType::DBL> Work;

class Reweighting {
public:
    Reweighting(const LinearModel &model, FitNorm norm) : model_(model), norm_(norm) {}

    ErrorCode allocate() {
        const int64_t n = model_.n;
        const int64_t k = model_.k;
        if (const ErrorCode failed = memory_.allocate((norm_ == bisquare ? 4 : 3) * n))
            return failed;
        return norm_ == bisquare ? covariance_.allocate(k * k) : 0;
    }

    // The least-squares solution, and for bisquare the leverages.
    ErrorCode start(DBL *c) {
        DBL *const covariance = norm_ == bisquare ? covariance_.data() : nullptr;
        if (const ErrorCode failed = SolveLinearModel(model_, bySVD, c, covariance))
            return failed;
        if (norm_ == bisquare)
            if (const ErrorCode failed = findLeverages())
                return failed;
        return findResiduals(c);
    }

    ErrorCode step(DBL *c) {
        if (const ErrorCode failed = findWeights())
            return failed;
        const LinearModel reweighted = {model_.rows, model_.n, model_.k, weights()};
        if (const ErrorCode failed = SolveLinearModel(reweighted, bySVD, c, nullptr))
            return failed;
        std::memcpy(earlier(), residuals(), static_cast<std::size_t>(model_.n) * sizeof(DBL));
        return findResiduals(c);
    }

    double size() const {
        double sum = 0.0;
        for (int32_t i = 0; i < model_.n; ++i)
            sum += std::fabs(residuals()[i]);
        return sum / model_.n;
    }
    double change() const {
        double sum = 0.0;
        for (int32_t i = 0; i < model_.n; ++i)
            sum += std::fabs(residuals()[i] - earlier()[i]);
        return sum / model_.n;
    }

private:
    DBL *residuals() const { return memory_.data(); }
    DBL *weights() const { return memory_.data() + model_.n; }
    DBL *earlier() const { return weights() + model_.n; }
    DBL *factors() const { return earlier() + model_.n; }

    ErrorCode findWeights() {
        if (norm_ == leastAbsolute)
            return LeastAbsoluteWeights(residuals(), model_.w, model_.n, weights());
        DBL *const adjusted = earlier(); // free until the step is done
        for (int32_t i = 0; i < model_.n; ++i)
            adjusted[i] = residuals()[i] * factors()[i];
        return BisquareWeights(adjusted, model_.w, model_.n, model_.k, weights());
    }

    ErrorCode findResiduals(const DBL *c) {
        RowStream stream;
        if (const ErrorCode failed = stream.open(model_))
            return failed;
        RowBlock block;
        while (stream.next(&block)) {
            DBL *const rest = residuals() + block.first;
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
        const int32_t k = model_.k;
        RowStream stream;
        if (const ErrorCode failed = stream.open(model_))
            return failed;
        RowBlock block;
        while (stream.next(&block))
            for (int32_t i = 0; i < block.count; ++i) {
                double form = 0.0;
                for (int32_t j = 0; j < k; ++j)
                    for (int32_t l = 0; l < k; ++l)
                        form += block.column(j)[i] * covariance_[std::ptrdiff_t{j} * k + l] *
                                block.column(l)[i];
                const std::ptrdiff_t at = block.first + i;
                factors()[at] = model_.w == nullptr ? form : form * std::fabs(model_.w[at]);
            }
        LeverageFactors(factors(), model_.w, model_.n, factors());
        return 0;
    }

    const LinearModel &model_;
    const FitNorm norm_;
    Work memory_, covariance_;
};

} // namespace

ErrorCode SolveRobustly(const LinearModel &model, FitNorm norm, RobustLimits limits, DBL *c) {
    if (norm == leastSquares || model.k < 1 || model.n < model.k)
        return SolveLinearModel(model, bySVD, c, nullptr);
    const double tolerance = limits.tolerance <= 0.0 ? 0.0001 : limits.tolerance;
    const double floor = limits.floor <= 0.0 ? 1e-12 : limits.floor;
    Reweighting fit(model, norm);
    if (const ErrorCode failed = fit.allocate())
        return failed;
    if (const ErrorCode failed = fit.start(c))
        return failed;
    for (int32_t i = 0; i < limits.iterations && fit.size() > floor; ++i) {
        if (const ErrorCode failed = fit.step(c))
            return failed;
        if (fit.change() <= tolerance * fit.size())
            break;
    }
    return 0;
}

} // namespace qx
