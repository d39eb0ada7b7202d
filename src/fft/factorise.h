#ifndef QX_FFT_FACTORISE_H
#define QX_FFT_FACTORISE_H

#include "fft/plan.h"

#include <cstdint>

namespace qx {

// Fills in the factors of the plan's length, ascending, with their kinds.
void Factorise(FFTPlan *plan);

// The length of the cyclic convolution by which Rader's algorithm transforms a prime p: p - 1, or, if
// p - 1 has large prime factors and a length of small factors is much cheaper, an even length of at
// least 2 (p - 1) - 1, for data padded with zeros.
int32_t RaderLength(int32_t p);

} // namespace qx

#endif
