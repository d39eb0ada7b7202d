#ifndef QX_MEASURE_PEAKS_H
#define QX_MEASURE_PEAKS_H

#include "frame/scratch.h"
#include "measure/parabolas.h"
#include "qx/errors.h"
#include "qx/peaks.h"

#include <cmath>
#include <cstdint>

namespace qx {

// Finds runs of at least `width` samples at or above the threshold, 1 <= width < n. `starts` must
// have room for n / width + 1 elements. Returns the number of runs.
int32_t FindRuns(const DBL *x, int32_t n, double threshold, int32_t width, I32 *starts);

// A peak or a valley.
struct Peak {
    DBL location, amplitude, derivative;
};

// The extrema that a call finds, by location. Of two entries less than a sample apart only the more
// extreme one is kept. The last entry of the previous call also counts: it is no longer in a list,
// but suppresses entries that are not more extreme.
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
        DBL *const at = place(size_++);
        at[0] = peak.location;
        at[chunk] = peak.amplitude;
        at[2 * chunk] = peak.derivative;
        lastLocation_ = peak.location;
        lastAmplitude_ = peak.amplitude;
        return 0;
    }
    // One after the other. ErrOutOfMemory.
    ErrorCode store(const FoundVertices &found);

    int32_t size() const { return size_; }
    void copyTo(DBL *locations, DBL *amplitudes, DBL *derivatives) const;
    double lastLocation() const { return lastLocation_; }
    double lastAmplitude() const { return lastAmplitude_; }

private:
    // The list lies in chunks of so many locations, as many amplitudes and as many derivatives.
    static constexpr int32_t chunk = 512;

    ErrorCode grow();
    // Those of a mask, none of which is close to another or to the last one.
    ErrorCode append(const FoundVertices &found, int32_t first, uint64_t kept);
    DBL *place(int32_t i) const {
        const std::ptrdiff_t before = i / chunk;
        return static_cast<DBL *>(memory_.bytes()) + before * 3 * chunk + i % chunk;
    }

    bool ofValleys_;
    double lastLocation_, lastAmplitude_;
    ScratchBytes memory_;
    int32_t size_ = 0, capacity_ = 0;
};

// A block of a stream and the settings of the search.
struct PeakBlock {
    DBL *data;
    int32_t n;
    double threshold;
    bool isFirst, isLast;
    bool ofValleys;
    bool mayBeFlat; // if the block is flat, its mean is subtracted
};

// The number of elements of the buffer of a stream's state, and the function that sets the state's
// pointers into it.
constexpr int64_t PeakBufferLength(int32_t w) { return 5 * int64_t{w} + 3; }
void PointInto(DBL *buffer, int32_t w, PeakDState *state);

// One block. The state has its width, and its pointers if it has a buffer. Between calls the work
// window contains the location and the amplitude of the last extremum (ListFor).
// ErrWidthOutOfRange, ErrNoUsableFit, ErrOverflow, ErrOutOfMemory, those of BuildFitMatrix.
PeakList ListFor(const PeakBlock &block, const PeakDState &state);
ErrorCode PeakDetectStep(const PeakBlock &block, PeakDState *state, PeakList *found);

} // namespace qx

#endif
