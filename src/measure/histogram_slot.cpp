#include "measure/histogram_slot.h"

#include "frame/host_binding.h"

#include <cstdlib>
#include <limits>

namespace qx {

namespace {

MeasurementHistogram *HeldBy(void *word) { return static_cast<MeasurementHistogram *>(word); }

// The sweep of a block: the word that held it belongs to what the host is discarding.
int32_t HistogramSweep(void *block) {
    std::free(HeldBy(block)->counts);
    std::free(block);
    return 0;
}

ErrorCode Resize(MeasurementHistogram *histogram, int32_t bins) {
    if (histogram->counts != nullptr && histogram->bins == bins)
        return 0;
    // As for all other memory, int32 must hold the size.
    if (bins > std::numeric_limits<int32_t>::max() / int32_t{sizeof(uint32_t)})
        return ErrOutOfMemory;
    void *const resized =
        std::realloc(histogram->counts, static_cast<std::size_t>(bins) * sizeof(uint32_t));
    if (resized == nullptr)
        return ErrOutOfMemory;
    *histogram = {bins, static_cast<uint32_t *>(resized)};
    return 0;
}

} // namespace

ErrorCode KeepHistogramInSlot::acquire(int32_t bins) const {
    if (*word_ != nullptr && HeldBy(*word_)->bins == bins)
        return 0;
    if (*word_ != nullptr) {
        HostRegisterSweep(HistogramSweep, *word_, SweepWithdraw);
        HistogramSweep(*word_);
        *word_ = nullptr;
    }
    void *const block = std::calloc(1, sizeof(MeasurementHistogram));
    if (block == nullptr)
        return ErrOutOfMemory;
    // A block that nobody would sweep is none.
    if (Resize(HeldBy(block), bins) != 0 ||
        HostRegisterSweep(HistogramSweep, block, SweepForObject) != 0) {
        HistogramSweep(block);
        return ErrOutOfMemory;
    }
    *word_ = block;
    return 0;
}

ErrorCode KeepHistogramInInstance::acquire(int32_t bins) const {
    if (*word_ == nullptr)
        *word_ = std::calloc(1, sizeof(MeasurementHistogram));
    return *word_ == nullptr ? ErrOutOfMemory : Resize(HeldBy(*word_), bins);
}

void MeasurementInstanceRelease(MeasurementInstanceWord *word) {
    if (word == nullptr || *word == nullptr)
        return;
    HistogramSweep(*word);
    *word = nullptr;
}

} // namespace qx
