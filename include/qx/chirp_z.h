#ifndef QX_CHIRP_Z_H
#define QX_CHIRP_Z_H

/* The chirp-Z transform: the z-transform of a sequence on a spiral of points that starts at `a` and
   proceeds by the factor 1/w. With a = 1 and w = exp(-2 pi i / n) it is the discrete Fourier
   transform; a short arc of the unit circle gives a detailed view of a part of the spectrum.
   Rabiner, Schafer and Rader, "The chirp z-transform algorithm and its application"; the fast
   method is Bluestein's. */

#include "qx/types.h"

QX_BEGIN_DECLS

/** out[m] = sum over k from 0 to n-1 of in[k] a^(-k) w^(k m), for m from 0 to count-1; a count
    below 1 means n. method: 0 the direct sum, with a complex power for each term; 1 Bluestein's
    method, one convolution by transforms. Off the unit circle |a|^n, |w|^(n count) in method 0 and
    |w|^((n + count)^2 / 2) in method 1 may leave the range of double; outputs are then infinite or
    NaN with code 0. Method 0 computes n count complex powers, however large that product is.
    Codes: ErrEmptyInput (in is empty), ErrInvalidSelector (no such method), ErrOutOfMemory (the
    host refuses out, or no memory), ErrNonFiniteInput (a is not finite), ErrTooFewWeights (|a|^2 is
    0: a number below about 1e-162 counts as 0), ErrNonFiniteInput (w is not finite),
    ErrTooFewWeights (|w|^2 is 0).
    NaN: in in all results; a.im, a.re, w.im, w.re refused with ErrNonFiniteInput. */
QX_API ErrorCode ChirpZT_head(QX_IN DBL1D in, QX_IN const CDB *a, QX_IN const CDB *w, int32_t count,
                              uint32_t method, QX_OUT CDB1D out);
/** As ChirpZT_head, for complex data. */
QX_API ErrorCode CxChirpZT_head(QX_IN CDB1D in, QX_IN const CDB *a, QX_IN const CDB *w,
                                int32_t count, uint32_t method, QX_OUT CDB1D out);

/** The inverse: the sequence of n values whose transform is `in`. A smaller count uses that many
    points of the input, around the point nearest to the unit circle, and gives a sequence of that
    length; a count below 1 means n. The time is that of n^2 complex powers. On the whole circle the
    relative error grows a little faster than n, 5e-12 for 512 values; on an arc or off the circle
    it grows exponentially with n, and powers that leave the range of double make values infinite or
    NaN with code 0.
    Codes: ErrEmptyInput (in is empty), ErrSizesDisagree (count is above n), ErrOutOfMemory (the
    host refuses out), ErrNonFiniteInput (a is not finite), ErrTooFewWeights (|a|^2 is 0),
    ErrNonFiniteInput (w is not finite), ErrTooFewWeights (|w|^2 is 0), ErrOutOfMemory (no memory),
    ErrDegenerateValue (1/a is 0, or two points agree to rounding).
    NaN: in in all results or in no result; a.im, a.re, w.im, w.re refused with
    ErrNonFiniteInput. */
QX_API ErrorCode InvChirpZT_head(QX_IN CDB1D in, QX_IN const CDB *a, QX_IN const CDB *w,
                                 int32_t count, QX_OUT CDB1D out);

QX_END_DECLS

#endif
