#ifndef QX_FFT2D_H
#define QX_FFT2D_H

/* Two-dimensional Fourier transforms of any sizes, with the sign and the scaling of qx/fft.h: first
   of the rows, then of the columns. Shifted order, plans and the host's status are described
   there. */

#include "qx/fft.h"

QX_BEGIN_DECLS

/** X[r][c] = sum over a and b of x[a][b] exp(-2 pi i (r a / rows + c b / cols)), with x the rows by
    cols values of `in` from (rowStart, colStart) on, zero-padded after its ends. The output is in
    shifted order in both dimensions if `shift` is non-zero. Unscaled. slotCols keeps the plan of
    length cols, slotRows that of length rows. The sizes of the plans and the output are determined
    by rows and cols, however small `in` is. A product rows cols above 2^31 - 1 is refused before
    any memory is allocated; a negative start is refused last, after the host has resized the
    output.
    Codes: ErrEmptyInput (in is empty), ErrIndexOutOfRange (a start is after the end),
    ErrSizesDisagree (rows or cols is below 1), ErrInternal (the word holds something other than a
    plan), ErrOutOfMemory (no memory), the host's status, ErrIndexOutOfRange (a negative start).
    NaN: in in all results or in no result. */
QX_API ErrorCode CxFFT2D_H(QX_IN CDB2D in, int32_t rowStart, int32_t colStart, int32_t rows,
                           int32_t cols, int32_t shift, QX_OUT CDB2D out,
                           QX_INOUT PlanSlot *slotCols, QX_INOUT PlanSlot *slotRows);
/** As CxFFT2D_H, with its plans in the host's instance data.
    NaN: in in all results. */
QX_API ErrorCode CxFFT2D_H_IDP(QX_IN CDB2D in, int32_t rowStart, int32_t colStart, int32_t rows,
                               int32_t cols, int32_t shift, QX_OUT CDB2D out,
                               QX_INOUT InstanceWord *instance);

/** As CxFFT2D_H, of a real matrix.
    NaN: in in some results or in no result. */
QX_API ErrorCode ReFFT2D_H(QX_IN DBL2D in, int32_t rowStart, int32_t colStart, int32_t rows,
                           int32_t cols, int32_t shift, QX_OUT CDB2D out,
                           QX_INOUT PlanSlot *slotCols, QX_INOUT PlanSlot *slotRows);
/** As ReFFT2D_H, with its plans in the host's instance data.
    NaN: in in some results. */
QX_API ErrorCode ReFFT2D_H_IDP(QX_IN DBL2D in, int32_t rowStart, int32_t colStart, int32_t rows,
                               int32_t cols, int32_t shift, QX_OUT CDB2D out,
                               QX_INOUT InstanceWord *instance);

/** The inverse transform of a rows by cols matrix X, which is in shifted order if `shift` is
    non-zero: x[a][b] = 1/(rows cols) sum over r and c of X[r][c] exp(2 pi i (r a / rows + c b /
    cols)). slotCols keeps the plan of the column count, slotRows that of the row count.
    Codes: ErrEmptyInput (in is empty), ErrInternal (the word holds something other than a plan),
    ErrOutOfMemory (no memory), the host's status.
    NaN: in in all results. */
QX_API ErrorCode CxInvFFT2D_H(QX_IN CDB2D in, int32_t shift, QX_OUT CDB2D out,
                              QX_INOUT PlanSlot *slotCols, QX_INOUT PlanSlot *slotRows);
/** As CxInvFFT2D_H, with its plans in the host's instance data. */
QX_API ErrorCode CxInvFFT2D_H_IDP(QX_IN CDB2D in, int32_t shift, QX_OUT CDB2D out,
                                  QX_INOUT InstanceWord *instance);

/** As CxInvFFT2D_H, of the spectrum of a real matrix: the rows of negative row frequency are not
    read.
    NaN: in in all results or in no result. */
QX_API ErrorCode ReInvFFT2D_H(QX_IN CDB2D in, int32_t shift, QX_OUT DBL2D out,
                              QX_INOUT PlanSlot *slotCols, QX_INOUT PlanSlot *slotRows);
/** As ReInvFFT2D_H, with its plans in the host's instance data. */
QX_API ErrorCode ReInvFFT2D_H_IDP(QX_IN CDB2D in, int32_t shift, QX_OUT DBL2D out,
                                  QX_INOUT InstanceWord *instance);

QX_END_DECLS

#endif
