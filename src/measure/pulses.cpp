#include "measure/pulses.h"

#include "frame/scratch.h"

#include <algorithm>
#include <cmath>
#include <limits>

namespace qx {

namespace {

bool IsDirection(int32_t direction) { return direction == falling || direction == rising; }

// A list of `2 number + 1` entries: enough for the requested period or transition, whichever way
// the waveform begins, and the entry after it. No two entries lie between the same samples, so the
// list need not be longer than the waveform.
template <class Entry>
class List {
public:
    ErrorCode allocate(int32_t number, const Waveform &waveform) {
        constexpr int64_t size = sizeof(Entry);
        const int64_t wanted = 2 * int64_t{number} + 1;
        // kept: a count whose list would exceed a scratch block is refused, although the list is
        // never that long.
        if (wanted * size > std::numeric_limits<int32_t>::max())
            return ErrMeasureOutOfMemory;
        length_ = static_cast<int32_t>(std::min<int64_t>(wanted, waveform.n));
        return memory_.allocate(length_ * size) ? ErrMeasureOutOfMemory : 0;
    }
    int32_t length() const { return length_; }
    Entry *data() const { return static_cast<Entry *>(memory_.bytes()); }
    const Entry &operator[](int32_t i) const { return data()[i]; }

    // The index of the entry with this number among those of a direction, or `count`.
    int32_t find(int32_t number, int32_t direction, int32_t count) const {
        int32_t place = 0;
        for (; place < count; ++place)
            if (data()[place].direction == direction && --number == 0)
                break;
        return place;
    }

private:
    ScratchBytes memory_;
    int32_t length_ = 0;
};

ErrorCode SelectPulse(const Waveform &waveform, double h, int32_t direction, bool mayBePartial,
                      int32_t number, double mid, PulseFound *found) {
    List<Crossing> list;
    if (const ErrorCode failed = list.allocate(number, waveform))
        return failed;
    const int32_t wanted = 2 * number + 1; // fits, because the list did
    const int32_t count =
        FindMidCrossings(waveform.t0, waveform.y, waveform.n, mid, h, list.data(), list.length());
    const bool isEnough = count == wanted || (mayBePartial && count == wanted - 1 &&
                                              list[count - 1].direction != direction);
    if (!isEnough)
        return ErrMeasureSearchShort;
    const int32_t first =
        direction == either ? 2 * number - 2 : list.find(number, direction, count);
    if (first + 1 >= count) // directions alternate unless there is NaN among the samples
        return ErrMeasureSearchShort;

    const double begin = list[first].position;
    const double end = list[first + 1].position;
    *found = {0, end - begin, 0, (begin + end) * 0.5};
    if (!mayBePartial) {
        // kept: the period is counted by the index in the list, whichever edges the pulse has.
        found->period = list[2 * number].position - list[2 * number - 2].position;
        found->dutyCycle = found->duration / found->period;
    }
    const double dt = waveform.dt;
    found->duration *= dt;
    found->period *= dt;
    found->center = (found->center - waveform.t0) * dt + waveform.t0;
    return 0;
}

// The level of a state and the bin of the histogram around it.
struct StateBand {
    double level, lower, upper;
    bool isHigh;

