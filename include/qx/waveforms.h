#ifndef QX_WAVEFORMS_H
#define QX_WAVEFORMS_H

/* Deterministic signals: waves, patterns, ramps, pulses and two modulators.

   The waves (names that end in CIN) have their frequency f in cycles per sample and keep their
   phase, in degrees, between calls, so that blocks join continuously: sample i has the phase p =
   fmod(i 360 f + phase, 360), plus 360 if that is negative, and `phase` returns p of sample n. The
   patterns fill one array and keep no state.

   Exports with an error out-parameter have the function result 0, or the host's status if it
   refused the resize. Unless noted otherwise, overflow is not checked for: if a product in the
   formula, such as n 360 f, leaves the range of double, samples and phases are infinite or NaN with
   code 0, and a shape whose width or bandwidth causes such a product has NaN at its centre, too.

   These exports first check for ErrEmptyInput (*n is below 1). A failure empties x and leaves the
   phase unchanged. */

#include "qx/types.h"

QX_BEGIN_DECLS

/** Sine wave amp sin(p), by the recurrence y[i] = y[i-2] + 2 sin(w) c[i-1] of sine and cosine with
    w = 2 pi f, each sample clipped to [-|amp|, |amp|]: the recurrence is not stable in amplitude,
    and the error grows with the length of a block, rapidly for w near a multiple of pi.
    Codes: ErrEmptyInput (*n is below 1), ErrOutOfMemory (the host refused the resize).
    NaN: amp, f in some results; phase in all results. */
QX_API int32_t SineWaveCIN(QX_OUT DBL1D x, QX_IN const int32_t *n, QX_IN const double *amp,
                           QX_IN const double *f, QX_INOUT double *phase, QX_OUT ErrorCode *err);

/** Square wave: amp while p is below 3.6 duty, else -amp; duty is in per cent, clamped to 0 to 100.
    Codes: ErrEmptyInput (*n is below 1), ErrOutOfMemory (the host refused the resize).
    NaN: amp, f, phase in some results; duty in no result. */
QX_API int32_t SquareWaveCIN(QX_OUT DBL1D x, QX_IN const int32_t *n, QX_IN const double *amp,
                             QX_IN const double *f, QX_INOUT double *phase,
                             QX_IN const double *duty, QX_OUT ErrorCode *err);

/** Triangle wave: 0 at p = 0, amp at 90, 0 at 180, -amp at 270 degrees.
    Codes: ErrEmptyInput (*n is below 1), ErrOutOfMemory (the host refused the resize).
    NaN: amp in some results; f, phase in all results. */
QX_API int32_t TriangleWaveCIN(QX_OUT DBL1D x, QX_IN const int32_t *n, QX_IN const double *amp,
                               QX_IN const double *f, QX_INOUT double *phase,
                               QX_OUT ErrorCode *err);

/** Sawtooth wave: amp p / 180 below 180 degrees, from there amp (p / 180 - 2); it jumps from amp to
    -amp at 180.
    Codes: ErrEmptyInput (*n is below 1), ErrOutOfMemory (the host refused the resize).
    NaN: amp in some results; f, phase in all results. */
QX_API int32_t SawtoothWaveCIN(QX_OUT DBL1D x, QX_IN const int32_t *n, QX_IN const double *amp,
                               QX_IN const double *f, QX_INOUT double *phase,
                               QX_OUT ErrorCode *err);

/** A wave whose period is given by a table, multiplied by amp: the table value at or before the
    phase, or linearly interpolated between its two neighbours if *interpolate is 1. The position in
    the table is a running sum. An empty table gives zeros and the phase 0.
    Codes: ErrEmptyInput (*n is below 1), ErrOutOfMemory (the host refused the resize),
    ErrNonFiniteInput (phase or f is not finite, or the position would overflow).
    NaN: amp in some results; f, phase refused with ErrNonFiniteInput; table in some results or in
    no result. */
QX_API int32_t ArbitraryWaveCIN(QX_OUT DBL1D x, QX_IN const int32_t *n, QX_IN const double *amp,
                                QX_IN const double *f, QX_INOUT double *phase, QX_IN DBL1D table,
                                QX_IN const int32_t *interpolate, QX_OUT ErrorCode *err);

/** Linear chirp amp sin(i ((f2 - f1) pi/n i + 2 pi f1)): the frequency changes from f1 at the first
    sample to f2 at sample n, one after the last.
    Codes: ErrEmptyInput (*n is below 1), ErrOutOfMemory (the host refused the resize).
    NaN: amp, f1, f2 in all results. */
