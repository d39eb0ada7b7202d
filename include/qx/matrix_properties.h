#ifndef QX_MATRIX_PROPERTIES_H
#define QX_MATRIX_PROPERTIES_H

/* Numbers that describe matrices and vectors, and tests of matrices.

   The exports with *err have the function result 0; the others return the code. A failure sets a
   numeric result to NaN, an integer to 0 and empties arrays, unless noted. */

#include "qx/matrix_factorisations.h"

QX_BEGIN_DECLS

/** Determinant of a square matrix. matrixType: 0 general (LU); 1 positive definite (Cholesky, of
    which the lower triangle is read); 2 lower triangular; 3 upper triangular (the product of the
    diagonal). One of order 2 is computed by the formula whatever the type. That of a singular
    matrix is 0 where the elimination meets an exact zero. Products that overflow make it infinite
    or NaN.
    Codes: ErrNotSquare (a is not square), ErrEmptyInput (a is empty), ErrInvalidSelector
    (*matrixType is not 0 to 3), ErrNonFiniteInput (a holds NaN or infinity), ErrOutOfMemory (no
    memory), ErrNotPositiveDefinite (*matrixType is 1, the order is not 2, and a is not positive
    definite, or nearly not).
    NaN: a refused with ErrNonFiniteInput. */
QX_API int32_t Determinant_head(QX_IN DBL2D a, QX_IN const int32_t *matrixType, QX_OUT DBL *det,
                                QX_OUT ErrorCode *err);
/** As Determinant_head, for complex data. */
QX_API int32_t CxDeterminant_head(QX_IN CDB2D a, QX_IN const int32_t *matrixType, QX_OUT CDB *det,
                                  QX_OUT ErrorCode *err);

/** Numerical rank: the number of singular values above *tolerance, which is max(m, n) times the
    largest one times 2.2e-16 if negative. Where the norm of a is below 1, values that should vanish
    are up to 2.2e-16 (SVD_head), which the default takes for rank: of 500 matrices of order 8 and
    rank 4 it counts wrong in 41 at a norm of 0.01, 208 at 1e-6 and 463 at 1e-12 (measured);
    Rank2026_head does not. A largest value that overflows gives rank 0 then. A failure leaves -1.
    Codes: ErrEmptyInput (a is empty), ErrNonFiniteInput (a holds NaN or infinity), ErrOutOfMemory
    (no memory), ErrIterationLimit (the singular values do not converge).
    NaN: a refused with ErrNonFiniteInput; tolerance in no result. */
QX_API int32_t Rank_head(QX_IN DBL2D a, QX_IN const double *tolerance, QX_OUT int32_t *rank,
                         QX_OUT ErrorCode *err);
/** As Rank_head, for complex data. */
QX_API int32_t CxRank_head(QX_IN CDB2D a, QX_IN const double *tolerance, QX_OUT int32_t *rank,
                           QX_OUT ErrorCode *err);

/** Condition number. normType: 0 the quotient of the largest and the smallest singular value, of
    any matrix; 1 to 3 the norm of a square matrix (as in Norm_head) times that of its inverse.
    Infinity for a singular matrix, which is no failure, and where the number overflows. Type 0
    loses digits where the norm of a is far below 1 (SVD_head): for a condition number of 1000 it is
    off by 6e-9 at a norm of 1e-8, 5e-4 at 1e-10 and 8e-2 at 1e-12 (measured); CondNumber2026_head
    keeps them.
    Codes: ErrEmptyInput (a is empty), ErrNonFiniteInput (a holds NaN or infinity),
    ErrInvalidSelector (*normType is not 0 to 3), ErrNotSquare (a is not square, of types 1 to 3),
    ErrOutOfMemory (no memory), ErrIterationLimit (the singular values do not converge).
    NaN: a refused with ErrNonFiniteInput. */
QX_API int32_t CondNumber_head(QX_IN DBL2D a, QX_IN const int32_t *normType, QX_OUT DBL *cond,
                               QX_OUT ErrorCode *err);
