#ifndef QX_FILTERS_ZERO_PHASE_H
#define QX_FILTERS_ZERO_PHASE_H

#include "filters/cascade.h"
#include "frame/elements.h"
#include "qx/errors.h"

#include <cstdint>

namespace qx {

// Filters x forward and backward, in place: the phases cancel, and the magnitude is squared. Zeros
// are put before and behind the signal, as many as the filter has coefficients. Each pass has
// states of its own, which go through the zeros as well. A failure leaves x as it is.

struct DirectPassState {
    DBL *x, *y;
};
// Without a denominator (na of 0) an FIR filter. ErrOutOfMemory.
ErrorCode ZeroPhaseDirect(const DBL *a, int32_t na, const DBL *b, int32_t nb,
                          DirectPassState forward, DirectPassState backward, DBL *x, int32_t n);

// Both states have the size of `a`. ErrInvalidSelector (no such form), ErrCoefficientSizes,
// ErrOutOfMemory.
ErrorCode ZeroPhaseCascade(const CascadeCoefficients &filter, DBL *forward, DBL *backward, DBL *x,
                           int32_t n);

} // namespace qx

#endif
