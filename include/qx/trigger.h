#ifndef QX_TRIGGER_H
#define QX_TRIGGER_H

/* Where a signal passes a level, in one array or in a stream that comes in blocks of any size.

   A rising trigger is armed by a sample strictly below level - hysteresis, and triggers at the
   first sample at or above level; it must then be armed again. A falling one is armed strictly
   above level + hysteresis and triggers at or below level. */

#include "qx/types.h"

QX_BEGIN_DECLS

/* Where a stream is; zeros at first. */
typedef struct TriggerState {
    int32_t armedRising;
    int32_t armedFalling;
    int32_t holdoffLeft; /* samples that are still passed over */
    int32_t hasLast;
    double last; /* the latest sample, where hasLast is not 0 */
} TriggerState;

/** The next trigger in a block of a stream, from sample `start` on. slope: 0 rising; 1 falling; 2
    either, each armed for itself. *index is the sample that triggers, within the block, -1 where
    there is none. *position is where the line from the sample before it to that one passes the
    level, from *index - 1 to *index, so between -1 and 0 where they lie in two blocks; it is *index
    where there is no sample before it or where that lies at or beyond the level already (after a
    holdoff), and NaN where nothing triggers.

    The state is that behind the sample that triggers, else behind the block; to go on in the same
    block, start at *index + 1. The `holdoff` samples behind one that triggers neither trigger nor
    arm; that one itself may arm the other slope. Only samples from `start` to the one that triggers
    are looked at, so blocks of any size give what one block gives. Where both slopes would trigger
    at one sample, it counts once and both must be armed again.

    A failure gives -1 and NaN and leaves the state as it was.
    Codes: ErrMeasureEmpty (y is empty), ErrInvalidSelector (slope), ErrIndexOutOfRange (start is
    below 0 or above the size of y, which itself finds nothing), ErrNegativeSetting (hysteresis or
    holdoff is negative, or hysteresis is NaN), ErrNonFiniteInput (level, hysteresis, or a sample
    that is looked at).
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
