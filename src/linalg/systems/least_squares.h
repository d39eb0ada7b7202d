#ifndef QX_LINALG_SYSTEMS_LEAST_SQUARES_H
#define QX_LINALG_SYSTEMS_LEAST_SQUARES_H

#include "qx/types.h"

#include <cstdint>

namespace qx {

// Least-squares solutions of smallest norm of a x = b for a of m by n and b of m by `rightSides`,
// by the singular values of a above tolerance * max(m, n) times the largest one. A tolerance of 0
// or below is the machine epsilon.
//
// ErrNonFiniteInput, ErrOutOfMemory, ErrIterationLimit; WarnRankDeficient where singular values are
// left out, with x valid.
ErrorCode SolveBySVD(const DBL *a, int32_t m, int32_t n, const DBL *b, int32_t rightSides, DBL *x,
                     double tolerance);
ErrorCode SolveBySVD(const CDB *a, int32_t m, int32_t n, const CDB *b, int32_t rightSides, CDB *x,
                     double tolerance);

// The same for one right side with U, the singular values and V in the caller's memory, which has
// LeastSquaresWork elements and is shown to the user; what the method does not need is 0.
int64_t LeastSquaresWork(int32_t m, int32_t n);
ErrorCode SolveBySVDIn(DBL *work, const DBL *a, int32_t m, int32_t n, const DBL *b, DBL *x,
                       double tolerance);

// The same, refined: x starts at 0 and is improved `refinements` times by the solution for the rest
// b - a x. Singular values up to tolerance times the largest one are left out; a tolerance below 0
// is the machine epsilon, and one of 0 stays. m + n more elements of work.
ErrorCode SolveBySVDRefined(DBL *work, const DBL *a, int32_t m, int32_t n, const DBL *b, DBL *x,
                            double tolerance, int32_t refinements);

// The pseudo-inverse, n by m, by the singular values above the tolerance, which is absolute; below
// 0 it is max(m, n) times the largest one times the machine epsilon.
//
// ErrEmptyInput, ErrNonFiniteInput, ErrOutOfMemory, ErrIterationLimit.
ErrorCode PseudoInverseMatrix(const DBL *a, int32_t m, int32_t n, double tolerance, DBL *out);
ErrorCode PseudoInverseMatrix(const CDB *a, int32_t m, int32_t n, double tolerance, CDB *out);

} // namespace qx

#endif
