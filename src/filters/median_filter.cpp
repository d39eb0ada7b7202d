#include "filters/median_filter.h"

#include "frame/constants.h"
#include "frame/scratch.h"
#include "stats/order.h"

#include <algorithm>
#include <cstring>

namespace qx {
namespace {

struct Job {
    const DBL *x;
    int32_t n, left, right;
    DBL *y;
    std::ptrdiff_t width() const { return std::ptrdiff_t{left} + right + 1; }
};

bool HasNaN(ConstRealVector x) {
    int32_t count = 0;
    for (const double value : x)
        count += value != value;
    return count != 0;
}

// Sorts values in the order of time, `step` apart, into a window. Sorting may exchange equal
// values, which can be distinguished if they are zeros of different sign; the order of these is
// restored.
void SortWindow(const DBL *values, std::ptrdiff_t step, std::ptrdiff_t width, DBL *sorted) {
    for (std::ptrdiff_t k = 0; k < width; ++k)
        sorted[k] = values[k * step];
    SortNaNsFirst({sorted, width}, SortOrder::Ascending, {sorted, width});
    DBL *zero = sorted;
    while (zero < sorted + width && !(*zero >= 0.0))
        ++zero;
    for (std::ptrdiff_t k = 0; k < width; ++k)
        if (values[k * step] == 0.0)
            *zero++ = values[k * step];
}

// The values of a window in ascending order, with equal ones in the order of time.
//
// kept: a NaN is neither equal to nor above any value. It is inserted at the top (in the first
// window, at the front), and when it should leave, the value at the top is removed instead. So a
// NaN may stay for good, and the medians are then those of fewer values.
class SortedWindow {
public:
    SortedWindow(DBL *values, std::ptrdiff_t width, bool hasNaN)
        : values_(values), width_(width), hasNaN_(hasNaN) {}

    double median() const {
        const double upper = values_[width_ / 2];
        return width_ % 2 != 0 ? upper : (values_[width_ / 2 - 1] + upper) * 0.5;
    }

    void replace(double leaving, double entering) {
        const std::ptrdiff_t from = hasNaN_ ? findByEquality(leaving) : countBelow(leaving);
        // Counted with the leaving value still in place.
        const std::ptrdiff_t upTo = hasNaN_ ? findAbove(entering, from) : countNotAbove(entering);
        if (upTo > from) {
            move(from, from + 1, upTo - 1 - from);
            values_[upTo - 1] = entering;
        } else {
            move(upTo + 1, upTo, from - upTo);
            values_[upTo] = entering;
        }
    }

private:
    void move(std::ptrdiff_t to, std::ptrdiff_t from, std::ptrdiff_t count) {
        std::memmove(values_ + to, values_ + from, static_cast<std::size_t>(count) * sizeof(DBL));
    }

    // Binary search without a branch that depends on the data.
    template <class IsBefore>
    std::ptrdiff_t countFirst(const IsBefore &isBefore) const {
        std::ptrdiff_t first = 0, count = width_;
        while (count > 1) {
            const std::ptrdiff_t half = count / 2;
            first += isBefore(values_[first + half - 1]) ? half : 0;
            count -= half;
        }
        return first + (isBefore(values_[first]) ? 1 : 0);
    }
    std::ptrdiff_t countBelow(double value) const {
        return countFirst([value](double other) { return other < value; });
    }
    std::ptrdiff_t countNotAbove(double value) const {
        return countFirst([value](double other) { return other <= value; });
    }

    std::ptrdiff_t findByEquality(double value) const {
        std::ptrdiff_t at = 0;
        while (at < width_ - 1 && !(values_[at] == value))
            ++at;
        return at;
    }
    std::ptrdiff_t findAbove(double value, std::ptrdiff_t leaving) const {
        std::ptrdiff_t at = 0;
        while (at < width_ && (at == leaving || !(values_[at] > value)))
            ++at;
        return at;
    }

    DBL *values_;
    std::ptrdiff_t width_;
    bool hasNaN_;
};

// A ring stores the samples that will leave, because y may be x.
ErrorCode RunOneByOne(const Job &job, bool hasNaN) {
    Scratch<ElementType::DBL> work;
    const std::ptrdiff_t width = job.width();
    if (const ErrorCode failed = work.allocate(2 * int64_t{width} + job.left))
        return failed;
    DBL *const sorted = work.data(), *const first = sorted + width, *const ring = first + width;
    Fill(ring, job.left, 0.0);
    Fill(first, job.left, 0.0);
    std::memcpy(first + job.left, job.x, (static_cast<std::size_t>(job.right) + 1) * sizeof(DBL));
    SortWindow(first, 1, width, sorted);

    SortedWindow window(sorted, width, hasNaN);
    int32_t oldest = 0;
    for (int32_t i = 0; i < job.n; ++i) {
        double leaving = job.x[i];
        job.y[i] = window.median();
        if (job.left > 0) {
            const double own = leaving;
            leaving = ring[oldest];
            ring[oldest] = own;
            oldest = oldest + 1 < job.left ? oldest + 1 : 0;
        }
        const bool isInside = job.right < job.n - 1 - i;
        window.replace(leaving, isInside ? job.x[i + job.right + 1] : 0.0);
    }
    return work.release();
}

// Several stretches of the signal side by side, in tiles that stay in the cache.
class StretchedFilter {
public:
    explicit StretchedFilter(const Job &job)
        : job_(job), width_(job.width()),
          length_(std::min((std::ptrdiff_t{job.n} + medianStretches - 1) / medianStretches,
                           std::max<std::ptrdiff_t>(256, 8 * width_))) {}

