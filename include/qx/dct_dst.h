#ifndef QX_DCT_DST_H
#define QX_DCT_DST_H

/* Cosine and sine transforms of vectors and matrices.

   Plans are kept in slots or, by the _IDP twins, in the host's instance data, as described in
   qx/fft.h. If the host refuses an output, its status is returned. */

#include "qx/fft.h"

QX_BEGIN_DECLS

/** Cosine transform, type II, orthonormal, of `size` values: the first elements of the input,
    zero-padded if it is shorter, or the whole input if `size` is below 1. X[k] = c(k) sqrt(2/n) sum
    over j of x[j] cos(pi k (2j+1) / (2n)), c(0) = 1/sqrt(2), else 1. J. Makhoul, "A fast cosine
    transform in one and two dimensions", 1980.
    Codes: ErrEmptyInput (in is empty), the host's status, ErrInternal (the word holds something
    other than a plan), ErrOutOfMemory (no memory). Every failure empties `out`.
    NaN: in in all results. */
QX_API ErrorCode DCT_1DH(QX_IN DBL1D in, QX_OUT DBL1D out, int32_t size, QX_INOUT PlanSlot *slot);
/** As DCT_1DH, with its plan in the host's instance data. */
QX_API ErrorCode DCT_1DH_IDP(QX_IN DBL1D in, QX_OUT DBL1D out, int32_t size,
                             QX_INOUT InstanceWord *instance);

/** Sine transform, type I, unscaled, of `size` values (as in DCT_1DH): X[k] = sum over j of x[j]
    sin(pi (j+1) (k+1) / (n+1)).
    Codes: ErrEmptyInput (in is empty), the host's status, ErrInternal (the word holds something
    other than a plan), ErrOutOfMemory (no memory). Every failure empties `out`.
    NaN: in in all results or in some results. */
QX_API ErrorCode DST_1DH(QX_IN DBL1D in, QX_OUT DBL1D out, int32_t size, QX_INOUT PlanSlot *slot);
/** As DST_1DH, with its plan in the host's instance data. */
QX_API ErrorCode DST_1DH_IDP(QX_IN DBL1D in, QX_OUT DBL1D out, int32_t size,
                             QX_INOUT InstanceWord *instance);

/** The inverse of DCT_1DH: type III, orthonormal, of the whole input.
    Codes: ErrEmptyInput (in is empty), the host's status, ErrInternal (the word holds something
    other than a plan), ErrOutOfMemory (no memory for the plan). Every failure empties `out`. If
    there is no working memory, the code is 0 and `out` has its full size but is not written.
    NaN: in in all results. */
QX_API ErrorCode InvDCT_1DH(QX_IN DBL1D in, QX_OUT DBL1D out, QX_INOUT PlanSlot *slot);
/** As InvDCT_1DH, with its plan in the host's instance data. */
QX_API ErrorCode InvDCT_1DH_IDP(QX_IN DBL1D in, QX_OUT DBL1D out, QX_INOUT InstanceWord *instance);

/** The inverse of DST_1DH: x[j] = 2/(n+1) sum over k of X[k] sin(pi (j+1) (k+1) / (n+1)).
    Codes: ErrEmptyInput (in is empty), the host's status, ErrInternal (the word holds something
    other than a plan), ErrOutOfMemory (no memory). Every failure empties `out`.
    NaN: in in all results or in some results. */
QX_API ErrorCode InvDST_1DH(QX_IN DBL1D in, QX_OUT DBL1D out, QX_INOUT PlanSlot *slot);
/** As InvDST_1DH, with its plan in the host's instance data. */
QX_API ErrorCode InvDST_1DH_IDP(QX_IN DBL1D in, QX_OUT DBL1D out, QX_INOUT InstanceWord *instance);

/** As DCT_1DH, of all rows, then of all columns, of the upper left rows by cols values, zero-padded
    beyond the input; a value of rows or cols below 1 means that of the input. slotA keeps the plan
    of the columns, slotB that of the rows. The memory is determined by rows and cols, however small
    `in` is; a product rows cols above 2^31 - 1 is refused before any memory is allocated.
    Codes: ErrEmptyInput (in is empty), ErrInternal (the word holds something other than a plan),
    ErrOutOfMemory (no memory), the host's status. Every failure empties `out`.
    NaN: in in all results or in no result. */
QX_API ErrorCode DCT_2DH(QX_IN DBL2D in, QX_OUT DBL2D out, int32_t rows, int32_t cols,
                         QX_INOUT PlanSlot *slotA, QX_INOUT PlanSlot *slotB);
/** As DCT_2DH, with its plans in the host's instance data.
    NaN: in in all results. */
QX_API ErrorCode DCT_2DH_IDP(QX_IN DBL2D in, QX_OUT DBL2D out, int32_t rows, int32_t cols,
                             QX_INOUT InstanceWord *instance);

/** As DST_1DH, of all rows, then of all columns; sizes and slots as in DCT_2DH.
    Codes: ErrEmptyInput (in is empty), ErrInternal (the word holds something other than a plan),
    ErrOutOfMemory (no memory), the host's status. Every failure empties `out`.
    NaN: in in all results or in no result. */
QX_API ErrorCode DST_2DH(QX_IN DBL2D in, QX_OUT DBL2D out, int32_t rows, int32_t cols,
                         QX_INOUT PlanSlot *slotA, QX_INOUT PlanSlot *slotB);
/** As DST_2DH, with its plans in the host's instance data.
    NaN: in in all results or in some results. */
QX_API ErrorCode DST_2DH_IDP(QX_IN DBL2D in, QX_OUT DBL2D out, int32_t rows, int32_t cols,
                             QX_INOUT InstanceWord *instance);

/** The inverse of DCT_2DH on the whole input, columns first.
    Codes: those of DCT_2DH.
    NaN: in in all results. */
QX_API ErrorCode InvDCT_2DH(QX_IN DBL2D in, QX_OUT DBL2D out, QX_INOUT PlanSlot *slotA,
                            QX_INOUT PlanSlot *slotB);
/** As InvDCT_2DH, with its plans in the host's instance data. */
QX_API ErrorCode InvDCT_2DH_IDP(QX_IN DBL2D in, QX_OUT DBL2D out, QX_INOUT InstanceWord *instance);

/** The inverse of DST_2DH on the whole input, rows first.
    Codes: those of DST_2DH.
    NaN: in in all results or in some results. */
QX_API ErrorCode InvDST_2DH(QX_IN DBL2D in, QX_OUT DBL2D out, QX_INOUT PlanSlot *slotA,
                            QX_INOUT PlanSlot *slotB);
/** As InvDST_2DH, with its plans in the host's instance data. */
QX_API ErrorCode InvDST_2DH_IDP(QX_IN DBL2D in, QX_OUT DBL2D out, QX_INOUT InstanceWord *instance);

QX_END_DECLS

#endif
