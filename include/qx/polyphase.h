#ifndef QX_POLYPHASE_H
#define QX_POLYPHASE_H

/* FIR filtering of a stream in blocks with a change of the sampling rate. Only the polyphase terms
   that contribute to an output are computed.

   The caller keeps `state`, `delayLeft` and `phase` and passes them back unchanged with each block.
   Blocks may have any size; the results are those of a single block, to the bit. A stream begins
   with a reset; every change of h, L or M requires one, too. A failure empties y and state and
   clears delayLeft and phase. */

#include "qx/types.h"

QX_BEGIN_DECLS

/** Filters a block at one of four rates. h holds n taps, and t is the position of an output at the
    upsampled rate. mode: 0 the same rate, y[t] = gain sum over k of h[k] x[t - k]; 1 L times the
    rate, y[t] = gain L sum over j of h[t mod L + j L] x[t / L - j]; 2 every M-th output of mode 0
    without the gain; 3 every M-th output of mode 1. A non-zero *reset, or an empty state, begins a
    stream. If *removeDelay is non-zero, the group delay of (n - 1) / 2 samples is then removed;
    otherwise outputs begin with the first input. The size of state is n - 1, ceil(n / L), ceil(n /
    M) + 1 or ceil(n / L) for mode 0 to 3. A change of h or of the rates is detected only if it
    changes that size.
    Codes: ErrOrderNotPositive (h is empty), ErrNotStrictlyPositive (L or M is below 1),
    ErrInvalidSelector (no such mode), ErrNegativeSetting (delayLeft is negative and there is no
    reset), ErrBadTapCount (a reset that removes the delay, with an even number of taps),
    ErrStateSizeMismatch (state has the wrong size and there is no reset), ErrOutOfMemory (no
    memory), WarnEmptyResult (x is empty).
    NaN: x in some results; state, h, gain in some results or in no result. */
QX_API ErrorCode ppMultiRateFIRH_DBL(QX_IN DBL1D x, QX_OUT DBL1D y, QX_INOUT DBL1D state,
                                     int32_t mode, int32_t L, int32_t M, QX_IN DBL1D h, double gain,
                                     QX_IN const uint8_t *reset, QX_IN const uint8_t *removeDelay,
                                     QX_INOUT int32_t *delayLeft, QX_INOUT int32_t *phase);
/** As ppMultiRateFIRH_DBL, in single precision throughout. */
QX_API ErrorCode ppMultiRateFIRH_SGL(QX_IN SGL1D x, QX_OUT SGL1D y, QX_INOUT SGL1D state,
                                     int32_t mode, int32_t L, int32_t M, QX_IN SGL1D h, float gain,
                                     QX_IN const uint8_t *reset, QX_IN const uint8_t *removeDelay,
                                     QX_INOUT int32_t *delayLeft, QX_INOUT int32_t *phase);
/** As ppMultiRateFIRH_DBL, for complex data and real taps. */
QX_API ErrorCode ppMultiRateFIRH_CDB(QX_IN CDB1D x, QX_OUT CDB1D y, QX_INOUT CDB1D state,
                                     int32_t mode, int32_t L, int32_t M, QX_IN DBL1D h, double gain,
                                     QX_IN const uint8_t *reset, QX_IN const uint8_t *removeDelay,
                                     QX_INOUT int32_t *delayLeft, QX_INOUT int32_t *phase);
/** As ppMultiRateFIRH_DBL, for complex data and real taps, in single precision throughout. */
QX_API ErrorCode ppMultiRateFIRH_CSG(QX_IN CSG1D x, QX_OUT CSG1D y, QX_INOUT CSG1D state,
                                     int32_t mode, int32_t L, int32_t M, QX_IN SGL1D h, float gain,
                                     QX_IN const uint8_t *reset, QX_IN const uint8_t *removeDelay,
                                     QX_INOUT int32_t *delayLeft, QX_INOUT int32_t *phase);

QX_END_DECLS

#endif
