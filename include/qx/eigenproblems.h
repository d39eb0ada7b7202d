#ifndef QX_EIGENPROBLEMS_H
#define QX_EIGENPROBLEMS_H

/* Eigenvalues and eigenvectors of square matrices, Schur forms, and generalised problems of two
   matrices.

   Matrices stand row after row. Exports with an `err` have the function result 0; the others return
   their code. Every failure empties all outputs. */

#include "qx/types.h"

QX_BEGIN_DECLS

/** Eigenvalues of the square matrix a and eigenvectors. output: 0 no vectors; 1 vectors of unit
   length, in columns. Conjugate pairs stand together, the value with positive imaginary part first;
   otherwise the order is that of the iteration. Balancing, reduction to Hessenberg form and QR
   iteration: J. H. Wilkinson and C. Reinsch, "Handbook for Automatic Computation", volume II, 1971.
   The values are those of a matrix that differs from the balanced a by a few n eps of its norm.
   Matrices that are graded over the whole range of the numbers can pass the limit of the iteration:
   random elements that halve from row to row and from column to column do from order 110 on. At order
   500 it takes twice as long as LAPACK; EigenValueVector2026_head works by blocks. Codes:
   ErrNotSquare (a is not square), ErrEmptyInput (a is empty), ErrOutOfMemory (no memory),
    ErrInvalidSelector (*output is not 0 or 1), ErrNonFiniteInput (an element is not finite),
    ErrIterationLimit (40 iterations were not enough for a value).
    NaN: a refused with ErrNonFiniteInput. */
QX_API int32_t EigenValueVector_head(QX_IN DBL2D a, QX_IN const int32_t *output,
                                     QX_OUT CDB1D values, QX_OUT CDB2D vectors,
                                     QX_OUT ErrorCode *err);

/** As EigenValueVector_head, for complex elements. matrixType: 0 a general matrix, of which
    pairs mean nothing; 1 a Hermitian one, read from its lower triangle, whose values ascend and are
    real, and whose vectors are orthonormal.
    Codes: ErrNotSquare (a is not square), ErrEmptyInput (a is empty), ErrOutOfMemory (no memory),
    ErrInvalidSelector (*matrixType or *output is not 0 or 1), ErrNonFiniteInput (an element is not
    finite), ErrIterationLimit (40 iterations were not enough for a value, or 100 if Hermitian). */
QX_API int32_t CxEigenValueVector_head(QX_IN CDB2D a, QX_IN const int32_t *matrixType,
                                       QX_IN const int32_t *output, QX_OUT CDB1D values,
                                       QX_OUT CDB2D vectors, QX_OUT ErrorCode *err);

/** As EigenValueVector_head, by blocks from order 160 on, in half the time at order 500: reduction to
    Hessenberg form by blocks of reflections, iterations with many shifts and early deflation (K.
    Braman, R. Byers and R. Mathias, "The multishift QR algorithm", 2002), and vectors by products of
    matrices, of which the largest element of a complex one is real. Below that with the bits of
    EigenValueVector_head.
    Codes: ErrNotSquare (a is not square), ErrEmptyInput (a is empty), ErrOutOfMemory (no memory),
    ErrInvalidSelector (*output is not 0 or 1), ErrNonFiniteInput (an element is not finite),
    ErrIterationLimit (30 iterations for each value, or 40 below order 160, were not enough).
    NaN: a refused with ErrNonFiniteInput. */
QX_API int32_t EigenValueVector2026_head(QX_IN DBL2D a, QX_IN const int32_t *output,
                                         QX_OUT CDB1D values, QX_OUT CDB2D vectors,
                                         QX_OUT ErrorCode *err);
/** As CxEigenValueVector_head, for general matrices by blocks from order 160 on as
    EigenValueVector2026_head; Hermitian ones have the bits of CxEigenValueVector_head.
    Codes: ErrNotSquare (a is not square), ErrEmptyInput (a is empty), ErrOutOfMemory (no memory),
    ErrInvalidSelector (*matrixType or *output is not 0 or 1), ErrNonFiniteInput (an element is not
    finite), ErrIterationLimit (30 iterations for each value, 40 below order 160, or 100 if
    Hermitian were not enough). */
