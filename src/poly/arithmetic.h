#ifndef QX_POLY_ARITHMETIC_H
#define QX_POLY_ARITHMETIC_H

#include "frame/views.h"
#include "qx/errors.h"

#include <cstdint>

namespace qx {

// Polynomials by their ascending coefficients; include/qx/polynomial_arithmetic.h has the formulas.
// Inputs are finite and overlap no output.

// The length without zeros at the top; 0 for the polynomial 0.
template <ElementType E>
int32_t LengthWithoutZeros(ConstVectorView<E> p);

// r, of one coefficient less than p and q together, is p q; neither is empty.
template <ElementType E>
void PolynomialProduct(ConstVectorView<E> p, ConstVectorView<E> q, VectorView<E> r);

// For m >= n >= 1 coefficients of `work` and q, the last one of q other than 0. The quotient has
// m - n + 1 coefficients; `work`, which holds p on entry, has the remainder in its first n - 1 ones
// at the end.
template <ElementType E>
void DivideInPlace(VectorView<E> work, ConstVectorView<E> q, VectorView<E> quotient);

// q, of `order` coefficients less than p and at least one, is the derivative.
template <ElementType E>
void Differentiate(ConstVectorView<E> p, int32_t order, VectorView<E> q);

// r, of (m - 1) (n - 1) + 1 coefficients for m of p and n of q, is p(q(x)); neither is empty.
// ErrOutOfMemory.
template <ElementType E>
ErrorCode Compose(ConstVectorView<E> p, ConstVectorView<E> q, VectorView<E> r);

// p, of one coefficient more than there are roots, is the monic product of all x - root.
// ErrOutOfMemory. The real one also gives ErrBadCoefficients where a root lacks its conjugate.
ErrorCode FromRoots(ConstComplexVector roots, RealVector p);
ErrorCode FromRoots(ConstComplexVector roots, ComplexVector p);

} // namespace qx

#endif