    StateBand(double stateLevel, double bin, bool high)
        : level(stateLevel), lower(stateLevel - bin / 2), upper(lower + bin), isHigh(high) {}
    bool isReachedBy(double y) const { return isHigh ? !(y < level) : !(y > level); }
};

struct Aberration {
    double under, over;
};

// The aberration of y[first..last] in percent of the amplitude.
Aberration AberrationIn(const DBL *y, int32_t first, int32_t last, const StateBand &state,
                        double amplitude) {
    double max = y[first];
    double min = max;
    for (int32_t i = first + 1; i <= last; ++i) {
        max = y[i] > max ? y[i] : max;
        min = y[i] < min ? y[i] : min;
    }
    return {min < state.lower ? (state.level - min) * 100 / amplitude : 0.0,
            max > state.upper ? (max - state.level) * 100 / amplitude : 0.0};
}

// The bounds of the regions of aberrations.
struct Neighbours {
    const Transition *before, *behind; // null at an end of the waveform
    int64_t reach; // in samples; the length of the waveform if there is no limit
};

int32_t Middle(int32_t a, int32_t b) { return a + (b - a) / 2; }

Aberration BeforeTransition(const Waveform &waveform, const Transition &transition,
                            const Neighbours &neighbours, const StateBand &state,
                            double amplitude) {
    const int32_t start = transition.startIndex;
    const int32_t half = neighbours.before ? Middle(neighbours.before->endIndex, start) : 0;
    const auto first = static_cast<int32_t>(std::max<int64_t>(half, start - neighbours.reach));
    int32_t last = start;
    while (last > first + 1 && !state.isReachedBy(waveform.y[last]))
        --last;
    return AberrationIn(waveform.y, first, last, state, amplitude);
}

Aberration BehindTransition(const Waveform &waveform, const Transition &transition,
                            const Neighbours &neighbours, const StateBand &state,
                            double amplitude) {
    const int32_t end = transition.endIndex;
    const int32_t half =
        neighbours.behind ? Middle(end, neighbours.behind->startIndex) : waveform.n - 1;
    const auto last = static_cast<int32_t>(std::min<int64_t>(half, end + neighbours.reach));
    int32_t first = end;
    while (first < last && !state.isReachedBy(waveform.y[first]))
        ++first;
    return AberrationIn(waveform.y, first, last, state, amplitude);
}

// The levels of a transition's states. In the end they always come from the histogram, unless the
// automatic method uses an extreme for a state.
ErrorCode TransitionLevels(const Waveform &waveform, const LevelSearch &search,
                           ReferenceLevels *references, StateLevelsFound *levels) {
    ErrorCode status = ComputeLevels(waveform, search, levels);
    if (status < 0)
        return status;
    if (references->percent)
        MakeAbsolute(*levels, references);
    if (!(references->low <= references->mid && references->mid <= references->high))
        return ErrMeasureRangeReversed;
    const bool isByPeaks = levels->chosen == QXLevelsByPeaks;
    if (isByPeaks && !(levels->amplitude > 0))
        return ErrMeasureNotPositive;
    if (isByPeaks || (levels->chosen == QXLevelsAutomatic && search.isStrict())) {
        const ErrorCode warning = TakeHistogramLevels(waveform, search, !isByPeaks, levels);
        status = Merge(status, warning);
    }
    // The amplitude is 0 if both states are in one bin.
    return levels->amplitude > 0 ? status : ErrMeasureNotPositive;
}

void MeasureAberrations(const Waveform &waveform, const LevelSearch &search,
                        const StateLevelsFound &levels, const List<Transition> &list, int32_t place,
                        int32_t count, TransitionFound *found) {
    const Transition &transition = list[place];
    const int32_t length = std::max(1, transition.endIndex - transition.startIndex);
    const Neighbours neighbours = {place > 0 ? &list[place - 1] : nullptr,
                                   place + 1 < count ? &list[place + 1] : nullptr,
                                   search.isStrict() ? 3 * int64_t{length} : waveform.n};
    const double bin = levels.range / search.bins;
    const StateBand low(levels.low, bin, false);
    const StateBand high(levels.high, bin, true);
    const bool rises = transition.direction == rising;
    const Aberration pre =
        BeforeTransition(waveform, transition, neighbours, rises ? low : high, levels.amplitude);
    const Aberration post =
        BehindTransition(waveform, transition, neighbours, rises ? high : low, levels.amplitude);
    found->preUndershoot = pre.under;
    found->preOvershoot = pre.over;
    found->postUndershoot = post.under;
    found->postOvershoot = post.over;
}

// A time in samples, rounded and limited to [0, most].
int32_t Rounded(double samples, int32_t most) {
    const double rounded = std::trunc(samples + 0.5);
    return rounded > 0 ? static_cast<int32_t>(std::min<double>(rounded, most)) : 0;
}

} // namespace

ErrorCode MeasurePulse(const Waveform &waveform, const LevelSearch &search, int32_t direction,
                       bool mayBePartial, int32_t number, ReferenceLevels *references,
                       PulseFound *found) {
    if (number < 1)
        return ErrMeasureBadCount;
    if (const ErrorCode failed = CheckWaveform(waveform, search.limit))
        return failed;
    if (direction != either && !IsDirection(direction))
        return ErrInvalidSelector;
    ErrorCode status = 0;
    if (references->percent) {
        StateLevelsFound levels;
        status = ComputeLevels(waveform, search, &levels);
        if (status < 0)
            return status;
        MakeAbsolute(levels, references);
    }
    const double h =
        std::min(references->mid - references->low, references->high - references->mid);
    if (!(h >= 0))
        return ErrMeasureRangeReversed;
    const ErrorCode failed =
        SelectPulse(waveform, h, direction, mayBePartial, number, references->mid, found);
    return failed ? failed : status;
}

ErrorCode MeasureCycle(const Waveform &waveform, const LevelSearch &search, int32_t number,
                       ReferenceLevels *references, CycleFound *found) {
    PulseFound pulse;
    const ErrorCode status =
        MeasurePulse(waveform, search, either, false, number, references, &pulse);
    if (status < 0)
        return status;
    found->start = pulse.center - pulse.duration / 2;
    found->end = found->start + pulse.period;
    // Times far from 0 are rounded, so the samples are limited to the waveform.
    const int32_t count = Rounded(pulse.period / waveform.dt, waveform.n);
    if (count == 0)
        return ErrMeasureNotFound;
    const int32_t first = Rounded((found->start - waveform.t0) / waveform.dt, waveform.n - count);
    double sum = 0;
    double squares = 0;
    for (int32_t i = first; i < first + count; ++i) {
        sum += waveform.y[i];
        squares += waveform.y[i] * waveform.y[i];
    }
    found->mean = sum / count;
    found->rms = std::sqrt(squares / count);
    return status;
}

ErrorCode MeasureTransition(const Waveform &waveform, const LevelSearch &search, int32_t direction,
                            int32_t number, ReferenceLevels *references, TransitionFound *found) {
    if (number < 1)
        return ErrMeasureBadCount;
    if (const ErrorCode failed = CheckWaveform(waveform, search.limit))
        return failed;
    if (!IsDirection(direction))
        return ErrInvalidSelector;
    StateLevelsFound levels;
    const ErrorCode status = TransitionLevels(waveform, search, references, &levels);
    if (status < 0)
        return status;
    List<Transition> list;
    if (const ErrorCode failed = list.allocate(number, waveform))
        return failed;
    int32_t count;
    if (const ErrorCode failed =
            FindTransitions(waveform.y, waveform.n, references->low, references->high, list.data(),
                            list.length(), &count))
        return failed;
    const int32_t place = list.find(number, direction, count);
    if (place == count)
        return ErrMeasureTooFewPoints;

    MeasureAberrations(waveform, search, levels, list, place, count, found);
    const double start = list[place].startPosition;
    const double end = list[place].endPosition;
    const double duration = end - start;
    if (!(duration > 0))
        return ErrMeasureOutOfRange;
    found->slewRate = (references->high - references->low) / duration / waveform.dt;
    found->duration = duration * waveform.dt;
    found->start = start * waveform.dt + waveform.t0;
    found->end = end * waveform.dt + waveform.t0;
    return status;
}

} // namespace qx