/** As CondNumber_head, for complex data. */
QX_API int32_t CxCondNumber_head(QX_IN CDB2D a, QX_IN const int32_t *normType, QX_OUT DBL *cond,
                                 QX_OUT ErrorCode *err);

/** Norm of a matrix. normType: 0 the largest singular value; 1 the largest column sum of moduli; 2
    the root of the sum of squares (Frobenius); 3 the largest row sum of moduli. Sums that overflow
    give infinity, those of squares from elements of about 1e154 on; squares of elements below
    1e-162 vanish. Type 0 loses digits where the norm is far below 1 (SVD_head): 7e-10 of it at
    1e-10, 3e-7 at 1e-12 and 5e-3 at 1e-14 (measured). Norm2026_head has neither fault.
    Codes: ErrEmptyInput (a is empty), ErrNonFiniteInput (a holds NaN or infinity),
    ErrInvalidSelector (*normType is not 0 to 3), ErrOutOfMemory (no memory), ErrIterationLimit (the
    singular values do not converge).
    NaN: a refused with ErrNonFiniteInput. */
QX_API int32_t Norm_head(QX_IN DBL2D a, QX_IN const int32_t *normType, QX_OUT DBL *norm,
                         QX_OUT ErrorCode *err);
/** As Norm_head, for complex data. */
QX_API int32_t CxNorm_head(QX_IN CDB2D a, QX_IN const int32_t *normType, QX_OUT DBL *norm,
                           QX_OUT ErrorCode *err);

/** Numerical rank of a matrix of any norm: the number of singular values above the tolerance, which
    is max(m, n) times the largest one times 2.2e-16 if negative or NaN. The values are those of
    SVDS2026_head; one that overflows is above any tolerance.
    Codes: ErrEmptyInput (a is empty), ErrNonFiniteInput (a holds NaN or infinity), ErrOutOfMemory
    (no memory), ErrIterationLimit (the singular values do not converge).
    NaN: a refused with ErrNonFiniteInput; tolerance in no result. */
QX_API ErrorCode Rank2026_head(QX_IN DBL2D a, double tolerance, QX_OUT int32_t *rank);
/** As Rank2026_head, for complex data.
    NaN: a refused with ErrNonFiniteInput; tolerance in no result. */
QX_API ErrorCode CxRank2026_head(QX_IN CDB2D a, double tolerance, QX_OUT int32_t *rank);

/** Condition number of a matrix of any norm. normType: 0 the quotient of the largest and the
    smallest singular value, of any matrix; 1 the largest column sum of moduli of a square matrix
    times that of its inverse; 2 the same with the Frobenius norm; 3 the same with the largest row
    sum. The matrix is scaled by a power of two first, which changes no condition number. Infinity
    for a singular matrix, which is no failure, and where the number overflows. The relative error
    is about the number itself times 2.2e-16.
    Codes: ErrEmptyInput (a is empty), ErrNonFiniteInput (a holds NaN or infinity),
    ErrInvalidSelector (normType is not 0 to 3), ErrNotSquare (a is not square, of types 1 to 3),
    ErrOutOfMemory (no memory), ErrIterationLimit (the singular values do not converge).
    NaN: a refused with ErrNonFiniteInput. */
QX_API ErrorCode CondNumber2026_head(QX_IN DBL2D a, int32_t normType, QX_OUT DBL *cond);
/** As CondNumber2026_head, for complex data.
    NaN: a refused with ErrNonFiniteInput. */
QX_API ErrorCode CxCondNumber2026_head(QX_IN CDB2D a, int32_t normType, QX_OUT DBL *cond);

