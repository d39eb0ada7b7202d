#include "stats/anova.h"

#include "frame/scratch.h"
#include "stats/distributions.h"

#include <cstddef>
#include <cstring>

namespace qx {

namespace {

struct Level {
    DBL sum;
    I32 label;
    I32 count;
};

// The levels in the order of their first appearance, with a hash table of their places: open
// addressing, at most half of it taken.
class Levels {
public:
    ErrorCode reserve(int32_t limit) {
        limit_ = limit;
        int64_t slots = 4;
        for (; slots < 2 * int64_t{limit}; slots *= 2)
            ;
        mask_ = static_cast<uint32_t>(slots - 1);
        if (const ErrorCode failed = levels_.allocate(limit * int64_t{sizeof(Level)}))
            return failed;
        if (const ErrorCode failed = places_.allocate(slots))
            return failed;
        std::memset(places_.data(), 0, static_cast<std::size_t>(slots) * sizeof(I32));
        return 0;
    }

    // The level of a label, opened if it is new; null beyond the limit.
    Level *find(int32_t label) {
        for (uint32_t slot = Hash(label) & mask_;; slot = (slot + 1) & mask_) {
            I32 &place = places_[static_cast<std::ptrdiff_t>(slot)]; // counts from 1, 0 is free
            if (place == 0) {
                if (count_ == limit_)
                    return nullptr;
                place = ++count_;
                at(count_ - 1) = {0.0, label, 0};
                return &at(count_ - 1);
            }
            if (at(place - 1).label == label)
                return &at(place - 1);
        }
    }

    int32_t count() const { return count_; }
    Level &at(std::ptrdiff_t i) const { return static_cast<Level *>(levels_.bytes())[i]; }
    ErrorCode release() { return Merge(levels_.release(), places_.release()); }

private:
    // The finaliser of MurmurHash3 (A. Appleby): every bit of the label moves every bit.
    static uint32_t Hash(int32_t label) {
        uint32_t h = static_cast<uint32_t>(label);
        h = (h ^ (h >> 16)) * 0x85ebca6bu;
        h = (h ^ (h >> 13)) * 0xc2b2ae35u;
        return h ^ (h >> 16);
    }

    ScratchBytes levels_;
    Scratch<ElementType::I32> places_;
    int32_t limit_ = 0;
    int32_t count_ = 0;
    uint32_t mask_ = 0;
};

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

ErrorCode ContingencyTest(const I32 *table, int32_t rows, int32_t cols, DBL *chiSquare, DBL *p) {
    if (rows < 0 || cols < 0)
        return ErrTableNegativeSize;
    if (rows < 2 || cols < 2)
        return ErrTableTooSmall;
    Scratch<ElementType::DBL> sums;
    if (const ErrorCode status = sums.allocate(int64_t{rows} + cols))
        return status;
    DBL *rowSum = sums.data();
    DBL *colSum = sums.data() + rows;
    Fill(rowSum, std::ptrdiff_t{rows} + cols, 0.0);
    double total = 0.0;
    for (int32_t i = 0; i < rows; ++i)
        for (int32_t j = 0; j < cols; ++j) {
            const int32_t cell = table[std::ptrdiff_t{i} * cols + j];
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
            const double difference = table[std::ptrdiff_t{i} * cols + j] - expected;
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

ErrorCode OneWayAnova(const DBL *y, const I32 *labels, int32_t n, int32_t k, double alpha,
                      OneWayTable *result) {
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
