#ifndef QX_GENERALISED_PROBLEMS_H
#define QX_GENERALISED_PROBLEMS_H

/* Problems for pairs of matrices: generalised Schur forms, eigenvalues and singular values.

   Matrices are stored row by row. All exports return their code, and every failure empties all
   outputs. A generalised eigenvalue is a number x for which a - x b is singular. It is returned as
   a quotient alpha / beta, which is infinite if beta is 0. */

#include "qx/types.h"

QX_BEGIN_DECLS

/** Generalised Schur form of two square matrices: a = q s z^T and b = q t z^T with orthogonal q and
    z. a becomes s, upper triangular except for 2 by 2 diagonal blocks, one for each pair of
    conjugate eigenvalues, and b becomes t, upper triangular. alpha[i] / beta[i] are the eigenvalues
    in the order of the diagonals. If wantVectors is 0, q and z are empty. order: as Schur80_head.
    Codes: ErrEmptyInput (a or b is empty), ErrNotSquare (a is not square), ErrBandVectorSize (b
    does not have the shape of a), ErrInvalidSelector (order is not 0 to 4), ErrOutOfMemory (no
    memory), ErrNonFiniteInput (an element is not finite), ErrIterationLimit (the iteration did not
    converge), ErrConditionTooHigh (the iteration failed for another reason), ErrSolverCount
    (rounding changed the eigenvalues).
    NaN: a, b refused with ErrNonFiniteInput. */
QX_API ErrorCode QZ80_head(QX_INOUT DBL2D a, QX_INOUT DBL2D b, int32_t wantVectors, int32_t order,
                           QX_OUT DBL2D q, QX_OUT DBL2D z, QX_OUT CDB1D alpha, QX_OUT DBL1D beta);
/** As QZ80_head, for complex elements: a = q s z^H and b = q t z^H with triangular s and t. */
QX_API ErrorCode CxQZ80_head(QX_INOUT CDB2D a, QX_INOUT CDB2D b, int32_t wantVectors, int32_t order,
                             QX_OUT CDB2D q, QX_OUT CDB2D z, QX_OUT CDB1D alpha, QX_OUT CDB1D beta);
/** As QZ80_head, without a choice of the order of the eigenvalues. */
QX_API ErrorCode QZ_head(QX_INOUT DBL2D a, QX_INOUT DBL2D b, int32_t wantVectors, QX_OUT DBL2D q,
                         QX_OUT DBL2D z, QX_OUT CDB1D alpha, QX_OUT DBL1D beta);
/** As QZ_head, for complex elements: a = q s z^H and b = q t z^H with triangular s and t. */
QX_API ErrorCode CxQZ_head(QX_INOUT CDB2D a, QX_INOUT CDB2D b, int32_t wantVectors, QX_OUT CDB2D q,
                           QX_OUT CDB2D z, QX_OUT CDB1D alpha, QX_OUT CDB1D beta);

/** As QZ80_head, always with q and z. The columns of `vectors` are the right eigenvectors, of unit
    length: beta a v = alpha b v. */
QX_API ErrorCode TmiQZ_head(QX_INOUT DBL2D a, QX_INOUT DBL2D b, int32_t order, QX_OUT DBL2D q,
                            QX_OUT DBL2D z, QX_OUT CDB1D alpha, QX_OUT DBL1D beta,
                            QX_OUT CDB2D vectors);
/** As TmiQZ_head, for complex elements. */
QX_API ErrorCode CxTmiQZ_head(QX_INOUT CDB2D a, QX_INOUT CDB2D b, int32_t order, QX_OUT CDB2D q,
                              QX_OUT CDB2D z, QX_OUT CDB1D alpha, QX_OUT CDB1D beta,
                              QX_OUT CDB2D vectors);

/** Generalised eigenvalues of two square matrices, a v = value b v, and eigenvectors. output: as
    EigenValueVector_head. An infinite eigenvalue has an infinite real part. An eigenvalue that is
    undetermined, because alpha and beta are both 0, is NaN.
    Codes: ErrEmptyInput (a or b is empty), ErrNotSquare (a is not square), ErrBandVectorSize (b
    does not have the shape of a), ErrInvalidSelector (output is not 0 or 1), ErrOutOfMemory (no
    memory), ErrNonFiniteInput (an element is not finite), ErrIterationLimit (the iteration did not
    converge), ErrConditionTooHigh (the iteration failed for another reason), ErrSolverCount
    (rounding changed the eigenvalues).
    NaN: a, b refused with ErrNonFiniteInput. */
QX_API ErrorCode GenEigenEx_head(QX_IN DBL2D a, QX_IN DBL2D b, int32_t output, QX_OUT CDB1D values,
                                 QX_OUT CDB2D vectors);
/** As GenEigenEx_head, for complex elements. */
QX_API ErrorCode CxGenEigenEx_head(QX_IN CDB2D a, QX_IN CDB2D b, int32_t output,
                                   QX_OUT CDB1D values, QX_OUT CDB2D vectors);

/** Generalised singular values of a (m by n) and b (p by n): u^T a q = d1 (0 r) and v^T b q = d2 (0
    r) with orthogonal u (m by m), v (p by p) and q (n by n). r is triangular of order *k + *l, the
    rank of a and b together; *l is the rank of b. The first *k + *l elements of alpha and beta
    satisfy alpha^2 + beta^2 = 1. The diagonal of d1 is alpha; that of d2 is beta[*k], beta[*k + 1]
    ... a and b are overwritten with the results of LAPACK's xGGSVD3, whose documentation describes
    where r is stored.
    Codes: ErrEmptyInput (a or b is empty), ErrBandVectorSize (b does not have as many columns as
    a), ErrOutOfMemory (no memory), ErrNonFiniteInput (an element is not finite), ErrIterationLimit
    (the iteration did not converge).
    NaN: a, b refused with ErrNonFiniteInput. */
QX_API ErrorCode GSVD_head(QX_INOUT DBL2D a, QX_INOUT DBL2D b, QX_OUT DBL1D alpha,
                           QX_OUT DBL1D beta, QX_OUT DBL2D u, QX_OUT DBL2D v, QX_OUT DBL2D q,
                           QX_OUT int32_t *k, QX_OUT int32_t *l);
/** As GSVD_head, for complex elements and unitary u, v and q. */
QX_API ErrorCode CxGSVD_head(QX_INOUT CDB2D a, QX_INOUT CDB2D b, QX_OUT DBL1D alpha,
                             QX_OUT DBL1D beta, QX_OUT CDB2D u, QX_OUT CDB2D v, QX_OUT CDB2D q,
                             QX_OUT int32_t *k, QX_OUT int32_t *l);

QX_END_DECLS

#endif