    // At each step a window is passed through completely, which pays only if it is short, and each
    // stretch begins with a sort. Up to four values at a time.
    static bool pays(const Job &job) {
        return job.width() <= 64 * std::min(lanesInUse, 4) &&
               job.n / (2 * medianStretches) >= job.width();
    }

    ErrorCode run() {
        const std::ptrdiff_t rows = length_ + width_;
        Scratch<ElementType::DBL> work;
        if (const ErrorCode failed =
                work.allocate(medianStretches * int64_t{rows + width_ + 1} + width_ + job_.left))
            return failed;
        samples_ = work.data();
        window_ = samples_ + medianStretches * rows;
        sorted_ = window_ + medianStretches * (width_ + 1);
        past_ = sorted_ + width_;
        Fill(past_, job_.left, 0.0);
        for (std::ptrdiff_t start = 0; start < job_.n; start += medianStretches * length_)
            runTile(start);
        return work.release();
    }

private:
    void runTile(std::ptrdiff_t start) {
        for (std::ptrdiff_t stretch = 0; stretch < medianStretches; ++stretch) {
            layOut(start, start + stretch * length_ - job_.left, samples_ + stretch);
            SortWindow(samples_ + stretch, medianStretches, width_, sorted_);
            for (std::ptrdiff_t k = 0; k < width_; ++k)
                window_[k * medianStretches + stretch] = sorted_[k];
        }
        Fill(window_ + width_ * medianStretches, medianStretches, kInfinity);
        const std::ptrdiff_t end = start + medianStretches * length_;
        if (end < job_.n) // saved for the start of the next tile, because y may overwrite it
            std::memcpy(past_, job_.x + (end - job_.left),
                        static_cast<std::size_t>(job_.left) * sizeof(DBL));
        MedianSteps(window_, static_cast<int32_t>(width_), samples_, static_cast<int32_t>(length_));
        for (std::ptrdiff_t stretch = 0; stretch < medianStretches; ++stretch) {
            const std::ptrdiff_t first = start + stretch * length_;
            const std::ptrdiff_t count = std::min(length_, job_.n - first);
            for (std::ptrdiff_t t = 0; t < count; ++t)
                job_.y[first + t] = samples_[t * medianStretches + stretch];
        }
    }

    // Copies samples from `first` on into a column; those before the tile come from `past_`, those
    // after the signal are zeros.
    void layOut(std::ptrdiff_t tile, std::ptrdiff_t first, DBL *column) const {
        const std::ptrdiff_t rows = length_ + width_, end = std::ptrdiff_t{job_.n} - first;
        std::ptrdiff_t row = 0;
        for (; row < tile - first; ++row)
            column[row * medianStretches] = past_[row];
        for (; row < std::min(rows, end); ++row)
            column[row * medianStretches] = job_.x[first + row];
        for (; row < rows; ++row)
            column[row * medianStretches] = 0.0;
    }

    const Job &job_;
    std::ptrdiff_t width_, length_;
    DBL *samples_ = nullptr, *window_ = nullptr, *sorted_ = nullptr, *past_ = nullptr;
};

} // namespace

ErrorCode MedianFilterRun(ConstRealVector x, int32_t leftRank, int32_t rightRank, RealVector y) {
    const auto n = static_cast<int32_t>(x.size());
    QX_EXPECTS(leftRank >= 0 && rightRank >= 0 && (n == 0 || n > rightRank) && y.size() == n);
    if (n < 1 || (leftRank == 0 && rightRank == 0)) {
        if (n > 0)
            std::memmove(y.data(), x.data(), static_cast<std::size_t>(n) * sizeof(DBL));
        return 0;
    }
    if (leftRank / 4 > n) { // the zeros before x outnumber it, so the median is always one of them
        Fill(y.data(), n, 0.0);
        return 0;
    }
    const Job job = {x.data(), n, leftRank, rightRank, y.data()};
    const bool hasNaN = HasNaN(x);
    if (!hasNaN && StretchedFilter::pays(job))
        return StretchedFilter(job).run();
    return RunOneByOne(job, hasNaN);
}

} // namespace qx
