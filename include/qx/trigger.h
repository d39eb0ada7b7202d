#ifndef QX_TRIGGER_H
#define QX_TRIGGER_H

/* Finds where a signal crosses a level, in one array or in a stream that is passed in blocks of any
   size.

   A rising trigger is armed by a sample strictly below level - hysteresis, and triggers at the
   first sample at or above level; it must then be armed again. A falling trigger is armed by a
   sample strictly above level + hysteresis and triggers at the first sample at or below level. */

#include "qx/types.h"

QX_BEGIN_DECLS

/* The state of a stream; zeros at first. */
typedef struct TriggerState {
    int32_t armedRising;
    int32_t armedFalling;
    int32_t holdoffLeft; /* samples still to be skipped */
    int32_t hasLast;
    double last; /* the latest sample, if hasLast is not 0 */
} TriggerState;

/** Finds the next trigger in a block of a stream, from sample `start` on. slope: 0 rising; 1
    falling; 2 either, each armed separately. *index is the index of the triggering sample within
    the block, or -1 if there is none. *position is where the line from the previous sample to the
    triggering one crosses the level: between *index - 1 and *index, so between -1 and 0 if the two
    samples are in different blocks. It is *index if there is no previous sample or if that is
    already at or beyond the level (after a holdoff), and NaN if nothing triggers.

    On return the state is the one after the triggering sample or, without a trigger, after the
    block; to continue in the same block, start at *index + 1. The `holdoff` samples after a
    triggering sample neither trigger nor arm; the triggering sample itself may arm the other slope.
    Only the samples from `start` to the triggering one are read, so blocks of any size give the
    results of a single block. If both slopes would trigger at the same sample, it counts once and
    both must be armed again.

    A failure returns an *index of -1 and a *position of NaN and leaves the state unchanged.
    Codes: ErrMeasureEmpty (y is empty), ErrInvalidSelector (slope), ErrIndexOutOfRange (start is
    below 0 or above the size of y; a start equal to that size finds nothing), ErrNegativeSetting
    (hysteresis or holdoff is negative, or hysteresis is NaN), ErrNonFiniteInput (level, hysteresis,
    or a sample that is read).
    NaN: y, level refused with ErrNonFiniteInput; hysteresis refused with ErrNegativeSetting;
    state.last in no result. */
QX_API ErrorCode Triggerh_86(QX_IN DBL1D y, double level, double hysteresis, int32_t slope,
                             int32_t start, int32_t holdoff, QX_INOUT TriggerState *state,
                             QX_OUT int32_t *index, QX_OUT double *position);

/** As Triggerh_86, with hysteresis 0, holdoff 0 and a state of zeros.
    NaN: y refused with ErrNonFiniteInput or in no result; level refused with ErrNonFiniteInput. */
QX_API ErrorCode Triggerh(QX_IN DBL1D y, double level, int32_t slope, int32_t start,
                          QX_OUT int32_t *index, QX_OUT double *position);

QX_END_DECLS

#endif