QX_API int32_t CxEigenValueVector2026_head(QX_IN CDB2D a, QX_IN const int32_t *matrixType,
                                           QX_IN const int32_t *output, QX_OUT CDB1D values,
                                           QX_OUT CDB2D vectors, QX_OUT ErrorCode *err);

/** Eigenvalues, ascending, of the symmetric matrix whose lower triangle a holds. output: 0 a stays;
   1 a becomes the matrix of orthonormal eigenvectors, one in each column. Householder reduction and
   implicit QL iteration. The error of a value is a few n eps times the largest one. Codes:
   ErrNotSquare (a is not square), ErrEmptyInput (a is empty), ErrOutOfMemory (no memory),
    ErrInvalidSelector (*output is not 0 or 1), ErrNonFiniteInput (an element is not finite),
    ErrIterationLimit (100 iterations were not enough for a value).
    NaN: a refused with ErrNonFiniteInput. */
QX_API int32_t SymEvectorEvalue_head(QX_INOUT DBL2D a, QX_IN const int32_t *output,
                                     QX_OUT DBL1D values, QX_OUT ErrorCode *err);

/** Schur form a = u t u^T of the square matrix a, which becomes t: u is orthogonal and t upper
    triangular but for blocks of two rows, one for each pair of conjugate eigenvalues. w has the
    eigenvalues as they stand along the diagonal. With wantVectors 0 u is empty.
    Codes: ErrEmptyInput (a is empty), ErrNotSquare (a is not square), ErrOutOfMemory (no memory),
    ErrNonFiniteInput (an element is not finite), ErrIterationLimit (the iteration did not
    converge).
    NaN: a refused with ErrNonFiniteInput. */
QX_API ErrorCode Schur_head(QX_INOUT DBL2D a, int32_t wantVectors, QX_OUT DBL2D u, QX_OUT CDB1D w);
/** As Schur_head, for complex elements: a = u t u^H with a triangular t. */
QX_API ErrorCode CxSchur_head(QX_INOUT CDB2D a, int32_t wantVectors, QX_OUT CDB2D u,
                              QX_OUT CDB1D w);

/** As Schur_head, with the eigenvalues in order. order: 0 as they come; 1 with ascending real part;
   2 with descending real part; 3 with ascending modulus; 4 with descending modulus. A pair of which
   the imaginary parts are rounding errors becomes two real values. Eigenvalues too close to be told
   apart may stay out of order, and so may those of graded matrices: exchanges with a pair change
   small eigenvalues after they are compared (of 30 real matrices of order 30, element (i, j) normal
   times 4^-(i + j), 6 to 10 came out of order). Schur2026_head sorts these again. Codes: ErrEmptyInput (a is empty), ErrNotSquare (a is not square),
   ErrInvalidSelector (order is not 0 to 4), ErrOutOfMemory (no memory), ErrNonFiniteInput (an
   element is not finite), ErrIterationLimit (the iteration did not converge). */
QX_API ErrorCode Schur80_head(QX_INOUT DBL2D a, int32_t wantVectors, int32_t order, QX_OUT DBL2D u,
                              QX_OUT CDB1D w);
/** As Schur80_head, for complex elements: a = u t u^H with a triangular t. */
QX_API ErrorCode CxSchur80_head(QX_INOUT CDB2D a, int32_t wantVectors, int32_t order,
                                QX_OUT CDB2D u, QX_OUT CDB1D w);

/** As Schur80_head, with eigenvalues that are in order as w has them: blocks are sorted, by up to 20
    rounds, until what they have become is in order. An exchange with a pair changes eigenvalues
    within 2.2e-16 times the norm of a, and so all digits of those that are smaller. Complex forms
    need no revision: their exchanges change no eigenvalue.
    Codes: ErrEmptyInput (a is empty), ErrNotSquare (a is not square), ErrInvalidSelector (order is
    not 0 to 4), ErrOutOfMemory (no memory, or the host refuses a resize), ErrNonFiniteInput (an
    element is not finite), ErrIterationLimit (the iteration did not converge), WarnLowAccuracy
    (blocks too close to be exchanged stay out of order).
    NaN: a refused with ErrNonFiniteInput. */
QX_API ErrorCode Schur2026_head(QX_INOUT DBL2D a, int32_t wantVectors, int32_t order,
                                QX_OUT DBL2D u, QX_OUT CDB1D w);

QX_END_DECLS

#endif
