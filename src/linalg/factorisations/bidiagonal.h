#ifndef QX_LINALG_FACTORISATIONS_BIDIAGONAL_H
#define QX_LINALG_FACTORISATIONS_BIDIAGONAL_H

#include "linalg/factorisations/rotations.h"
#include "qx/errors.h"

namespace qx {

// The largest number of iterations for one singular value, or one eigenvalue of a symmetric matrix.
inline constexpr int32_t SVDIterationLimit = 100;

// Makes the upper bidiagonal matrix with diagonal d and e[i] at row i - 1, column i (e[0] is 0)
// diagonal. The rotations are applied to `left` and `right`, which hold the transposed factors.
// Elements of d may become negative. ErrIterationLimit.
ErrorCode DiagonaliseBidiagonal(RealVector d, RealVector e, RotationQueue &left,
                                RotationQueue &right);

} // namespace qx

#endif
