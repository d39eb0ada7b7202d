#ifndef QX_FIT_POLYNOMIAL_H
#define QX_FIT_POLYNOMIAL_H

#include "fit/robust.h"
#include "fit/samples.h"

namespace qx {

// Terms of a polynomial that are fixed. Of equal orders the last counts; orders out of range are
// ignored.
struct FixedTerms {
    ConstVectorView<ElementType::I32> orders;
    ConstRealVector values; // as many as orders
    int32_t count() const { return static_cast<int32_t>(orders.size()); }
};

// ErrPolynomialOrderNegative (below 0); ErrPolynomialOrderTooHigh (n is at most order minus the
// number of fixed terms).
ErrorCode CheckPolynomialOrder(int32_t n, int32_t order, int32_t fixedCount);

// y = sum of c[j] x^j, in raw powers of x, for an order that has been checked and is c.size() - 1.
//
// At most 26 terms are fitted, and the coefficients of the others are 0. Fitted are the terms up to
// order 25, or, if fixed terms leave fewer than two of these free, the first two free terms of all.
//
// `algorithm` is the method of least squares (fit/general.h); for another norm `limits` applies
// instead. The MSE is computed only together with the values.
//
// ErrPolynomialOrderTooHigh (fewer samples than free terms), ErrEmptyInput (no samples, but an MSE
// is requested), otherwise the codes of SolveLinearModel and SolveRobustly;
// WarnPolynomialOrderCapped.
ErrorCode FitPolynomial(const FitSamples &samples, const FixedTerms &fixed, int32_t algorithm,
                        RealVector c, const FitOutput &out, FitNorm norm = leastSquares,
                        const FitLimits &limits = {});

} // namespace qx

#endif
