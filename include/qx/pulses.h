#ifndef QX_PULSES_H
#define QX_PULSES_H

/* Levels, pulses, cycles and transitions of a waveform y, sampled every dt from t0 on.

   A waveform is mostly in one of two states, whose levels are taken from its histogram or its
   extremes. Reference levels, given as percentages of the amplitude above the low state or as
   absolute values, define its transitions; times are interpolated between samples. The terms are
   those of IEEE Std 181.

   The counters of the histogram are kept from call to call in a slot: a word of the caller, null at
   first, which is registered with the host for clean-up. An _IDP twin keeps them in the instance
   data of the host instead, which MeasurementUnreserveProc releases. A word that was filled by
   another kind of slot, by an _IDP export or by a transform is refused. Any other address in the
   word cannot be distinguished from counters: never store one there.

   The counters take 4 bytes per bin as long as the slot holds them, and every call that determines
   levels by histogram or automatically clears and scans all of them, however short the waveform is.

   NaN samples belong to neither state. Numeric results are 0 after a failure. Times that overflow,
   as with a dt near 1e308, are infinite or NaN, with the code 0, and so is a slew rate with a dt
   near 0. polarity: 0 falling; 1 rising. limit: 0 none; 1 the automatic method takes either both
   levels from the histogram or neither, and the regions of aberrations end at a distance of three
   times the duration of the transition. */

#include "qx/types.h"

QX_BEGIN_DECLS

/* How the levels of the states are found. */
enum QXLevelMethod {
    QXLevelsByHistogram = 0, /* the fullest bins of the lowest and of the highest two fifths */
    QXLevelsByPeaks = 1,     /* minimum and maximum */
    QXLevelsAutomatic = 2    /* the histogram if its bins hold over 5% of the samples, else peaks */
};

typedef struct HistogramOptions {
    uint32_t method; /* of QXLevelMethod */
    int32_t bins;    /* from 1 */
} HistogramOptions;

/* The levels that begin and end pulses and transitions. */
typedef struct ReferenceLevels {
    double high;
    double mid;
    double low;
    uint16_t
        percent; /* 0: absolute values; else percentages of the amplitude above the low state */
} ReferenceLevels;

/* A word of the caller in which an export keeps its counters from call to call; null at first. */
typedef void *MeasurementSlot;
/* The word that the host keeps for a call node, for the _IDP exports; null at first. */
typedef void *MeasurementInstanceWord;

/** The levels of the two states and their difference. method: 0 to 2 those of QXLevelMethod.
    Codes: ErrMeasureNullState (a pointer is null), ErrMeasureEmptyChannel (bins is below 1),
    ErrMeasureTooManyChannels (unknown method), ErrInternal (the word holds something other than
    counters), ErrOutOfMemory (no memory for the counters), ErrMeasureEmpty (y is empty),
    ErrMeasureLevelsReversed (dt is not above 0), ErrInvalidSelector (limit is neither 0 nor 1),
    ErrMeasureNotPositive (y is flat (which is allowed with levels by peaks), has only NaN, or spans
    more than the largest double), WarnMeasurePartial (by histogram: the bin of a state holds fewer
    than 5% of the samples; the results are valid).
    NaN: y skipped; t0 in no result; dt refused with ErrMeasureLevelsReversed. */
QX_API ErrorCode StateLevels(QX_IN DBL1D y, double t0, double dt, int32_t method, int32_t bins,
                             QX_INOUT MeasurementSlot *slot, QX_OUT double *high,
                             QX_OUT double *low, QX_OUT double *amplitude, int32_t limit);
/** As StateLevels, with its counters in the host's instance data. */
QX_API ErrorCode StateLevels_IDP(QX_IN DBL1D y, double t0, double dt, int32_t method, int32_t bins,
                                 QX_INOUT MeasurementInstanceWord *instance, QX_OUT double *high,
                                 QX_OUT double *low, QX_OUT double *amplitude, int32_t limit);

/** Measures pulse number `pulseNumber` (from 1) among those whose first edge has the given
    polarity. A pulse is between two successive crossings of the mid reference; a crossing counts
    once the waveform has left the band around mid that extends to the nearer of the other
    references. The results, in units of time, are the duration, the center, and the period between
    the crossings of number 2 pulseNumber - 1 and 2 pulseNumber + 1 of the waveform; dutyCycle =
    duration / period. With `partial` the last crossing of the period may be missing, and period and
    dutyCycle are always 0. Levels are computed only for references in percent, which are returned
    as absolute values. The crossings are found as sample numbers plus t0, so a t0 far beyond the
    number of samples loses digits; beyond about 1e16 times that number duration and period are 0
    and dutyCycle is NaN.
    Codes: ErrMeasureNullState (a pointer is null), ErrMeasureEmptyChannel (bins is below 1),
    ErrMeasureTooManyChannels (unknown method), ErrInternal (the word holds something other than
    counters), ErrOutOfMemory (no memory for the counters), ErrMeasureBadCount (pulseNumber is below
    1), ErrMeasureEmpty (y is empty), ErrMeasureLevelsReversed (dt is not above 0),
    ErrInvalidSelector (limit or polarity is neither 0 nor 1), ErrMeasureNotPositive (no amplitude,
    as in StateLevels), ErrMeasureRangeReversed (the references are out of order),
    ErrMeasureOutOfMemory (no memory for the crossings, at most as many as y has samples; or
    pulseNumber above about 8e7), ErrMeasureSearchShort (too few crossings), WarnMeasurePartial (as
    in StateLevels).
    NaN: y refused with ErrMeasureSearchShort or by position (kept); t0, ref.high in some results;
    dt refused with ErrMeasureLevelsReversed; ref.low, ref.mid refused with
    ErrMeasureRangeReversed. */
