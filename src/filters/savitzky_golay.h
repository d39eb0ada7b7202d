#ifndef QX_FILTERS_SAVITZKY_GOLAY_H
#define QX_FILTERS_SAVITZKY_GOLAY_H

#include "qx/errors.h"
#include "qx/types.h"

#include <cstdint>

namespace qx {

// Least-squares fit of a polynomial to `frame` samples at t = -(frame - 1)/2 to (frame - 1)/2 (A.
// Savitzky and M. J. E. Golay, "Smoothing and differentiation of data by simplified least squares
// procedures", 1964), from the triangular factor of the powers of t. The absolute values of the
// weights are used; null means equal weights.
//
// ErrBadCoefficients (order is below 1), ErrPolynomialOrderTooHigh (frame is not above order),
// ErrBadTapCount (frame is even), ErrOutOfMemory; ErrNonFiniteInput and ErrSingularMatrix: the
// powers of t, or their weighted values, overflow or are linearly dependent within 2.2e-16.
ErrorCode CheckSavitzkyGolay(int32_t order, int32_t frame);

// `differentiators`, order + 1 by frame, maps the samples to the coefficients of t^0 to t^order,
// and `smoothing`, frame by frame, maps them to the values of the polynomial. `differentiators` may
// be null.
ErrorCode SavitzkyGolayMatrix(int32_t order, int32_t frame, const DBL *weights, DBL *smoothing,
                              DBL *differentiators);

// y[i] is the value at i of the polynomial fitted to the frame around i or, near the ends, to the
// first or the last frame. y does not overlap x. ErrSizesDisagree (n is below frame).
ErrorCode SavitzkyGolayFilter(const DBL *x, int32_t n, int32_t order, int32_t frame,
                              const DBL *weights, DBL *y);

} // namespace qx

#endif
