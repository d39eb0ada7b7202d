#ifndef QX_TRANSFORMS_CHIRP_Z_H
#define QX_TRANSFORMS_CHIRP_Z_H

#include "frame/views.h"
#include "qx/errors.h"

#include <cstdint>

namespace qx {

// The z-transform of n values on a spiral of `count` points, the size of the output: X[m] = sum
// over k of x[k] a^(-k) w^(k m). No input is empty. A power z^p is exp(i p arg z) times
// (|z|^2)^(p/2).
//
// ErrNonFiniteInput (a), ErrTooFewWeights (a is 0), the same two of w, ErrOutOfMemory.
enum ChirpMethod : uint32_t {
    DirectSum = 0, // n count powers
    Bluestein = 1, // one convolution by transforms, n + count powers
};

template <ElementType E>
ErrorCode ChirpZ(ConstVectorView<E> x, CDB a, CDB w, ChirpMethod method, ComplexVector out);

// The inverse: the sequence of `count` values whose transform is the input, which has at least as many
// values. If it has more, the `count` values around the point of the spiral that is nearest to the
// unit circle are used.
//
// With y[k] = x[k] a^(-k) this is the interpolation of a polynomial at the powers of w, solved by
// Lagrange's formula: the products of the differences of such points are products of 1 - w^(-j),
// the sum over the points is a chirp-Z transform with the step 1/w, and the coefficients of the
// product over all points are Gaussian binomials. The error grows with the condition of the points
// (docs/accuracy/chirp_z.md).
//
// In addition to the codes above: ErrDegenerateValue if two points agree to rounding.
ErrorCode InverseChirpZ(ConstComplexVector in, CDB a, CDB w, ComplexVector out);

} // namespace qx

#endif