QX_API int32_t ChirpCIN(QX_OUT DBL1D x, QX_IN const int32_t *n, QX_IN const double *amp,
                        QX_IN const double *f1, QX_IN const double *f2, QX_OUT ErrorCode *err);

/** `cycles` periods (not necessarily an integer) of a sine over the array, starting at the phase in
    degrees; computed as in SineWaveCIN.
    Codes: ErrEmptyInput (*n is below 1), ErrOutOfMemory (the host refused the resize).
    NaN: amp, phase in all results; cycles in some results. */
QX_API int32_t SinePtrn(QX_OUT DBL1D x, QX_IN const int32_t *n, QX_IN const double *amp,
                        QX_IN const double *phase, QX_IN const double *cycles,
                        QX_OUT ErrorCode *err);

/** Rectangular pattern between amp and 0: each period of round(n / cycles) samples begins with
    round(duty period / 100) samples of amp. At a duty of 100 all samples are amp.
    Codes: ErrEmptyInput (*n is below 1), ErrWaveParameterNotPositive (the duty is not above 0),
    ErrWaveParameterRange (cycles is not above 0 or exceeds the integer part of n / 2),
    ErrOutOfMemory (the host refused the resize).
    NaN: amp in some results; duty refused with ErrWaveParameterNotPositive; cycles refused with
    ErrWaveParameterRange. */
QX_API int32_t Square(QX_OUT DBL1D x, QX_IN const int32_t *n, QX_IN const double *amp,
                      QX_IN const double *duty, QX_IN const double *cycles, QX_OUT ErrorCode *err);

/** A rectangular pulse: `width` samples of amp from sample `delay` on, the others 0.
    Codes: ErrEmptyInput (*n is below 1), ErrOutOfMemory (the host refused the resize),
    ErrPulseOutOfRange (delay or width is negative, or the pulse ends beyond the array).
    NaN: amp in some results. */
QX_API int32_t PulsePtrn(QX_OUT DBL1D x, QX_IN const int32_t *n, QX_IN const double *amp,
                         QX_IN const int32_t *delay, QX_IN const int32_t *width,
                         QX_OUT ErrorCode *err);

/** An impulse: sample `delay` is amp, the others are 0.
    Codes: ErrEmptyInput (*n is below 1), ErrOutOfMemory (the host refused the resize),
    ErrIndexOutOfRange (delay is outside the array).
    NaN: amp in some results. */
QX_API int32_t ImpulsePtrn(QX_OUT DBL1D x, QX_IN const int32_t *n, QX_IN const double *amp,
                           QX_IN const int32_t *delay, QX_OUT ErrorCode *err);

/** amp sin(x) / x at x = pi (i dt - delay).
    Codes: ErrEmptyInput (*n is below 1), ErrOutOfMemory (the host refused the resize),
    ErrSamplingNotPositive (dt is not above 0).
    NaN: amp, delay in all results; dt refused with ErrSamplingNotPositive. */
QX_API int32_t SincWave(QX_OUT DBL1D x, QX_IN const int32_t *n, QX_IN const double *amp,
                        QX_IN const double *delay, QX_IN const double *dt, QX_OUT ErrorCode *err);

/** A straight line from start to end, both included.
    Codes: ErrEmptyInput (*n is below 1), ErrFewerThanTwo (*n is 1 and start and end differ),
    ErrOutOfMemory (the host refused the resize).
    NaN: start, end in some results. */
QX_API int32_t RampPtrn(QX_OUT DBL1D x, QX_IN const int32_t *n, QX_IN const double *start,
                        QX_IN const double *end, QX_OUT ErrorCode *err);

/** A straight line from start to end; if `excludeEnd` is non-zero, end would be reached at sample
    n. The function result is the code.
    Codes: ErrCountNotPositive (n is below 1 and the end is excluded), ErrFewerThanTwo (the end is
    included and n is below 2, except for one sample with equal ends), ErrOutOfMemory (the host
    refused the resize).
    NaN: start in all results; end in some results. */
QX_API ErrorCode RampPtrn80(QX_OUT DBL1D x, int32_t n, double start, double end,
                            int32_t excludeEnd);

/** As RampPtrn80, with a choice of scale. scale: 0 linear; 1 in equal ratios. A negative scale
    counts as 0.
    Codes: ErrCountNotPositive (n is below 1 and the end is excluded), ErrFewerThanTwo (the end is
    included and n is below 2, except for one sample with equal ends), ErrInvalidSelector (scale is
    above 1), ErrOutOfMemory (the host refused the resize), ErrNotStrictlyPositive (equal ratios,
    and start or end is not above 0).
    NaN: start refused with ErrNotStrictlyPositive or in all results; end refused with
    ErrNotStrictlyPositive or in some results. */
