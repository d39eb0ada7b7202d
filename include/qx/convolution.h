#ifndef QX_CONVOLUTION_H
#define QX_CONVOLUTION_H

/* Linear convolution, correlation and deconvolution of sequences and of matrices.

   The caller chooses the algorithm; it never depends on the sizes. algorithm: 0 direct summation; 1
   transforms. Direct summation is exact up to the rounding of each sum, and infinities and NaN
   affect only the outputs that depend on them. Transforms take time proportional to n log n and
   leave an error relative to the largest value.

   Correlations are normalized. normalization: 0 none; 1 unbiased (each lag divided by the number of
   its terms); 2 biased (all divided by the greater length). */

#include "qx/types.h"

QX_BEGIN_DECLS

/** out[t] = sum over i of x[i] y[t - i], nx + ny - 1 values. The code is in *err. Any other
    algorithm leaves the elements of `out` as they are, with code 0.
    Codes: ErrEmptyInput (x or y is empty), ErrOutOfMemory (the host refuses the output, or no
    memory). A failure empties `out`.
    NaN: x, y in all results or in some results. */
QX_API int32_t Convolution(QX_IN DBL1D x, QX_IN DBL1D y, QX_OUT DBL1D out,
                           QX_IN const int32_t *algorithm, QX_OUT ErrorCode *err);

/** Complex convolution or, with `correlate` non-zero, correlation: out[t] = sum over i of
    conj(x[nx - 1 - i]) y[t - i], element nx - 1 being lag zero, normalized as selected. Convolution
    ignores the normalization.
    Codes: ErrEmptyInput (x or y is empty; `out` is unchanged), the host's status (it refuses the
    output), ErrInvalidSelector (no such normalization of a correlation, or no such algorithm),
    ErrOutOfMemory (no memory). Every code but the first empties `out`.
    NaN: x, y in all results or in some results. */
QX_API ErrorCode CxConvolution(QX_IN CDB1D x, QX_IN CDB1D y, QX_OUT CDB1D out, int32_t algorithm,
                               int32_t correlate, int32_t normalization);

/** Cross-correlation: out[t] = sum over j of x[nx - 1 - t + j] y[j], nx + ny - 1 values, element
    nx - 1 being lag zero. The code is in *err. Any other algorithm leaves the elements of `out` as
    they are, apart from the normalization. If x and y are the same array, two transforms are
    computed instead of three.
    Codes: ErrEmptyInput (x or y is empty), ErrOutOfMemory (the host refuses the output, or no
    memory), ErrInvalidSelector (no such normalization). A failure empties `out`.
    NaN: x, y in all results or in some results. */
QX_API int32_t Rxy80(QX_IN DBL1D x, QX_IN DBL1D y, QX_OUT DBL1D out, QX_IN const int32_t *algorithm,
                     int32_t normalization, QX_OUT ErrorCode *err);
/** As Rxy80, without a normalization.
    Codes: ErrEmptyInput (x or y is empty), ErrOutOfMemory (the host refuses the output, or no
    memory). A failure empties `out`. */
QX_API int32_t Rxy(QX_IN DBL1D x, QX_IN DBL1D y, QX_OUT DBL1D out, QX_IN const int32_t *algorithm,
                   QX_OUT ErrorCode *err);

/** Replaces x by its autocorrelation, 2 n - 1 values with lag zero in the middle, always by
    transforms. The code is in *err. x is never emptied: if the host refuses the larger size, the
    call succeeds, the size field is the new one, and only as much of the result is written as fits
    into the block of n values.
    Codes: ErrEmptyInput (x is empty), ErrOutOfMemory (no memory), ErrInvalidSelector (no such
    normalization; the result is returned without normalization).
    NaN: x in all results. */
QX_API int32_t AutoCorrelation80(QX_INOUT DBL1D x, int32_t normalization, QX_OUT ErrorCode *err);
/** As AutoCorrelation80, without a normalization.
    Codes: ErrEmptyInput (x is empty), ErrOutOfMemory (no memory). */
QX_API int32_t AutoCorrelation(QX_INOUT DBL1D x, QX_OUT ErrorCode *err);

/** Replaces xy by q, nxy - ny + 1 values, with xy = q convolved with y: by division of the
    spectra, or, if the spectrum of y appears singular, by long division of the series, which allows
    leading zeros of y. If xy is not a multiple of y, the remainder affects q. The code is in *err
    and is the function result.
    Codes: ErrLengthTooLarge (an input of more than 8388608 values), ErrEmptyInput (xy or y is
    empty), ErrSizesDisagree (y is the longer one), ErrOutOfMemory (no memory). A failure empties
    xy.
    NaN: xy, y in all results. */
QX_API int32_t Deconvolution(QX_INOUT DBL1D xy, QX_IN DBL1D y, QX_OUT ErrorCode *err);

QX_END_DECLS

#endif
