#ifndef QX_POLY_ARITHMETIC_H
#define QX_POLY_ARITHMETIC_H

#include "qx/errors.h"
#include "qx/types.h"

#include <cstdint>

namespace qx {

// Polynomials by their ascending coefficients; include/qx/polynomial_arithmetic.h has the formulas.
// Inputs are finite and overlap no output.

// The length without zeros at the top; 0 for the polynomial 0.
int32_t LengthWithoutZeros(const DBL *p, int32_t n);
int32_t LengthWithoutZeros(const CDB *p, int32_t n);

// r, of m + n - 1 coefficients, is p q; m and n are at least 1.
void PolynomialProduct(const DBL *p, int32_t m, const DBL *q, int32_t n, DBL *r);
void PolynomialProduct(const CDB *p, int32_t m, const CDB *q, int32_t n, CDB *r);

// For m >= n >= 1 and q[n - 1] other than 0. The quotient has m - n + 1 coefficients; `work`, which
// holds p on entry, has the remainder in its first n - 1 ones at the end.
void DivideInPlace(DBL *work, int32_t m, const DBL *q, int32_t n, DBL *quotient);
void DivideInPlace(CDB *work, int32_t m, const CDB *q, int32_t n, CDB *quotient);

// q, of n - order coefficients, is the derivative; 0 <= order < n.
void Differentiate(const DBL *p, int32_t n, int32_t order, DBL *q);
void Differentiate(const CDB *p, int32_t n, int32_t order, CDB *q);

// r, of (m - 1) (n - 1) + 1 coefficients, is p(q(x)); m and n are at least 1. ErrOutOfMemory.
ErrorCode Compose(const DBL *p, int32_t m, const DBL *q, int32_t n, DBL *r);
ErrorCode Compose(const CDB *p, int32_t m, const CDB *q, int32_t n, CDB *r);

// p, of n + 1 coefficients, is the monic product of all x - root. ErrOutOfMemory. The real one also
// gives ErrBadCoefficients where a root lacks its conjugate.
ErrorCode FromRoots(const CDB *roots, int32_t n, DBL *p);
ErrorCode FromRoots(const CDB *roots, int32_t n, CDB *p);

} // namespace qx

#endif
