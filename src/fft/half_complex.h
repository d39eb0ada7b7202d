#ifndef QX_FFT_HALF_COMPLEX_H
#define QX_FFT_HALF_COMPLEX_H

#include "qx/types.h"

#include <cstdint>

namespace qx {

// Conversions between the half-complex form h of a spectrum of n values (h[k] = Re X[k], h[n-k] = Im X[k])
// and the full spectrum, interleaved, in plain or, with `shift` non-zero, in shifted order.

// FFTCompactToFull expands h in place in a buffer of n complex values. h is contiguous in it, because
// transforms of stride 1 are faster: at the end of the buffer for plain order, at the start for shifted
// order. CompactHalf returns that place.
inline DBL *CompactHalf(DBL *buffer, int32_t n, int32_t shift) {
    return shift == 0 ? buffer + n : buffer;
}
void FFTCompactToFull(DBL *buffer, int32_t n, int32_t shift);

// Reads only the non-negative frequencies, and of zero and n/2 only the real part.
void FFTFullToHalf(const DBL *in, int32_t n, int32_t shift, DBL *h);

} // namespace qx

#endif