/** Norm of a matrix. normType: 0 the largest singular value; 1 the largest column sum of moduli; 2
    the root of the sum of squares (Frobenius); 3 the largest row sum of moduli. The matrix is
    scaled by a power of two first, so that only a norm that overflows itself is infinite. The
    relative error is a few times max(m, n) eps.
    Codes: ErrEmptyInput (a is empty), ErrNonFiniteInput (a holds NaN or infinity),
    ErrInvalidSelector (normType is not 0 to 3), ErrOutOfMemory (no memory), ErrIterationLimit (the
    singular values do not converge).
    NaN: a refused with ErrNonFiniteInput. */
QX_API ErrorCode Norm2026_head(QX_IN DBL2D a, int32_t normType, QX_OUT DBL *norm);
/** As Norm2026_head, for complex data.
    NaN: a refused with ErrNonFiniteInput. */
QX_API ErrorCode CxNorm2026_head(QX_IN CDB2D a, int32_t normType, QX_OUT DBL *norm);

/** Sum of the diagonal of a square matrix.
    Codes: ErrNotSquare (a is not square), ErrEmptyInput (a is empty).
    NaN: a in all results or in no result. */
QX_API int32_t Trace_head(QX_IN DBL2D a, QX_OUT DBL *trace, QX_OUT ErrorCode *err);
/** As Trace_head, for complex data. */
QX_API int32_t CxTrace_head(QX_IN CDB2D a, QX_OUT CDB *trace, QX_OUT ErrorCode *err);

/** Sum of x[i] y[i], in ascending order.
    Codes: ErrSizeMismatch (the lengths differ), ErrEmptyInput (x and y are empty).
    NaN: x, y in all results. */
QX_API int32_t DotProduct_head(QX_IN DBL1D x, QX_IN DBL1D y, QX_OUT DBL *dot,
                               QX_OUT ErrorCode *err);
/** As DotProduct_head, for complex data; nothing is conjugated. */
QX_API int32_t DotprodCx(QX_IN CDB1D x, QX_IN CDB1D y, QX_OUT CDB *dot, QX_OUT ErrorCode *err);

/** p-norm (sum of |x[i]|^p)^(1/p), also for negative p; the largest |x[i]| for p = +infinity, the
    smallest for p = -infinity. NaN if x holds NaN, whatever p. Sums and powers that overflow give
    infinity, squares from elements of about 1e154 on; squares of elements below 1e-162 vanish.
    Codes: ErrEmptyInput (x is empty), ErrNonFiniteInput (p is NaN), ErrTooFewWeights (p is 0).
    NaN: x in all results; p refused with ErrNonFiniteInput. */
QX_API ErrorCode vectorNormH(QX_IN DBL1D x, double p, QX_OUT DBL *norm);
/** As vectorNormH, for complex data. */
QX_API ErrorCode CxVectorNormH(QX_IN CDB1D x, double p, QX_OUT DBL *norm);

/** Scales x to the 2-norm 1 and gives its former norm. A norm of 0 or infinity leaves x as it is.
    Codes: ErrEmptyInput (x is empty).
    NaN: x in some results. */
QX_API int32_t unitVector_head(QX_INOUT DBL1D x, QX_OUT DBL *norm, QX_OUT ErrorCode *err);
/** As unitVector_head, for complex data. */
QX_API int32_t CxUnitVector_head(QX_INOUT CDB1D x, QX_OUT DBL *norm, QX_OUT ErrorCode *err);

/** As unitVector_head, for the p-norm of vectorNormH.
    Codes: ErrEmptyInput (x is empty), ErrNonFiniteInput (p is NaN), ErrTooFewWeights (p is 0).
    NaN: x in some results; p refused with ErrNonFiniteInput. */
QX_API int32_t unitVector80_head(QX_INOUT DBL1D x, double p, QX_OUT DBL *norm,
                                 QX_OUT ErrorCode *err);
/** As unitVector80_head, for complex data. */
QX_API int32_t CxUnitVector80_head(QX_INOUT CDB1D x, double p, QX_OUT DBL *norm,
                                   QX_OUT ErrorCode *err);

