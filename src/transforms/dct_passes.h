#ifndef QX_TRANSFORMS_DCT_PASSES_H
#define QX_TRANSFORMS_DCT_PASSES_H

#include "frame/widths.h"
#include "qx/types.h"

#include <cstdint>

namespace qx {

// The passes of the cosine transforms of an even number n of contiguous values, before and after the
// Fourier transform. `wave` holds, interleaved, cos and sin of pi k / (2n).

// The values of even index, followed by those of odd index in reverse order.
QX_BY_WIDTH(void, GatherEvenOdd, (const DBL *x, int32_t n, DBL *reordered))
// The inverse permutation, for the real parts of complex values.
QX_BY_WIDTH(void, SpreadEvenOdd, (const DBL *complex, int32_t n, DBL *x))

// For k from 1 to n/2 - 1, with c and s of k and h in half-complex form, out[k] = (h[k] c + h[n-k]
// s) scale and out[n-k] = (h[k] s - h[n-k] c) scale.
QX_BY_WIDTH(void, TurnHalfComplex,
            (const DBL *h, const DBL *wave, double scale, int32_t n, DBL *out))
// For k from 1 to n/2, with c and s of k times scale, complex[k] = x[k] (c, s) and complex[n-k] =
// x[n-k] (s, c).
QX_BY_WIDTH(void, TurnReal, (const DBL *x, const DBL *wave, double scale, int32_t n, DBL *complex))

} // namespace qx

#endif
