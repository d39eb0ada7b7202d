#ifndef QX_SMOOTHING_H
#define QX_SMOOTHING_H

/* Smoothing of whole arrays: least-squares polynomials over a sliding frame (A. Savitzky and M. J.
   E. Golay, "Smoothing and differentiation of data by simplified least squares procedures", 1964),
   and the running median. Nothing is kept from call to call. */

#include "qx/types.h"

QX_BEGIN_DECLS

/** Matrices of the least-squares fit of a polynomial of this order to a frame of samples at
    t = -(frame - 1)/2, ..., (frame - 1)/2: `smoothing` (frame by frame) times the samples gives the
    polynomial's values at all of them, and `differentiators` (order + 1 by frame; left as it is
    where wantDifferentiators is 0) its coefficients of t^0 to t^order, row i being the i-th
    derivative at the centre over i factorial. Weights count by their absolute values; without any,
    all samples count alike. The fit goes through the inverse of the triangular factor of the powers
    of t, which is refused where its diagonal falls to 2.2e-16 of its largest element: from frames
    of 3575 samples on at order 5, of 225 at order 8, of 49 at order 12. Memory grows as frame^2 and
    time as frame^2 order, by these two numbers alone.
    Codes: ErrBadCoefficients (order is below 1), ErrPolynomialOrderTooHigh (frame is not above
    order), ErrSizeMismatch (weights are there, but not as many as the frame has samples),
    ErrBadTapCount (frame is even), ErrOutOfMemory (no memory, or the host refuses an output),
    ErrNonFiniteInput (a weight is NaN or infinite, or the powers overflow), ErrSingularMatrix (the
    factor is refused).
    NaN: weights refused with ErrNonFiniteInput. */
QX_API ErrorCode SavitzkyGolayCoefH(int32_t order, int32_t frame, QX_IN DBL1D weights,
                                    int32_t wantDifferentiators, QX_OUT DBL2D smoothing,
                                    QX_OUT DBL2D differentiators);

/** y[i] is the value at i of the polynomial of this order that fits the `frame` samples of x around
    i best; the first and last frame / 2 values are those of the polynomials through the first and
    the last frame. y is as long as x. Weights as of SavitzkyGolayCoefH.
    Codes: ErrBadCoefficients (order is below 1), ErrPolynomialOrderTooHigh (frame is not above
    order), ErrSizeMismatch (weights are there, but not as many as the frame has samples),
    ErrOutOfMemory (no memory, or the host refuses y), ErrBadTapCount (frame is even),
    ErrSizesDisagree (x is shorter than the frame), ErrNonFiniteInput (a weight is NaN or infinite,
    or the powers overflow), ErrSingularMatrix (as of SavitzkyGolayCoefH).
    NaN: x in some results; weights refused with ErrNonFiniteInput. */
QX_API ErrorCode SavitzkyGolayFiltH(QX_IN DBL1D x, int32_t order, int32_t frame,
                                    QX_IN DBL1D weights, QX_OUT DBL1D y);

/** Running median in place: x[i] becomes the median of x[i - *rank] to x[i + *rank], with zeros
    before and behind x. An empty x stays empty. The code is in *err. Among zeros of either sign the
    older one counts as the smaller. NaN brings the window into disorder, also for what comes later.
    Codes: ErrNegativeCount (*rank is below 0), ErrSizesDisagree (x is not longer than *rank),
    ErrOutOfMemory (no memory).
    NaN: x in no result. */
QX_API int32_t MedianFilterCIN(QX_INOUT DBL1D x, QX_IN const int32_t *rank, QX_OUT ErrorCode *err);

/** Running median in place, of x[i - leftRank] to x[i + rightRank]; of an even number of values it
    is the mean of the two in the middle. A rightRank below 0 is leftRank. Otherwise as
    MedianFilterCIN.
    Codes: ErrNegativeCount (leftRank is below 0), ErrSizesDisagree (x is not longer than
    rightRank), ErrOutOfMemory (no memory).
    NaN: x in some results or in no result. */
QX_API ErrorCode MedianFilter81_H(QX_INOUT DBL1D x, int32_t leftRank, int32_t rightRank);

QX_END_DECLS

#endif
