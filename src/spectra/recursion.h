#ifndef QX_SPECTRA_RECURSION_H
#define QX_SPECTRA_RECURSION_H

#include "frame/views.h"

#include <cmath>
#include <cstdint>

namespace qx {

// Flushes a part of a value in a recursion: a magnitude not above the smallest normal number
// becomes 0.0, so that a decaying response does not linger in subnormal numbers. NaN is unchanged.
inline double Flush(double value) {
    return std::fabs(value) <= 2.2250738585072014e-308 ? 0.0 : value;
}

// The recursive half of a direct-form filter, and the division of one power series by another, in
// place:
//
//     y[t] = flush((y[t] - a[na-1] y[t-na+1] - ... - a[1] y[t-1]) / a[0])
//
// with the subtractions in this order. `history` contains the na - 1 values before y[0], newest
// last, and is updated. A complex division multiplies by the conjugate of a[0] and divides by its
// squared magnitude.
template <ElementType Coefficient, ElementType Signal>
void RunRecursion(ConstVectorView<Coefficient> a, VectorView<Signal> history, VectorView<Signal> y);

} // namespace qx

#endif
