#ifndef QX_LINALG_FACTORISATIONS_SVD_H
#define QX_LINALG_FACTORISATIONS_SVD_H

#include "qx/types.h"

namespace qx {

// Singular value decomposition of a row-major m by n matrix, a = U diag(s) V^H with s falling and k
// = min(m, n): u is m by k and v n by k, or with fullSize m by m and n by n. a stays as it is and
// may not overlap the outputs. G. H. Golub and C. Reinsch, "Singular value decomposition and least
// squares solutions", 1970.
//
// The error of a singular value is a few n eps times the largest one, and never less than about
// eps itself: what is below 2.2e-16 counts as zero whatever the norm of the matrix.
//
// ErrEmptyInput, ErrNonFiniteInput, ErrOutOfMemory, ErrIterationLimit.
ErrorCode SVDecompose(const DBL *a, int32_t m, int32_t n, DBL *u, DBL *s, DBL *v, int32_t fullSize);
ErrorCode SVDecompose(const CDB *a, int32_t m, int32_t n, CDB *u, DBL *s, CDB *v, int32_t fullSize);

// The singular values alone, falling.
ErrorCode SingularValues(const DBL *a, int32_t m, int32_t n, DBL *s);
ErrorCode SingularValues(const CDB *a, int32_t m, int32_t n, DBL *s);

} // namespace qx

#endif
