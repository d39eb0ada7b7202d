#ifndef QX_SMOOTHING_H
#define QX_SMOOTHING_H

/* Smoothing of whole arrays: least-squares polynomials over a sliding frame (A. Savitzky and M. J.
   E. Golay, "Smoothing and differentiation of data by simplified least squares procedures", 1964),
   and the running median. No state is kept from call to call. */

#include "qx/types.h"

QX_BEGIN_DECLS

/** The matrices of the least-squares fit of a polynomial of degree `order` to a frame of samples at
    t = -(frame - 1)/2, ..., (frame - 1)/2. `smoothing` (frame by frame) times the samples gives the
    values of the polynomial at all of them. `differentiators` (order + 1 by frame; unchanged if
    wantDifferentiators is 0) times the samples gives its coefficients of t^0 to t^order, that is,
    the i-th derivative at the centre divided by i factorial from row i. Only the absolute values of
    weights count; if weights is empty, all samples count equally. The fit inverts the triangular
    factor of the matrix of powers of t. That factor is refused if a diagonal element is not above
    2.2e-16 times its largest element: for frames of 3575 samples or more at order 5, 225 at order 8
    and 49 at order 12. Memory grows as frame^2 and time as frame^2 order.
    Codes: ErrBadCoefficients (order is below 1), ErrPolynomialOrderTooHigh (frame is not above
    order), ErrSizeMismatch (weights is neither empty nor as long as the frame), ErrBadTapCount
    (frame is even), ErrOutOfMemory (no memory, or the host refuses an output), ErrNonFiniteInput (a
    weight is NaN or infinite, or the powers overflow), ErrSingularMatrix (the factor is refused).
    NaN: weights refused with ErrNonFiniteInput. */
QX_API ErrorCode SavitzkyGolayCoefH(int32_t order, int32_t frame, QX_IN DBL1D weights,
                                    int32_t wantDifferentiators, QX_OUT DBL2D smoothing,
                                    QX_OUT DBL2D differentiators);

/** y[i] is the value at i of the polynomial of degree `order` that best fits the `frame` samples of
    x around i; the first and last frame / 2 values are those of the polynomials of the first and
    the last frame. y is as long as x. Weights are as in SavitzkyGolayCoefH.
    Codes: ErrBadCoefficients (order is below 1), ErrPolynomialOrderTooHigh (frame is not above
    order), ErrSizeMismatch (weights is neither empty nor as long as the frame), ErrOutOfMemory (no
    memory, or the host refuses y), ErrBadTapCount (frame is even), ErrSizesDisagree (x is shorter
    than the frame), ErrNonFiniteInput (a weight is NaN or infinite, or the powers overflow),
    ErrSingularMatrix (as in SavitzkyGolayCoefH).
    NaN: x in some results; weights refused with ErrNonFiniteInput. */
QX_API ErrorCode SavitzkyGolayFiltH(QX_IN DBL1D x, int32_t order, int32_t frame,
                                    QX_IN DBL1D weights, QX_OUT DBL1D y);

/** Running median in place: x[i] becomes the median of x[i - *rank] to x[i + *rank], with zeros
    before and after x. An empty x stays empty. The code is in *err. Among zeros of either sign the
    older one counts as the smaller. A NaN disorders the window, so that later medians are wrong,
    too.
    Codes: ErrNegativeCount (*rank is below 0), ErrSizesDisagree (x is not longer than *rank),
    ErrOutOfMemory (no memory).
    NaN: x in some results or by position (kept). */
QX_API int32_t MedianFilterCIN(QX_INOUT DBL1D x, QX_IN const int32_t *rank, QX_OUT ErrorCode *err);

/** Running median in place, of x[i - leftRank] to x[i + rightRank]. The median of an even number of
    values is the mean of the two in the middle. A rightRank below 0 counts as leftRank. Otherwise
    as MedianFilterCIN.
    Codes: ErrNegativeCount (leftRank is below 0), ErrSizesDisagree (x is not longer than
    rightRank), ErrOutOfMemory (no memory).
    NaN: x in some results or by position (kept). */
QX_API ErrorCode MedianFilter81_H(QX_INOUT DBL1D x, int32_t leftRank, int32_t rightRank);

QX_END_DECLS

#endif
