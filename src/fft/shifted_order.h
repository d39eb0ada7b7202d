#ifndef QX_FFT_SHIFTED_ORDER_H
#define QX_FFT_SHIFTED_ORDER_H

#include "qx/errors.h"
#include "qx/types.h"

#include <cstdint>

namespace qx {

// A spectrum of n values in shifted order has its zero frequency at index n/2: index j holds
// frequency (j - n/2) modulo n.

// Converts to shifted order, in place. Returns 0 or ErrOutOfMemory.
ErrorCode RotateToShifted(CDB *spectrum, int32_t n);

// Converts from shifted order. `plain` must not overlap `shifted`.
void RotateFromShifted(const CDB *shifted, int32_t n, CDB *plain);

} // namespace qx

#endif
