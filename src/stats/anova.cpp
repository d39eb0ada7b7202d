#include "stats/anova.h"

#include "frame/constants.h"
#include "frame/extended.h"
#include "frame/scratch.h"
#include "stats/distributions.h"
#include "stats/levels.h"
#include "stats/tail_distributions.h"

#include <algorithm>
#include <cmath>
#include <cstddef>

namespace qx {

namespace {

// Status and upper tail of a distribution.
template <class Distribution>
ErrorCode UpperTail(Distribution distribution, double *p) {
    double below;
    const ErrorCode status = distribution(&below);
    if (status == 0)
        *p = 1.0 - below;
    return status;
}

// The sums of a table of counts, over its rows, over its columns and over all.
struct TableSums {
    ErrorCode add(const ConstMatrixView<ElementType::I32> &table) {
        if (const ErrorCode status =
                memory.take(Sized(rows, table.rows()), Sized(cols, table.cols())))
            return status;
        Fill(rows.data(), rows.size(), 0.0);
        Fill(cols.data(), cols.size(), 0.0);
        for (int32_t i = 0; i < table.rows(); ++i)
            for (int32_t j = 0; j < table.cols(); ++j) {
                const int32_t cell = table(i, j);
                if (cell < 0)
                    return ErrTableNegativeSize;
                rows[i] += cell;
                cols[j] += cell;
                total += cell;
            }
        return 0;
    }

