#ifndef QX_TRANSFORMS_H
#define QX_TRANSFORMS_H

/* Cosine, sine, Hartley, Hilbert and band transforms of real and complex arrays.

   Plans are kept in slots or, by the _IDP twins, in the host's instance data, as qx/fft.h tells.
   A status of the host that refuses an output is returned as it is. */

#include "qx/fft.h"

QX_BEGIN_DECLS

/** Cosine transform, type II, orthonormal, of `size` values (those of the input if below 1; more
    are zeros, fewer are the first ones): X[k] = c(k) sqrt(2/n) sum over j of x[j] cos(pi k (2j+1) /
    (2n)), c(0) = 1/sqrt(2), else 1. J. Makhoul, "A fast cosine transform in one and two
    dimensions", 1980.
    Codes: ErrEmptyInput (in is empty), the host's status, ErrOutOfMemory (no memory). Every failure
    empties out. */
QX_API ErrorCode DCT_1DH(QX_IN DBL1D in, QX_OUT DBL1D out, int32_t size, QX_INOUT PlanSlot *slot);
/** As DCT_1DH, with its plan in the host's instance data. */
QX_API ErrorCode DCT_1DH_IDP(QX_IN DBL1D in, QX_OUT DBL1D out, int32_t size,
                             QX_INOUT InstanceWord *instance);

/** Sine transform, type I, unscaled, of `size` values (as in DCT_1DH): X[k] = sum over j of x[j]
    sin(pi (j+1) (k+1) / (n+1)).
    Codes: ErrEmptyInput (in is empty), the host's status, ErrOutOfMemory (no memory). Every failure
    empties out. */
QX_API ErrorCode DST_1DH(QX_IN DBL1D in, QX_OUT DBL1D out, int32_t size, QX_INOUT PlanSlot *slot);
/** As DST_1DH, with its plan in the host's instance data. */
QX_API ErrorCode DST_1DH_IDP(QX_IN DBL1D in, QX_OUT DBL1D out, int32_t size,
                             QX_INOUT InstanceWord *instance);

/** The inverse of DCT_1DH: type III, orthonormal, of the whole input.
    Codes: ErrEmptyInput (in is empty), the host's status, ErrOutOfMemory (no memory for the plan).
    Every failure empties out. Without work memory the result is 0 and out, of full size, is not
    written. */
QX_API ErrorCode InvDCT_1DH(QX_IN DBL1D in, QX_OUT DBL1D out, QX_INOUT PlanSlot *slot);
/** As InvDCT_1DH, with its plan in the host's instance data. */
QX_API ErrorCode InvDCT_1DH_IDP(QX_IN DBL1D in, QX_OUT DBL1D out, QX_INOUT InstanceWord *instance);

/** The inverse of DST_1DH: x[j] = 2/(n+1) sum over k of X[k] sin(pi (j+1) (k+1) / (n+1)).
    Codes: ErrEmptyInput (in is empty), the host's status, ErrOutOfMemory (no memory). Every failure
    empties out. */
QX_API ErrorCode InvDST_1DH(QX_IN DBL1D in, QX_OUT DBL1D out, QX_INOUT PlanSlot *slot);
/** As InvDST_1DH, with its plan in the host's instance data. */
QX_API ErrorCode InvDST_1DH_IDP(QX_IN DBL1D in, QX_OUT DBL1D out, QX_INOUT InstanceWord *instance);

/** As DCT_1DH, of all rows, then of all columns, of the upper left rows by cols values (those of
    the input where below 1; zeros beyond it). slotA keeps the plan of the columns, slotB that of
    the rows.
    Codes: ErrEmptyInput (in is empty), ErrOutOfMemory (no memory), the host's status. Every failure
    empties out. */
QX_API ErrorCode DCT_2DH(QX_IN DBL2D in, QX_OUT DBL2D out, int32_t rows, int32_t cols,
                         QX_INOUT PlanSlot *slotA, QX_INOUT PlanSlot *slotB);
/** As DCT_2DH, with its plans in the host's instance data. */
QX_API ErrorCode DCT_2DH_IDP(QX_IN DBL2D in, QX_OUT DBL2D out, int32_t rows, int32_t cols,
                             QX_INOUT InstanceWord *instance);

/** As DST_1DH, of all rows, then of all columns; sizes and slots as in DCT_2DH.
    Codes: ErrEmptyInput (in is empty), ErrOutOfMemory (no memory), the host's status. Every failure
    empties out. */
QX_API ErrorCode DST_2DH(QX_IN DBL2D in, QX_OUT DBL2D out, int32_t rows, int32_t cols,
                         QX_INOUT PlanSlot *slotA, QX_INOUT PlanSlot *slotB);
/** As DST_2DH, with its plans in the host's instance data. */
QX_API ErrorCode DST_2DH_IDP(QX_IN DBL2D in, QX_OUT DBL2D out, int32_t rows, int32_t cols,
                             QX_INOUT InstanceWord *instance);

/** The inverse of DCT_2DH on the whole input, columns first.
    Codes: those of DCT_2DH. */
