#ifndef QX_LINEAR_SYSTEMS_H
#define QX_LINEAR_SYSTEMS_H

/* Linear systems, least squares and inverses.

   Matrices are blocks of rows and columns, stored row by row. The exports with *err have the
   function result 0. They run all their checks and report the last one that fails, so their lists
   of codes begin with it. The exports without *err return the code of the first check that fails. A
   failure empties the outputs. */

#include "qx/matrix_factorisations.h"

QX_BEGIN_DECLS

/** Solves a x = b for a square a by LU factorisation with row exchanges. If the host refuses the
    resize, its own status is the function result. The data are not checked for NaN or infinity.
    Codes: ErrSizeMismatch (b does not have as many elements as a has rows), ErrNotSquare (a is not
    square), ErrEmptyInput (a and b are empty), ErrOutOfMemory (no memory, or the host refused the
    resize), ErrSingularMatrix (a column has no non-zero pivot).
    NaN: a refused with ErrSingularMatrix; b in all results. */
QX_API int32_t EqsByLUDri_head(QX_IN DBL2D a, QX_IN DBL1D b, QX_OUT DBL1D x, QX_OUT ErrorCode *err);
/** As EqsByLUDri_head, for complex data. */
QX_API int32_t CxEqsByLUDri_head(QX_IN CDB2D a, QX_IN CDB1D b, QX_OUT CDB1D x,
                                 QX_OUT ErrorCode *err);

/** Not available: it checks its arguments, sizes x, empties it and fails. Use EqsSetByLU2026_head
    to solve for several right-hand sides.
    Codes: ErrEmptyInput (a or b is empty), ErrNotSquare (a is not square), ErrSizeMismatch (b
    does not have as many rows as a), ErrOutOfMemory (the host refused the resize), ErrNotAvailable
    (always). */
QX_API ErrorCode EqsSetByLUDri_head(QX_IN DBL2D a, QX_IN DBL2D b, QX_OUT DBL2D x);
/** As EqsSetByLUDri_head, for complex data. */
QX_API ErrorCode CxEqsSetByLUDri_head(QX_IN CDB2D a, QX_IN CDB2D b, QX_OUT CDB2D x);

/** Solves a x = b for all columns of b by LU factorisation with row exchanges, for a square matrix
    with elements of any magnitude: a and each column of b are scaled by powers of two, and the
    solutions are scaled back. *reciprocalCondition is 1 / (|a| |a^-1|) in the 1-norm. The second
    factor is an estimate from below, seldom too small by more than a factor of 3 (N. J. Higham,
    "FORTRAN codes for estimating the one-norm of a real or complex matrix", 1988). The relative
    error of x is about 2.2e-16 / *reciprocalCondition, while |b - a x| is a few n eps |a| |x|
    (docs/accuracy/matrix_revisions.md). Elements of x that overflow are infinite.
    Codes: ErrEmptyInput (a or b is empty), ErrNotSquare (a is not square), ErrSizeMismatch (b does
    not have as many rows as a), ErrOutOfMemory (no memory, or the host refused the resize),
    ErrNonFiniteInput (a or b holds NaN or infinity), ErrSingularMatrix (a column has no non-zero
    pivot), WarnLowAccuracy (the reciprocal condition is below 2.2e-16: no digit of x is certain).
    NaN: a, b refused with ErrNonFiniteInput. */
QX_API ErrorCode EqsSetByLU2026_head(QX_IN DBL2D a, QX_IN DBL2D b, QX_OUT DBL2D x,
                                     QX_OUT DBL *reciprocalCondition);
/** As EqsSetByLU2026_head, for complex data.
    NaN: a, b refused with ErrNonFiniteInput. */
QX_API ErrorCode CxEqsSetByLU2026_head(QX_IN CDB2D a, QX_IN CDB2D b, QX_OUT CDB2D x,
                                       QX_OUT DBL *reciprocalCondition);