/** Whether |a[i][j] - a[j][i]| is nowhere above a limit: the tolerance, or 0 if that is negative;
    with `relative` not 0 the order of a times the tolerance times the largest |a[i][j]|, with
    2.2e-16 for a negative tolerance.
    Codes: ErrEmptyInput (a is empty), ErrNotSquare (a is not square), ErrNonFiniteInput (a holds
    NaN or infinity).
    NaN: a refused with ErrNonFiniteInput; tolerance in no result. */
QX_API ErrorCode CheckSym_head(QX_IN DBL2D a, double tolerance, int32_t relative,
                               QX_OUT int32_t *isSymmetric);

/** As CheckSym_head, for complex data; with `hermitian` not 0 elements are compared with the
    conjugate of their mirror image, those of the diagonal with their own. */
QX_API ErrorCode CxCheckSym_head(QX_IN CDB2D a, double tolerance, int32_t relative,
                                 int32_t hermitian, QX_OUT int32_t *isSymmetric);

/** Whether a is positive definite: exactly symmetric, with all eigenvalues above 2.2e-16 times the
    largest modulus of them.
    Codes: ErrNotSquare (a is not square), ErrEmptyInput (a is empty), ErrNonFiniteInput (a is
    symmetric and holds infinity), ErrOutOfMemory (no memory), ErrIterationLimit (the eigenvalues do
    not converge).
    NaN: a refused with ErrNonFiniteInput or in no result. */
QX_API int32_t CheckPosdef_head(QX_IN DBL2D a, QX_OUT int32_t *isPositiveDefinite,
                                QX_OUT ErrorCode *err);
/** As CheckPosdef_head, for complex data: exactly Hermitian.
    NaN: a in no result. */
QX_API int32_t CxCheckPosdef_head(QX_IN CDB2D a, QX_OUT int32_t *isPositiveDefinite,
                                  QX_OUT ErrorCode *err);

/** Whether a is positive semi-definite, and its rank, by symmetric elimination that takes the
    largest diagonal element first. With t the tolerance (2.2e-16 times the order of a if negative)
    times the largest diagonal element: a must be symmetric within t, no diagonal element that is
    left may be below -t, and once none is above t all that is left must vanish within t. rank is
    -1 where the answer is 0, and after a failure.
    Codes: ErrEmptyInput (a is empty), ErrNotSquare (a is not square), ErrNonFiniteInput (a holds
    NaN or infinity), ErrOutOfMemory (no memory).
    NaN: a refused with ErrNonFiniteInput; tolerance in no result. */
QX_API ErrorCode CheckPosSemiDef_head(QX_IN DBL2D a, double tolerance,
                                      QX_OUT int32_t *isSemiDefinite, QX_OUT int32_t *rank);
/** As CheckPosSemiDef_head, for complex data: Hermitian within t. */
QX_API ErrorCode CxCheckPosSemiDef_head(QX_IN CDB2D a, double tolerance,
                                        QX_OUT int32_t *isSemiDefinite, QX_OUT int32_t *rank);

/** Coefficients of det(t - a), ascending: poly has one element more than a has rows, the last one
    is 1. They are multiplied up from the eigenvalues.
    Codes: ErrNotSquare (a is not square), ErrEmptyInput (a is empty), ErrOutOfMemory (no memory, or
    the host refused the resize), ErrNonFiniteInput (a holds NaN or infinity), ErrIterationLimit
    (the eigenvalues do not converge), ErrOverflow (a coefficient overflows).
    NaN: a refused with ErrNonFiniteInput. */
QX_API int32_t MatrixCharacteristicPoly_head(QX_IN DBL2D a, QX_OUT DBL1D poly,
                                             QX_OUT ErrorCode *err);
/** As MatrixCharacteristicPoly_head, for complex data. */
QX_API int32_t CxMatrixCharacteristicPoly_head(QX_IN CDB2D a, QX_OUT CDB1D poly,
                                               QX_OUT ErrorCode *err);

QX_END_DECLS

#endif
