#ifndef QX_POLY_ARITHMETIC_H
#define QX_POLY_ARITHMETIC_H

#include "frame/views.h"
#include "qx/errors.h"

#include <cstdint>

namespace qx {

// Polynomials by their ascending coefficients; include/qx/polynomial_arithmetic.h documents the
// formulas. Inputs must be finite and must not overlap outputs.

// The number of coefficients without zeros at the top; 0 for the polynomial 0.
template <ElementType E>
int32_t LengthWithoutZeros(ConstVectorView<E> p);

// r = p q. It has one coefficient fewer than p and q together; neither of these is empty.
template <ElementType E>
void PolynomialProduct(ConstVectorView<E> p, ConstVectorView<E> q, VectorView<E> r);

// Divides the polynomial p of m coefficients by q of n coefficients, m >= n >= 1, where the last
// coefficient of q is not 0. The quotient has m - n + 1 coefficients; `work` holds p on entry, and
// the remainder in its first n - 1 elements on return.
template <ElementType E>
void DivideInPlace(VectorView<E> work, ConstVectorView<E> q, VectorView<E> quotient);

// q is the derivative of this order; it has `order` coefficients fewer than p, but at least one.
template <ElementType E>
void Differentiate(ConstVectorView<E> p, int32_t order, VectorView<E> q);

// r = p(q(x)), with (m - 1) (n - 1) + 1 coefficients if p has m and q has n; neither is empty.
// ErrOutOfMemory.
template <ElementType E>
ErrorCode Compose(ConstVectorView<E> p, ConstVectorView<E> q, VectorView<E> r);

// p is the monic product of all x - root, with one coefficient more than there are roots.
// ErrOutOfMemory. The real form also returns ErrBadCoefficients if a root lacks its conjugate.
ErrorCode FromRoots(ConstComplexVector roots, RealVector p);
ErrorCode FromRoots(ConstComplexVector roots, ComplexVector p);

} // namespace qx

#endif
