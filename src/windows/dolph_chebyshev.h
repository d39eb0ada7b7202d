#ifndef QX_WINDOWS_DOLPH_CHEBYSHEV_H
#define QX_WINDOWS_DOLPH_CHEBYSHEV_H

#include "qx/errors.h"
#include "windows/signal.h"

namespace qx {

// The Dolph-Chebyshev window of `length` >= 2 values, not normalised: the inverse transform of
// T[length-1](x0 cos(pi k / length)), whose side lobes all lie `ratio` below the main lobe
// (C. L. Dolph: A current distribution for broadside arrays which optimizes the relationship
// between beam width and side-lobe level, 1946). *peak is its largest value.
// ErrOutOfMemory.
ErrorCode GenerateDolChebyWindow(DBL *w, double *peak, int32_t length, double ratio);

// Multiplies by the window with its peak brought to 1: of n values if `symmetric` is non-zero,
// else the first n of n + 1, which is the periodic form. The ratio is linear and not checked:
// below 1 it gives NaN. ErrEmptyInput, ErrOutOfMemory.
template <class Signal>
ErrorCode ApplyDolChebyWindow(Signal x, int32_t n, double ratio, int32_t symmetric);

} // namespace qx

#endif
