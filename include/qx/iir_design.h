#ifndef QX_IIR_DESIGN_H
#define QX_IIR_DESIGN_H

/* IIR filters of five families, as cascades for the exports of filtering.h: an analog prototype
   with a cut-off of 1 rad/s is transformed to the requested band, and each section by the bilinear
   transform to H(z) = (b0 + b1 z^-1 + ...) / (1 + a0 z^-1 + ...). The frequencies are prewarped, so
   that the digital filter has the requested cut-offs.

   type: 0 lowpass; 1 highpass, both with the cut-off fl (fh is ignored); 2 bandpass; 3 bandstop,
   both between fl and fh. Frequencies are in the unit of the sampling rate fs, ripple (of the pass
   band) and attenuation (of the stop band) in decibels. The order is that of the prototype: a band
   filter has twice as many poles.

   form: 0 second-order sections, with 2 values in a and 3 in b each; 1 fourth-order sections, with
   4 and 5. The exports without this argument use form 0 for lowpass and highpass and 1 for the
   others. A real pole has its own section, with zeros in the unused places, and comes first. With n
   = (order + 1) / 2 rounded down, lowpass and highpass have n sections of second order, or half of
   that, rounded up, of fourth order; the others have 2 n of second order or n of fourth order. A
   band filter is designed in fourth order, and split by its roots if second order is selected. In
   either form, filters for bands far below the sampling rate are less accurate than a highpass
   followed by a lowpass.

   Ripple and attenuation are converted to 10^(decibels / 10) - 1. Below 4.8e-16 dB that is 0 and
   above 3082.5 dB infinite: most coefficients are then NaN with code 0. A small ripple r loses
   digits in the difference, with a relative error of 1e-15 / r.

   The 2026 revisions compute sections of second order from accurate poles and zeros, which they
   also return; they return their code and refuse NaN. The others report their code in *err; if the
   host refuses an array, the function result is its status, and NaN in a frequency, ripple or
   attenuation makes coefficients NaN. A failure empties the arrays. */

#include "qx/types.h"

QX_BEGIN_DECLS

/** Butterworth filter: |H|^2 = 1 / (1 + w^(2 order)), 3 dB down at the cut-offs.
    Codes: ErrOrderNotPositive (the order is below 1, or so large that the coefficients do not fit
    into an array), ErrOutOfMemory (the host refuses an array, or no memory), ErrBadCutoff (a
    frequency is not above 0, or fl is not below fh; for lowpass and highpass also a cut-off at half
    the sampling rate or above), ErrAboveNyquist (a cut-off is above half the sampling rate),
    ErrInvalidSelector (no such type).
    NaN: fs, fl in all results or in some results; fh in all results or in some results or in no
    result. */
QX_API int32_t BWCoefs(QX_IN const double *fs, QX_IN const double *fl, QX_IN const double *fh,
                       QX_IN const int32_t *order, QX_IN const int32_t *type, QX_OUT DBL1D a,
                       QX_OUT DBL1D b, QX_OUT ErrorCode *err);
/** As BWCoefs, with a choice of the form. For a bandpass of order 12 from 0.0005 to 0.001 of the
    sampling rate the error of the gain is 6e-5; that of BWCoefs2026 is 8e-12, due to the rounding
    of its coefficients.
    Codes: those of BWCoefs, ErrInvalidSelector (also: no such form). */
QX_API int32_t BWCoefs90(QX_IN const double *fs, QX_IN const double *fl, QX_IN const double *fh,
                         QX_IN const int32_t *order, QX_IN const int32_t *type, int32_t form,
                         QX_OUT DBL1D a, QX_OUT DBL1D b, QX_OUT ErrorCode *err);

/** Chebyshev filter: |H|^2 = 1 / (1 + e^2 T(w)^2) with the Chebyshev polynomial T of that order
    and e^2 = 10^(ripple / 10) - 1, lower by the ripple at the cut-offs. A filter of even order is
    lower by the ripple in the middle of its pass band, too; the factor is in the first section of
    lowpass and highpass and in the last of the others.
    Codes: ErrOrderNotPositive (the order is below 1, or so large that the coefficients do not fit
    into an array), ErrOutOfMemory (the host refuses an array, or no memory), ErrBadCutoff (a
    frequency is not above 0, or fl is not below fh; for lowpass and highpass also a cut-off at half
    the sampling rate or above), ErrAboveNyquist (a cut-off is above half the sampling rate),
    ErrRippleNotPositive (the ripple is not above 0), ErrInvalidSelector (no such type).
    NaN: fs, fl, ripple in all results or in some results; fh in all results or in some results or
    in no result. */
