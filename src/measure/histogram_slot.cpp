#include "measure/histogram_slot.h"

#include "frame/host_binding.h"
#include "frame/node_cell.h"

#include <cstdlib>
#include <limits>

namespace qx {

namespace {

MeasurementHistogram *HeldBy(void *word) { return static_cast<MeasurementHistogram *>(word); }

// The clean-up of a block. The word that held its address belongs to data that the host is
// discarding.
int32_t HistogramSweep(void *block) {
    std::free(HeldBy(block)->counts);
    FreeCell(block);
    return 0;
}

ErrorCode Resize(MeasurementHistogram *histogram, int32_t bins) {
    if (histogram->counts != nullptr && histogram->bins == bins)
        return 0;
    // As for all other memory, the size must fit into int32.
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
    if (*word_ != nullptr && !IsCell(*word_, CellKind::Histogram))
        return ErrInternal;
    if (*word_ != nullptr && HeldBy(*word_)->bins == bins)
        return 0;
    if (*word_ != nullptr) {
        HostRegisterSweep(HistogramSweep, *word_, SweepWithdraw);
        HistogramSweep(*word_);
        *word_ = nullptr;
    }
    auto *const block = NewCell<MeasurementHistogram>(CellKind::Histogram);
    if (block == nullptr)
        return ErrOutOfMemory;
    // If the clean-up cannot be registered, treat it as a failed allocation.
    if (Resize(block, bins) != 0 || HostRegisterSweep(HistogramSweep, block, SweepForObject) != 0) {
        HistogramSweep(block);
        return ErrOutOfMemory;
    }
    *word_ = block;
    return 0;
}

ErrorCode KeepHistogramInInstance::acquire(int32_t bins) const {
    if (const ErrorCode failed =
            ReserveCell<MeasurementHistogram>(word_, CellKind::HistogramInstance))
        return failed;
    return Resize(HeldBy(*word_), bins);
}

ErrorCode MeasurementInstanceRelease(MeasurementInstanceWord *word) {
    if (word == nullptr || *word == nullptr)
        return 0;
    if (!IsCell(*word, CellKind::HistogramInstance))
        return ErrInternal;
    HistogramSweep(*word);
    *word = nullptr;
    return 0;
}

} // namespace qx
