#ifndef QX_MATRIX_FUNCTIONS_H
#define QX_MATRIX_FUNCTIONS_H

/* Functions of square matrices: exponential, logarithm, square root, integer power; and the
   pseudo-inverse of any matrix.

   Matrices are stored row by row. Exports with an `err` have the function result 0; the others
   return their code. Every failure empties all outputs. */

#include "qx/types.h"

QX_BEGIN_DECLS

/** Replaces the square matrix a by exp(a), by scaling, a Pade approximant and repeated squaring;
    for a diagonal matrix, element by element. The degree of the approximant follows from the bound
    1e-8 / (exp(norm) norm) on its error, where norm is the largest row sum of absolute values. The
    measured errors relative to the largest element of the result (random matrices of several kinds,
    orders 2 to 5) are rounding errors up to a norm of 0.1, up to 4e-8 for norms just below 1
    (rotations are worst), 6e-9 up to 2 and 4e-10 up to 8. Above that they are the errors of
    squaring, which grow with the norm: 4e-14 at 100 and 3e-13 at 500, but more if powers of a are
    far larger than exp(a): 0.15 for (1, 1e100; 0, -1). Those of MatrixExp2026_head are rounding
    errors. Elements that overflow, and those computed from them, are infinite or NaN. C. Moler and
    C. Van Loan, "Nineteen dubious ways to compute the exponential of a matrix", 1978.
    Codes: ErrNotSquare (a is not square), ErrEmptyInput (a is empty), ErrOutOfMemory (no memory),
    ErrNonFiniteInput (an element, or the norm, is not finite, unless a is diagonal).
    NaN: a refused with ErrNonFiniteInput. */
QX_API int32_t MatrixExp_head(QX_INOUT DBL2D a, QX_OUT ErrorCode *err);
/** As MatrixExp_head, for complex elements. */
QX_API int32_t CxMatrixExp_head(QX_INOUT CDB2D a, QX_OUT ErrorCode *err);

/** exp(a) of the square matrix a by scaling, a Pade approximant of degree 3 to 13 and repeated
    squaring; for a diagonal matrix, element by element. Degree and scaling are determined by norms
    of powers of a, so that a single large element loses no digits if powers of a are small; the
    backward error of the approximant is below 2.2e-16. A matrix of norm 2^53 or more is first
    brought to D^-1 a D with the diagonal matrix D of powers of two that makes the largest element
    smallest, and its exponential is transformed back. Elements of any magnitude then lose no digits
    if the products of elements along cycles are small, as in triangular matrices. Elements that D
    makes smaller than 2^-1074 count as 0. If powers are small because of cancellation, as those of
    (-x, -x; x, x), large matrices are ill-conditioned and no digit may be correct. Elements that
    overflow, and those computed from them, are infinite or NaN. A. H. Al-Mohy and N. J. Higham, "A
    new scaling and squaring algorithm for the matrix exponential", 2009.
    Codes: ErrEmptyInput (a is empty), ErrNotSquare (a is not square), ErrOutOfMemory (no memory, or
    the host refuses the resize), ErrNonFiniteInput (an element is not finite).
    NaN: a refused with ErrNonFiniteInput. */
QX_API ErrorCode MatrixExp2026_head(QX_IN DBL2D a, QX_OUT DBL2D out);
/** As MatrixExp2026_head, for complex elements.
    NaN: a refused with ErrNonFiniteInput. */
QX_API ErrorCode CxMatrixExp2026_head(QX_IN CDB2D a, QX_OUT CDB2D out);