QX_API int32_t ChebyshevCoefs(QX_IN const double *fs, QX_IN const double *fl,
                              QX_IN const double *fh, QX_IN const double *ripple,
                              QX_IN const int32_t *order, QX_IN const int32_t *type, QX_OUT DBL1D a,
                              QX_OUT DBL1D b, QX_OUT ErrorCode *err);
/** As ChebyshevCoefs, with a choice of the form. For a bandpass of order 12 from 0.0005 to 0.001 of
    the sampling rate the error of the gain is 1e-4; that of ChebyshevCoefs2026 is 4e-11, due to the
    rounding of its coefficients.
    Codes: those of ChebyshevCoefs, ErrInvalidSelector (also: no such form). */
QX_API int32_t ChebyshevCoefs90(QX_IN const double *fs, QX_IN const double *fl,
                                QX_IN const double *fh, QX_IN const double *ripple,
                                QX_IN const int32_t *order, QX_IN const int32_t *type, int32_t form,
                                QX_OUT DBL1D a, QX_OUT DBL1D b, QX_OUT ErrorCode *err);

/** Inverse Chebyshev filter: |H|^2 = 1 / (1 + 1 / (e^2 T(1/w)^2)) with e^2 = 1 / (10^(attenuation /
    10) - 1). The cut-offs are the edges of the stop band, where the attenuation is reached.
    Codes: ErrOrderNotPositive (the order is below 1, or so large that the coefficients do not fit
    into an array), ErrOutOfMemory (the host refuses an array, or no memory), ErrBadCutoff (a
    frequency is not above 0, or fl is not below fh; for lowpass and highpass also a cut-off at half
    the sampling rate or above), ErrAttenuationNotPositive (the attenuation is not above 0),
    ErrAboveNyquist (a cut-off is above half the sampling rate), ErrInvalidSelector (no such type).
    NaN: fs, fl, attenuation in all results or in some results; fh in all results or in some results
    or in no result. */
QX_API int32_t InvChebyshevCoefs(QX_IN const double *fs, QX_IN const double *fl,
                                 QX_IN const double *fh, QX_IN const double *attenuation,
                                 QX_IN const int32_t *order, QX_IN const int32_t *type,
                                 QX_OUT DBL1D a, QX_OUT DBL1D b, QX_OUT ErrorCode *err);
/** As InvChebyshevCoefs, with a choice of the form. For a bandpass of order 12 from 0.0005 to 0.001
    of the sampling rate the error of the gain is 3e-5; that of InvChebyshevCoefs2026 is 9e-11, due
    to the rounding of its coefficients.
    Codes: those of InvChebyshevCoefs, ErrInvalidSelector (also: no such form). */
QX_API int32_t InvChebyshevCoefs90(QX_IN const double *fs, QX_IN const double *fl,
                                   QX_IN const double *fh, QX_IN const double *attenuation,
                                   QX_IN const int32_t *order, QX_IN const int32_t *type,
                                   int32_t form, QX_OUT DBL1D a, QX_OUT DBL1D b,
                                   QX_OUT ErrorCode *err);

/** Elliptic filter: |H|^2 = 1 / (1 + e^2 R(w)^2) with the elliptic rational function R of that
    order, lower by the ripple at the cut-offs and by the attenuation in the stop band, which begins
    as close to the pass band as the order allows.
    Codes: ErrOrderNotPositive (the order is below 1, or so large that the coefficients do not fit
    into an array), ErrOutOfMemory (the host refuses an array, or no memory), ErrBadCutoff (a
    frequency is not above 0, or fl is not below fh; for lowpass and highpass also a cut-off at half
    the sampling rate or above), ErrAboveNyquist (a cut-off is above half the sampling rate),
    ErrRippleNotPositive (the ripple is not above 0), ErrAttenuationNotPositive (the attenuation is
    not above 0), ErrRippleAboveAttenuation (the ripple is not below the attenuation),
    ErrInvalidSelector (no such type).
    NaN: fs, fl, ripple, attenuation in all results or in some results; fh in all results or in some
    results or in no result. */
QX_API int32_t EllipticCoefs(QX_IN const double *fs, QX_IN const double *fl, QX_IN const double *fh,
                             QX_IN const double *ripple, QX_IN const double *attenuation,
                             QX_IN const int32_t *order, QX_IN const int32_t *type, QX_OUT DBL1D a,
                             QX_OUT DBL1D b, QX_OUT ErrorCode *err);
/** As EllipticCoefs, with a choice of the form. For a bandpass of order 12 from 0.0005 to 0.001 of
    the sampling rate the error of the gain is 1e-3; that of EllipticCoefs2026 is 3e-9, due to the
    rounding of its coefficients. For a lowpass of order 24 at 0.003 the error is 4e-8 in sections
    of second order and 0.8 in sections of fourth order.
    Codes: those of EllipticCoefs, ErrInvalidSelector (also: no such form). */
