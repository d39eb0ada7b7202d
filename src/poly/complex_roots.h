#ifndef QX_POLY_COMPLEX_ROOTS_H
#define QX_POLY_COMPLEX_ROOTS_H

#include "frame/views.h"
#include "qx/errors.h"

#include <cstdint>

namespace qx {

// All roots of a complex polynomial of ascending coefficients, at least one, in the order in which
// they are found: Newton's method with a line search, which changes direction when it makes no
// progress, and deflation. `roots` has as many elements as `coef` and may be `coef`; *rootCount is
// the degree without vanishing top coefficients. A search may change direction `maxIterations`
// times between two of its steps. It can get stuck where the polynomial is constant to the last
// bit.
//
// ErrBadCoefficients: NaN, or a constant; ErrNonFiniteFunction: NaN in a search;
// ErrIterationLimit; ErrOutOfMemory.
ErrorCode CxPolynomialRoots(ConstComplexVector coef, int32_t maxIterations, ComplexVector roots,
                            int32_t *rootCount);

// c + b x + a x^2 = 0 with a and c other than 0.
void CxQuadraticRoots(CDB c, CDB b, CDB a, CDB *roots);

} // namespace qx

#endif
