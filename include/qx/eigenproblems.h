#ifndef QX_EIGENPROBLEMS_H
#define QX_EIGENPROBLEMS_H

/* Eigenvalues and eigenvectors of square matrices, and Schur forms.

   Matrices are stored row by row. Exports with an `err` have the function result 0; the others
   return their code. Every failure empties all outputs. */

#include "qx/types.h"

QX_BEGIN_DECLS

/** Eigenvalues and eigenvectors of the square matrix a. output: 0 no vectors; 1 vectors of unit
    length, in columns. Conjugate pairs are adjacent, the value with positive imaginary part first;
    otherwise the order is that of the iteration. The method is balancing, reduction to Hessenberg
    form and QR iteration: J. H. Wilkinson and C. Reinsch, "Handbook for Automatic Computation",
    volume II, 1971. The values are those of a matrix that differs from the balanced a by a few n
    eps of its norm. Matrices that are graded over the whole range of double can exceed the limit of
    the iteration: random elements that halve from row to row and from column to column do so from
    order 110 on. At order 500 it takes twice as long as LAPACK; EigenValueVector2026_head works on
    blocks and is faster.
    Codes: ErrNotSquare (a is not square), ErrEmptyInput (a is empty), ErrOutOfMemory (no memory),
    ErrInvalidSelector (*output is not 0 or 1), ErrNonFiniteInput (an element is not finite),
    ErrIterationLimit (40 iterations were not enough for a value).
    NaN: a refused with ErrNonFiniteInput. */
QX_API int32_t EigenValueVector_head(QX_IN DBL2D a, QX_IN const int32_t *output,
                                     QX_OUT CDB1D values, QX_OUT CDB2D vectors,
                                     QX_OUT ErrorCode *err);

/** As EigenValueVector_head, for complex elements. matrixType: 0 a general matrix, whose
    eigenvalues do not form conjugate pairs; 1 a Hermitian matrix, of which the lower triangle is
    read: its eigenvalues are real and ascend, and its vectors are orthonormal.
    Codes: ErrNotSquare (a is not square), ErrEmptyInput (a is empty), ErrOutOfMemory (no memory),
    ErrInvalidSelector (*matrixType or *output is not 0 or 1), ErrNonFiniteInput (an element is not
    finite), ErrIterationLimit (40 iterations were not enough for a value, or 100 if Hermitian). */
QX_API int32_t CxEigenValueVector_head(QX_IN CDB2D a, QX_IN const int32_t *matrixType,
                                       QX_IN const int32_t *output, QX_OUT CDB1D values,
                                       QX_OUT CDB2D vectors, QX_OUT ErrorCode *err);

/** As EigenValueVector_head, with a block algorithm from order 160 on, in half the time at order
    500: reduction to Hessenberg form by blocks of reflections, iterations with many shifts and
    early deflation (K. Braman, R. Byers and R. Mathias, "The multishift QR algorithm", 2002), and
    vectors by matrix products; the largest element of a complex vector is real. Below order 160 the
    results are those of EigenValueVector_head, to the bit.
    Codes: ErrNotSquare (a is not square), ErrEmptyInput (a is empty), ErrOutOfMemory (no memory),
    ErrInvalidSelector (*output is not 0 or 1), ErrNonFiniteInput (an element is not finite),
    ErrIterationLimit (30 iterations for each value, or 40 below order 160, were not enough).
    NaN: a refused with ErrNonFiniteInput. */
QX_API int32_t EigenValueVector2026_head(QX_IN DBL2D a, QX_IN const int32_t *output,
                                         QX_OUT CDB1D values, QX_OUT CDB2D vectors,
                                         QX_OUT ErrorCode *err);
/** As CxEigenValueVector_head, with the block algorithms of EigenValueVector2026_head for general
    matrices from order 160 on and of SymEvectorEvalue2026_head for Hermitian matrices from order 64
    on. Below these orders the results are those of CxEigenValueVector_head, to the bit.
    Codes: ErrNotSquare (a is not square), ErrEmptyInput (a is empty), ErrOutOfMemory (no memory),
    ErrInvalidSelector (*matrixType or *output is not 0 or 1), ErrNonFiniteInput (an element is not
    finite), ErrIterationLimit (30 iterations for each value, 40 for a general matrix below order
    160, or 100 for a Hermitian one below 64 were not enough). */
QX_API int32_t CxEigenValueVector2026_head(QX_IN CDB2D a, QX_IN const int32_t *matrixType,
                                           QX_IN const int32_t *output, QX_OUT CDB1D values,
                                           QX_OUT CDB2D vectors, QX_OUT ErrorCode *err);

