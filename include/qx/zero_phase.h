#ifndef QX_ZERO_PHASE_H
#define QX_ZERO_PHASE_H

/* Filtering forward and backward: the phases cancel, and the magnitude response is squared. The
   signal is taken to be zero before its first and after its last sample; as many zeros as the
   filter has coefficients are filtered, too. So these exports are meant for whole records, not for
   streams. The caller keeps the states of each pass, as in qx/filtering.h. If a state has the wrong
   size, it is resized and all states are cleared. */

#include "qx/types.h"

QX_BEGIN_DECLS

/** Filters x in place by the filter with the coefficients a and b in direct form, as in IIR_Filter.
    If a is empty, it is an FIR filter; if both a and b are empty, x is unchanged. keepState 0
    clears the states.
    Codes: ErrEmptyInput (x is empty), ErrSizesDisagree (a without b), the host's status (it
    refuses a state), ErrOutOfMemory (no memory). A failure leaves x unchanged; the last two also
    empty all four states.
    NaN: x, a, b in some results; xStateForward, xStateBackward, yStateForward, yStateBackward in
    some results or in no result. */
QX_API ErrorCode zeroPhaseFiltH(QX_INOUT DBL1D x, QX_IN DBL1D a, QX_IN DBL1D b,
                                QX_INOUT DBL1D xStateForward, QX_INOUT DBL1D xStateBackward,
                                QX_INOUT DBL1D yStateForward, QX_INOUT DBL1D yStateBackward,
                                int32_t keepState);

/** Filters x in place by a cascade with the coefficients a and b. form: as IIR_Filter2. Without any
    coefficients x is unchanged. keepState 0 clears the states.
    Codes: ErrEmptyInput (x is empty), ErrSizesDisagree (a without b, or b without a), the host's
    status (it refuses a state), ErrInvalidSelector (no such form), ErrCoefficientSizes (the sizes
    of a and b do not fit the form), ErrOutOfMemory (no memory). A failure leaves x unchanged.
    NaN: x in all results; a in all results or in some results; b in some results; stateForward in
    all results or in some results or in no result; stateBackward in some results or in no
    result. */
QX_API ErrorCode zeroPhaseCascadeFiltH(QX_INOUT DBL1D x, QX_IN const int32_t *form, QX_IN DBL1D a,
                                       QX_IN DBL1D b, QX_INOUT DBL1D stateForward,
                                       QX_INOUT DBL1D stateBackward, int32_t keepState);

QX_END_DECLS

#endif
