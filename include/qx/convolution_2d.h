#ifndef QX_CONVOLUTION_2D_H
#define QX_CONVOLUTION_2D_H

/* Convolution and correlation of matrices. The algorithms are those of qx/convolution.h. */

#include "qx/types.h"

QX_BEGIN_DECLS

/** out[r][c] = sum over i and j of x[i][j] y[r - i][c - j]. outputSize: 0 the full result, xRows
    + yRows - 1 by xCols + yCols - 1 values; 1 the size of x, from row yRows / 2 and column yCols
    / 2 of the full result on; 2 the part where y lies wholly within x, xRows - yRows + 1 by xCols -
    yCols + 1 values. algorithm: as CxConvolution.
    Codes: ErrEmptyInput (x or y is empty), ErrInvalidSelector (no such outputSize; as the last
    check, no such algorithm), ErrSizesDisagree (outputSize 2 and y exceeds x), ErrOutOfMemory (the
    host refuses the output, or no memory). The codes up to ErrSizesDisagree leave `out` unchanged;
    the later ones empty it.
    NaN: x, y in all results or in some results. */
QX_API ErrorCode Convolve_2DH(QX_IN DBL2D x, QX_IN DBL2D y, QX_OUT DBL2D out, int32_t outputSize,
                              int32_t algorithm);
/** As Convolve_2DH, for complex data. With outputSize 2, an x or a y with more columns than rows
    always gives ErrSizesDisagree, even if y fits, and empties `out`. */
QX_API ErrorCode CxConvolve_2DH(QX_IN CDB2D x, QX_IN CDB2D y, QX_OUT CDB2D out, int32_t outputSize,
                                int32_t algorithm);

/** The convolution of x, rotated by 180 degrees, with y, in full size. Lag zero is the element in
    row xRows - 1, column xCols - 1. algorithm: as CxConvolution.
    Codes: ErrEmptyInput (x or y is empty; `out` is unchanged), ErrOutOfMemory (the host refuses the
    output, or no memory), ErrInvalidSelector (no such algorithm). Every code but the first empties
    `out`.
    NaN: x, y in all results or in some results. */
QX_API ErrorCode Correlation_2DH(QX_IN DBL2D x, QX_IN DBL2D y, QX_OUT DBL2D out, int32_t algorithm);
/** As Correlation_2DH, for complex data; x is conjugated. */
QX_API ErrorCode CxCorrelation_2DH(QX_IN CDB2D x, QX_IN CDB2D y, QX_OUT CDB2D out,
                                   int32_t algorithm);

QX_END_DECLS

#endif
