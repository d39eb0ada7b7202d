#ifndef QX_MEASURE_HISTOGRAM_SLOT_H
#define QX_MEASURE_HISTOGRAM_SLOT_H

#include "qx/errors.h"
#include "qx/pulses.h"

#include <cstdint>

namespace qx {

// The counters that a call site keeps between calls.
struct MeasurementHistogram {
    int32_t bins;
    uint32_t *counts;
};

// The two ways to store them, which are the only difference between a plain export and its _IDP
// twin. `acquire` gives the word `bins` counters with unspecified content. Returns 0, ErrInternal
// if the word holds something else, which is left alone, or ErrOutOfMemory.

// In a word that the caller owns, freed by the host's clean-up. If the number of bins changes, the
// block is replaced.
class KeepHistogramInSlot {
public:
    explicit KeepHistogramInSlot(MeasurementSlot *slot) : word_(slot) {}
    bool isNull() const { return word_ == nullptr; }
    ErrorCode acquire(int32_t bins) const;
    uint32_t *counts() const { return static_cast<MeasurementHistogram *>(*word_)->counts; }

private:
    MeasurementSlot *word_;
};

// In the host's instance data, freed by MeasurementUnreserveProc.
class KeepHistogramInInstance {
public:
    explicit KeepHistogramInInstance(MeasurementInstanceWord *word) : word_(word) {}
    bool isNull() const { return word_ == nullptr; }
    ErrorCode acquire(int32_t bins) const;
    uint32_t *counts() const { return static_cast<MeasurementHistogram *>(*word_)->counts; }

private:
    MeasurementInstanceWord *word_;
};

// 0, or ErrInternal if the word holds something else, which is left alone.
ErrorCode MeasurementInstanceRelease(MeasurementInstanceWord *word);

} // namespace qx

#endif
