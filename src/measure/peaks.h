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
//
// Behind entries with their numbers there may be windows of one run that are only marked, by a bit
// each: their vertices are entries, whose numbers are computed when they are copied out. This takes
// a hundredth of the memory.
class PeakList {
public:
    PeakList(bool ofValleys, double lastLocation, double lastAmplitude)
        : ofValleys_(ofValleys), lastLocation_(lastLocation), lastAmplitude_(lastAmplitude) {}

    // ErrOutOfMemory.
    ErrorCode store(const Peak &peak) {
        if (isClose(peak)) {
            if (!isBetter(peak))
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
        setLast(peak);
        return 0;
    }

    // From here on windows are marked, of a run of w = 3 or 4 samples each that starts at element
    // `offset` of the block. ErrOutOfMemory.
    ErrorCode beginMarks(const DBL *fitMatrix, int32_t w, const VertexLimits &limits,
                         std::ptrdiff_t offset, std::ptrdiff_t windows);
    // Window i, which has that vertex.
    void mark(const Peak &peak, std::ptrdiff_t i);
    // Windows of a group that starts with window `first`, a multiple of 64: those that are possible
    // and not doubtful, and those found of the others.
    void mark(const VertexMarks &marks, const FoundVertices &found, std::ptrdiff_t first,
              int32_t count);
    // After the last mark. x is the start of the run.
    void endMarks(const DBL *x);

    int32_t size() const { return size_ + marked_; }
    // `block` has the samples in which windows have been marked.
    void copyTo(const DBL *block, DBL *locations, DBL *amplitudes, DBL *derivatives) const;
    double lastLocation() const { return lastLocation_; }
    double lastAmplitude() const { return lastAmplitude_; }

private:
    // The list lies in chunks of so many locations, as many amplitudes and as many derivatives.
    static constexpr int32_t chunk = 512;

    bool isClose(const Peak &peak) const { return std::fabs(lastLocation_ - peak.location) < 1.0; }
    bool isBetter(const Peak &peak) const {
        return ofValleys_ ? peak.amplitude < lastAmplitude_ : peak.amplitude > lastAmplitude_;
    }
    void setLast(const Peak &peak) {
        lastLocation_ = peak.location;
        lastAmplitude_ = peak.amplitude;
    }
    ErrorCode grow();
    DBL *place(int32_t i) const {
        const std::ptrdiff_t before = i / chunk;
        return static_cast<DBL *>(memory_.bytes()) + before * 3 * chunk + i % chunk;
    }
    typedef uint64_t Word __attribute__((aligned(1), may_alias));
    Word &word(std::ptrdiff_t i) const { return static_cast<Word *>(marks_.bytes())[i]; }

    bool ofValleys_;
    double lastLocation_, lastAmplitude_;
    ScratchBytes memory_, marks_;
    int32_t size_ = 0, capacity_ = 0;

    DBL fitMatrix_[12];
    int32_t w_ = 0, words_ = 0, marked_ = 0;
    VertexLimits limits_ = {}; // of the first window
    std::ptrdiff_t offset_ = 0, lastMark_ = -1;
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
