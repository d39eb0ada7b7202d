#ifndef QX_ZERO_PHASE_H
#define QX_ZERO_PHASE_H

/* Filtering forward and backward: the phases cancel, and the magnitude response is squared. The
   signal is taken to be zero before its first and behind its last sample; as many zeros as the
   filter has coefficients go through it, too, so that this is a filter for whole records. The
   states of each pass stay with the caller, as in qx/filtering.h; one of another size is given its
   size, and then all of them are cleared. */

#include "qx/types.h"

QX_BEGIN_DECLS

/** Filters x in place by a filter in direct form, as of IIR_Filter; without a it is an FIR
    filter, without both x stays as it is. keepState 0 clears the states.
    Codes: ErrEmptyInput (x is empty), ErrSizesDisagree (a without b), the host's status (it
    refuses a state), ErrOutOfMemory (no memory). A failure leaves x as it is; the last two empty
    all four states.
    NaN: x, a, b in some results; xStateForward, xStateBackward, yStateForward, yStateBackward in no
    result. */
QX_API ErrorCode zeroPhaseFiltH(QX_INOUT DBL1D x, QX_IN DBL1D a, QX_IN DBL1D b,
                                QX_INOUT DBL1D xStateForward, QX_INOUT DBL1D xStateBackward,
                                QX_INOUT DBL1D yStateForward, QX_INOUT DBL1D yStateBackward,
                                int32_t keepState);

/** Filters x in place by a cascade. form: as IIR_Filter2. Without any coefficients
    x stays as it is. keepState 0 clears the states.
    Codes: ErrEmptyInput (x is empty), ErrSizesDisagree (a without b, or b without a), the host's
    status (it refuses a state), ErrInvalidSelector (no such form), ErrCoefficientSizes (the sizes
    of a and b do not fit the form), ErrOutOfMemory (no memory). A failure leaves x as it is.
    NaN: x in all results; a in all results or in some results; b in some results; stateForward,
    stateBackward in no result. */
QX_API ErrorCode zeroPhaseCascadeFiltH(QX_INOUT DBL1D x, QX_IN const int32_t *form, QX_IN DBL1D a,
                                       QX_IN DBL1D b, QX_INOUT DBL1D stateForward,
                                       QX_INOUT DBL1D stateBackward, int32_t keepState);

QX_END_DECLS

#endif
