#ifndef QX_MEASURE_PEAKS_H
#define QX_MEASURE_PEAKS_H

#include "frame/scratch.h"
#include "qx/errors.h"
#include "qx/peaks.h"

#include <cmath>
#include <cstdint>

namespace qx {

// Runs of at least `width` samples at or above the threshold; width is from 1 and below n, and
// starts has room for n / width + 1. The number of runs.
int32_t FindRuns(const DBL *x, int32_t n, double threshold, int32_t width, I32 *starts);

// An extremum.
struct Peak {
    DBL location, amplitude, derivative;
};

// What a call finds, in the order of its places. Of two entries less than a sample apart the more
// extreme one stays. The last entry of the call before counts as well: it is in no list any more,
// and hides what is no more extreme than itself.
class PeakList {
public:
    PeakList(bool ofValleys, double lastLocation, double lastAmplitude)
        : ofValleys_(ofValleys), lastLocation_(lastLocation), lastAmplitude_(lastAmplitude) {}

    // ErrOutOfMemory.
    ErrorCode store(const Peak &peak) {
        if (std::fabs(lastLocation_ - peak.location) < 1.0) {
            if (!(ofValleys_ ? peak.amplitude < lastAmplitude_ : peak.amplitude > lastAmplitude_))
                return 0;
            size_ -= size_ > 0;
        }
        if (size_ == capacity_)
            if (const ErrorCode failed = grow())
                return failed;
        peaks()[size_++] = peak;
        lastLocation_ = peak.location;
        lastAmplitude_ = peak.amplitude;
        return 0;
    }
    int32_t size() const { return size_; }
    const Peak &operator[](int32_t i) const { return peaks()[i]; }
    double lastLocation() const { return lastLocation_; }
    double lastAmplitude() const { return lastAmplitude_; }

private:
    ErrorCode grow();
    Peak *peaks() const { return static_cast<Peak *>(memory_.bytes()); }

    bool ofValleys_;
    double lastLocation_, lastAmplitude_;
    ScratchBytes memory_;
    int32_t size_ = 0, capacity_ = 0;
};

// A block of a stream and what is sought in it.
struct PeakBlock {
    DBL *data;
    int32_t n;
    double threshold;
    bool isFirst, isLast;
    bool ofValleys;
    bool mayBeFlat; // flat blocks are looked for, and have their mean subtracted
};

// Elements of the buffer that the stream's state stands in, and the pointers of the state into it.
constexpr int64_t PeakBufferLength(int32_t w) { return 5 * int64_t{w} + 3; }
void PointInto(DBL *buffer, int32_t w, PeakDState *state);

// One block. The state has its width, and its pointers where it has a buffer; in between calls the
// work window has the location and the amplitude of the last extremum (ListFor).
// ErrWidthOutOfRange, ErrNoUsableFit, ErrOverflow, ErrOutOfMemory, those of BuildFitMatrix.
PeakList ListFor(const PeakBlock &block, const PeakDState &state);
ErrorCode PeakDetectStep(const PeakBlock &block, PeakDState *state, PeakList *found);

} // namespace qx

#endif