/** Solves a x = b with the factors and pivots of LU_head; x replaces b. A zero on the diagonal
    gives infinities or NaN.
    Codes: ErrSizeMismatch (pivots or b does not have as many elements as lu has rows), ErrNotSquare
    (lu is not square), ErrEmptyInput (lu, pivots and b are empty), ErrIndexOutOfRange (a pivot is
    not a row of lu).
    NaN: lu in all results or in some results; b in all results. */
QX_API int32_t LULinEqs_head(QX_IN DBL2D lu, QX_IN I32_1D pivots, QX_INOUT DBL1D b,
                             QX_OUT ErrorCode *err);
/** As LULinEqs_head, for complex data. */
QX_API int32_t CxLULinEqs_head(QX_IN CDB2D lu, QX_IN I32_1D pivots, QX_INOUT CDB1D b,
                               QX_OUT ErrorCode *err);

/** Replaces a by its inverse, by LU factorisation.
    Codes: ErrNotSquare (a is not square), ErrEmptyInput (a is empty), ErrOutOfMemory (no memory),
    ErrSingularMatrix (a column has no non-zero pivot).
    NaN: a refused with ErrSingularMatrix. */
QX_API int32_t InvMatrixLUDri_head(QX_INOUT DBL2D a, QX_OUT ErrorCode *err);
/** As InvMatrixLUDri_head, for complex data. */
QX_API int32_t CxInvMatrixLUDri_head(QX_INOUT CDB2D a, QX_OUT ErrorCode *err);

/** Replaces the factors of LU_head by the inverse of the matrix, from the factors and pivots. A
    zero on the diagonal gives infinities or NaN.
    Codes: ErrSizeMismatch (pivots does not have as many elements as lu has rows), ErrNotSquare (lu
    is not square), ErrEmptyInput (lu and pivots are empty), ErrOutOfMemory (no memory),
    ErrIndexOutOfRange (a pivot is not a row of lu).
    NaN: lu in all results or in some results. */
QX_API int32_t LUInvMatrix_head(QX_INOUT DBL2D lu, QX_IN I32_1D pivots, QX_OUT ErrorCode *err);
/** As LUInvMatrix_head, for complex data. */
QX_API int32_t CxLUInvMatrix_head(QX_INOUT CDB2D lu, QX_IN I32_1D pivots, QX_OUT ErrorCode *err);

/** Least-squares solution of smallest norm of a x = b for an m by n matrix, by the singular value
    decomposition. Singular values up to max(m, n) times 2.2e-16 times the largest one count as 0;
    rank deficiency is not reported. Where the norm of a is below 1, digits are lost (SVD_head): the
    relative error of x is up to about 2.2e-16 times the condition number divided by the norm. For a
    condition number of 1000 it was measured as 3e-9 at a norm of 1e-4, 3e-5 at 1e-8 and 0.3 at
    1e-12. GenLinEqs2026_head does not lose them. If the host refuses the resize, its own status is
    the function result.
    Codes: ErrSizeMismatch (b does not have as many elements as a has rows), ErrEmptyInput (a has no
    column, or a and b are empty), ErrOutOfMemory (no memory, or the host refused the resize),
    ErrNonFiniteInput (a or b holds NaN or infinity), ErrIterationLimit (the singular values do not
    converge).
    NaN: a, b refused with ErrNonFiniteInput. */
QX_API int32_t GenLinEqs_head(QX_IN DBL2D a, QX_IN DBL1D b, QX_OUT DBL1D x, QX_OUT ErrorCode *err);
/** As GenLinEqs_head, for complex data. */
QX_API int32_t CxGenLinEqs_head(QX_IN CDB2D a, QX_IN CDB1D b, QX_OUT CDB1D x,
                                QX_OUT ErrorCode *err);

/** As GenLinEqs_head, with `tolerance` in place of 2.2e-16. A tolerance of 0 or below selects
    2.2e-16. The function result is 0 even if the host refuses a resize.
    NaN: a, b refused with ErrNonFiniteInput; tolerance in no result. */