/** Eigenvalues, in ascending order, of the symmetric matrix whose lower triangle is in a. output: 0
    a is unchanged; 1 a becomes the matrix of orthonormal eigenvectors, one in each column.
    Householder reduction and implicit QL iteration. The error of a value is a few n eps times the
    largest one. At order 500 it takes 3.5 times as long as LAPACK's divide and conquer;
    SymEvectorEvalue2026_head works on blocks and is faster.
    Codes: ErrNotSquare (a is not square), ErrEmptyInput (a is empty), ErrOutOfMemory (no memory),
    ErrInvalidSelector (*output is not 0 or 1), ErrNonFiniteInput (an element is not finite),
    ErrIterationLimit (100 iterations were not enough for a value).
    NaN: a refused with ErrNonFiniteInput. */
QX_API int32_t SymEvectorEvalue_head(QX_INOUT DBL2D a, QX_IN const int32_t *output,
                                     QX_OUT DBL1D values, QX_OUT ErrorCode *err);

/** As SymEvectorEvalue_head, with a block algorithm from order 64 on: reduction to tridiagonal form
    by blocks of reflections, and divide and conquer (M. Gu and S. C. Eisenstat, "A
    divide-and-conquer algorithm for the symmetric tridiagonal eigenproblem", 1995). Below order 64
    the results are those of SymEvectorEvalue_head, to the bit.
    Codes: ErrNotSquare (a is not square), ErrEmptyInput (a is empty), ErrOutOfMemory (no memory),
    ErrInvalidSelector (*output is not 0 or 1), ErrNonFiniteInput (an element is not finite),
    ErrIterationLimit (a value was not found in 100 iterations, or in 30 from order 64 on).
    NaN: a refused with ErrNonFiniteInput. */
QX_API int32_t SymEvectorEvalue2026_head(QX_INOUT DBL2D a, QX_IN const int32_t *output,
                                         QX_OUT DBL1D values, QX_OUT ErrorCode *err);

/** Schur form a = u t u^T of the square matrix a, which becomes t: u is orthogonal and t upper
    triangular except for 2 by 2 diagonal blocks, one for each pair of conjugate eigenvalues. w
    holds the eigenvalues in the order of the diagonal. If wantVectors is 0, u is empty.
    Codes: ErrEmptyInput (a is empty), ErrNotSquare (a is not square), ErrOutOfMemory (no memory),
    ErrNonFiniteInput (an element is not finite), ErrIterationLimit (the iteration did not
    converge).
    NaN: a refused with ErrNonFiniteInput. */
QX_API ErrorCode Schur_head(QX_INOUT DBL2D a, int32_t wantVectors, QX_OUT DBL2D u, QX_OUT CDB1D w);
/** As Schur_head, for complex elements: a = u t u^H with a triangular t. */
QX_API ErrorCode CxSchur_head(QX_INOUT CDB2D a, int32_t wantVectors, QX_OUT CDB2D u,
                              QX_OUT CDB1D w);

/** As Schur_head, with the eigenvalues in order. order: 0 unsorted; 1 with ascending real part; 2
    with descending real part; 3 with ascending modulus; 4 with descending modulus. A pair whose
    imaginary parts are rounding errors becomes two real values. Eigenvalues too close to be
    distinguished may stay out of order, and so may those of graded matrices: exchanges with a pair
    change small eigenvalues after they are compared (of 30 real matrices of order 30, with normal
    random elements times 4^-(i + j), 6 to 10 came out of order). Schur2026_head sorts them again.
    Codes: ErrEmptyInput (a is empty), ErrNotSquare (a is not square), ErrInvalidSelector (order is
    not 0 to 4), ErrOutOfMemory (no memory), ErrNonFiniteInput (an element is not finite),
    ErrIterationLimit (the iteration did not converge). */
QX_API ErrorCode Schur80_head(QX_INOUT DBL2D a, int32_t wantVectors, int32_t order, QX_OUT DBL2D u,
                              QX_OUT CDB1D w);
/** As Schur80_head, for complex elements: a = u t u^H with a triangular t. */
QX_API ErrorCode CxSchur80_head(QX_INOUT CDB2D a, int32_t wantVectors, int32_t order,
                                QX_OUT CDB2D u, QX_OUT CDB1D w);

/** As Schur80_head, with the eigenvalues in w guaranteed to be in order: blocks are sorted, in up
    to 20 rounds, until the eigenvalues as changed by the exchanges are in order. An exchange with a
    pair changes eigenvalues by up to 2.2e-16 times the norm of a, and thus all digits of smaller
    ones. The complex form has no revision, because its exchanges do not change eigenvalues.
    Codes: ErrEmptyInput (a is empty), ErrNotSquare (a is not square), ErrInvalidSelector (order is
    not 0 to 4), ErrOutOfMemory (no memory, or the host refuses a resize), ErrNonFiniteInput (an
    element is not finite), ErrIterationLimit (the iteration did not converge), WarnLowAccuracy
    (blocks too close to be exchanged remain out of order).
    NaN: a refused with ErrNonFiniteInput. */
QX_API ErrorCode Schur2026_head(QX_INOUT DBL2D a, int32_t wantVectors, int32_t order,
                                QX_OUT DBL2D u, QX_OUT CDB1D w);

QX_END_DECLS

#endif