/** The principal logarithm of the square matrix a. If the condition number of the eigenvectors is
    at most 1e14, it is computed from the logarithms of the eigenvalues and refined until its
    exponential equals a to a relative 1e-12; otherwise, and for a singular a, it is 2^k times ten
    terms of the series after k square roots. For a diagonal matrix it is computed element by
    element. The exponential is that of MatrixExp_head, whose own error limits the refinement: the
    error can reach 4e-8 although exp(log(a)) equals a. log |z| is half the logarithm of |z|^2, so
    the logarithm of a diagonal element or an eigenvalue above 1e154 in modulus is infinite, and one
    below 1e-162 counts as zero. For negative eigenvalues rounding errors decide between +i pi and
    -i pi, and in the second case all digits are lost. MatrixLn2026_head has neither limitation.
    Codes: ErrNotSquare (a is not square), ErrEmptyInput (a is empty), ErrOutOfMemory (no memory),
    ErrNonFiniteInput (an element, or the result, is not finite), ErrDegenerateValue (a has a zero
    eigenvalue, or square roots did not approach the identity), ErrSingularMatrix (an exponential
    has no inverse), ErrConditionTooHigh (the eigenvectors of a, slightly perturbed, are linearly
    dependent), ErrIterationLimit (the eigenvalue iteration did not converge), WarnSingular (a is
    singular, but the series gave a result), WarnLowAccuracy (the best result found has an error of
    more than 1e-12).
    NaN: a refused with ErrNonFiniteInput. */
QX_API int32_t MatrixLn_head(QX_IN DBL2D a, QX_OUT CDB2D out, QX_OUT ErrorCode *err);
/** As MatrixLn_head, for complex elements and in place. */
QX_API int32_t CxMatrixLn_head(QX_INOUT CDB2D a, QX_OUT ErrorCode *err);

/** The principal logarithm of the square matrix a, whose exponential is a and whose eigenvalues
    have imaginary parts above -pi and up to pi. It is computed through the Schur form, square roots
    of the triangle and a Pade approximant of degree up to 7 in partial fractions, whose backward
    error is below 1.1e-16; for a diagonal matrix, element by element. Elements may have any
    magnitude. A real negative eigenvalue of a real matrix (or of a complex one without imaginary
    parts) has the logarithm with +i pi; in a complex matrix, unless it is triangular, an eigenvalue
    counts as negative if its imaginary part is below 0 by at most n 2.2e-16 times the Frobenius
    norm of a. If a is real and has no negative eigenvalue, imaginary parts are 0. Errors grow with
    the condition number of the logarithm, which is large if eigenvalues are near 0, or near the
    negative axis for an a far from normal. A. H. Al-Mohy and N. J. Higham, "Improved inverse
    scaling and squaring algorithms for the matrix logarithm", 2012.
    Codes: ErrEmptyInput (a is empty), ErrNotSquare (a is not square), ErrOutOfMemory (no memory, or
    the host refuses the resize), ErrNonFiniteInput (an element is not finite), ErrIterationLimit
    (the eigenvalue iteration did not converge), ErrDegenerateValue (an eigenvalue is 0, or becomes
    0 by rounding, so that there is no logarithm; or square roots overflow), WarnLowAccuracy (an
    eigenvalue is below n 2.2e-16 times the Frobenius norm of a, and a is not triangular: rounding
    errors determine its logarithm).
    NaN: a refused with ErrNonFiniteInput. */
QX_API ErrorCode MatrixLn2026_head(QX_IN DBL2D a, QX_OUT CDB2D out);
/** As MatrixLn2026_head, for complex elements.
    NaN: a refused with ErrNonFiniteInput. */
QX_API ErrorCode CxMatrixLn2026_head(QX_IN CDB2D a, QX_OUT CDB2D out);

/** Replaces the square matrix a by the real part of its principal square root; imaginary parts,
    which arise from negative eigenvalues, are dropped without notice. It is computed through the
    complex Schur form with eigenvalues of descending modulus: A. Bjorck and S. Hammarling, "A Schur
    method for the square root of a matrix", 1983. A singular matrix may have no root, as for
    example (0, 1; 0, 0): elements are then NaN, infinite or meaningless, and only the warning
    indicates it. Rounding errors determine the sign of the root of a negative eigenvalue, and
    numbers below 1e-12 count as 0, so that the root of a matrix with elements of 1e-14 may have no
    correct digit. MatrixSqrt2026_head accepts elements of any magnitude and always uses +i.
    Codes: ErrNotSquare (a is not square), ErrEmptyInput (a is empty), ErrOutOfMemory (no memory),
    ErrNonFiniteInput (an element, or an eigenvalue, is not finite), ErrIterationLimit (the
    eigenvalue iteration did not converge), ErrConditionTooHigh (the eigenvalues could not be
    ordered), WarnLowAccuracy (two or more eigenvalues are below 1e-12: there may be no root).
    NaN: a refused with ErrNonFiniteInput. */
