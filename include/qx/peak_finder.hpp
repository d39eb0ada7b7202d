#ifndef QX_PEAK_FINDER_HPP
#define QX_PEAK_FINDER_HPP

// Peaks of a stream for qx/qx.hpp.

#include "qx/calls.hpp"
#include "qx/peaks.h"

namespace qx::measure {

struct Peaks {
    std::vector<double> locations;   // sample numbers from the start of the stream, with fractions
    std::vector<double> amplitudes;  // of the parabolas there
    std::vector<double> derivatives; // their second derivatives, per sample squared
};

// Finds peaks above a threshold, or valleys below it, from a parabola over each window of `width`
// samples, in blocks of any size. Calls PeakD, with at least `width` samples at a time: the others
// are kept for the next block, or for `last`. The division into blocks changes the results only
// where PeakD2014 says so.
class PeakFinder {
public:
    explicit PeakFinder(double threshold, int32_t width = 5, bool valleys = false) {
        detail::Call call(place);
        data_ = detail::Array1<double>(call);
        locations_ = detail::Array1<double>(call);
        amplitudes_ = detail::Array1<double>(call);
        derivatives_ = detail::Array1<double>(call);
        buffer_ = detail::Array1<double>(call);
        request_.threshold = threshold;
        request_.width = width;
        request_.polarity = valleys ? 1 : 0;
        if (width < 3 || width > widest)
            call.refuse(ErrInvalidSelector, "width");
        made_ = call.status();
    }

    // The peaks that have become certain with this block.
    Returned<Peaks> operator()(Returning, std::span<const double> block) {
        return step(block, false);
    }
    Peaks operator()(std::span<const double> block) { return step(block, false).value(); }
    // Passes the last block, which may be empty; the next one starts a new stream.
    Returned<Peaks> last(Returning, std::span<const double> block = {}) {
        return step(block, true);
    }
    Peaks last(std::span<const double> block = {}) { return step(block, true).value(); }
    // Restarts the stream.
    void reset() {
        begun_ = false;
        kept_.clear();
    }

private:
    Returned<Peaks> step(std::span<const double> block, bool isLast) {
        detail::Call call(place);
        Peaks found;
        if (made_.failed())
            return {found, made_};
        detail::Allocating(call, [&] { kept_.insert(kept_.end(), block.begin(), block.end()); });
        const auto width = static_cast<std::size_t>(request_.width);
        // As many samples are kept as the last call needs.
        const std::size_t kept = isLast ? 0 : width;
        if (call.ready() && kept_.size() >= width + kept) {
            scan(call, kept_.size() - kept, isLast, found);
            kept_.erase(kept_.begin(), kept_.end() - static_cast<std::ptrdiff_t>(kept));
        }
        if (isLast || !call.ready())
            reset();
        return call.with(std::move(found));
    }

    void scan(detail::Call &call, std::size_t count, bool isLast, Peaks &found) {
        static constexpr detail::Blame blames[] = {{ErrIterationLimit, "width"}};
        data_.assign(call, "block", std::span(kept_).first(count));
        if (!call.ready())
            return;
        request_.data = data_.handle();
        request_.locations = locations_.handle();
        request_.amplitudes = amplitudes_.handle();
        request_.derivatives = derivatives_.handle();
        request_.flags =
            (begun_ ? 0U : unsigned{QXPeakFirstBlock}) | (isLast ? unsigned{QXPeakLastBlock} : 0U);
        DBL1D buffer = buffer_.handle();
        ErrorCode err = QXSuccess;
        call.ended(PeakD(&request_, &state_, &buffer, &err), blames);
        begun_ = true;
        detail::Take(call, found.locations, locations_);
        detail::Take(call, found.amplitudes, amplitudes_);
        detail::Take(call, found.derivatives, derivatives_);
        if (!call.ready())
            found = {};
    }

    static constexpr const char *place = "measure::PeakFinder";
    static constexpr int32_t widest = 1 << 30; // of PeakD
    detail::Array1<double> data_, locations_, amplitudes_, derivatives_, buffer_;
    PeakDRequest request_{};
    PeakDState state_{};
    std::vector<double> kept_; // samples that have not been scanned
    Status made_;
    bool begun_ = false;
};

} // namespace qx::measure

#endif
