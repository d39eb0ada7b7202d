#include "qx/tones.h"

#include "frame/constants.h"
#include "frame/export.h"
#include "measure/harmonics.h"
#include "measure/tone_search.h"

#include <algorithm>
#include <cmath>
#include <cstddef>

namespace qx {
namespace {

constexpr int32_t fewestSamples = 4;

bool IsSampling(double dt) { return dt > 0 && std::isfinite(dt); }

bool AllFinite(const In<DBL1D> &y) {
    for (int32_t i = 0; i < y.size(); ++i)
        if (!std::isfinite(y.data()[i]))
            return false;
    return true;
}

enum ToneOrder : int32_t { FallingAmplitude = 0, RisingFrequency = 1 };

// The indices of the tones in order; equal ones stay in the order in which they were found.
void Sort(const ToneSearch &search, ToneOrder order, I32 *places) {
    const auto isBefore = [&](int32_t a, int32_t b) {
        return order == RisingFrequency ? search[a].frequency < search[b].frequency
                                        : Amplitude(search[a]) > Amplitude(search[b]);
    };
    for (int32_t i = 0; i < search.count(); ++i) {
        int32_t at = i;
        for (; at > 0 && isBefore(i, places[at - 1]); --at)
            places[at] = places[at - 1];
        places[at] = i;
    }
}

Outcome Tones(In<DBL1D> y, double dt, int32_t count, int32_t order, Out<DBL1D> frequencies,
              Out<DBL1D> amplitudes, Out<DBL1D> phases, OutDBL residualRms) {
    if (const ErrorCode bad = FirstFailed(
            {{y.isEmpty(), ErrMeasureEmpty},
             {!IsSampling(dt), ErrSamplingNotPositive},
             {count < 1, ErrMeasureBadCount},
             {order != FallingAmplitude && order != RisingFrequency, ErrInvalidSelector}}))
        return bad;
    if (!AllFinite(y))
        return ErrNonFiniteInput;
    const int32_t n = y.size();
    if (n < fewestSamples)
        return ErrMeasureTooFewPoints;

    ToneSearch search;
    if (const ErrorCode bad = search.begin(y.data(), n))
        return bad;
    for (auto step = ToneSearch::Step::Added;
         step == ToneSearch::Step::Added && search.count() < count;)
        if (const ErrorCode bad = search.add(wholeBand, false, step))
            return bad;
    const int32_t found = search.count();
    if (found == 0)
        return ErrMeasureNotFound;
    search.settle();
    Scratch<ElementType::I32> places;
    if (const ErrorCode bad = places.allocate(found))
        return bad;
    Sort(search, static_cast<ToneOrder>(order), places.data());
    for (Out<DBL1D> *output : {&frequencies, &amplitudes, &phases})
        if (const Outcome bad = output->resize(found))
            return bad;
    for (int32_t i = 0; i < found; ++i) {
        const Line &tone = search[places[i]];
        frequencies.data()[i] = tone.frequency / dt;
        amplitudes.data()[i] = Amplitude(tone) * search.unit();
        phases.data()[i] = PhaseAtStart(tone, n);
    }
    residualRms = search.residualRms(nullptr) * search.unit();
    return 0;
}

Outcome SingleTone(In<DBL1D> y, double dt, double centre, double halfWidth, OutDBL frequency,
                   OutDBL amplitude, OutDBL phase, OutDBL offset, OutDBL residualRms) {
    if (const ErrorCode bad = FirstFailed(
            {{y.isEmpty(), ErrMeasureEmpty}, {!IsSampling(dt), ErrSamplingNotPositive}}))
        return bad;
    if (!AllFinite(y) || !std::isfinite(centre) || !std::isfinite(halfWidth))
        return ErrNonFiniteInput;
    const int32_t n = y.size();
    if (n < fewestSamples)
        return ErrMeasureTooFewPoints;

    const Band band =
        halfWidth > 0 ? Band{(centre - halfWidth) * dt, (centre + halfWidth) * dt} : wholeBand;
    ToneSearch search;
    if (const ErrorCode bad = search.begin(y.data(), n))
        return bad;
    if (const ErrorCode bad = FindToneInBand(search, band))
        return bad;
    search.settle();
    const Line tone = search[search.count() - 1];
    frequency = tone.frequency / dt;
    amplitude = Amplitude(tone) * search.unit();
    phase = PhaseAtStart(tone, n);
    offset = (search.level() + search.constant()) * search.unit();
    residualRms = search.residualRmsOf(tone) * search.unit();
    return 0;
}

// The frequency at which a tone appears after aliasing, in cycles per sample.
double Seen(double frequency, double dt) { return std::fabs(PartOfTurn(frequency, dt)); }

Outcome Harmonics(In<DBL1D> y, double dt, double fundamental, int32_t highest, double fullScale,
                  Out<DBL1D> frequencies, Out<DBL1D> amplitudes, Out<DBL1D> phases, OutDBL thd,
                  OutDBL sinad, OutDBL snr, OutDBL sfdr, OutDBL enob, OutDBL noiseFloor) {
    if (const ErrorCode bad = FirstFailed({{y.isEmpty(), ErrMeasureEmpty},
                                           {!IsSampling(dt), ErrSamplingNotPositive},
                                           {highest < 1, ErrMeasureBadCount}}))
        return bad;
    if (!AllFinite(y) || !std::isfinite(fundamental) || !std::isfinite(fullScale))
        return ErrNonFiniteInput;
    const int32_t n = y.size();
    if (n < fewestSamples || n < 2 * (int64_t{highest} + 1))
        return ErrMeasureTooFewPoints;

    Band band = wholeBand;
    if (fundamental > 0) {
        const double seen = Seen(fundamental, dt);
        if (!std::isfinite(seen))
            return ErrMeasureNotFound;
        const double reach = std::max(2.0 / n, 0.01 * seen);
        band = {seen - reach, seen + reach};
    }
    ToneSearch search;
    if (const ErrorCode bad = search.begin(y.data(), n))
        return bad;
    if (const ErrorCode bad = FindToneInBand(search, band))
        return bad;
    ScratchBytes memory;
    if (const ErrorCode bad = memory.allocate(highest * int64_t{sizeof(Line)}))
        return bad;
    Line *const harmonics = static_cast<Line *>(memory.bytes());
    HarmonicSums sums;
    const Line found = search[search.count() - 1];
    if (const ErrorCode bad = MeasureHarmonics(search, found, n, highest, harmonics, sums))
        return bad;

    for (Out<DBL1D> *output : {&frequencies, &amplitudes, &phases})
        if (const Outcome bad = output->resize(highest))
            return bad;
    for (int32_t h = 0; h < highest; ++h) {
        frequencies.data()[h] = harmonics[h].frequency / dt;
        amplitudes.data()[h] = Amplitude(harmonics[h]) * search.unit();
        phases.data()[h] = PhaseAtStart(harmonics[h], n);
    }
    thd = sums.thd;
    sinad = sums.sinad;
    snr = sums.snr;
    sfdr = sums.sfdr;
    const double range = fullScale > 0 ? fullScale / (sums.amplitude * search.unit()) : 1.0;
    enob = (sums.sinad + 20 * std::log10(range) - 1.7609) / 6.0206;
    noiseFloor = sums.noiseFloor;
    return 0;
}

} // namespace
} // namespace qx

using qx::Returned;

ErrorCode MultipleToneMeasurements(DBL1D y, double dt, int32_t count, int32_t order,
                                   DBL1D frequencies, DBL1D amplitudes, DBL1D phases,
                                   double *residualRms) {
    return Returned(qx::Tones, y, dt, count, order, frequencies, amplitudes, phases, residualRms);
}

ErrorCode SingleToneMeasurement(DBL1D y, double dt, double centre, double halfWidth,
                                double *frequency, double *amplitude, double *phase, double *offset,
                                double *residualRms) {
    return Returned(qx::SingleTone, y, dt, centre, halfWidth, frequency, amplitude, phase, offset,
                    residualRms);
}

ErrorCode HarmonicAnalysis(DBL1D y, double dt, double fundamental, int32_t highestHarmonic,
                           double fullScale, DBL1D frequencies, DBL1D amplitudes, DBL1D phases,
                           double *thd, double *sinad, double *snr, double *sfdr, double *enob,
                           double *noiseFloor) {
    return Returned(qx::Harmonics, y, dt, fundamental, highestHarmonic, fullScale, frequencies,
                    amplitudes, phases, thd, sinad, snr, sfdr, enob, noiseFloor);
}
