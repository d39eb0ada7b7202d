#ifndef QX_FILTERS_ZERO_PHASE_H
#define QX_FILTERS_ZERO_PHASE_H

#include "filters/cascade.h"
#include "qx/errors.h"

namespace qx {

// Filters x forward and backward, in place: the phases cancel, and the magnitude is squared. The
// signal is padded on both sides with as many zeros as the filter has coefficients. Each pass has
// its own states, which also process the zeros. A failure leaves x unchanged.

struct DirectPassState {
    RealVector x, y;
};
// Without a denominator (an empty a) this is an FIR filter. ErrOutOfMemory.
ErrorCode ZeroPhaseDirect(ConstRealVector a, ConstRealVector b, DirectPassState forward,
                          DirectPassState backward, RealVector x);

// Both states have the size of `a`. ErrInvalidSelector (unknown form), ErrCoefficientSizes,
// ErrOutOfMemory.
ErrorCode ZeroPhaseCascade(const CascadeCoefficients &filter, RealVector forward,
                           RealVector backward, RealVector x);

} // namespace qx

#endif
