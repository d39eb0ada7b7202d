#ifndef QX_LINALG_SYSTEMS_LEAST_SQUARES_H
#define QX_LINALG_SYSTEMS_LEAST_SQUARES_H

#include "linalg/matrix.h"

namespace qx {

// Least-squares solutions of smallest norm of a x = b for an m by n matrix a that is not empty,
// from the singular values of a above tolerance * max(m, n) times the largest one. A tolerance of 0
// or below means the machine epsilon.
//
// ErrNonFiniteInput, ErrOutOfMemory, ErrIterationLimit; WarnRankDeficient if singular values are
// left out; x is valid.
template <ElementType E>
ErrorCode SolveBySVD(const ConstMatrixView<E> &a, const ConstMatrixView<E> &b,
                     const MatrixView<E> &x, double tolerance);

// The same for one right side with U, the singular values and V in the caller's memory, which has
// LeastSquaresWork elements and is returned to the user; what the method does not need is 0.
int64_t LeastSquaresWork(int32_t m, int32_t n);
ErrorCode SolveBySVDIn(RealVector work, const ConstRealMatrix &a, ConstRealVector b, RealVector x,
                       double tolerance);

// The same, refined: x starts at 0 and is improved `refinements` times by the solution for the
// residual b - a x. Singular values up to tolerance times the largest one are left out; a tolerance
// below 0 means the machine epsilon, and a tolerance of 0 is used as it is. `work` has m + n more
// elements.
ErrorCode SolveBySVDRefined(RealVector work, const ConstRealMatrix &a, ConstRealVector b,
                            RealVector x, double tolerance, int32_t refinements);

// The pseudo-inverse, n by m, from the singular values above the tolerance, which is absolute; a
// tolerance below 0 means max(m, n) times the largest one times the machine epsilon. `out` may be
// a.
//
// ErrNonFiniteInput, ErrOutOfMemory, ErrIterationLimit.
template <ElementType E>
ErrorCode PseudoInverseMatrix(const ConstMatrixView<E> &a, double tolerance,
                              const MatrixView<E> &out);

// SolveBySVD and PseudoInverseMatrix for matrices of any norm: a and each column of b are scaled by
// powers of two, and the results are scaled back, so that 2^j a has the same digits. Results that
// overflow are infinite. For SolveScaledBySVD a tolerance that is negative or NaN means the machine
// epsilon, and a tolerance of 0 is used as it is. `out` must not be a.
template <ElementType E>
ErrorCode SolveScaledBySVD(const ConstMatrixView<E> &a, const ConstMatrixView<E> &b,
                           const MatrixView<E> &x, double tolerance);
template <ElementType E>
ErrorCode ScaledPseudoInverse(const ConstMatrixView<E> &a, double tolerance,
                              const MatrixView<E> &out);

} // namespace qx

#endif
