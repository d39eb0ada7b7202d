#ifndef QX_LINALG_EIGENPROBLEMS_COMPLEX_QR_H
#define QX_LINALG_EIGENPROBLEMS_COMPLEX_QR_H

#include "linalg/factorisations/balance.h"
#include "qx/errors.h"

namespace qx {

// The single-shift QR iteration on a complex Hessenberg matrix h, in the block `range`. With
// `transposed`, which holds the transposed basis in rows `stride` apart as those of h are, h
// becomes the triangular Schur form and `transposed` its transposed vectors; with null only the
// values come out. An element beside the diagonal counts as 0 where it is within eps of its
// neighbours or at most `negligible`. ErrIterationLimit.
ErrorCode ComplexSchurIteration(CDB *h, std::ptrdiff_t stride, int32_t n, Balanced range,
                                double negligible, CDB *values, CDB *transposed);

} // namespace qx

#endif