QX_API int32_t MatrixSqrt_head(QX_INOUT DBL2D a, QX_OUT ErrorCode *err);
/** As MatrixSqrt_head, with the whole complex root in `out`; the code is the function result.
    Codes: ErrNotSquare (a is not square), ErrEmptyInput (a is empty), ErrOutOfMemory (no memory),
    ErrNonFiniteInput (an element, or an eigenvalue, is not finite), ErrIterationLimit (the
    eigenvalue iteration did not converge), ErrConditionTooHigh (the eigenvalues could not be
    ordered), WarnLowAccuracy (two or more eigenvalues are below 1e-12: there may be no root). */
QX_API ErrorCode MatrixSqrtH(QX_IN DBL2D a, QX_OUT CDB2D out);
/** As MatrixSqrt_head, for complex elements; nothing is dropped. */
QX_API int32_t CxMatrixSqrt_head(QX_INOUT CDB2D a, QX_OUT ErrorCode *err);

/** The principal square root of the square matrix a, whose eigenvalues have no negative real part.
    It is computed through the Schur form, whose triangle is divided recursively into halves; for a
    diagonal matrix, element by element. Elements may have any magnitude: no test uses an absolute
    threshold. Eigenvalues on the negative axis (as in MatrixLn2026_head) have the root with +i; if
    a is real and has none, imaginary parts are 0. The square of the root equals a to about n
    2.2e-16 |root|^2. For a singular a, a root is found unless two zero eigenvalues are coupled in
    the Schur form by more than rounding errors, as in (0, 1; 0, 0), which has no root; roots that
    are not functions of a are not considered. A. Bjorck and S. Hammarling, "A Schur method for the
    square root of a matrix", 1983; E. Deadman, N. J. Higham and R. Ralha, "Blocked Schur algorithms
    for computing the matrix square root", 2012.
    Codes: ErrEmptyInput (a is empty), ErrNotSquare (a is not square), ErrOutOfMemory (no memory, or
    the host refuses the resize), ErrNonFiniteInput (an element is not finite), ErrIterationLimit
    (the eigenvalue iteration did not converge), ErrDegenerateValue (no root was found, or it
    overflows), WarnLowAccuracy (|root|^2 / |a| in Frobenius norms is above 1e8, so that half of the
    digits or more are lost, and a is not triangular).
    NaN: a refused with ErrNonFiniteInput. */
QX_API ErrorCode MatrixSqrt2026_head(QX_IN DBL2D a, QX_OUT CDB2D out);
/** As MatrixSqrt2026_head, for complex elements.
    NaN: a refused with ErrNonFiniteInput. */
QX_API ErrorCode CxMatrixSqrt2026_head(QX_IN CDB2D a, QX_OUT CDB2D out);

/** Replaces the square matrix a by a^power, by repeated squaring. Power 0 gives the identity. A
    negative power is a power of the pseudo-inverse, so a singular matrix is not an error, and
    digits are lost if the norm of a is below 1 (PseudoInverse_head): the cube of the inverse of a
    matrix with condition number 1000 can have a relative error of 2e-6 for elements of 1e-8, and
    has no correct digit for 1e-12. MatrixPower2026_head keeps the digits. Elements that overflow,
    and those computed from them, are infinite or NaN.
    Codes: ErrNotSquare (a is not square), ErrEmptyInput (a is empty), ErrOutOfMemory (no memory),
    ErrNonFiniteInput (power is negative and an element is not finite), ErrIterationLimit (the
    singular value iteration did not converge).
    NaN: a refused with ErrNonFiniteInput or in all results or in no result. */
