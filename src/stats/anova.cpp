#include "stats/anova.h"

#include "frame/scratch.h"
#include "stats/distributions.h"
#include "stats/levels.h"

#include <cstddef>

namespace qx {

namespace {

// Upper tail of a distribution's status and value.
template <class Distribution>
ErrorCode UpperTail(Distribution distribution, double *p) {
    double below;
    const ErrorCode status = distribution(&below);
    if (status == 0)
        *p = 1.0 - below;
    return status;
}

} // namespace

ErrorCode ContingencyTest(const ConstMatrixView<ElementType::I32> &table, DBL *chiSquare, DBL *p) {
    const int32_t rows = table.rows(), cols = table.cols();
    if (rows < 2 || cols < 2)
        return ErrTableTooSmall;
    RealVector rowSum, colSum;
    ScratchParts sums;
    if (const ErrorCode status = sums.take(Sized(rowSum, rows), Sized(colSum, cols)))
        return status;
    Fill(rowSum.data(), rows, 0.0);
    Fill(colSum.data(), cols, 0.0);
    double total = 0.0;
    for (int32_t i = 0; i < rows; ++i)
        for (int32_t j = 0; j < cols; ++j) {
            const int32_t cell = table(i, j);
            if (cell < 0)
                return ErrTableNegativeSize;
            rowSum[i] += cell;
            colSum[j] += cell;
            total += cell;
        }

    double statistic = 0.0;
    for (int32_t i = 0; i < rows; ++i)
        for (int32_t j = 0; j < cols; ++j) {
            const double expected = colSum[j] * rowSum[i] / total;
            const double difference = table(i, j) - expected;
            statistic += difference * difference / expected;
        }
    *chiSquare = statistic;
    // A table of 2^31 degrees of freedom cannot be held.
    const int32_t dof = static_cast<int32_t>(int64_t{rows - 1} * (cols - 1));
    double upper = 0.0;
    ErrorCode status =
        UpperTail([&](double *below) { return ChiSquareCDF(statistic, dof, below); }, &upper);
    if (status == 0)
        *p = upper;
    return Merge(status, sums.release());
}

ErrorCode OneWayAnova(ConstRealVector y, ConstVectorView<ElementType::I32> labels, int32_t k,
                      double alpha, OneWayTable *result) {
    QX_EXPECTS(labels.size() == y.size());
    const auto n = static_cast<int32_t>(y.size());
    if (k < 2 || k >= n)
        return ErrAnovaFewLevels;
    if (alpha < 0.0 || alpha > 1.0)
        return ErrBadSignificance;
    Levels levels;
    if (const ErrorCode status = levels.reserve(k))
        return status;

    double total = 0.0;
    double squares = 0.0;
    for (int32_t i = 0; i < n; ++i) {
        Level *level = levels.find(labels[i]);
        if (level == nullptr)
            return ErrAnovaFactorEmpty;
        level->sum += y[i];
        ++level->count;
        total += y[i];
        squares += y[i] * y[i];
    }
    if (levels.count() < k)
        return ErrAnovaNoReplication;

    const double correction = total * total / n;
    double between = 0.0;
    for (int32_t i = 0; i < k; ++i)
        between += levels.at(i).sum * levels.at(i).sum / levels.at(i).count;
    result->ssTotal = squares - correction;
    result->ssBetween = between - correction;
    result->ssError = result->ssTotal - result->ssBetween;
    result->msBetween = result->ssBetween / (k - 1);
    result->msError = result->ssError / (n - k);
    result->f = result->msBetween / result->msError;
    ErrorCode status = UpperTail(
        [&](double *below) { return FisherCDF(result->f, k - 1, n - k, below); }, &result->p);
    if (status == 0)
        status = FisherQuantile(1.0 - alpha, k - 1, n - k, &result->fCritical);
    return Merge(status, levels.release());
}

} // namespace qx
