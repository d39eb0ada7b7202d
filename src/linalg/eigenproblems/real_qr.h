#ifndef QX_LINALG_EIGENPROBLEMS_REAL_QR_H
#define QX_LINALG_EIGENPROBLEMS_REAL_QR_H

#include "linalg/factorisations/balance.h"
#include "qx/errors.h"

namespace qx {

// The sum of the absolute values of a Hessenberg matrix.
double SumOfHessenberg(const ConstRealMatrix &h);

// The double-shift QR iteration on a real Hessenberg matrix h, in the block `range`. With
// `transposed`, which holds the transposed basis, h becomes the quasi-triangular Schur form and
// `transposed` its transposed vectors; without it only the eigenvalues are computed. The form has a
// block of two where a value has a positive imaginary part, and its other elements below the
// diagonal are meaningless. A subdiagonal element counts as 0 where it is within eps of its
// neighbours or at most `negligible`. ErrIterationLimit.
ErrorCode RealSchurIteration(const RealMatrix &h, Balanced range, double negligible,
                             ComplexVector values, const RealMatrix &transposed);

} // namespace qx

#endif
