#ifndef QX_WINDOWS_DOLPH_CHEBYSHEV_H
#define QX_WINDOWS_DOLPH_CHEBYSHEV_H

#include "qx/errors.h"
#include "windows/signal.h"

namespace qx {

// The Dolph-Chebyshev window, whose side lobes all lie `ratio` below the main lobe (C. L. Dolph: A
// current distribution for broadside arrays which optimizes the relationship between beam width
// and side-lobe level, 1946), with its peak scaled to 1: of n values if `symmetric`, otherwise the
// first n of n + 1 values, which is the periodic form. The ratio is linear and not checked: below 1
// the result is NaN. A single sample is left as it is. ErrEmptyInput, ErrOutOfMemory.
template <ElementType E>
ErrorCode ApplyDolChebyWindow(VectorView<E> x, double ratio, bool symmetric);

} // namespace qx

#endif
