#ifndef QX_POLY_EVALUATION_H
#define QX_POLY_EVALUATION_H

#include "frame/views.h"
#include "frame/widths.h"
#include "qx/errors.h"
#include "qx/types.h"

#include <cstdint>

namespace qx {

// y[i] = p(x[i]) for `count` points by Horner's rule with compensation, as for PolyEv of
// include/qx/polynomial_arithmetic.h. p has n >= 1 finite coefficients.
QX_BY_WIDTH(void, EvaluateReal,
            (const DBL *p, int32_t n, const DBL *x, std::ptrdiff_t count, DBL *y))
QX_BY_WIDTH(void, EvaluateComplex,
            (const CDB *p, int32_t n, const CDB *x, std::ptrdiff_t count, CDB *y))

// y = p(a) for a square matrix without gaps between its rows: by blocks of coefficients with powers
// below the s-th, and Horner's rule in the s-th power. ErrOutOfMemory.
// Source: M. S. Paterson and L. J. Stockmeyer, On the number of nonscalar multiplications necessary
// to evaluate polynomials, 1973.
template <ElementType E>
ErrorCode EvaluateAtMatrix(ConstVectorView<E> p, const ConstMatrixView<E> &a,
                           const MatrixView<E> &y);

} // namespace qx

#endif