QX_API ErrorCode PulseMeasEx(QX_IN DBL1D y, double t0, double dt, uint16_t polarity,
                             uint16_t partial, int32_t pulseNumber,
                             QX_IN const ReferenceLevels *ref, QX_IN const HistogramOptions *hist,
                             QX_INOUT MeasurementSlot *slot, QX_OUT double *period,
                             QX_OUT double *duration, QX_OUT double *dutyCycle,
                             QX_OUT double *center, QX_OUT double *lowRef, QX_OUT double *midRef,
                             QX_OUT double *highRef, int32_t limit);
/** As PulseMeasEx, with its counters in the host's instance data. */
QX_API ErrorCode PulseMeasEx_IDP(QX_IN DBL1D y, double t0, double dt, uint16_t polarity,
                                 uint16_t partial, int32_t pulseNumber,
                                 QX_IN const ReferenceLevels *ref,
                                 QX_IN const HistogramOptions *hist,
                                 QX_INOUT MeasurementInstanceWord *instance, QX_OUT double *period,
                                 QX_OUT double *duration, QX_OUT double *dutyCycle,
                                 QX_OUT double *center, QX_OUT double *lowRef,
                                 QX_OUT double *midRef, QX_OUT double *highRef, int32_t limit);
/** As PulseMeasEx, of whole periods only. */
QX_API ErrorCode PulseMeas(QX_IN DBL1D y, double t0, double dt, uint16_t polarity,
                           int32_t pulseNumber, QX_IN const ReferenceLevels *ref,
                           QX_IN const HistogramOptions *hist, QX_INOUT MeasurementSlot *slot,
                           QX_OUT double *period, QX_OUT double *duration, QX_OUT double *dutyCycle,
                           QX_OUT double *center, QX_OUT double *lowRef, QX_OUT double *midRef,
                           QX_OUT double *highRef, int32_t limit);

/** Measures transition number `number` (from 1) of the given polarity between the low and the high
    reference: start, end and duration in units of time, and slewRate, the difference of the
    references divided by the duration. Aberrations are the excursions from the state before and
    after the transition, up to halfway to the neighbouring transitions or to the ends of the
    waveform, in percent of the amplitude; an overshoot is above the histogram bin of the state, an
    undershoot below it, and excursions within the bin do not count. Afterwards `ref` holds absolute
    levels, with `percent` unchanged; a failure leaves it unchanged.
    Codes: ErrMeasureNullState (a pointer is null), ErrMeasureEmptyChannel (bins is below 1),
    ErrMeasureTooManyChannels (unknown method), ErrInternal (the word holds something other than
    counters), ErrOutOfMemory (no memory for the counters), ErrMeasureBadCount (number is below 1),
    ErrMeasureEmpty (y is empty), ErrMeasureLevelsReversed (dt is not above 0), ErrInvalidSelector
    (limit or polarity is neither 0 nor 1), ErrMeasureNotPositive (no amplitude, as in StateLevels,
    but also with levels by peaks), ErrMeasureRangeReversed (the references are out of order),
    ErrMeasureOutOfMemory (no memory for the transitions, at most as many as y has samples; or
    number above about 3e7), ErrMeasureTooFewPoints (there is no such transition),
    ErrMeasureOutOfRange (the duration is not above 0), WarnMeasurePartial (as in StateLevels, but
    also with levels by peaks).
    NaN: y refused with ErrMeasureOutOfRange or by position (kept); t0 in some results; dt refused
    with ErrMeasureLevelsReversed; ref.high, ref.low, ref.mid refused with
    ErrMeasureRangeReversed. */
QX_API ErrorCode TransMeas(QX_IN DBL1D y, double t0, double dt, uint16_t polarity, int32_t number,
                           QX_INOUT ReferenceLevels *ref, QX_IN const HistogramOptions *hist,
                           QX_INOUT MeasurementSlot *slot, QX_OUT double *slewRate,
                           QX_OUT double *duration, QX_OUT double *start, QX_OUT double *end,
                           QX_OUT double *lowRef, QX_OUT double *midRef, QX_OUT double *highRef,
                           QX_OUT double *preUndershoot, QX_OUT double *preOvershoot,
                           QX_OUT double *postUndershoot, QX_OUT double *postOvershoot,
                           int32_t limit);
