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
// samples, block by block. Each block has at least `width` samples. Calls PeakD. The last `width`
// samples of a block are scanned with the next one, or by `last`.
class PeakFinder {
public:
    explicit PeakFinder(double threshold, int32_t width = 3, bool valleys = false) {
        detail::Call call(place);
        data_ = detail::Array1<double>(call);
        locations_ = detail::Array1<double>(call);
        amplitudes_ = detail::Array1<double>(call);
        derivatives_ = detail::Array1<double>(call);
        buffer_ = detail::Array1<double>(call);
        request_.threshold = threshold;
        request_.width = width;
        request_.polarity = valleys ? 1 : 0;
        made_ = call.status();
    }

    Returned<Peaks> operator()(Returning, std::span<const double> block) {
        return step(block, false);
    }
    Peaks operator()(std::span<const double> block) { return step(block, false).value(); }
    // Passes the last block; the next one starts a new stream.
    Returned<Peaks> last(Returning, std::span<const double> block) { return step(block, true); }
    Peaks last(std::span<const double> block) { return step(block, true).value(); }

private:
    Returned<Peaks> step(std::span<const double> block, bool isLast) {
        static constexpr detail::Blame blames[] = {{ErrInvalidSelector, "width"},
                                                   {ErrWidthOutOfRange, "block"},
                                                   {ErrIterationLimit, "width"}};
        detail::Call call(place);
        Peaks found;
        if (made_.failed())
            return {found, made_};
        data_.assign(call, "block", block);
        if (!call.ready())
            return call.with(found);
        request_.data = data_.handle();
        request_.locations = locations_.handle();
        request_.amplitudes = amplitudes_.handle();
        request_.derivatives = derivatives_.handle();
        request_.flags =
            (begun_ ? 0U : unsigned{QXPeakFirstBlock}) | (isLast ? unsigned{QXPeakLastBlock} : 0U);
        DBL1D buffer = buffer_.handle();
        ErrorCode err = QXSuccess;
        const ErrorCode code = PeakD(&request_, &state_, &buffer, &err);
        call.ended(code, blames);
        begun_ = call.ready() && !isLast;
        detail::Take(call, found.locations, locations_);
        detail::Take(call, found.amplitudes, amplitudes_);
        detail::Take(call, found.derivatives, derivatives_);
        return call.with(std::move(found));
    }

    static constexpr const char *place = "measure::PeakFinder";
    detail::Array1<double> data_, locations_, amplitudes_, derivatives_, buffer_;
    PeakDRequest request_{};
    PeakDState state_{};
    Status made_;
    bool begun_ = false;
};

} // namespace qx::measure

#endif
