#ifndef QX_LINALG_EQUATIONS_MATRIX_EQUATIONS_H
#define QX_LINALG_EQUATIONS_MATRIX_EQUATIONS_H

#include "linalg/matrix.h"

namespace qx {

enum SylvesterEquation : int32_t {
    sylvesterSum = 0,        // a x + x b = c
    sylvesterDifference = 1, // a x - x b = c
    sylvesterProducts = 2    // a x b - x = c
};
enum LyapunovEquation : int32_t {
    lyapunovContinuous = 0, // a x + x a^H = q
    lyapunovDiscrete = 1    // a x a^H - x + q = 0
};

// a is m by m, b n by n, c and x m by n; n and m are positive. x shares no element with the others.
// Through the Schur forms of a and b and back substitution by blocks (R. H. Bartels and G. W.
// Stewart, 1972; for the products J. D. Gardiner, A. J. Laub, J. J. Amato and C. B. Moler,
// "Solution of the Sylvester matrix equation AXB^T + CXD^T = E", 1992). The matrices are scaled by
// powers of two so that nothing but the result can overflow; with products, one step of iterative
// refinement follows.
//
// ErrNonFiniteInput, ErrIterationLimit, ErrSingularMatrix, ErrOverflow, ErrOutOfMemory.
template <ElementType E>
ErrorCode SolveSylvester(const ConstMatrixView<E> &a, const ConstMatrixView<E> &b,
                         const ConstMatrixView<E> &c, SylvesterEquation equation,
                         const MatrixView<E> &x);

// All matrices have the same order; x is Hermitian to the bit where q is.
template <ElementType E>
ErrorCode SolveLyapunov(const ConstMatrixView<E> &a, const ConstMatrixView<E> &q,
                        LyapunovEquation equation, const MatrixView<E> &x);

} // namespace qx

#endif
