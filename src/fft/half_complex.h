#ifndef QX_FFT_HALF_COMPLEX_H
#define QX_FFT_HALF_COMPLEX_H

#include "qx/types.h"

#include <cstdint>

namespace qx {

// Between the half-complex form h of a spectrum of n values (h[k] = Re X[k], h[n-k] = Im X[k])
// and the full spectrum, interleaved, in plain or, with `shift` non-zero, in shifted order.

// Expands in place a buffer of n complex values in which h lies in one piece, as transforms of
// stride 1, which are the faster ones, give it: its place is at the end of the buffer in plain
// order, at the start in shifted order.
inline DBL *CompactHalf(DBL *buffer, int32_t n, int32_t shift) {
    return shift == 0 ? buffer + n : buffer;
}
void FFTCompactToFull(DBL *buffer, int32_t n, int32_t shift);

// Reads only the non-negative frequencies, and of zero and n/2 only the real part.
void FFTFullToHalf(const DBL *in, int32_t n, int32_t shift, DBL *h);

} // namespace qx

#endif
