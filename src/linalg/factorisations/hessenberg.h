#ifndef QX_LINALG_FACTORISATIONS_HESSENBERG_H
#define QX_LINALG_FACTORISATIONS_HESSENBERG_H

#include "linalg/matrix.h"

namespace qx {

// Reduces rows and columns low to high (from 0) of a square a to upper Hessenberg form h = q^H a q
// by Householder reflections. a becomes h; q, of the same order, may be empty. ErrOutOfMemory.
template <ElementType E>
ErrorCode ReduceToHessenberg(const MatrixView<E> &a, int32_t low, int32_t high,
                             const MatrixView<E> &q);

} // namespace qx

#endif