    ScratchParts memory;
    RealVector rows, cols;
    double total = 0.0;
};

} // namespace

ErrorCode ContingencyTest(const ConstMatrixView<ElementType::I32> &table, DBL *chiSquare, DBL *p) {
    const int32_t rows = table.rows(), cols = table.cols();
    if (rows < 2 || cols < 2)
        return ErrTableTooSmall;
    TableSums sums;
    if (const ErrorCode status = sums.add(table))
        return status;
    double statistic = 0.0;
    for (int32_t i = 0; i < rows; ++i)
        for (int32_t j = 0; j < cols; ++j) {
            const double expected = sums.cols[j] * sums.rows[i] / sums.total;
            const double difference = table(i, j) - expected;
            statistic += difference * difference / expected;
        }
    *chiSquare = statistic;
    // A table with 2^31 degrees of freedom would not fit into memory.
    const int32_t dof = static_cast<int32_t>(int64_t{rows - 1} * (cols - 1));
    double upper = 0.0;
    ErrorCode status =
        UpperTail([&](double *below) { return ChiSquareCDF(statistic, dof, below); }, &upper);
    if (status == 0)
        *p = upper;
    return Merge(status, sums.memory.release());
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

ErrorCode ContingencyTail(const ConstMatrixView<ElementType::I32> &table, DBL *chiSquare, DBL *p) {
    const int32_t rows = table.rows(), cols = table.cols();
    if (rows < 2 || cols < 2)
        return ErrTableTooSmall;
    TableSums sums;
    if (const ErrorCode status = sums.add(table))
        return status;
    Extended statistic = {0.0, 0.0};
    for (int32_t i = 0; i < rows; ++i)
        for (int32_t j = 0; j < cols; ++j) {
            const int32_t cell = table(i, j);
            const Extended product = ExactProduct(sums.rows[i], sums.cols[j]);
            const Extended difference = ExactProduct(cell, sums.total) - product;
            statistic = statistic + difference * difference / product;
        }
    statistic = statistic / Extended{sums.total, 0.0};
    *chiSquare = statistic.high;
    // An empty row or column makes the statistic NaN, and so there is no tail.
    const double dof = static_cast<double>(rows - 1) * (cols - 1);
    *p = std::isnan(*chiSquare) ? kNaN
                                : ChiSquareValue(*chiSquare, dof, DistributionValue::Survival);
    return sums.memory.release();
}

namespace {

// y[i] - y[0] times a power of 2 with which no square overflows or underflows.
class ScaledDifferences {
public:
    explicit ScaledDifferences(ConstRealVector y) : y_(y) {
        double largest = 0.0;
        for (const DBL &value : y)
            largest = std::max(largest, std::fabs(value));
        if (largest > 0.0 && std::isfinite(largest))
            exponent_ = std::ilogb(largest);
    }
    Extended at(int32_t i) const { return ExactSum(scaled(i), -scaled(0)); }
    double unscaledSquare(double square) const {
        return std::ldexp(std::ldexp(square, exponent_), exponent_);
    }

private:
    double scaled(int32_t i) const { return std::ldexp(y_[i], -exponent_); }

    ConstRealVector y_;
    int exponent_ = 0;
};

struct SumsOfSquares {
    Extended between, error;
};

// `sums` has a pair of elements for each level: the two parts of its sum, later of its mean.
SumsOfSquares SquaresAboutMeans(const ScaledDifferences &differences,
                                ConstVectorView<ElementType::I32> labels, Levels &levels,
                                Scratch<ElementType::DBL> &sums) {
    const auto n = static_cast<int32_t>(labels.size());
    const auto pair = [&](std::ptrdiff_t i) { return Extended{sums[2 * i], sums[2 * i + 1]}; };
    const auto put = [&](std::ptrdiff_t i, Extended value) {
        sums[2 * i] = value.high;
        sums[2 * i + 1] = value.low;
    };
    Extended total = {0.0, 0.0};
    for (int32_t i = 0; i < n; ++i) {
        const int32_t level = levels.placeOf(labels[i]);
        const Extended difference = differences.at(i);
        put(level, pair(level) + difference);
        total = total + difference;
    }
    const Extended mean = total / Extended{static_cast<double>(n), 0.0};
    SumsOfSquares squares = {};
    for (int32_t i = 0; i < levels.count(); ++i) {
        const Extended count = {static_cast<double>(levels.at(i).count), 0.0};
        put(i, pair(i) / count);
        const Extended effect = pair(i) - mean;
        squares.between = squares.between + count * (effect * effect);
    }
    Extended all = {0.0, 0.0};
    for (int32_t i = 0; i < n; ++i) {
        const Extended difference = differences.at(i);
        const Extended rest = difference - pair(levels.placeOf(labels[i]));
        squares.error = squares.error + rest * rest;
        all = all + difference * difference;
    }
    constexpr double negligible = 0x1p-90;
    for (Extended *sum : {&squares.between, &squares.error})
        if (sum->high < negligible * all.high)
            *sum = {0.0, 0.0};
    return squares;
}

} // namespace

ErrorCode OneWayAnovaByDifferences(ConstRealVector y, ConstVectorView<ElementType::I32> labels,
                                   int32_t k, double alpha, OneWayTable *result) {
    const auto n = static_cast<int32_t>(y.size());
    if (k < 2 || k >= n)
        return ErrAnovaFewLevels;
    if (!(alpha >= 0.0 && alpha <= 1.0))
        return ErrBadSignificance;
    Levels levels;
    if (const ErrorCode status = levels.reserve(k))
        return status;
    Scratch<ElementType::DBL> sums;
    if (const ErrorCode status = sums.allocate(2 * int64_t{k}))
        return status;
    Fill(sums.data(), 2 * std::ptrdiff_t{k}, 0.0);
    for (int32_t i = 0; i < n; ++i) {
        Level *level = levels.find(labels[i]);
        if (level == nullptr)
            return ErrAnovaFactorEmpty;
        ++level->count;
    }
    if (levels.count() < k)
        return ErrAnovaNoReplication;

    const ScaledDifferences differences(y);
    const SumsOfSquares squares = SquaresAboutMeans(differences, labels, levels, sums);
    const Extended whole = squares.between + squares.error;
    const double between = squares.between.high / (k - 1);
    const double error = squares.error.high / (n - k);
    result->ssBetween = differences.unscaledSquare(squares.between.high);
    result->ssError = differences.unscaledSquare(squares.error.high);
    result->ssTotal = differences.unscaledSquare(whole.high);
    result->msBetween = differences.unscaledSquare(between);
    result->msError = differences.unscaledSquare(error);
    const Extended ratio = squares.between / squares.error * Extended{double(n - k), 0.0} /
                           Extended{double(k - 1), 0.0};
    result->f = squares.error.high > 0.0 ? ratio.high : between / error;
    if (std::isnan(result->f))
        return ErrNaNInData;
    result->p = FisherValue(result->f, k - 1, n - k, DistributionValue::Survival);
    result->fCritical = FisherPoint(alpha, true, k - 1, n - k);
    return Merge(levels.release(), sums.release());
}

} // namespace qx
