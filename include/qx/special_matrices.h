#ifndef QX_SPECIAL_MATRICES_H
#define QX_SPECIAL_MATRICES_H

/* Construction of matrices: of a named kind, from vectors, or from another storage form.

   The exports with *err have the function result 0; the others return the code. A failure empties
   the result. */

#include "qx/matrix_factorisations.h"

QX_BEGIN_DECLS

/** Creates a matrix of a named kind. kind: 0 identity of order *size; 1 diagonal with x; 2 Toeplitz
    with x as first column and y[1], y[2] ... as the rest of the first row (y[0] is not read); 3
    Vandermonde, whose row i is the powers of x[i] from the highest to 1; 4 companion of the
    polynomial with the coefficients x, the leading one first: -x[j+1] / x[0] in the first row, ones
    below the diagonal. Arguments that a kind does not need are ignored.
    Codes: ErrInvalidSelector (*kind is not 0 to 4), ErrEmptyInput (kinds 0 to 3: the size is below
    1), ErrFewerThanTwo (kind 4: x has fewer than 2 elements), ErrOutOfMemory (the host refused
    the resize).
    NaN: x, y in some results or in no result. */
QX_API int32_t SpecialMatrix_head(QX_IN const int32_t *kind, QX_IN const int32_t *size,
                                  QX_IN DBL1D x, QX_IN DBL1D y, QX_OUT DBL2D out,
                                  QX_OUT ErrorCode *err);
/** As SpecialMatrix_head, for complex data. */
QX_API int32_t CxSpecialMatrix_head(QX_IN const int32_t *kind, QX_IN const int32_t *size,
                                    QX_IN CDB1D x, QX_IN CDB1D y, QX_OUT CDB2D out,
                                    QX_OUT ErrorCode *err);

/** out[i][j] = x[i] y[j].
    Codes: ErrEmptyInput (x or y is empty), ErrOutOfMemory (the host refused the resize).
    NaN: x, y in some results. */
QX_API int32_t OuterProd_head(QX_IN DBL1D x, QX_IN DBL1D y, QX_OUT DBL2D out,
                              QX_OUT ErrorCode *err);
/** As OuterProd_head, for complex data; nothing is conjugated. */
QX_API int32_t OuterProdCx_head(QX_IN CDB1D x, QX_IN CDB1D y, QX_OUT CDB2D out,
                                QX_OUT ErrorCode *err);

/** Kronecker product: the block in place of a[i][j] is a[i][j] b.
    Codes: ErrEmptyInput (a or b is empty), ErrOutOfMemory (the host refused the resize, or out
    would have more than 2^31 - 1 rows or columns).
    NaN: a, b in some results. */
QX_API ErrorCode KroneckerProd_H(QX_IN DBL2D a, QX_IN DBL2D b, QX_OUT DBL2D out);
/** As KroneckerProd_H, for complex data. */
QX_API ErrorCode CxKroneckerProd_H(QX_IN CDB2D a, QX_IN CDB2D b, QX_OUT CDB2D out);

/** Unpacks a packed triangle into a full square matrix. For triangle 0 and 1 the other triangle is
    0; for 2 it is the mirror image. With any other value of triangle out is unchanged and the code
    is 0.
    Codes: ErrEmptyInput (packed is empty), ErrNotSquare (its length is not of the form n (n+1) /
    2), ErrOutOfMemory (the host refused the resize).
    NaN: a.packed in some results. */
QX_API int32_t Compact_to_Matrix_head(QX_IN const PackedTriangle *a, QX_OUT DBL2D out,
                                      QX_OUT ErrorCode *err);
/** As Compact_to_Matrix_head, for complex data; the mirror image is not conjugated. */
QX_API int32_t CxCompact_to_Matrix_head(QX_IN const CxPackedTriangle *a, QX_OUT CDB2D out,
                                        QX_OUT ErrorCode *err);

/** Packs a triangle of a square matrix. triangle: 0 lower; 1 upper; 2 symmetric, which packs the
    lower triangle.
    Codes: ErrEmptyInput (a is empty), ErrNotSquare (a is not square), ErrInvalidSelector
    (*triangle is not 0, 1 or 2), ErrOutOfMemory (the host refused the resize, or the packed length
    exceeds 2^31 - 1).
    NaN: a in some results or in no result. */
