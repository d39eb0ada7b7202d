#ifndef QX_LINALG_EIGENPROBLEMS_COMPLEX_QR_H
#define QX_LINALG_EIGENPROBLEMS_COMPLEX_QR_H

#include "linalg/factorisations/balance.h"
#include "qx/errors.h"

namespace qx {

// The single-shift QR iteration on a complex Hessenberg matrix h, in the block `range`. With
// `transposed`, which holds the transposed basis, h becomes the triangular Schur form and
// `transposed` its transposed vectors; without it only the eigenvalues are computed. A subdiagonal
// element counts as 0 where it is within eps of its neighbours or at most `negligible`.
// ErrIterationLimit.
ErrorCode ComplexSchurIteration(const ComplexMatrix &h, Balanced range, double negligible,
                                ComplexVector values, const ComplexMatrix &transposed);

} // namespace qx

#endif
