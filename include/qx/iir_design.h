#ifndef QX_IIR_DESIGN_H
#define QX_IIR_DESIGN_H

/* IIR filters of five families, as cascades for the exports of filtering.h: an analog prototype
   whose cut-off is at 1 rad/s, the transformation to the wanted band, and the bilinear transform of
   each section, H(z) = (b0 + b1 z^-1 + ...) / (1 + a0 z^-1 + ...). The cut-offs are moved
   beforehand, so that the digital filter has them where they were asked for.

   type: 0 lowpass; 1 highpass, both with their cut-off fl (fh is not looked at); 2 bandpass; 3
   bandstop, both between fl and fh. Frequencies are in the unit of the sampling rate fs, ripple (of
   the pass band) and attenuation (of the stop band) in decibels. The order is that of the
   prototype: a band filter has twice as many poles.

   form: 0 second-order sections, with 2 values in a and 3 in b each; 1 fourth-order sections, with
   4 and 5. The exports without a form give 0 to lowpass and highpass and 1 to the others. A real
   pole has a section of its own, whose upper places are zero, and stands first. With n = (order +
   1) / 2 rounded down, lowpass and highpass have n sections of second order, or half of that,
   rounded up, of fourth order; the others have 2 n of second order or n of fourth order. A band
   filter is built in fourth order, and split by its roots where second order is asked for; in
   either form bands far below the sampling rate have fewer digits than a highpass and a lowpass
   one after the other.

   Ripple and attenuation are turned into 10^(decibels / 10) - 1. Below 4.8e-16 dB that is 0 and
   above 3082.5 dB infinite: most coefficients are then NaN with code 0. Of a small ripple r only
   the digits count that are left in the difference, with a relative error of 1e-15 / r.

   The code is in *err. Where the host refuses an array, the function result is its status. A
   failure empties both arrays. NaN in a frequency, ripple or attenuation makes coefficients NaN. */

#include "qx/types.h"

QX_BEGIN_DECLS

/** Butterworth filter: |H|^2 = 1 / (1 + w^(2 order)), 3 dB down at the cut-offs.
    Codes: ErrOrderNotPositive (the order is below 1, or its coefficients exceed every array),
    ErrOutOfMemory (the host refuses an array, or no memory), ErrBadCutoff (a frequency is not above
    0, or fl is not below fh; for lowpass and highpass also a cut-off at half the sampling rate or
    above), ErrAboveNyquist (a cut-off is above half the sampling rate), ErrInvalidSelector (no such
    type).
    NaN: fs, fl in all results or in some results; fh in all results or in some results or in no
    result. */
QX_API int32_t BWCoefs(QX_IN const double *fs, QX_IN const double *fl, QX_IN const double *fh,
                       QX_IN const int32_t *order, QX_IN const int32_t *type, QX_OUT DBL1D a,
                       QX_OUT DBL1D b, QX_OUT ErrorCode *err);
/** As BWCoefs, with a choice of the form.
    Codes: those of BWCoefs, ErrInvalidSelector (also: no such form). */
QX_API int32_t BWCoefs90(QX_IN const double *fs, QX_IN const double *fl, QX_IN const double *fh,
                         QX_IN const int32_t *order, QX_IN const int32_t *type, int32_t form,
                         QX_OUT DBL1D a, QX_OUT DBL1D b, QX_OUT ErrorCode *err);

/** Chebyshev filter: |H|^2 = 1 / (1 + e^2 T(w)^2) with the Chebyshev polynomial T of that order
    and e^2 = 10^(ripple / 10) - 1, down by the ripple at the cut-offs. One of even order is down by
    the ripple in the middle of its band, too; the factor stands in the first section of lowpass and
    highpass and in the last of the others.
    Codes: ErrOrderNotPositive (the order is below 1, or its coefficients exceed every array),
    ErrOutOfMemory (the host refuses an array, or no memory), ErrBadCutoff (a frequency is not above
    0, or fl is not below fh; for lowpass and highpass also a cut-off at half the sampling rate or
    above), ErrAboveNyquist (a cut-off is above half the sampling rate), ErrRippleNotPositive (the
    ripple is not above 0), ErrInvalidSelector (no such type).
    NaN: fs, fl, ripple in all results or in some results; fh in all results or in some results or
    in no result. */
QX_API int32_t ChebyshevCoefs(QX_IN const double *fs, QX_IN const double *fl,
                              QX_IN const double *fh, QX_IN const double *ripple,
                              QX_IN const int32_t *order, QX_IN const int32_t *type, QX_OUT DBL1D a,
                              QX_OUT DBL1D b, QX_OUT ErrorCode *err);
/** As ChebyshevCoefs, with a choice of the form.
    Codes: those of ChebyshevCoefs, ErrInvalidSelector (also: no such form). */
QX_API int32_t ChebyshevCoefs90(QX_IN const double *fs, QX_IN const double *fl,
                                QX_IN const double *fh, QX_IN const double *ripple,
                                QX_IN const int32_t *order, QX_IN const int32_t *type, int32_t form,
                                QX_OUT DBL1D a, QX_OUT DBL1D b, QX_OUT ErrorCode *err);