QX_API int32_t EllipticCoefs90(QX_IN const double *fs, QX_IN const double *fl,
                               QX_IN const double *fh, QX_IN const double *ripple,
                               QX_IN const double *attenuation, QX_IN const int32_t *order,
                               QX_IN const int32_t *type, int32_t form, QX_OUT DBL1D a,
                               QX_OUT DBL1D b, QX_OUT ErrorCode *err);

/** Bessel filter, whose group delay is maximally flat at 0 Hz before the bilinear transform, 3 dB
    down at the cut-offs: 1 / |B(j w)|^2, with B the reversed Bessel polynomial of that order.
    Codes: ErrOrderNotPositive (the order is below 1, or so large that the coefficients do not fit
    into an array), ErrOutOfMemory (the host refuses an array, or no memory), ErrBadCutoff (a
    frequency is not above 0, or fl is not below fh; for lowpass and highpass also a cut-off at half
    the sampling rate or above), ErrAboveNyquist (a cut-off is above half the sampling rate),
    ErrInvalidSelector (no such type), ErrBadCoefficients (an order of 150 or above, whose
    polynomial overflows), ErrIterationLimit (poles are not found), ErrNonFiniteFunction (poles are
    not found), ErrDegenerateValue (poles are not found).
    NaN: fs, fl in all results or in some results; fh in all results or in some results or in no
    result. */
QX_API int32_t BesselCoefs(QX_IN const double *fs, QX_IN const double *fl, QX_IN const double *fh,
                           QX_IN const int32_t *order, QX_IN const int32_t *type, QX_OUT DBL1D a,
                           QX_OUT DBL1D b, QX_OUT ErrorCode *err);
/** As BesselCoefs, with a choice of the form. For a bandpass of order 12 from 0.0005 to 0.001 of
    the sampling rate the error of the gain is 1e-6; that of BesselCoefs2026 is 2e-12, due to the
    rounding of its coefficients. At order 40 a pair of complex poles is found as two real ones.
    Codes: those of BesselCoefs, ErrInvalidSelector (also: no such form). */
QX_API int32_t BesselCoefs90(QX_IN const double *fs, QX_IN const double *fl, QX_IN const double *fh,
                             QX_IN const int32_t *order, QX_IN const int32_t *type, int32_t form,
                             QX_OUT DBL1D a, QX_OUT DBL1D b, QX_OUT ErrorCode *err);

/** Butterworth filter, defined as in BWCoefs, designed from its poles and zeros. a and b hold
    sections of second order, with 2 and 3 values each; H(z) = *gain (product of z - zeros[k]) /
    (product of z - poles[k]). Lowpass and highpass have (order + 1) / 2 sections, rounded down, and
    `order` poles and zeros; bandpass and bandstop have `order` sections and twice as many poles and
    zeros. The sections are in the order of the poles and zeros, the least damped ones last, and
    each has gain 1 in the middle of the pass band. *gain is 0 if it underflows.

    Poles and zeros are within 4e-15 of those of a design with 50 digits, up to order 30 and for
    edges at least 1e-4 of the sampling rate away from 0 and from half of it; the relative error of
    the gain is at most 2e-14. The coefficients are rounded from these, which changes the response
    of a narrow band in any sections of this form (docs/accuracy/filter_design.md).
    Codes: ErrOrderNotPositive (the order is below 1), ErrLengthTooLarge (the order is above 500),
    ErrInvalidSelector (no such type), ErrBadCutoff (the sampling rate or an edge is not above 0 or
    not finite, or fl is not below fh), ErrAboveNyquist (an edge is not below half the sampling
    rate), ErrOutOfMemory (the host refuses an array), ErrDegenerateValue (the frequencies are so
    far apart that a coefficient overflows or underflows).
    NaN: fs, fl refused with ErrBadCutoff; fh refused with ErrBadCutoff or in no result. */
QX_API ErrorCode BWCoefs2026(double fs, double fl, double fh, int32_t order, int32_t type,
                             QX_OUT DBL1D a, QX_OUT DBL1D b, QX_OUT CDB1D zeros, QX_OUT CDB1D poles,
                             QX_OUT double *gain);
/** Chebyshev filter as in ChebyshevCoefs, with the outputs of BWCoefs2026. The factor of a filter
    of even order is in the first section. Small ripples lose no digits.
    Codes: ErrOrderNotPositive (the order is below 1), ErrLengthTooLarge (the order is above 500),
    ErrInvalidSelector (no such type), ErrBadCutoff (the sampling rate or an edge is not above 0 or
    not finite, or fl is not below fh), ErrAboveNyquist (an edge is not below half the sampling
    rate), ErrRippleNotPositive (the ripple is not above 0), ErrOutOfMemory (the host refuses an
    array), ErrDegenerateValue (the frequencies are so far apart, or the ripple is so small, that a
    coefficient overflows or underflows).
    NaN: fs, fl refused with ErrBadCutoff; fh refused with ErrBadCutoff or in no result; ripple
    refused with ErrRippleNotPositive. */