QX_API int32_t GenLinEqs82_head(QX_IN DBL2D a, QX_IN DBL1D b, QX_OUT DBL1D x, double tolerance,
                                QX_OUT ErrorCode *err);
/** As GenLinEqs82_head, for complex data. */
QX_API int32_t CxGenLinEqs82_head(QX_IN CDB2D a, QX_IN CDB1D b, QX_OUT CDB1D x, double tolerance,
                                  QX_OUT ErrorCode *err);

/** Least-squares solution with the method of GenLinEqs82_head, which loses digits at small norms.
    For a condition number of 1000, errors reach 3e-5 at a norm of 1e-8; those of GenLinEqs2026_head
    are at rounding level.
    `work` receives the working memory of the method: with k = min(m, n), k (m + n + 1) + m n + k
    elements, and k m more if m is above 1. It begins with U (m by k) and the singular values of a,
    followed by V (n by k) with each column divided by its singular value, or 0 if that counts as 0.
    Codes: ErrEmptyInput (a or b is empty), ErrSizeMismatch (b does not have as many elements as a
    has rows), ErrOutOfMemory (no memory, or the host refused a resize), ErrNonFiniteInput (a or b
    holds NaN or infinity), ErrIterationLimit (the singular values do not converge).
    NaN: a, b refused with ErrNonFiniteInput; tolerance in no result. */
QX_API ErrorCode GenLinEqs2010_head(QX_IN DBL2D a, QX_IN DBL1D b, QX_OUT DBL1D x, double tolerance,
                                    QX_OUT DBL1D work);

/** As GenLinEqs2010_head, with iterative refinement and m + n more elements in `work`: starting
    from 0, x is improved `refinements` times by the least-squares solution for the residual b - a
    x. Singular values up to the tolerance times the largest one count as 0, without the factor
    max(m, n); only a tolerance below 0 selects 2.2e-16. With 0 refinements GenLinEqs2010_head is
    called, and a negative count leaves x at 0. Otherwise `work` begins with U, the inverse singular
    values (0 for those that count as 0) and V. Each refinement costs up to 6 m n operations. Once x
    repeats an earlier x to the bit, the refinements have become periodic, and whole periods are
    skipped. That happens after a few refinements for small, well-conditioned matrices, but rounding
    errors may keep x moving: for a random matrix of order 30 a million refinements were all carried
    out, in 7 s, so 2^31 would take hours. Refinements restore digits that small norms cost: for a
    condition number of 1000 and a norm of 1e-8 errors were 7e-6 after one, 7e-12 after two and
    9e-14 after five. */
QX_API ErrorCode GenLinEqsbySVD2011_head(QX_IN DBL2D a, QX_IN DBL1D b, QX_OUT DBL1D x,
                                         double tolerance, int32_t refinements, QX_OUT DBL1D work);

/** Least-squares solutions of smallest norm of a x = b for all columns of b, by the method of
    GenLinEqs_head, which loses digits at small norms: for a condition number of 1000, errors reach
    3e-5 at a norm of 1e-8. EqsSetBySVD2026_head does not. Here rank deficiency is reported by the
    code.
    Codes: ErrEmptyInput (a or b is empty), ErrSizeMismatch (b does not have as many rows as a),
    ErrOutOfMemory (no memory, or the host refused the resize), ErrNonFiniteInput (a or b holds NaN
    or infinity), ErrIterationLimit (the singular values do not converge), WarnRankDeficient
    (singular values count as 0; x is valid).
    NaN: a, b refused with ErrNonFiniteInput. */
QX_API ErrorCode EqsSetBySVDDri_head(QX_IN DBL2D a, QX_IN DBL2D b, QX_OUT DBL2D x);
/** As EqsSetBySVDDri_head, for complex data. */
QX_API ErrorCode CxEqsSetBySVDDri_head(QX_IN CDB2D a, QX_IN CDB2D b, QX_OUT CDB2D x);

