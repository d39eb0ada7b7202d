#include "measure/peaks.h"

#include "frame/export.h"
#include "qx/peaks.h"

#include <cstring>
#include <initializer_list>
#include <limits>

namespace qx {
namespace {

Outcome Runs(In<DBL1D> x, const double *threshold, const int32_t *width, Out<I32_1D> indices,
             OutI32 count) {
    // kept: an array as long as the width is refused, although it has room for a run.
    if (const ErrorCode bad = FirstFailed({{*width < 1 || x.size() <= *width, ErrWidthOutOfRange}}))
        return bad;
    if (const Outcome bad = indices.resize(x.size() / *width + 1))
        return bad;
    const int32_t found = FindRuns(x.data(), x.size(), *threshold, *width, indices.data());
    if (const Outcome bad = indices.resize(found))
        return bad;
    count = found;
    return 0;
}

// The caller's request: its last arrays are outputs of the call, and its first array may be
// modified.
class InOutRequest {
public:
    InOutRequest(PeakDRequest *request)
        : request_(request), data_(request->data), locations_(request->locations),
          amplitudes_(request->amplitudes), derivatives_(request->derivatives) {}

    const PeakDRequest *operator->() const { return request_; }
    const Spoiled<DBL1D> &data() const { return data_; }

    // `block` has the samples that were scanned; a resize may move it.
    template <class Block>
    Outcome take(const PeakList &found, const Block &block) {
        for (InOut<DBL1D> *array : {&locations_, &amplitudes_, &derivatives_})
            if (const Outcome bad = array->resize(found.size()))
                return bad;
        found.copyTo(block.data(), locations_.data(), amplitudes_.data(), derivatives_.data());
        request_->count = found.size();
        return 0;
    }
    void settleFailure() {
        locations_.empty();
        amplitudes_.empty();
        derivatives_.empty();
        request_->count = 0;
    }
    auto inputs() { return std::tie(data_); }
    auto outputs() const {
        return std::tuple(locations_.identity(), amplitudes_.identity(), derivatives_.identity());
    }

private:
    PeakDRequest *request_;
    Spoiled<DBL1D> data_;
    InOut<DBL1D> locations_, amplitudes_, derivatives_;
};

// The state of a stream: the caller's record, and the array that stores its numbers.
class InOutStream {
public:
    struct Words {
        PeakDState *state;
        DBL1D *buffer; // may be null
    };
    InOutStream(Words words) : words_(words) {}

    // The state for windows of w samples, with its pointers into the buffer where that lies now. A
    // first block of n samples must contain at least one window; otherwise the buffer is not
    // resized.
    Outcome open(int32_t w, bool isFirst, int32_t n, PeakDState *&state) {
        state = words_.state;
        const int64_t length = PeakBufferLength(w);
        if (isFirst) {
            *state = {};
            state->width = w;
            if (words_.buffer == nullptr)
                return 0; // the step then refuses it
            if (length > std::numeric_limits<int32_t>::max())
                return ErrOutOfMemory;
            if (n < w)
                return ErrWidthOutOfRange;
            if (const Outcome bad =
                    InOut<DBL1D>(*words_.buffer).resize(static_cast<int32_t>(length)))
                return bad.code();
        } else if (state->historyCount != w || words_.buffer == nullptr ||
                   InOut<DBL1D>(*words_.buffer).size() != length || state->position < 0) {
            return ErrStateSizeMismatch;
        }
        PointInto(InOut<DBL1D>(*words_.buffer).data(), w, state);
        state->width = w;
        return 0;
    }
    Outcome release() {
        *words_.state = {};
        return InOut<DBL1D>(*words_.buffer).resize(0).code();
    }
    void settleFailure() {
        *words_.state = {};
        if (words_.buffer != nullptr && *words_.buffer != nullptr)
            InOut<DBL1D>(*words_.buffer).empty();
    }
    auto outputs() const {
        return std::tuple<const void *>(words_.buffer == nullptr ? nullptr : *words_.buffer);
    }

private:
    Words words_;
};

// The samples that are scanned: the request's own data, or a copy of the source.
class ScanData {
public:
    ErrorCode copyOf(DBL1D source) {
        if (source == nullptr || In<DBL1D>(source).isEmpty())
            return 0;
        const In<DBL1D> samples(source);
        if (const ErrorCode failed = copy_.allocate(samples.size()))
            return failed;
        size_ = samples.size();
        std::memcpy(copy_.data(), samples.data(), static_cast<std::size_t>(size_) * sizeof(DBL));
        return 0;
    }
    void showOf(const Spoiled<DBL1D> &array) {
        shown_ = &array;
        size_ = array.size();
    }
    DBL *data() const { return shown_ != nullptr ? shown_->data() : copy_.data(); }
    int32_t size() const { return size_; }

private:
    Scratch<ElementType::DBL> copy_;
    const Spoiled<DBL1D> *shown_ = nullptr;
    int32_t size_ = 0;
};

enum PeakMode : int32_t { requestData = 0, flatRequestData = 1, flatSourceCopy = 2 };

Outcome Peaks(DBL1D source, InOutRequest request, InOutStream stream, int32_t mode) {
    ScanData scanned;
    if (mode == flatSourceCopy)
        if (const ErrorCode bad = scanned.copyOf(source))
            return bad;
    const int32_t w = request->width;
    constexpr int32_t widest = 1 << 30;
    const bool isSelector = mode >= requestData && mode <= flatSourceCopy &&
                            (request->polarity == 0 || request->polarity == 1);
    if (const ErrorCode bad =
            FirstFailed({{w < 3 || w > widest || !isSelector, ErrInvalidSelector}}))
        return bad;

    const bool isFirst = (request->flags & QXPeakFirstBlock) != 0;
    const bool isLast = (request->flags & QXPeakLastBlock) != 0;
    const bool ofValleys = request->polarity == 1;
    PeakDState *state = nullptr;
    const int32_t n = mode == flatSourceCopy ? scanned.size() : request.data().size();
    if (const Outcome bad = stream.open(w, isFirst, n, state))
        return bad;
    if (mode != flatSourceCopy)
        scanned.showOf(request.data());
    const PeakBlock block{scanned.data(), scanned.size(), request->threshold, isFirst,
                          isLast,         ofValleys,      mode != requestData};
    PeakList found = ListFor(block, *state);
    if (const ErrorCode bad = PeakDetectStep(block, state, &found))
        return bad;
    if (const Outcome bad = request.take(found, scanned))
        return bad.code();
    return isLast ? stream.release() : Outcome(0);
}

} // namespace
} // namespace qx

using qx::InErrAndReturnedWithHost;

int32_t PeakDetector(DBL1D x, const double *threshold, const int32_t *width, I32_1D indices,
                     int32_t *count, ErrorCode *err) {
    return InErrAndReturnedWithHost(err, qx::Runs, x, threshold, width, indices, count);
}

ErrorCode PeakD(PeakDRequest *request, PeakDState *state, DBL1D *buffer, ErrorCode *err) {
    return PeakD2014(nullptr, request, state, buffer, err, 0);
}

ErrorCode PeakD2010(PeakDRequest *request, PeakDState *state, DBL1D *buffer, ErrorCode *err,
                    int32_t mode) {
    return PeakD2014(nullptr, request, state, buffer, err, mode);
}

ErrorCode PeakD2014(DBL1D source, PeakDRequest *request, PeakDState *state, DBL1D *buffer,
                    ErrorCode *err, int32_t mode) {
    return InErrAndReturnedWithHost(err, qx::Peaks, source, request,
                                    qx::InOutStream::Words{state, buffer}, mode);
}
