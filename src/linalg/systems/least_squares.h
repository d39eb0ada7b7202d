#ifndef QX_LINALG_SYSTEMS_LEAST_SQUARES_H
#define QX_LINALG_SYSTEMS_LEAST_SQUARES_H

#include "linalg/matrix.h"

namespace qx {

// Least-squares solutions of smallest norm of a x = b for a of m by n, none of them 0, by the
// singular values of a above tolerance * max(m, n) times the largest one. A tolerance of 0 or below
// is the machine epsilon.
//
// ErrNonFiniteInput, ErrOutOfMemory, ErrIterationLimit; WarnRankDeficient where singular values are
// left out, with x valid.
template <ElementType E>
ErrorCode SolveBySVD(const ConstMatrixView<E> &a, const ConstMatrixView<E> &b,
                     const MatrixView<E> &x, double tolerance);

// The same for one right side with U, the singular values and V in the caller's memory, which has
// LeastSquaresWork elements and is shown to the user; what the method does not need is 0.
int64_t LeastSquaresWork(int32_t m, int32_t n);
ErrorCode SolveBySVDIn(RealVector work, const ConstRealMatrix &a, ConstRealVector b, RealVector x,
                       double tolerance);

// The same, refined: x starts at 0 and is improved `refinements` times by the solution for the rest
// b - a x. Singular values up to tolerance times the largest one are left out; a tolerance below 0
// is the machine epsilon, and one of 0 stays. m + n more elements of work.
ErrorCode SolveBySVDRefined(RealVector work, const ConstRealMatrix &a, ConstRealVector b,
                            RealVector x, double tolerance, int32_t refinements);

// The pseudo-inverse, n by m, by the singular values above the tolerance, which is absolute; below
// 0 it is max(m, n) times the largest one times the machine epsilon. It may take the place of a.
//
// ErrNonFiniteInput, ErrOutOfMemory, ErrIterationLimit.
template <ElementType E>
ErrorCode PseudoInverseMatrix(const ConstMatrixView<E> &a, double tolerance,
                              const MatrixView<E> &out);

// SolveBySVD and PseudoInverseMatrix for matrices of any norm: a and each column of b are scaled by
// powers of two, and the results are scaled back, so that 2^j a has the same digits. What overflows
// is infinite. A tolerance below 0 or NaN is the machine epsilon for SolveScaledBySVD, and one of 0
// stays. `out` may not take the place of a.
template <ElementType E>
ErrorCode SolveScaledBySVD(const ConstMatrixView<E> &a, const ConstMatrixView<E> &b,
                           const MatrixView<E> &x, double tolerance);
template <ElementType E>
ErrorCode ScaledPseudoInverse(const ConstMatrixView<E> &a, double tolerance,
                              const MatrixView<E> &out);

} // namespace qx

#endif
