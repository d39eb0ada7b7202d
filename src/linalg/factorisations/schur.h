#ifndef QX_LINALG_FACTORISATIONS_SCHUR_H
#define QX_LINALG_FACTORISATIONS_SCHUR_H

#include "qx/types.h"

namespace qx {

// How the eigenvalues stand along the diagonal.
enum SchurOrder : int32_t {
    schurUnordered = 0,
    schurRealAscending = 1,
    schurRealDescending = 2,
    schurModulusAscending = 3,
    schurModulusDescending = 4
};

// Schur form a = z t z^H of the square row-major matrix of order n through LAPACK: z is unitary, t
// upper triangular, for real elements with blocks of two for conjugate pairs, and w its
// eigenvalues. z may be null. a may be t.
//
// ErrEmptyInput, ErrInvalidSelector, ErrNonFiniteInput, ErrOutOfMemory, ErrIterationLimit,
// ErrConditionTooHigh.
ErrorCode SchurDecompose(const DBL *a, int32_t n, int32_t order, DBL *z, DBL *t, CDB *w);
ErrorCode SchurDecompose(const CDB *a, int32_t n, int32_t order, CDB *z, CDB *t, CDB *w);

} // namespace qx

#endif