/** As EqsSetBySVDDri_head, with `tolerance` in place of 2.2e-16. A tolerance of 0 or below selects
    2.2e-16.
    NaN: a, b refused with ErrNonFiniteInput; tolerance in no result. */
QX_API ErrorCode EqsSetBySVDDri82_head(QX_IN DBL2D a, QX_IN DBL2D b, QX_OUT DBL2D x,
                                       double tolerance);
/** As EqsSetBySVDDri82_head, for complex data. */
QX_API ErrorCode CxEqsSetBySVDDri82_head(QX_IN CDB2D a, QX_IN CDB2D b, QX_OUT CDB2D x,
                                         double tolerance);

/** Least-squares solution of smallest norm of a x = b for an m by n matrix of any norm, by the
    singular value decomposition of SVD2026_head. Singular values up to max(m, n) times the
    tolerance times the largest one count as 0; a tolerance that is negative or NaN selects 2.2e-16.
    a and b are scaled by powers of two, and x is scaled back, so that 2^j a gives the same digits
    as a; elements of x that overflow are infinite. The relative error of x is a few n eps times the
    condition number for small residuals, at any norm.
    Codes: ErrEmptyInput (a or b is empty), ErrSizeMismatch (b does not have as many elements as a
    has rows), ErrOutOfMemory (no memory, or the host refused the resize), ErrNonFiniteInput (a or b
    holds NaN or infinity), ErrIterationLimit (the singular values do not converge),
    WarnRankDeficient (singular values count as 0; x is valid).
    NaN: a, b refused with ErrNonFiniteInput; tolerance in no result. */
QX_API ErrorCode GenLinEqs2026_head(QX_IN DBL2D a, QX_IN DBL1D b, QX_OUT DBL1D x, double tolerance);
/** As GenLinEqs2026_head, for complex data.
    NaN: a, b refused with ErrNonFiniteInput; tolerance in no result. */
QX_API ErrorCode CxGenLinEqs2026_head(QX_IN CDB2D a, QX_IN CDB1D b, QX_OUT CDB1D x,
                                      double tolerance);

/** As GenLinEqs2026_head, for all columns of b, each scaled separately.
    Codes: ErrEmptyInput (a or b is empty), ErrSizeMismatch (b does not have as many rows as a),
    ErrOutOfMemory (no memory, or the host refused the resize), ErrNonFiniteInput (a or b holds NaN
    or infinity), ErrIterationLimit (the singular values do not converge), WarnRankDeficient
    (singular values count as 0; x is valid).
    NaN: a, b refused with ErrNonFiniteInput; tolerance in no result. */
QX_API ErrorCode EqsSetBySVD2026_head(QX_IN DBL2D a, QX_IN DBL2D b, QX_OUT DBL2D x,
                                      double tolerance);
/** As EqsSetBySVD2026_head, for complex data.
    NaN: a, b refused with ErrNonFiniteInput; tolerance in no result. */
QX_API ErrorCode CxEqsSetBySVD2026_head(QX_IN CDB2D a, QX_IN CDB2D b, QX_OUT CDB2D x,
                                        double tolerance);

/** Solves a x = b for a positive definite a by Cholesky factorisation. Only the upper triangle of a
    is read.
    Codes: ErrSizeMismatch (b does not have as many elements as a has rows), ErrNotSquare (a is not
    square), ErrEmptyInput (a and b are empty), ErrOutOfMemory (no memory, or the host refused the
    resize), ErrNonFiniteInput (a or b holds NaN or infinity), ErrNotPositiveDefinite (a is not
    positive definite, or nearly singular).
    NaN: a, b refused with ErrNonFiniteInput. */
QX_API int32_t EqsByCholeskyDri_head(QX_IN DBL2D a, QX_IN DBL1D b, QX_OUT DBL1D x,
                                     QX_OUT ErrorCode *err);