/** Inverse Chebyshev filter: |H|^2 = 1 / (1 + 1 / (e^2 T(1/w)^2)) with e^2 = 1 / (10^(attenuation /
    10) - 1). The cut-offs are the edges of the stop band, where the attenuation is reached.
    Codes: ErrOrderNotPositive (the order is below 1, or its coefficients exceed every array),
    ErrOutOfMemory (the host refuses an array, or no memory), ErrBadCutoff (a frequency is not above
    0, or fl is not below fh; for lowpass and highpass also a cut-off at half the sampling rate or
    above), ErrAttenuationNotPositive (the attenuation is not above 0), ErrAboveNyquist (a cut-off
    is above half the sampling rate), ErrInvalidSelector (no such type).
    NaN: fs, fl, attenuation in all results or in some results; fh in all results or in some results
    or in no result. */
QX_API int32_t InvChebyshevCoefs(QX_IN const double *fs, QX_IN const double *fl,
                                 QX_IN const double *fh, QX_IN const double *attenuation,
                                 QX_IN const int32_t *order, QX_IN const int32_t *type,
                                 QX_OUT DBL1D a, QX_OUT DBL1D b, QX_OUT ErrorCode *err);
/** As InvChebyshevCoefs, with a choice of the form.
    Codes: those of InvChebyshevCoefs, ErrInvalidSelector (also: no such form). */
QX_API int32_t InvChebyshevCoefs90(QX_IN const double *fs, QX_IN const double *fl,
                                   QX_IN const double *fh, QX_IN const double *attenuation,
                                   QX_IN const int32_t *order, QX_IN const int32_t *type,
                                   int32_t form, QX_OUT DBL1D a, QX_OUT DBL1D b,
                                   QX_OUT ErrorCode *err);

/** Elliptic filter: |H|^2 = 1 / (1 + e^2 R(w)^2) with the elliptic rational function R of that
    order, down by the ripple at the cut-offs and by the attenuation in the stop band, which begins
   as near to the pass band as the order allows. Codes: ErrOrderNotPositive (the order is below 1,
   or its coefficients exceed every array), ErrOutOfMemory (the host refuses an array, or no
   memory), ErrBadCutoff (a frequency is not above 0, or fl is not below fh; for lowpass and
   highpass also a cut-off at half the sampling rate or above), ErrAboveNyquist (a cut-off is above
   half the sampling rate), ErrRippleNotPositive (the ripple is not above 0),
   ErrAttenuationNotPositive (the attenuation is not above 0), ErrRippleAboveAttenuation (the ripple
   is not below the attenuation), ErrInvalidSelector (no such type).
    NaN: fs, fl, ripple, attenuation in all results or in some results; fh in all results or in some
    results or in no result. */
QX_API int32_t EllipticCoefs(QX_IN const double *fs, QX_IN const double *fl, QX_IN const double *fh,
                             QX_IN const double *ripple, QX_IN const double *attenuation,
                             QX_IN const int32_t *order, QX_IN const int32_t *type, QX_OUT DBL1D a,
                             QX_OUT DBL1D b, QX_OUT ErrorCode *err);
/** As EllipticCoefs, with a choice of the form.
    Codes: those of EllipticCoefs, ErrInvalidSelector (also: no such form). */
QX_API int32_t EllipticCoefs90(QX_IN const double *fs, QX_IN const double *fl,
                               QX_IN const double *fh, QX_IN const double *ripple,
                               QX_IN const double *attenuation, QX_IN const int32_t *order,
                               QX_IN const int32_t *type, int32_t form, QX_OUT DBL1D a,
                               QX_OUT DBL1D b, QX_OUT ErrorCode *err);

/** Bessel filter, whose group delay is maximally flat at 0 Hz before the bilinear transform, 3 dB
    down at the cut-offs: 1 / |B(j w)|^2, with B the reversed Bessel polynomial of that order.
    Codes: ErrOrderNotPositive (the order is below 1, or its coefficients exceed every array),
    ErrOutOfMemory (the host refuses an array, or no memory), ErrBadCutoff (a frequency is not above
    0, or fl is not below fh; for lowpass and highpass also a cut-off at half the sampling rate or
    above), ErrAboveNyquist (a cut-off is above half the sampling rate), ErrInvalidSelector (no such
    type), ErrBadCoefficients (an order of 150 or above, whose polynomial leaves the numbers),
    ErrIterationLimit (poles that are not found), ErrNonFiniteFunction (the same),
    ErrDegenerateValue (the same).
    NaN: fs, fl in all results or in some results; fh in all results or in some results or in no
    result. */
QX_API int32_t BesselCoefs(QX_IN const double *fs, QX_IN const double *fl, QX_IN const double *fh,
                           QX_IN const int32_t *order, QX_IN const int32_t *type, QX_OUT DBL1D a,
                           QX_OUT DBL1D b, QX_OUT ErrorCode *err);
/** As BesselCoefs, with a choice of the form.
    Codes: those of BesselCoefs, ErrInvalidSelector (also: no such form). */
QX_API int32_t BesselCoefs90(QX_IN const double *fs, QX_IN const double *fl, QX_IN const double *fh,
                             QX_IN const int32_t *order, QX_IN const int32_t *type, int32_t form,
                             QX_OUT DBL1D a, QX_OUT DBL1D b, QX_OUT ErrorCode *err);

QX_END_DECLS

#endif
