#ifndef QX_LINALG_FACTORISATIONS_HESSENBERG_H
#define QX_LINALG_FACTORISATIONS_HESSENBERG_H

#include "linalg/scalar.h"
#include "qx/errors.h"

namespace qx {

// Reduces rows and columns low to high (from 0) of a to upper Hessenberg form h = q^H a q by
// Householder reflections. a becomes h; q, n by n with rows `qStride` apart, may be null.
// ErrOutOfMemory.
template <ElementType E>
ErrorCode ReduceToHessenberg(ElementOf<E> *a, std::ptrdiff_t stride, int32_t n, int32_t low,
                             int32_t high, ElementOf<E> *q, std::ptrdiff_t qStride);

} // namespace qx

#endif
