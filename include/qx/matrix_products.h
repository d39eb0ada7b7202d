#ifndef QX_MATRIX_PRODUCTS_H
#define QX_MATRIX_PRODUCTS_H

/* Products of matrices and vectors.

   Matrices are blocks of rows and columns, stored row by row. The code is in *err. If the host
   refuses a resize, *err is ErrOutOfMemory and the function result is the host's own status;
   otherwise the function result is 0. A failure empties the result.

   If `alignedCopy` is not 0, the operands are first copied into new blocks; otherwise the export
   works on the host's blocks. Both give the same values. */

#include "qx/types.h"

QX_BEGIN_DECLS

/** Matrix product c = a b, where a is m by k and b is k by n. If k is 0, every element of c is NaN;
    if m or n is 0, c is empty. The terms a_ip b_pj of an element are added in ascending order of p,
    each rounded once as a product and once in the sum.
    Codes: ErrInnerDimensionMismatch (a does not have as many columns as b has rows),
    ErrNegativeDimension (a size is below 0), ErrOutOfMemory (no memory, or the host refused the
    resize).
    NaN: a, b in some results. */
QX_API int32_t MatrixMulAligned_head(QX_IN DBL2D a, QX_IN DBL2D b, QX_OUT DBL2D c,
                                     int32_t alignedCopy, QX_OUT ErrorCode *err);
/** As MatrixMulAligned_head, with alignedCopy 0. */
QX_API int32_t MatrixMul_head(QX_IN DBL2D a, QX_IN DBL2D b, QX_OUT DBL2D c, QX_OUT ErrorCode *err);
/** As MatrixMulAligned_head, for complex data. */
QX_API int32_t AxBCxAlignedCIN(QX_IN CDB2D a, QX_IN CDB2D b, QX_OUT CDB2D c, int32_t alignedCopy,
                               QX_OUT ErrorCode *err);
/** As AxBCxAlignedCIN, with alignedCopy 0. */
QX_API int32_t AxBCxCIN(QX_IN CDB2D a, QX_IN CDB2D b, QX_OUT CDB2D c, QX_OUT ErrorCode *err);

/** y = a x, where a is a matrix and x a vector, with one sum per row, from the first column to the
    last. An empty a or x gives an empty y. alignedCopy has no effect.
    Codes: ErrNegativeDimension (a size is below 0), ErrInnerDimensionMismatch (a does not have as
    many columns as x has elements), ErrOutOfMemory (the host refused the resize).
    NaN: a in some results; x in all results. */
QX_API int32_t AxVectAligned_head(QX_IN DBL2D a, QX_IN DBL1D x, QX_OUT DBL1D y, int32_t alignedCopy,
                                  QX_OUT ErrorCode *err);
/** As AxVectAligned_head, with alignedCopy 0. */
QX_API int32_t AxVect_head(QX_IN DBL2D a, QX_IN DBL1D x, QX_OUT DBL1D y, QX_OUT ErrorCode *err);
/** As AxVectAligned_head, for complex data. */
QX_API int32_t AxVectorCxAligned(QX_IN CDB2D a, QX_IN CDB1D x, QX_OUT CDB1D y, int32_t alignedCopy,
                                 QX_OUT ErrorCode *err);
/** As AxVectorCxAligned, with alignedCopy 0. */
QX_API int32_t AxVectorCx(QX_IN CDB2D a, QX_IN CDB1D x, QX_OUT CDB1D y, QX_OUT ErrorCode *err);

/** y = x a, with x as a matrix of one row, computed as a matrix product.
    Codes: ErrInnerDimensionMismatch (x does not have as many elements as a has rows),
    ErrNegativeDimension (a size is below 0), ErrOutOfMemory (no memory, or the host refused the
    resize).
    NaN: x in all results; a in some results. */
QX_API int32_t vectxAAligned_head(QX_IN DBL1D x, QX_IN DBL2D a, QX_OUT DBL1D y, int32_t alignedCopy,
                                  QX_OUT ErrorCode *err);
/** As vectxAAligned_head, with alignedCopy 0. */
QX_API int32_t vectxA_head(QX_IN DBL1D x, QX_IN DBL2D a, QX_OUT DBL1D y, QX_OUT ErrorCode *err);
/** As vectxAAligned_head, for complex data. */
QX_API int32_t CxVectxAAligned_head(QX_IN CDB1D x, QX_IN CDB2D a, QX_OUT CDB1D y,
                                    int32_t alignedCopy, QX_OUT ErrorCode *err);
/** As CxVectxAAligned_head, with alignedCopy 0. */
QX_API int32_t CxVectxA_head(QX_IN CDB1D x, QX_IN CDB2D a, QX_OUT CDB1D y, QX_OUT ErrorCode *err);

QX_END_DECLS

#endif
