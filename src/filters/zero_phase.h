#ifndef QX_FILTERS_ZERO_PHASE_H
#define QX_FILTERS_ZERO_PHASE_H

#include "filters/cascade.h"
#include "qx/errors.h"

namespace qx {

// Filters x forward and backward, in place: the phases cancel, and the magnitude is squared. Zeros
// are put before and behind the signal, as many as the filter has coefficients. Each pass has
// states of its own, which go through the zeros as well. A failure leaves x as it is.

struct DirectPassState {
    RealVector x, y;
};
// Without a denominator (an empty a) an FIR filter. ErrOutOfMemory.
ErrorCode ZeroPhaseDirect(ConstRealVector a, ConstRealVector b, DirectPassState forward,
                          DirectPassState backward, RealVector x);

// Both states have the size of `a`. ErrInvalidSelector (no such form), ErrCoefficientSizes,
// ErrOutOfMemory.
ErrorCode ZeroPhaseCascade(const CascadeCoefficients &filter, RealVector forward,
                           RealVector backward, RealVector x);

} // namespace qx

#endif
