#ifndef QX_RATIONAL_RESAMPLING_H
#define QX_RATIONAL_RESAMPLING_H

/* Change of the sampling rate of a stream by L / M with a symmetric filter given by the caller,
   without delay.

   Positions refer to the grid of the input with L - 1 zeros inserted after each sample: sample i is
   at position i L, counted from the oldest sample available, which is in the state or, if that is
   empty, in the block. The caller keeps `state`, `stateCount` and `offset` and passes them back
   unchanged with each block. Blocks may have any size; the results are those of a single block, to
   the bit. A failure empties y and state. */

#include "qx/types.h"

QX_BEGIN_DECLS

/** Resamples a block by L / M: the output at position p, beginning at *offset in steps of M, is y =
    L sum over k of h[k] u[p - (n - 1) / 2 + k], where u is the input with its inserted zeros and h
    holds n taps. Outputs follow until a window extends beyond the block. A non-zero `reset` begins
    a stream and makes room for (n - 1) / L + 1 samples in state, of which *stateCount are in use.
    It leaves *offset as the caller set it; with (n - 1) / 2 the first output is the first one with
    a full window. The taps are not checked for symmetry; with asymmetric taps the result is a
    correlation.
    Codes: ErrNegativeSetting (*offset or *stateCount is negative), ErrNotStrictlyPositive (L or M
    is below 1), ErrOutOfMemory (the host refuses the state), ErrOverflow (the positions of the
    block may exceed 31 bits), ErrOutOfMemory (the host refuses y), ErrBadTapCount (h is empty or of
    even size), ErrOverflow (state has no room for the remaining samples), ErrOutOfMemory (no
    memory).
    NaN: x in some results; h, state in some results or in no result. */
QX_API ErrorCode RationalResample_H(QX_IN DBL1D x, int32_t L, int32_t M, int32_t reset,
                                    QX_INOUT int32_t *offset, QX_IN DBL1D h, QX_INOUT DBL1D state,
                                    QX_INOUT int32_t *stateCount, QX_OUT DBL1D y);
/** As RationalResample_H, for complex data and real taps. */
QX_API ErrorCode CxRationalResample_H(QX_IN CDB1D x, int32_t L, int32_t M, int32_t reset,
                                      QX_INOUT int32_t *offset, QX_IN DBL1D h, QX_INOUT CDB1D state,
                                      QX_INOUT int32_t *stateCount, QX_OUT CDB1D y);

/** As RationalResample_H, for channels in the rows of matrices, which share their positions. An
    empty state begins a stream as well, and leaves *stateCount unchanged.
    Codes: ErrNegativeSetting (*offset or *stateCount is negative), ErrNotStrictlyPositive (L or M
    is below 1), ErrSizesDisagree (state does not have as many rows as x), ErrOutOfMemory (the host
    refuses the state), ErrOverflow (the positions of the block may exceed 31 bits), ErrOutOfMemory
    (the host refuses y), ErrBadTapCount (h is empty or of even size), ErrOverflow (state has no
    room for the remaining samples), ErrOutOfMemory (no memory). */
QX_API ErrorCode RationalResampleMultiCh_H(QX_IN DBL2D x, int32_t L, int32_t M, int32_t reset,
                                           QX_INOUT int32_t *offset, QX_IN DBL1D h,
                                           QX_INOUT DBL2D state, QX_INOUT int32_t *stateCount,
                                           QX_OUT DBL2D y);
/** As RationalResampleMultiCh_H, for complex data and real taps. */
QX_API ErrorCode CxRationalResampleMCh_H(QX_IN CDB2D x, int32_t L, int32_t M, int32_t reset,
                                         QX_INOUT int32_t *offset, QX_IN DBL1D h,
                                         QX_INOUT CDB2D state, QX_INOUT int32_t *stateCount,
                                         QX_OUT CDB2D y);

QX_END_DECLS

#endif
