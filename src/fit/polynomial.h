#ifndef QX_FIT_POLYNOMIAL_H
#define QX_FIT_POLYNOMIAL_H

#include "fit/robust.h"
#include "fit/samples.h"

namespace qx {

// Terms of a polynomial that are given: the last one of equal orders counts, and orders out of
// range do not.
struct FixedTerms {
    ConstVectorView<ElementType::I32> orders;
    ConstRealVector values; // as many
    int32_t count() const { return static_cast<int32_t>(orders.size()); }
};

// ErrPolynomialOrderNegative (below 0); ErrPolynomialOrderTooHigh (n is at most order less the
// number of fixed terms).
ErrorCode CheckPolynomialOrder(int32_t n, int32_t order, int32_t fixedCount);

// y = sum of c[j] x^j, in raw powers of x, for an order that has been checked and is c.size() - 1.
//
// At most 26 terms are fitted, and the coefficients of others are 0: those up to order 25, or where
// fixed ones leave less than two of these free, the first two free ones of all.
//
// `algorithm` is the method of least squares (fit/general.h); another norm takes `limits` instead.
// Without values there is no MSE.
//
// ErrPolynomialOrderTooHigh (fewer samples than free terms), ErrEmptyInput (no samples, and an MSE
// is asked for), else as SolveLinearModel and SolveRobustly; WarnPolynomialOrderCapped.
ErrorCode FitPolynomial(const FitSamples &samples, const FixedTerms &fixed, int32_t algorithm,
                        RealVector c, const FitOutput &out, FitNorm norm = leastSquares,
                        const FitLimits &limits = {});

} // namespace qx

#endif