/** As EqsByCholeskyDri_head, for a Hermitian matrix. */
QX_API int32_t CxEqsByCholeskyDri_head(QX_IN CDB2D a, QX_IN CDB1D b, QX_OUT CDB1D x,
                                       QX_OUT ErrorCode *err);

/** As EqsByCholeskyDri_head, for all columns of b, from the upper triangle of a if useUpper is not
    0, otherwise from the lower one. The code is the function result.
    Codes: ErrEmptyInput (a or b is empty), ErrNotSquare (a is not square), ErrSizeMismatch (b does
    not have as many rows as a), ErrOutOfMemory (no memory, or the host refused the resize),
    ErrNonFiniteInput (a or b holds NaN or infinity), ErrNotPositiveDefinite (a is not positive
    definite, or nearly singular). */
QX_API ErrorCode EqsSetByCholeskyDri_head(QX_IN DBL2D a, int32_t useUpper, QX_IN DBL2D b,
                                          QX_OUT DBL2D x);
/** As EqsSetByCholeskyDri_head, for a Hermitian matrix. */
QX_API ErrorCode CxEqsSetByCholeskyDri_head(QX_IN CDB2D a, int32_t useUpper, QX_IN CDB2D b,
                                            QX_OUT CDB2D x);

/** Solves L L^T x = b with a packed lower factor of Cholesky_head; x replaces b.
    Codes: ErrNotSquare (the length of packedFactor is not of the form n (n+1) / 2), ErrSizeMismatch
    (b does not have n elements), ErrEmptyInput (packedFactor and b are empty).
    NaN: packedFactor, b in all results. */
QX_API int32_t CholeskyLinEqs_head(QX_IN DBL1D packedFactor, QX_INOUT DBL1D b,
                                   QX_OUT ErrorCode *err);
/** As CholeskyLinEqs_head, for complex data: L L^H x = b. */
QX_API int32_t CxCholeskyLinEqs_head(QX_IN CDB1D packedFactor, QX_INOUT CDB1D b,
                                     QX_OUT ErrorCode *err);

/** Solves a x = b for all columns of b, where a is triangular; the other triangle of a is not read.
    triangle: 0 lower; 1 upper.
    Codes: ErrEmptyInput (a or b is empty), ErrNotSquare (a is not square), ErrSizeMismatch (b does
    not have as many rows as a), ErrInvalidSelector (triangle is neither 0 nor 1), ErrOutOfMemory
    (no memory, or the host refused the resize), ErrNonFiniteInput (the triangle or b holds NaN or
    infinity), ErrSingularMatrix (the modulus of a diagonal element is not above 2.2e-16 times the
    largest modulus of the triangle).
    NaN: a refused with ErrNonFiniteInput or in no result; b refused with ErrNonFiniteInput. */
QX_API ErrorCode TriEqsSetDri_head(QX_IN DBL2D a, int32_t triangle, QX_IN DBL2D b, QX_OUT DBL2D x);
/** As TriEqsSetDri_head, for complex data. */
QX_API ErrorCode CxTriEqsSetDri_head(QX_IN CDB2D a, int32_t triangle, QX_IN CDB2D b,
                                     QX_OUT CDB2D x);

/** As TriEqsSetDri_head, for a packed triangle and one right-hand side; x replaces b. The code is
    in *err.
    Codes: ErrInvalidSelector (triangle is neither 0 nor 1), ErrNotSquare (the length of a is not of
    the form n (n+1) / 2), ErrSizeMismatch (b does not have n elements), ErrEmptyInput (a and b are
    empty), ErrNonFiniteInput (a or b holds NaN or infinity), ErrSingularMatrix (as in
    TriEqsSetDri_head).
    NaN: a.packed, b refused with ErrNonFiniteInput. */
QX_API int32_t TriLinEqs_head(QX_IN const PackedTriangle *a, QX_INOUT DBL1D b,
                              QX_OUT ErrorCode *err);