QX_API ErrorCode RampPtrn85(QX_OUT DBL1D x, int32_t n, double start, double end, int32_t excludeEnd,
                            int32_t scale);

/** Gaussian pulse amp exp(-k (pi fc t)^2) cos(2 pi fc t) with k = 5 bandwidth^2 / (ln(10)
    dBReference): its spectrum falls by dBReference over the fractional bandwidth around fc. x holds
    the times and receives the pulse; if x is empty, it receives n samples at the times i dt -
    delay. The function result is the code.
    Codes: ErrEmptyInput (x is empty and n is below 1), ErrOutOfMemory (the host refused the
    resize), ErrNotStrictlyPositive (fc, bandwidth or dBReference is not above 0),
    ErrSamplingNotPositive (dt is not above 0).
    NaN: x in some results; amp in all results; delay in all results or in no result; dt refused
    with ErrSamplingNotPositive; fc, bandwidth, dBReference refused with ErrNotStrictlyPositive. */
QX_API ErrorCode GaussPulseH(QX_INOUT DBL1D x, int32_t n, double amp, double delay, double dt,
                             double fc, double bandwidth, double dBReference);

/** As GaussPulseH, the derivative of a Gaussian: 2 amp sqrt(e) u exp(-2 u^2) with u = pi fc t, with
    a peak of amp at u = 1/2.
    Codes: ErrEmptyInput (x is empty and n is below 1), ErrOutOfMemory (the host refused the
    resize), ErrNotStrictlyPositive (fc is not above 0), ErrSamplingNotPositive (dt is not above
    0). */
QX_API ErrorCode GaussMonopulseH(QX_INOUT DBL1D x, int32_t n, double dt, double delay, double fc,
                                 double amp);

/** As GaussPulseH, a single triangle of the given width, with its peak of amp at skew times width
    from its start. With the times i dt - delay it begins at t = 0; with times given in x it is
    centred on t = 0.
    Codes: ErrEmptyInput (x is empty and n is below 1), ErrOutOfMemory (the host refused the
    resize), ErrNotStrictlyPositive (the width is not above 0), ErrSamplingNotPositive (dt is not
    above 0), ErrProbabilityOutOfRange (skew is not in 0 to 1).
    NaN: x, amp, skew in some results; delay in all results or in no result; dt refused with
    ErrSamplingNotPositive; width refused with ErrNotStrictlyPositive. */
QX_API ErrorCode AperiodTriangleH(QX_INOUT DBL1D x, int32_t n, double amp, double delay, double dt,
                                  double width, double skew);

/** As GaussPulseH, the periodic sinc amp sin(order t/2) / (order sin(t/2)), with its limit where
    sin(t/2) vanishes: amp, or -amp at odd multiples of 2 pi for an even order. A time of NaN gives
    amp as well.
    Codes: ErrEmptyInput (x is empty and n is below 1), ErrOutOfMemory (the host refused the
    resize), ErrNotStrictlyPositive (the order is below 1), ErrSamplingNotPositive (dt is not above
    0).
    NaN: x, delay in no result; amp in all results; dt refused with ErrSamplingNotPositive. */
QX_API ErrorCode PeriodicSincH(QX_INOUT DBL1D x, int32_t n, double amp, int32_t order, double dt,
                               double delay);

/** Phase modulation: y[i], in degrees, becomes sin(y[i] pi/180 + *phase dt), where *phase advances
    by 2 pi fc per sample, plus or minus a full turn, which does not change the sine: 2 pi/dt is
    subtracted once *phase reaches it and added otherwise. A dt of 0, or a phase whose product with
    dt is not finite, gives NaN. *peak is the input of largest magnitude so far, compared by integer
    parts. *phaseOut is *phase dt in degrees plus the last output, which counts as 0 if there are no
    samples. The function result is 0.
    NaN: dt, fc, peak, phase in some results. */
QX_API int32_t PhasMod(int32_t n, double dt, QX_OUT double *phaseOut, double fc,
                       QX_INOUT QX_LENGTH(n) DBL *y, QX_INOUT double *peak, QX_INOUT double *phase);

/** As PhasMod, frequency modulation: y[i], in the unit of fc, becomes sin(*phase dt), where *phase
    advances by 2 pi (fc + y[i]). *phaseOut is *phase dt in degrees. */
QX_API int32_t FreqMod(int32_t n, double dt, QX_OUT double *phaseOut, double fc,
                       QX_INOUT QX_LENGTH(n) DBL *y, QX_INOUT double *peak, QX_INOUT double *phase);

QX_END_DECLS

#endif
