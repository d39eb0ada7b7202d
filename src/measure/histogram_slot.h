#ifndef QX_MEASURE_HISTOGRAM_SLOT_H
#define QX_MEASURE_HISTOGRAM_SLOT_H

#include "qx/errors.h"
#include "qx/pulses.h"

#include <cstdint>

namespace qx {

// The counters that a call site holds between its calls.
struct MeasurementHistogram {
    int32_t bins;
    uint32_t *counts;
};

// The two ways to keep them; a plain export and its _IDP twin differ in nothing else. `acquire`
// makes the word hold so many counters, of any content: 0, ErrInternal for a word that holds
// something else, which stays, or ErrOutOfMemory.

// In a word that the caller owns, swept by the host. A change of the number replaces the block.
class KeepHistogramInSlot {
public:
    explicit KeepHistogramInSlot(MeasurementSlot *slot) : word_(slot) {}
    bool isNull() const { return word_ == nullptr; }
    ErrorCode acquire(int32_t bins) const;
    uint32_t *counts() const { return static_cast<MeasurementHistogram *>(*word_)->counts; }

private:
    MeasurementSlot *word_;
};

// In the host's instance data, given back through MeasurementUnreserveProc.
class KeepHistogramInInstance {
public:
    explicit KeepHistogramInInstance(MeasurementInstanceWord *word) : word_(word) {}
    bool isNull() const { return word_ == nullptr; }
    ErrorCode acquire(int32_t bins) const;
    uint32_t *counts() const { return static_cast<MeasurementHistogram *>(*word_)->counts; }

private:
    MeasurementInstanceWord *word_;
};

// 0, or ErrInternal for a word that holds something else, which stays.
ErrorCode MeasurementInstanceRelease(MeasurementInstanceWord *word);

} // namespace qx

#endif