/** As TriLinEqs_head, for complex data. */
QX_API int32_t CxTriLinEqs_head(QX_IN const CxPackedTriangle *a, QX_INOUT CDB1D b,
                                QX_OUT ErrorCode *err);

/** Solves a x = b for a band matrix a; x replaces b. Row upperBands + i - j, column j of `band`
    holds a(i, j), so row 0 is the topmost diagonal. Through LAPACK.
    Codes: ErrSizesDisagree (band does not have lowerBands + upperBands + 1 rows), ErrBandVectorSize
    (b does not have as many elements as band has columns), ErrEmptyInput (band, or a matrix b, has
    no column), ErrSizesDisagree (a count of bands is below 0, or lowerBands + upperBands + 1 is
    above the order), ErrOutOfMemory (no memory), ErrSingularMatrix (a pivot is 0).
    NaN: band in all results or in no result; b in all results. */
QX_API ErrorCode BandEqsDriH(QX_IN DBL2D band, QX_INOUT DBL1D b, int32_t lowerBands,
                             int32_t upperBands);
/** As BandEqsDriH, for complex data. */
QX_API ErrorCode CxBandEqsDriH(QX_IN CDB2D band, QX_INOUT CDB1D b, int32_t lowerBands,
                               int32_t upperBands);

/** As BandEqsDriH, for all columns of b.
    NaN: band in all results or in no result; b in some results. */
QX_API ErrorCode BandEqsSetDriH(QX_IN DBL2D band, QX_INOUT DBL2D b, int32_t lowerBands,
                                int32_t upperBands);
/** As BandEqsSetDriH, for complex data. */
QX_API ErrorCode CxBandEqsSetDriH(QX_IN CDB2D band, QX_INOUT CDB2D b, int32_t lowerBands,
                                  int32_t upperBands);

/** LU factorisation with row exchanges of a tridiagonal matrix of order n, in place: lower, diag
    and upper receive the multipliers, the diagonal and the first superdiagonal of U. upper2
    receives the second superdiagonal; pivots[i] is the row (counted from 1) that was exchanged with
    row i.
    Codes: ErrFewerThanThree (diag has fewer than 3 elements), ErrSizesDisagree (lower or upper does
    not have n - 1 elements), ErrOutOfMemory (no memory, or the host refused a resize), WarnSingular
    (a pivot is 0; the factors are complete but cannot be used to solve).
    NaN: lower, diag, upper in some results. */
QX_API ErrorCode TriDiagLU_head(QX_INOUT DBL1D lower, QX_INOUT DBL1D diag, QX_INOUT DBL1D upper,
                                QX_OUT DBL1D upper2, QX_OUT I32_1D pivots);

/** Solves a x = b with the factors of TriDiagLU_head, or a^T x = b if `transposed` is not 0; x
    replaces b. A pivot of 0 gives infinities or NaN.
    Codes: ErrFewerThanThree (diag has fewer than 3 elements), ErrSizesDisagree (a factor or b does
    not have the size that belongs to diag), ErrOutOfMemory (no memory), ErrIndexOutOfRange (pivots
    holds a row other than i or i + 1 at step i).
    NaN: lower, diag, upper, upper2 in all results or in some results; b in all results. */
QX_API ErrorCode TriDiagEqsByLU_head(int32_t transposed, QX_IN DBL1D lower, QX_IN DBL1D diag,
                                     QX_IN DBL1D upper, QX_IN DBL1D upper2, QX_IN I32_1D pivots,
                                     QX_INOUT DBL1D b);

/** As TriDiagEqsByLU_head, for all columns of b.
    NaN: lower, diag, upper, upper2 in all results or in some results; b in some results. */
QX_API ErrorCode TriDiagEqsSetByLU_head(int32_t transposed, QX_IN DBL1D lower, QX_IN DBL1D diag,
                                        QX_IN DBL1D upper, QX_IN DBL1D upper2, QX_IN I32_1D pivots,
                                        QX_INOUT DBL2D b);

QX_END_DECLS

#endif
