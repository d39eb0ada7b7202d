#ifndef QX_STREAMS_HPP
#define QX_STREAMS_HPP

// Running statistics and triggers of a stream for qx/qx.hpp.

#include "qx/calls.hpp"
#include "qx/trigger.h"

#include <algorithm>
#include <cmath>
#include <limits>

namespace qx::stats {

struct Summary {
    std::int64_t count = 0;
    double mean = std::numeric_limits<double>::quiet_NaN();
    double std = mean; // the standard deviation, divided by count
    double rms = mean;
    double least = mean;
    double greatest = mean;
};

// Statistics of all values so far. The results are the same, to the bit, however the values are
// divided into blocks. Allocates no memory. Differences from the first value are summed, so a small
// spread far from zero keeps its digits as long as the first value is near the others.
class RunningStream {
public:
    Summary operator()(std::span<const double> block) noexcept {
        for (const double value : block)
            add(value);
        return summary();
    }

    // NaN if there have been no values.
    Summary summary() const noexcept {
        if (count_ == 0)
            return {};
        const auto n = static_cast<double>(count_);
        const double shift = total_ / n;
        const double mean = first_ + shift;
        const double deviation = squares_ / n - shift * shift;
        const double variance = deviation < 0 ? 0 : deviation;
        return {count_, mean,     std::sqrt(variance), std::sqrt(variance + mean * mean),
                least_, greatest_};
    }

    // Restarts the stream.
    void reset() noexcept { *this = RunningStream(); }

private:
    void add(double value) noexcept {
        if (count_++ == 0)
            first_ = least_ = greatest_ = value;
        const double away = value - first_;
        total_ += away;
        squares_ += away * away;
        least_ = std::min(least_, value);
        greatest_ = std::max(greatest_, value);
    }

    std::int64_t count_ = 0;
    double first_ = 0, total_ = 0, squares_ = 0, least_ = 0, greatest_ = 0;
};

} // namespace qx::stats

namespace qx::measure {

struct Triggers {
    std::vector<double> positions; // sample numbers from the start of the stream, with fractions
    std::vector<std::int64_t> indices; // of the samples that trigger
};

// Finds where a stream crosses a level; the results do not depend on the division into blocks.
// Calls Triggerh_86. A block that is not longer than the longest before it, or than `longest`,
// allocates memory only for its results.
class TriggerStream {
public:
    enum class Direction : int32_t { rising = 0, falling = 1, either = 2 };

    explicit TriggerStream(double level, Direction slope = Direction::rising,
                           double hysteresis = 0.0, int32_t holdoff = 0, std::size_t longest = 0)
        : level_(level), hysteresis_(hysteresis), slope_(static_cast<int32_t>(slope)),
          holdoff_(holdoff) {
        detail::Call call(place);
        block_ = detail::Array1<double>(call);
        if (call.ready())
            block_.reserve(call, "longest", longest);
        made_ = call.status();
    }

    Returned<Triggers> operator()(Returning, std::span<const double> block) {
        static constexpr detail::Blame blames[] = {{ErrInvalidSelector, "slope"}};
        detail::Call call(place);
        Triggers found;
        if (made_.failed() || block.empty())
            return {found, made_};
        block_.assign(call, "block", block);
        int32_t start = 0;
        while (call.ready()) {
            int32_t index = -1;
            double position = 0;
            call.ended(Triggerh_86(block_.handle(), level_, hysteresis_, slope_, start, holdoff_,
                                   &state_, &index, &position),
                       blames);
            if (index < 0 || !call.ready())
                break;
            detail::Allocating(call, [&] {
                found.positions.push_back(static_cast<double>(before_) + position);
                found.indices.push_back(before_ + index);
            });
            start = index + 1;
        }
        if (!call.ready()) {
            reset();
            return call.with(Triggers());
        }
        before_ += static_cast<std::int64_t>(block.size());
        return call.with(std::move(found));
    }
    Triggers operator()(std::span<const double> block) { return (*this)(returned, block).value(); }

    // Restarts the stream.
    void reset() {
        state_ = {};
        before_ = 0;
    }

private:
    static constexpr const char *place = "measure::TriggerStream";
    double level_, hysteresis_;
    int32_t slope_, holdoff_;
    detail::Array1<double> block_;
    TriggerState state_{};
    std::int64_t before_ = 0;
    Status made_;
};

} // namespace qx::measure

#endif