QX_API int32_t Matrix_to_Compact_head(QX_IN DBL2D a, QX_IN const int32_t *triangle,
                                      QX_OUT DBL1D packed, QX_OUT ErrorCode *err);
/** As Matrix_to_Compact_head, for complex data. */
QX_API int32_t CxMatrix_to_Compact_head(QX_IN CDB2D a, QX_IN const int32_t *triangle,
                                        QX_OUT CDB1D packed, QX_OUT ErrorCode *err);

/** Unpacks a symmetric matrix in packed storage, as returned by fits, into a full square matrix.
    Codes: ErrEmptyInput (packed is empty), ErrNotSquare (its length is not of the form n (n+1) /
    2), ErrOutOfMemory (the host refused the resize).
    NaN: packed in some results. */
QX_API ErrorCode CompactToMatrix_H(QX_IN DBL1D packed, QX_OUT DBL2D out);

/** Packs the lower triangle of a square matrix, as fits expect it.
    Codes: ErrEmptyInput (a is empty), ErrNotSquare (a is not square), ErrOutOfMemory (the host
    refused the resize, or the packed length exceeds 2^31 - 1).
    NaN: a in some results or in no result. */
QX_API ErrorCode MatrixToCompact_H(QX_IN DBL2D a, QX_OUT DBL1D packed);

/** Transpose.
    Codes: ErrEmptyInput (a is empty), ErrOutOfMemory (no memory, or the host refused the
    resize).
    NaN: a in some results. */
QX_API ErrorCode Transpose_head(QX_IN DBL2D a, QX_OUT DBL2D out);

/** As Transpose_head, for complex data, without conjugation and with the code in *err. */
QX_API int32_t CxTranspose_head(QX_IN CDB2D a, QX_OUT CDB2D out, QX_OUT ErrorCode *err);

/** Creates a matrix of zeros. The memory is first allocated on trial, before the host is asked for
    it.
    Codes: ErrEmptyInput (rows or cols is below 1), ErrOutOfMemory (no memory, or the host refused
    the resize). */
QX_API ErrorCode InitialMatrixH(int32_t rows, int32_t cols, QX_OUT DBL2D out);
/** As InitialMatrixH, for complex data. */
QX_API ErrorCode CxInitialMatrixH(int32_t rows, int32_t cols, QX_OUT CDB2D out);

/** A full symmetric matrix with the given eigenvalues: Q diag(values) Q with the reflection Q = 1
    - (2/n) e e^T, e being all ones.
    Codes: ErrEmptyInput (values is empty), ErrOutOfMemory (the host refused the resize).
    NaN: values in all results. */
QX_API int32_t CreateMatrixFromEVs_head(QX_IN DBL1D values, QX_OUT DBL2D out,
                                        QX_OUT ErrorCode *err);

/** Correlation matrix of order maxLag + 1, out[i][j] = r(i - j): r(k) is the sum over i of x[i +
    k] conj(y[i]) where both exist, normalized. normalization: as Rxy80. With y = x it is the
    autocorrelation matrix, symmetric or Hermitian.
    Codes: ErrEmptyInput (x or y is empty), ErrSizeMismatch (the lengths differ), ErrIndexOutOfRange
    (maxLag is below 0 or not below n), ErrInvalidSelector (normalization is not 0, 1 or 2),
    ErrOutOfMemory (no memory, or the host refused the resize).
    NaN: x, y in some results. */
QX_API ErrorCode AutoCorrMtrxH(QX_IN DBL1D x, QX_IN DBL1D y, int32_t maxLag, int32_t normalization,
                               QX_OUT DBL2D out);
/** As AutoCorrMtrxH, for complex data. */
QX_API ErrorCode CxAutoCorrMtrxH(QX_IN CDB1D x, QX_IN CDB1D y, int32_t maxLag,
                                 int32_t normalization, QX_OUT CDB2D out);

QX_END_DECLS

#endif
