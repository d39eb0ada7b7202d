#ifndef QX_MATRIX_EQUATIONS_H
#define QX_MATRIX_EQUATIONS_H

/* Linear matrix equations: Sylvester and Lyapunov equations.

   Matrices are stored row by row; a' is the transpose, for complex matrices the conjugate
   transpose. x is a separate array. The right-hand side may be any matrix, symmetric or not. The
   equations are solved through the Schur forms of a and b and back substitution by blocks (R. H.
   Bartels and G. W. Stewart, "Solution of the matrix equation AX + XB = C", 1972; for products J.
   D. Gardiner, A. J. Laub, J. J. Amato and C. B. Moler, "Solution of the Sylvester matrix equation
   AXB' + CXD' = E", 1992), in a number of operations that grows as the cube of the order.

   The residual, in the Frobenius norm, is below 30 eps (|a| + |b|) |x|, for products below 30 eps
   (|a| |b| + 1) |x| (eps 2.2e-16), for orders up to 200. The error of x depends on the condition of
   the equation: if l + m (l - m, l m - 1) is small for eigenvalues l of a and m of b, both x and
   its relative error are large. The test for singular equations uses the norms of the whole
   matrices. With strongly graded matrices, whose small eigenvalues are within rounding errors of
   the norm, an equation may be refused although x exists. Elements of any magnitude are accepted:
   nothing overflows but x itself. */

#include "qx/types.h"

QX_BEGIN_DECLS

/** Solves for x (m by n), with a m by m, b n by n and c m by n. equation: 0 a x + x b = c; 1
    a x - x b = c; 2 a x b - x = c.
    Codes: ErrEmptyInput (a matrix is empty), ErrNotSquare (a or b), ErrSizesDisagree (c is not m by
    n), ErrInvalidSelector (equation), ErrNonFiniteInput (an element of a, b or c),
    ErrIterationLimit (the iteration for a Schur form does not converge), ErrSingularMatrix (for
    eigenvalues l of a and m of b |l + m|, in equation 1 |l - m|, is at most eps (|a| + |b|), or in
    equation 2 |l m - 1| at most eps (|a| |b| + 1), with Frobenius norms), ErrOverflow (an element
    of x is too large), ErrOutOfMemory (no memory).
    NaN: a, b, c refused with ErrNonFiniteInput. */
QX_API ErrorCode Sylvester2011_head(QX_IN DBL2D a, QX_IN DBL2D b, QX_IN DBL2D c, int32_t equation,
                                    QX_OUT DBL2D x);
/** As Sylvester2011_head, for complex elements. */
QX_API ErrorCode CxSylvester2011_head(QX_IN CDB2D a, QX_IN CDB2D b, QX_IN CDB2D c, int32_t equation,
                                      QX_OUT CDB2D x);
/** As Sylvester2011_head, with equation 0: a x + x b = c. */
QX_API ErrorCode Sylvester_head(QX_IN DBL2D a, QX_IN DBL2D b, QX_IN DBL2D c, QX_OUT DBL2D x);
/** As Sylvester_head, for complex elements. */
QX_API ErrorCode CxSylvester_head(QX_IN CDB2D a, QX_IN CDB2D b, QX_IN CDB2D c, QX_OUT CDB2D x);

/** Solves for x, all matrices n by n. equation: 0 a x + x a' = q (continuous time); 1
    a x a' - x + q = 0 (discrete time). Note that the sign of q differs: for a stable a and a
    positive definite q, x is negative definite under equation 0 and positive definite under
    equation 1. If q is symmetric (Hermitian) to the bit, so is x; q may also be any other matrix.
    Codes: ErrEmptyInput (a matrix is empty), ErrNotSquare (a or q), ErrSizesDisagree (a and q
    differ in order), ErrInvalidSelector (equation), ErrNonFiniteInput (an element of a or q),
    ErrIterationLimit (the iteration for the Schur form does not converge), ErrSingularMatrix (for
    eigenvalues l and m of a, which may be the same, |l + conj(m)| is at most 2 eps |a|, or in
    equation 1 |l conj(m) - 1| at most eps (|a|^2 + 1), with the Frobenius norm), ErrOverflow (an
    element of x is too large), ErrOutOfMemory (no memory).
    NaN: a, q refused with ErrNonFiniteInput. */
QX_API ErrorCode Lyapunov2011_head(QX_IN DBL2D a, QX_IN DBL2D q, int32_t equation, QX_OUT DBL2D x);
/** As Lyapunov2011_head, for complex elements. */
QX_API ErrorCode CxLyapunov2011_head(QX_IN CDB2D a, QX_IN CDB2D q, int32_t equation,
                                     QX_OUT CDB2D x);
/** As Lyapunov2011_head, with equation 0: a x + x a' = q. */
QX_API ErrorCode Lyapunov_head(QX_IN DBL2D a, QX_IN DBL2D q, QX_OUT DBL2D x);
/** As Lyapunov_head, for complex elements. */
QX_API ErrorCode CxLyapunov_head(QX_IN CDB2D a, QX_IN CDB2D q, QX_OUT CDB2D x);

QX_END_DECLS

#endif
