#include "measure/levels.h"

#include "stats/order.h"

#include <cstring>
#include <initializer_list>
#include <limits>

namespace qx {

namespace {

constexpr double leastShare = 0.05; // share of the samples that the bin of a state should contain

struct State {
    double level;
    double count;
};

struct States {
    State low, high;
    bool isPartial(int32_t n) const {
        return low.count < leastShare * n || high.count < leastShare * n;
    }
};

void BuildHistogram(const Waveform &waveform, const LevelSearch &search, double min, double range) {
    std::memset(search.counts, 0, static_cast<std::size_t>(search.bins) * sizeof(uint32_t));
    const double perUnit = 1 / (range / search.bins);
    const int32_t last = search.bins - 1;
    for (int32_t i = 0; i < waveform.n; ++i) {
        const double position = (waveform.y[i] - min) * perUnit;
        if (position >= 0) // NaN is not counted
            ++search.counts[position < last ? static_cast<int32_t>(position) : last];
    }
}

// The fullest bin on the way from `from` to `to`; the last one if several are equally full.
State FullestBin(const LevelSearch &search, int32_t from, int32_t to, double min, double range) {
    const int32_t step = from < to ? 1 : -1;
    int32_t best = from;
    for (int32_t i = from; i != to + step; i += step)
        if (search.counts[i] >= search.counts[best])
            best = i;
    return {min + (0.5 + best) * (range / search.bins), static_cast<double>(search.counts[best])};
}

States FindStates(const LevelSearch &search, double min, double range) {
    return {
        FullestBin(search, static_cast<int32_t>(0.4 * search.bins), 0, min, range),
        FullestBin(search, static_cast<int32_t>(0.6 * search.bins), search.bins - 1, min, range)};
}

ErrorCode ByHistogram(const Waveform &waveform, const LevelSearch &search,
                      StateLevelsFound *levels) {
    BuildHistogram(waveform, search, levels->min, levels->range);
    const States states = FindStates(search, levels->min, levels->range);
    levels->high = states.high.level;
    levels->low = states.low.level;
    return states.isPartial(waveform.n) ? WarnMeasurePartial : 0;
}

void Automatic(const Waveform &waveform, const LevelSearch &search, StateLevelsFound *levels) {
    BuildHistogram(waveform, search, levels->min, levels->range);
    const States states = FindStates(search, levels->min, levels->range);
    const double least = leastShare * waveform.n;
    const bool hasLow = states.low.count > least;
    const bool hasHigh = states.high.count > least;
    const bool takesBoth = hasLow && hasHigh;
    if (search.isStrict() ? takesBoth : hasLow)
        levels->low = states.low.level;
    if (search.isStrict() ? takesBoth : hasHigh)
        levels->high = states.high.level;
    if (search.isStrict() && takesBoth)
        levels->chosen = QXLevelsByHistogram;
}

} // namespace

ErrorCode CheckWaveform(const Waveform &waveform, int32_t limit) {
    if (waveform.n < 1 || waveform.y == nullptr)
        return ErrMeasureEmpty;
    if (!(waveform.dt > 0))
        return ErrMeasureLevelsReversed;
    return limit == 0 || limit == 1 ? 0 : ErrInvalidSelector;
}

ErrorCode ComputeLevels(const Waveform &waveform, const LevelSearch &search,
                        StateLevelsFound *levels) {
    *levels = {};
    if (const ErrorCode failed = CheckWaveform(waveform, search.limit))
        return failed;
    if (search.method < QXLevelsByHistogram || search.method > QXLevelsAutomatic)
        return ErrMeasureTooManyChannels;
    Extremes extremes;
    if (const ErrorCode failed = ArrayMaxMin({waveform.y, waveform.n}, &extremes))
        return failed;
    const double max = extremes.max, min = extremes.min, range = max - min;
    // The extremes must be numbers and, except for the method of peaks, must differ.
    const bool isFlatAllowed = search.method == QXLevelsByPeaks;
    if (!(isFlatAllowed ? range >= 0 : range > 0) || range > std::numeric_limits<double>::max())
        return ErrMeasureNotPositive;

    *levels = {search.method, max, min, 0, min, range};
    ErrorCode status = 0;
    if (search.method == QXLevelsByHistogram)
        status = ByHistogram(waveform, search, levels);
    else if (search.method == QXLevelsAutomatic)
        Automatic(waveform, search, levels);
    levels->amplitude = levels->high - levels->low;
    return status;
}

ErrorCode TakeHistogramLevels(const Waveform &waveform, const LevelSearch &search, bool isBuilt,
                              StateLevelsFound *levels) {
    if (!isBuilt)
        BuildHistogram(waveform, search, levels->min, levels->range);
    const States states = FindStates(search, levels->min, levels->range);
    levels->high = states.high.level;
    levels->low = states.low.level;
    levels->amplitude = levels->high - levels->low;
    return states.isPartial(waveform.n) ? WarnMeasurePartial : 0;
}

void MakeAbsolute(const StateLevelsFound &levels, ReferenceLevels *references) {
    for (double *level : {&references->high, &references->mid, &references->low})
        *level = *level * levels.amplitude / 100 + levels.low;
}

} // namespace qx
