#ifndef QX_LINALG_PROPERTIES_VECTORS_H
#define QX_LINALG_PROPERTIES_VECTORS_H

#include "linalg/matrix.h"

namespace qx {

// The p-norm (sum |x[i]|^p)^(1/p) of a vector that is not empty; for p = +infinity the largest and
// for -infinity the smallest |x[i]|. p is neither 0 nor NaN.
template <ElementType E>
double VectorNorm(ConstVectorView<E> x, double p);

} // namespace qx

#endif