/** As TransMeas, with its counters in the host's instance data. */
QX_API ErrorCode TransMeas_IDP(QX_IN DBL1D y, double t0, double dt, uint16_t polarity,
                               int32_t number, QX_INOUT ReferenceLevels *ref,
                               QX_IN const HistogramOptions *hist,
                               QX_INOUT MeasurementInstanceWord *instance, QX_OUT double *slewRate,
                               QX_OUT double *duration, QX_OUT double *start, QX_OUT double *end,
                               QX_OUT double *lowRef, QX_OUT double *midRef, QX_OUT double *highRef,
                               QX_OUT double *preUndershoot, QX_OUT double *preOvershoot,
                               QX_OUT double *postUndershoot, QX_OUT double *postOvershoot,
                               int32_t limit);

/** Mean and root mean square over cycle number `cycleNumber` (from 1), over the samples between the
    crossings of number 2 cycleNumber - 1 and 2 cycleNumber + 1 of the mid reference, counted as in
    PulseMeasEx; start and end are in units of time. Sums and squares that overflow, as for samples
    of 1e154 and above, make mean and rms infinite or NaN. Afterwards `ref` holds absolute levels,
    with `percent` unchanged; a failure leaves it unchanged.
    Codes: ErrMeasureNullState (a pointer is null), ErrMeasureEmptyChannel (bins is below 1),
    ErrMeasureTooManyChannels (unknown method), ErrInternal (the word holds something other than
    counters), ErrOutOfMemory (no memory for the counters), ErrMeasureBadCount (cycleNumber is below
    1), ErrMeasureEmpty (y is empty), ErrMeasureLevelsReversed (dt is not above 0),
    ErrInvalidSelector (limit is neither 0 nor 1), ErrMeasureNotPositive (no amplitude, as in
    StateLevels), ErrMeasureRangeReversed (the references are out of order), ErrMeasureOutOfMemory
    (no memory for so many crossings), ErrMeasureSearchShort (too few crossings), ErrMeasureNotFound
    (a cycle without samples), WarnMeasurePartial (as in StateLevels).
    NaN: y in some results or by position (kept); t0 refused with ErrMeasureNotFound; dt refused
    with ErrMeasureLevelsReversed; ref.high in some results; ref.low, ref.mid refused with
    ErrMeasureRangeReversed. */
QX_API ErrorCode CycleRMSAverage(QX_IN DBL1D y, double t0, double dt, int32_t cycleNumber,
                                 QX_INOUT ReferenceLevels *ref, QX_IN const HistogramOptions *hist,
                                 QX_INOUT MeasurementSlot *slot, QX_OUT double *mean,
                                 QX_OUT double *rms, QX_OUT double *start, QX_OUT double *end,
                                 QX_OUT double *lowRef, QX_OUT double *midRef,
                                 QX_OUT double *highRef, int32_t limit);
/** As CycleRMSAverage, with its counters in the host's instance data. */
QX_API ErrorCode CycleRMSAverage_IDP(QX_IN DBL1D y, double t0, double dt, int32_t cycleNumber,
                                     QX_INOUT ReferenceLevels *ref,
                                     QX_IN const HistogramOptions *hist,
                                     QX_INOUT MeasurementInstanceWord *instance,
                                     QX_OUT double *mean, QX_OUT double *rms, QX_OUT double *start,
                                     QX_OUT double *end, QX_OUT double *lowRef,
                                     QX_OUT double *midRef, QX_OUT double *highRef, int32_t limit);

/** Measures the first pulse of a waveform in units of samples: base and top, the fullest bins from
    below and from above in a histogram of 101 bins; amplitude = top - base, overshoot = max - top,
    undershoot = base - min; delay, the first crossing of 50% of the amplitude; width, from there to
    the next crossing; riseTime and fallTime between 10% and 90%; slewRate = 0.8 amplitude /
    riseTime, or 1e30 if riseTime is 0. A waveform that starts above 50% has a negative pulse: top
    and base are exchanged, the amplitude is negative, and the times are those of the inverted
    waveform; overshoot is still the excursion above the upper level, undershoot that below the
    lower level. A level that the waveform does not reach counts as reached at its last sample in
    delay and width, and at its end, counted from the last sample before the missing edge, in
    riseTime and fallTime. If top - base overflows, amplitude and slewRate are infinite. The
    function result is 0.
    Codes: ErrEmptyInput (y is empty).
    NaN: y in some results or by position (kept). */
QX_API int32_t PulseParameters(QX_IN DBL1D y, QX_OUT double *top, QX_OUT double *base,
                               QX_OUT double *amplitude, QX_OUT double *delay, QX_OUT double *width,
                               QX_OUT double *slewRate, QX_OUT double *fallTime,
                               QX_OUT double *riseTime, QX_OUT double *overshoot,
                               QX_OUT double *undershoot, QX_OUT ErrorCode *err);

/** Releases the counters of an _IDP node and clears its instance-data word. Null is allowed.
    Codes: ErrInternal (the word holds something other than counters, and is unchanged). */
QX_API ErrorCode MeasurementUnreserveProc(QX_INOUT MeasurementInstanceWord *instance);

/** Has no effect: the measurements need no preparation. */
QX_API void measurements_create(void);
/** As measurements_create. */
QX_API void measurements_destroy(void);
/** As measurements_create. */
QX_API void measurements_clear(void);

QX_END_DECLS

#endif
