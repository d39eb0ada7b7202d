#ifndef QX_TONES_H
#define QX_TONES_H

/* Sinusoidal tones of a sampled signal, and its distortion and noise.

   A tone is amplitude cos(2 pi frequency t + phase), with t = 0 at the first sample: the amplitude
   is the peak value, and the phase is above -pi and at most pi. The samples are dt apart, so a
   frequency bin of a record of n samples is 1 / (n dt) wide.

   Tones are found one after the other, each as the largest line in a windowed spectrum of the
   residual, and all of them are then fitted to the samples together with a constant, by least
   squares: the sine fit of IEEE Std 1057-2017 (four parameters) with more than one sine. In white
   noise that is the maximum-likelihood estimate, whose deviations are those of the Cramer-Rao bound
   once the tones stand out of the noise (D. C. Rife and R. R. Boorstyn, "Single tone parameter
   estimation from discrete-time observations", 1974). The time grows with the number of samples,
   times the square of the number of tones. Frequencies within a quarter of a bin of 0 or of half
   the sampling rate cannot be found. */

#include "qx/types.h"

QX_BEGIN_DECLS

/** Finds the `count` largest tones of y, or fewer, with their frequencies, amplitudes and phases.
    order: 0 by falling amplitude; 1 by rising frequency. *residualRms is the root mean square of
    the residual after the tones and the constant. The search ends early if the largest remaining
    line is below 1e-12 of the largest tone or could be noise, and when there are no more than three
    samples for each tone and one for the constant. The largest tone of all is always returned, even
    if it may be noise.

    Tones less than about two bins apart form a single line in the spectrum and are separated only
    by the fit. The fit separates two tones that are at least half a bin apart. For three tones
    within three bins, half a bin apart, about one record in 1000 is fitted by tones other than
    those it consists of, even without noise.
    Codes: ErrMeasureEmpty (y is empty), ErrSamplingNotPositive (dt is not a positive finite
    number), ErrMeasureBadCount (count is below 1), ErrInvalidSelector (order), ErrNonFiniteInput
    (y), ErrMeasureTooFewPoints (fewer than 4 samples), ErrMeasureNotFound (nothing but a constant),
    ErrOutOfMemory (no memory, or an array cannot be resized).
    NaN: y refused with ErrNonFiniteInput; dt refused with ErrSamplingNotPositive. */
QX_API ErrorCode MultipleToneMeasurements(QX_IN DBL1D y, double dt, int32_t count, int32_t order,
                                          QX_OUT DBL1D frequencies, QX_OUT DBL1D amplitudes,
                                          QX_OUT DBL1D phases, QX_OUT double *residualRms);

/** Measures the largest tone whose frequency is within halfWidth of `centre`; if halfWidth is not
    above 0, the largest of all. *offset is the constant, *residualRms the root mean square of the
    residual after the tone and the constant, which includes the other tones. Up to 32 larger tones
    outside the band are included in the fit, so that they do not disturb the result. Smaller tones
    do disturb it, by about their amplitude divided by pi times the distance in bins;
    MultipleToneMeasurements fits them all. In a band, a line that could be noise does not count.
    Codes: ErrMeasureEmpty (y is empty), ErrSamplingNotPositive (dt is not a positive finite
    number), ErrNonFiniteInput (y, centre or halfWidth), ErrMeasureTooFewPoints (fewer than 4
    samples), ErrMeasureNotFound (nothing but a constant, or nothing in the band), ErrOutOfMemory
    (no memory).
    NaN: y, centre, halfWidth refused with ErrNonFiniteInput; dt refused with
    ErrSamplingNotPositive. */
QX_API ErrorCode SingleToneMeasurement(QX_IN DBL1D y, double dt, double centre, double halfWidth,
                                       QX_OUT double *frequency, QX_OUT double *amplitude,
                                       QX_OUT double *phase, QX_OUT double *offset,
                                       QX_OUT double *residualRms);

/** Measures a tone, its harmonics and the residual, by the definitions of IEEE Std 1241-2010 and
    1057-2017. The largest tone within 2 bins or 1 % of `fundamental`, or the largest of all if
    `fundamental` is not above 0, and its multiples up to highestHarmonic are fitted together, with
    one frequency for all. `fundamental` may exceed half the sampling rate.

    Index 0 of frequencies, amplitudes and phases is the fundamental, index h - 1 harmonic h. Each
    is given at the frequency where it appears; with the sampling rate 1 / dt, a harmonic above half
    that rate appears at |h f - m / dt| with the nearest integer m. A harmonic is NaN in all three
    arrays if it appears within half a bin of 0, of half the sampling rate, of another harmonic
    (then both are NaN) or of the fundamental: its amplitude cannot be determined. Its line still
    counts as distortion, once, unless it falls on 0 or on the fundamental.

    With A the amplitude of the fundamental, D the root of the sum of the squared amplitudes of the
    harmonics, and with root mean squares of residuals:

        *thd         D / A, a ratio
        *sinad       20 log10 of A / sqrt(2) over what constant and fundamental leave, in dB
        *snr         the same over what the harmonics leave, too
        *sfdr        20 log10 of A over the amplitude of the largest other line, harmonic or not
        *enob        (*sinad + 20 log10(F / A) - 1.7609) / 6.0206, where F is fullScale, the
                     peak of a sine at full scale, or A where that is not above 0
        *noiseFloor  - *snr - 10 log10(n / 2): noise in each bin relative to the fundamental, in dB

    Where a residual is 0, the values computed from it are infinite.
    Codes: ErrMeasureEmpty (y is empty), ErrSamplingNotPositive (dt is not a positive finite
    number), ErrMeasureBadCount (highestHarmonic is below 1), ErrNonFiniteInput (y, fundamental or
    fullScale), ErrMeasureTooFewPoints (fewer than 4 samples, or than 2 highestHarmonic + 2),
    ErrMeasureNotFound (nothing but a constant, or no tone near `fundamental`), ErrOutOfMemory (no
    memory, or an array cannot be resized).
    NaN: y, fundamental, fullScale refused with ErrNonFiniteInput; dt refused with
    ErrSamplingNotPositive. */
QX_API ErrorCode HarmonicAnalysis(QX_IN DBL1D y, double dt, double fundamental,
                                  int32_t highestHarmonic, double fullScale,
                                  QX_OUT DBL1D frequencies, QX_OUT DBL1D amplitudes,
                                  QX_OUT DBL1D phases, QX_OUT double *thd, QX_OUT double *sinad,
                                  QX_OUT double *snr, QX_OUT double *sfdr, QX_OUT double *enob,
                                  QX_OUT double *noiseFloor);

QX_END_DECLS

#endif
