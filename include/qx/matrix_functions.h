#ifndef QX_MATRIX_FUNCTIONS_H
#define QX_MATRIX_FUNCTIONS_H

/* Functions of square matrices: exponential, logarithm, square root, integer power; and the
   pseudo-inverse of any matrix.

   Matrices stand row after row. Exports with an `err` have the function result 0; the others return
   their code. Every failure empties all outputs. */

#include "qx/types.h"

QX_BEGIN_DECLS

/** exp(a) in place of the square matrix a, by scaling, a Pade approximant and repeated squaring; of a
    diagonal matrix element by element. The degree of the approximant follows from the bound 1e-8 /
    (exp(norm) norm) on its error, where norm is the largest row sum of absolute values: relative to
    the norm of the result the error is up to 1e-9 for norms up to 2, and falls to rounding errors as
    the norm grows. C. Moler and C. Van Loan, "Nineteen dubious ways to compute the exponential of a
    matrix", 1978.
    Codes: ErrEmptyInput (a is empty), ErrNotSquare (a is not square), ErrOutOfMemory (no memory),
    ErrNonFiniteInput (an element is not finite, unless a is diagonal). */
QX_API int32_t MatrixExp_head(QX_INOUT DBL2D a, QX_OUT ErrorCode *err);
/** As MatrixExp_head, for complex elements. */
QX_API int32_t CxMatrixExp_head(QX_INOUT CDB2D a, QX_OUT ErrorCode *err);

/** The principal logarithm of the square matrix a. It is that of the eigenvalues, if the condition
    number of the eigenvectors is up to 1e14, refined until its exponential gives a back to a relative
    1e-12; otherwise, and for a singular a, 2^k times ten terms of the series after k square roots. A
    diagonal matrix is taken element by element. The exponential is that of MatrixExp_head, whose own
    error limits what refinement can tell: the error can reach 1e-8, while exp(log(a)) gives a back.
    Codes: ErrEmptyInput (a is empty), ErrNotSquare (a is not square), ErrOutOfMemory (no memory),
    ErrNonFiniteInput (an element, or the result, is not finite), ErrDegenerateValue (a has a zero
    eigenvalue, or square roots did not come near the identity), ErrSingularMatrix (an exponential has
    no inverse), ErrConditionTooHigh (the eigenvectors of a, slightly changed, are dependent),
    ErrIterationLimit (the eigenvalue iteration did not converge), WarnSingular (a is singular, and
    the series gave a result all the same), WarnLowAccuracy (the best that was found is off by more
    than 1e-12). */
QX_API int32_t MatrixLn_head(QX_IN DBL2D a, QX_OUT CDB2D out, QX_OUT ErrorCode *err);
/** As MatrixLn_head, for complex elements and in place. */
QX_API int32_t CxMatrixLn_head(QX_INOUT CDB2D a, QX_OUT ErrorCode *err);

/** The real part of the principal square root in place of the square matrix a; imaginary parts, which
    negative eigenvalues give, are dropped without a sign. Through the complex Schur form with
    eigenvalues of falling modulus: A. Bjorck and S. Hammarling, "A Schur method for the square root
    of a matrix", 1983.
    Codes: ErrEmptyInput (a is empty), ErrNotSquare (a is not square), ErrOutOfMemory (no memory),
    ErrNonFiniteInput (an element is not finite), ErrIterationLimit (the eigenvalue iteration did not
    converge), ErrConditionTooHigh (the eigenvalues could not be ordered), WarnLowAccuracy (two or more
    eigenvalues are below 1e-12: there may be no root). */
QX_API int32_t MatrixSqrt_head(QX_INOUT DBL2D a, QX_OUT ErrorCode *err);
/** As MatrixSqrt_head, with the whole complex root in `out`; the code is the function result.
    Codes: ErrNotSquare (a is not square), ErrEmptyInput (a is empty), ErrOutOfMemory (no memory),
    ErrNonFiniteInput (an element is not finite), ErrIterationLimit (the eigenvalue iteration did not
    converge), ErrConditionTooHigh (the eigenvalues could not be ordered), WarnLowAccuracy (two or more
    eigenvalues are below 1e-12: there may be no root). */
QX_API ErrorCode MatrixSqrtH(QX_IN DBL2D a, QX_OUT CDB2D out);
/** As MatrixSqrt_head, for complex elements; nothing is dropped. */
QX_API int32_t CxMatrixSqrt_head(QX_INOUT CDB2D a, QX_OUT ErrorCode *err);

/** a^power in place of the square matrix a, by repeated squaring. Power 0 gives the identity; a
    negative power is one of the pseudo-inverse, so a singular matrix is no failure.
    Codes: ErrNotSquare (a is not square), ErrEmptyInput (a is empty), ErrOutOfMemory (no memory),
    ErrNonFiniteInput (power is negative and an element not finite), ErrIterationLimit (the singular
    value iteration did not converge). */
QX_API ErrorCode MatrixPower_head(QX_INOUT DBL2D a, int32_t power);
/** As MatrixPower_head, for complex elements. */
QX_API ErrorCode CxMatrixPower_head(QX_INOUT CDB2D a, int32_t power);

/** The pseudo-inverse (E. H. Moore, R. Penrose) in place of the m by n matrix a, n by m: v diag(1/s)
    u^T of its singular value decomposition. Values not above *tolerance, an absolute number, count as
    0; a negative one stands for max(m, n) s[0] 2.2e-16.
    Codes: ErrEmptyInput (a is empty), ErrOutOfMemory (no memory), ErrNonFiniteInput (an element is
    not finite), ErrIterationLimit (the singular value iteration did not converge). */
QX_API int32_t PseudoInverse_head(QX_INOUT DBL2D a, QX_IN const double *tolerance,
                                  QX_OUT ErrorCode *err);
/** As PseudoInverse_head, for complex elements. */
QX_API int32_t CxPseudoInverse_head(QX_INOUT CDB2D a, QX_IN const double *tolerance,
                                    QX_OUT ErrorCode *err);

QX_END_DECLS

#endif