QX_API ErrorCode MatrixPower_head(QX_INOUT DBL2D a, int32_t power);
/** As MatrixPower_head, for complex elements. */
QX_API ErrorCode CxMatrixPower_head(QX_INOUT CDB2D a, int32_t power);

/** a^power of the square matrix a by repeated squaring; a negative power is a power of the inverse
    by LU factors, for which a is scaled by powers of two, so that the accuracy does not depend on
    the magnitude of its elements. Power 0 gives the identity, even for a singular a. Elements that
    overflow, and those computed from them, are infinite or NaN.
    Codes: ErrEmptyInput (a is empty), ErrNotSquare (a is not square), ErrOutOfMemory (no memory, or
    the host refuses the resize), ErrNonFiniteInput (an element is not finite), ErrSingularMatrix
    (power is negative and a pivot is 0), WarnLowAccuracy (power is negative and the estimated
    reciprocal condition number of a in the 1-norm is below 2.2e-16).
    NaN: a refused with ErrNonFiniteInput. */
QX_API ErrorCode MatrixPower2026_head(QX_IN DBL2D a, int32_t power, QX_OUT DBL2D out);
/** As MatrixPower2026_head, for complex elements.
    NaN: a refused with ErrNonFiniteInput. */
QX_API ErrorCode CxMatrixPower2026_head(QX_IN CDB2D a, int32_t power, QX_OUT CDB2D out);

/** Replaces the m by n matrix a by its pseudo-inverse (E. H. Moore, R. Penrose), n by m: v
    diag(1/s) u^T of its singular value decomposition. Singular values not above *tolerance, an
    absolute value, count as 0; a negative tolerance means max(m, n) s[0] 2.2e-16. Where the norm of
    a is below 1, digits are lost (SVD_head): the relative error is up to about 2.2e-16 times the
    condition number divided by the norm; for a condition number of 1000 it was measured as 2e-9 at
    a norm of 1e-4, 2e-5 at 1e-8 and 0.2 at 1e-12. PseudoInverse2026_head does not lose them. If 1/s
    overflows, elements are infinite or NaN.
    Codes: ErrEmptyInput (a is empty), ErrOutOfMemory (no memory), ErrNonFiniteInput (an element is
    not finite), ErrIterationLimit (the singular value iteration did not converge).
    NaN: a refused with ErrNonFiniteInput; tolerance in no result. */
QX_API int32_t PseudoInverse_head(QX_INOUT DBL2D a, QX_IN const double *tolerance,
                                  QX_OUT ErrorCode *err);
/** As PseudoInverse_head, for complex elements. */
QX_API int32_t CxPseudoInverse_head(QX_INOUT CDB2D a, QX_IN const double *tolerance,
                                    QX_OUT ErrorCode *err);

/** The pseudo-inverse (E. H. Moore, R. Penrose) of the m by n matrix a of any norm, n by m: v
    diag(1/s) u^T of its singular value decomposition. Singular values not above the tolerance, an
    absolute value, count as 0; a tolerance that is negative or NaN means max(m, n) s[0] 2.2e-16.
    The matrix is scaled by a power of two and the result scaled back, so that 2^j a gives the same
    digits as a. The relative error is a few times max(m, n) eps times the condition number. If 1/s
    overflows, elements are infinite or NaN.
    Codes: ErrEmptyInput (a is empty), ErrOutOfMemory (no memory, or the host refuses the resize),
    ErrNonFiniteInput (an element is not finite), ErrIterationLimit (the singular value iteration
    did not converge).
    NaN: a refused with ErrNonFiniteInput; tolerance in no result. */
QX_API ErrorCode PseudoInverse2026_head(QX_IN DBL2D a, double tolerance, QX_OUT DBL2D out);
/** As PseudoInverse2026_head, for complex elements.
    NaN: a refused with ErrNonFiniteInput; tolerance in no result. */
QX_API ErrorCode CxPseudoInverse2026_head(QX_IN CDB2D a, double tolerance, QX_OUT CDB2D out);

QX_END_DECLS

#endif