QX_API ErrorCode InvDCT_2DH(QX_IN DBL2D in, QX_OUT DBL2D out, QX_INOUT PlanSlot *slotA,
                            QX_INOUT PlanSlot *slotB);
/** As InvDCT_2DH, with its plans in the host's instance data. */
QX_API ErrorCode InvDCT_2DH_IDP(QX_IN DBL2D in, QX_OUT DBL2D out, QX_INOUT InstanceWord *instance);

/** The inverse of DST_2DH on the whole input, rows first.
    Codes: those of DST_2DH. */
QX_API ErrorCode InvDST_2DH(QX_IN DBL2D in, QX_OUT DBL2D out, QX_INOUT PlanSlot *slotA,
                            QX_INOUT PlanSlot *slotB);
/** As InvDST_2DH, with its plans in the host's instance data. */
QX_API ErrorCode InvDST_2DH_IDP(QX_IN DBL2D in, QX_OUT DBL2D out, QX_INOUT InstanceWord *instance);

/** Replaces x by its Hartley transform: H[k] = sum over j of x[j] (cos(2 pi j k / n) + sin(2 pi j k
    / n)), unscaled.
    Codes: ErrEmptyInput (x is empty), ErrOutOfMemory (no memory). A failure empties x. */
QX_API ErrorCode FHTH(QX_INOUT DBL1D x, QX_INOUT PlanSlot *slot);
/** As FHTH, with its plan in the host's instance data. */
QX_API ErrorCode FHTH_IDP(QX_INOUT DBL1D x, QX_INOUT InstanceWord *instance);

/** The inverse of FHTH: the same transform with the factor 1/n.
    Codes: ErrEmptyInput (x is empty), ErrOutOfMemory (no memory). A failure empties x, but where no
    plan can be had x stays as it is. */
QX_API ErrorCode InvFHTH(QX_INOUT DBL1D x, QX_INOUT PlanSlot *slot);
/** As InvFHTH, with its plan in the host's instance data. */
QX_API ErrorCode InvFHTH_IDP(QX_INOUT DBL1D x, QX_INOUT InstanceWord *instance);

/** Replaces x by its Hilbert transform: the spectrum times -i for positive and i for negative
    frequencies, 0 at the zero and the Nyquist frequency. A cosine becomes a sine.
    Codes: ErrEmptyInput (x is empty), ErrOutOfMemory (no memory). A failure empties x. */
QX_API ErrorCode FastHilbertTransformH(QX_INOUT DBL1D x, QX_INOUT PlanSlot *slot);
/** As FastHilbertTransformH, with its plan in the host's instance data. */
QX_API ErrorCode FastHilbertTransformH_IDP(QX_INOUT DBL1D x, QX_INOUT InstanceWord *instance);

/** The negative of FastHilbertTransformH, which returns x less its mean and, for even n, less its
    Nyquist part.
    Codes: those of FastHilbertTransformH. */
QX_API ErrorCode InvFastHilbertTransformH(QX_INOUT DBL1D x, QX_INOUT PlanSlot *slot);
/** As InvFastHilbertTransformH, with its plan in the host's instance data. */
QX_API ErrorCode InvFastHilbertTransformH_IDP(QX_INOUT DBL1D x, QX_INOUT InstanceWord *instance);

/** A band of bins of a transform of length L = S N from S transforms of length N: out[i] = sum over
    u of x[u] exp(-2 pi i u (start + i) / L) for i from 0 to size-1, cyclic in frequency. An input
    shorter than L is zero-padded. A longer one is folded, in place: its elements from index N on
    (not from L) are added, one after the other, to elements 0 to L-1 over and over.
    Codes: ErrOrderNotPositive (S below 1), ErrFFTSizeNotPositive (size or N below 1),
    ErrOutOfMemory (no memory), the host's status, ErrLengthTooLarge (an index would pass int32). A
    negative status empties out. An empty input gives an empty output and 0. */
QX_API ErrorCode ReDZTH(QX_INOUT DBL1D in, int32_t S, int32_t N, int32_t start, int32_t size,
                        QX_OUT CDB1D out, QX_INOUT PlanSlot *slot);
/** As ReDZTH, with its plan in the host's instance data. */
QX_API ErrorCode ReDZTH_IDP(QX_INOUT DBL1D in, int32_t S, int32_t N, int32_t start, int32_t size,
                            QX_OUT CDB1D out, QX_INOUT InstanceWord *instance);

/** As ReDZTH, of complex data. */
QX_API ErrorCode CxDZTH(QX_INOUT CDB1D in, int32_t S, int32_t N, int32_t start, int32_t size,
                        QX_OUT CDB1D out, QX_INOUT PlanSlot *slot);
/** As CxDZTH, with its plan in the host's instance data. */
QX_API ErrorCode CxDZTH_IDP(QX_INOUT CDB1D in, int32_t S, int32_t N, int32_t start, int32_t size,
                            QX_OUT CDB1D out, QX_INOUT InstanceWord *instance);

QX_END_DECLS

#endif
