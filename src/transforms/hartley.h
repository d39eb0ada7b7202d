#ifndef QX_TRANSFORMS_HARTLEY_H
#define QX_TRANSFORMS_HARTLEY_H

#include "fft/plan.h"
#include "frame/views.h"
#include "qx/errors.h"

namespace qx {

// All four work in place on n values, with a plan of that length. ErrOutOfMemory.

// H[k] = sum over j of x[j] (cos(2 pi j k / n) + sin(2 pi j k / n)); the inverse is the same
// transform scaled by 1/n.
ErrorCode FastHartley(const FFTPlan *plan, RealVector x);
ErrorCode FastHartleyInverse(const FFTPlan *plan, RealVector x);

// The signal whose spectrum is -i sign(frequency) X, with the zero and the Nyquist frequency
// dropped; the inverse is its negative.
ErrorCode FastHilbert(const FFTPlan *plan, RealVector x);
ErrorCode FastHilbertInverse(const FFTPlan *plan, RealVector x);

} // namespace qx

#endif