QX_API ErrorCode ChebyshevCoefs2026(double fs, double fl, double fh, double ripple, int32_t order,
                                    int32_t type, QX_OUT DBL1D a, QX_OUT DBL1D b,
                                    QX_OUT CDB1D zeros, QX_OUT CDB1D poles, QX_OUT double *gain);
/** Inverse Chebyshev filter as in InvChebyshevCoefs, with the outputs of BWCoefs2026.
    Codes: ErrOrderNotPositive (the order is below 1), ErrLengthTooLarge (the order is above 500),
    ErrInvalidSelector (no such type), ErrBadCutoff (the sampling rate or an edge is not above 0 or
    not finite, or fl is not below fh), ErrAboveNyquist (an edge is not below half the sampling
    rate), ErrAttenuationNotPositive (the attenuation is not above 0), ErrOutOfMemory (the host
    refuses an array), ErrDegenerateValue (the frequencies are so far apart, or the attenuation is
    so large, that a coefficient overflows or underflows).
    NaN: fs, fl refused with ErrBadCutoff; fh refused with ErrBadCutoff or in no result; attenuation
    refused with ErrAttenuationNotPositive. */
QX_API ErrorCode InvChebyshevCoefs2026(double fs, double fl, double fh, double attenuation,
                                       int32_t order, int32_t type, QX_OUT DBL1D a, QX_OUT DBL1D b,
                                       QX_OUT CDB1D zeros, QX_OUT CDB1D poles, QX_OUT double *gain);
/** Elliptic filter as in EllipticCoefs, with the outputs of BWCoefs2026, by theta functions of the
    smaller nome (NIST Digital Library of Mathematical Functions, chapters 20 and 22) and the
    integrals of B. C. Carlson, "Numerical computation of real or complex elliptic integrals", 1995.
    The factor of a filter of even order is in the first section.
    Codes: ErrOrderNotPositive (the order is below 1), ErrLengthTooLarge (the order is above 500),
    ErrInvalidSelector (no such type), ErrBadCutoff (the sampling rate or an edge is not above 0 or
    not finite, or fl is not below fh), ErrAboveNyquist (an edge is not below half the sampling
    rate), ErrRippleNotPositive (the ripple is not above 0), ErrAttenuationNotPositive (the
    attenuation is not above 0), ErrRippleAboveAttenuation (the ripple is not below the
    attenuation), ErrOutOfMemory (the host refuses an array), ErrDegenerateValue (the frequencies
    are so far apart, or ripple or attenuation so small or large, that a coefficient overflows or
    underflows).
    NaN: fs, fl refused with ErrBadCutoff; fh refused with ErrBadCutoff or in no result; ripple
    refused with ErrRippleNotPositive; attenuation refused with ErrAttenuationNotPositive. */
QX_API ErrorCode EllipticCoefs2026(double fs, double fl, double fh, double ripple,
                                   double attenuation, int32_t order, int32_t type, QX_OUT DBL1D a,
                                   QX_OUT DBL1D b, QX_OUT CDB1D zeros, QX_OUT CDB1D poles,
                                   QX_OUT double *gain);
/** Bessel filter as in BesselCoefs, with the outputs of BWCoefs2026. The zeros of the Bessel
    polynomial solve the relations that T. J. Stieltjes found for zeros of solutions of differential
    equations, sum over j != i of 1 / (s_i - s_j) = 1 + n / s_i, by Newton's method; so each pole is
    accurate at any order. The time grows with the cube of the order.
    Codes: ErrOrderNotPositive (the order is below 1), ErrLengthTooLarge (the order is above 500),
    ErrInvalidSelector (no such type), ErrBadCutoff (the sampling rate or an edge is not above 0 or
    not finite, or fl is not below fh), ErrAboveNyquist (an edge is not below half the sampling
    rate), ErrOutOfMemory (the host refuses an array, or no memory), ErrDegenerateValue (the
    frequencies are so far apart that a coefficient overflows or underflows).
    NaN: fs, fl refused with ErrBadCutoff; fh refused with ErrBadCutoff or in no result. */
QX_API ErrorCode BesselCoefs2026(double fs, double fl, double fh, int32_t order, int32_t type,
                                 QX_OUT DBL1D a, QX_OUT DBL1D b, QX_OUT CDB1D zeros,
                                 QX_OUT CDB1D poles, QX_OUT double *gain);

QX_END_DECLS

#endif
