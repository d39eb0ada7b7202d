#ifndef QX_FIT_POLYNOMIAL_H
#define QX_FIT_POLYNOMIAL_H

#include "fit/robust.h"
#include "qx/errors.h"
#include "qx/types.h"

namespace qx {

// y = sum of c[j] x^j for j up to `order`, in raw powers of x: c has order + 1 elements. A term
// whose order stands in fixedOrders has the value beside it there; the last one of equal orders
// counts, and orders out of range do not.
//
// At most 26 terms are fitted, and the coefficients of others are 0: those up to order 25, or where
// fixed ones leave less than two of these free, the first two free ones of all.
//
// `algorithm` is the method of least squares (fit/general.h); another norm takes `limits` instead.
// fit may be y, or null, and then mse is null.
//
// ErrPolynomialOrderNegative (the order or the count is negative), ErrPolynomialOrderTooHigh (n is
// at most order - fixedCount, or below the number of free terms), ErrEmptyInput (n is 0 and an MSE
// is asked for), else as SolveLinearModel and SolveRobustly; WarnPolynomialOrderCapped.
ErrorCode FitPolynomial(const DBL *x, const DBL *y, const DBL *w, int32_t n, int32_t order,
                        int32_t algorithm, const I32 *fixedOrders, const DBL *fixedValues,
                        int32_t fixedCount, DBL *fit, DBL *coefficients, DBL *mse,
                        FitNorm norm = leastSquares, RobustLimits limits = {});

// The checks that come before the coefficients can have their size.
ErrorCode CheckPolynomialOrder(int32_t n, int32_t order, int32_t fixedCount);

} // namespace qx

#endif
