#ifndef QX_RATIONAL_RESAMPLING_H
#define QX_RATIONAL_RESAMPLING_H

/* Change of the rate of a stream by L / M with a symmetric filter of the caller's, without delay.

   Positions count on the grid of the input with L - 1 zeros after each sample: sample i stands at
   i L, counted from the first sample in hand, that is the oldest of the state or else of the block.
   The caller keeps `state`, `stateCount` and `offset` and hands them back unchanged with each
   block; blocks may have any size, and give to the bit what one block would give. A failure
   empties y and state. */

#include "qx/types.h"

QX_BEGIN_DECLS

/** Resamples a block by L / M: the output at position p, beginning at *offset in steps of M, is
    y = L sum over k of h[k] u[p - (n - 1) / 2 + k], with u the input and its zeros and n taps h.
    Outputs follow until a window reaches beyond the block. `reset` begins a stream and makes room
    for (n - 1) / L + 1 samples in state, of which *stateCount are in use; *offset stays as the
    caller set it, and half of n - 1 makes the first output the first one with a full window. The
    taps are not checked for symmetry, without which the result is a correlation.
    Codes: ErrNegativeSetting (*offset or *stateCount is negative), ErrNotStrictlyPositive (L or M
    below 1), ErrOutOfMemory (the host refuses the state), ErrOverflow (the positions of the block
    may exceed 31 bits), ErrOutOfMemory (the host refuses y), ErrBadTapCount (h is empty or of even
    size), ErrOverflow (state has no room for what is left), ErrOutOfMemory (no memory).
    NaN: x in some results; h in no result; state in some results or in no result. */
QX_API ErrorCode RationalResample_H(QX_IN DBL1D x, int32_t L, int32_t M, int32_t reset,
                                    QX_INOUT int32_t *offset, QX_IN DBL1D h, QX_INOUT DBL1D state,
                                    QX_INOUT int32_t *stateCount, QX_OUT DBL1D y);
/** As RationalResample_H, for complex data and real taps. */
QX_API ErrorCode CxRationalResample_H(QX_IN CDB1D x, int32_t L, int32_t M, int32_t reset,
                                      QX_INOUT int32_t *offset, QX_IN DBL1D h, QX_INOUT CDB1D state,
                                      QX_INOUT int32_t *stateCount, QX_OUT CDB1D y);

/** As RationalResample_H, for channels in the rows of matrices, which share their positions. An
    empty state begins a stream as well, with *stateCount as it is.
    Codes: ErrNegativeSetting (*offset or *stateCount is negative), ErrNotStrictlyPositive (L or M
    below 1), ErrSizesDisagree (state has not as many rows as x), ErrOutOfMemory (the host refuses
    the state), ErrOverflow (the positions of the block may exceed 31 bits), ErrOutOfMemory (the
    host refuses y), ErrBadTapCount (h is empty or of even size), ErrOverflow (state has no room for
    what is left), ErrOutOfMemory (no memory). */
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
