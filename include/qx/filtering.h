#ifndef QX_FILTERING_H
#define QX_FILTERING_H

/* Filtering of signals by IIR and FIR filters. The caller keeps the memory of a filter in state
   arrays and passes them back unchanged; a signal may then be split between calls anywhere, and the
   results are the same to the bit. The exports set the sizes of the states. If a state has the
   wrong size, all states of the call are cleared, whatever the flag says.

   Direct form: y[t] = (b[0] x[t] + ... + b[nb-1] x[t-nb+1] - a[1] y[t-1] - ... - a[na-1] y[t-na+1])
   / a[0]. If `a` is empty, it is an FIR filter; if both are empty, x is unchanged. The state of x
   holds nb - 1 values and that of y na - 1 (none without `a`), the newest last.

   Cascade: sections of order m, 2 (form 0) or 4 (form 1), in direct form II, each with m values in
   `a` (the leading 1 is not stored), m + 1 in `b` and m in the state.

   Values kept in a recursion are set to 0 if their magnitude is not above the smallest normal
   number. A zero a[0] is not checked for and gives infinities and NaN. */

#include "qx/types.h"

QX_BEGIN_DECLS

/** Filters x in place, in direct form. The states are kept from the last call if *keepState is 1
    and cleared otherwise. The code is in *err. If the host refuses a state, the function result is
    its status and that state is emptied.
    Codes: ErrEmptyInput (x is empty), ErrSizesDisagree (a without b; x is emptied), ErrOutOfMemory
    (the host refuses a state; or no memory, in which case x is emptied).
    NaN: x, a, b in some results; xState, yState in some results or in no result. */
QX_API int32_t IIR_Filter(QX_INOUT DBL1D x, QX_IN DBL1D a, QX_IN DBL1D b, QX_INOUT DBL1D xState,
                          QX_INOUT DBL1D yState, QX_IN const uint8_t *keepState,
                          QX_OUT ErrorCode *err);
/** As IIR_Filter, for a complex signal: its parts run through the same coefficients. */
QX_API int32_t CxSigIIR_Filter(QX_INOUT CDB1D x, QX_IN DBL1D a, QX_IN DBL1D b,
                               QX_INOUT CDB1D xState, QX_INOUT CDB1D yState,
                               QX_IN const uint8_t *keepState, QX_OUT ErrorCode *err);
/** As IIR_Filter, for a complex signal and complex coefficients. */
QX_API int32_t CxIIR_Filter_H(QX_INOUT CDB1D x, QX_IN CDB1D a, QX_IN CDB1D b, QX_INOUT CDB1D xState,
                              QX_INOUT CDB1D yState, QX_IN const uint8_t *keepState,
                              QX_OUT ErrorCode *err);

/** Filters a real signal x by a filter with complex coefficients, in direct form; without any
    coefficients y is x. The states are kept from the last call if *keepState is 1 and cleared
    otherwise.
    Codes: ErrEmptyInput (x is empty), ErrSizesDisagree (a without b), ErrOutOfMemory (the host
    refuses y or a state, or no memory). A failure empties y, and a refused state.
    NaN: x, a, b, xState, yState in some results. */
QX_API ErrorCode CxIIRReSig_Filter_H(QX_IN DBL1D x, QX_OUT CDB1D y, QX_IN CDB1D a, QX_IN CDB1D b,
                                     QX_INOUT DBL1D xState, QX_INOUT CDB1D yState,
                                     QX_IN const uint8_t *keepState);

/** Filters x in place, in direct form, with the state of x, followed by that of y, in one array. It
    is kept from the last call if *keepState is 1 and cleared otherwise.
    Codes: ErrEmptyInput (x is empty), ErrSizesDisagree (a without b), ErrOutOfMemory (the host
    refuses the state, or no memory). A failure empties x and the state.
    NaN: x, a, b in some results; state in some results or in no result. */
QX_API ErrorCode IIR_Filter_OneState(QX_INOUT DBL1D x, QX_IN DBL1D a, QX_IN DBL1D b,
                                     QX_INOUT DBL1D state, QX_IN const uint8_t *keepState);
/** As IIR_Filter_OneState, for a complex signal: its parts run through the same coefficients. */
QX_API ErrorCode CxSigIIR_Filter_OneState(QX_INOUT CDB1D x, QX_IN DBL1D a, QX_IN DBL1D b,
                                          QX_INOUT CDB1D state, QX_IN const uint8_t *keepState);

/** Filters x in place by a cascade. form: 0 sections of second order; 1 sections of fourth order.
    Without any coefficients x is unchanged. The state is kept from the last call if *keepState is 1
    and cleared otherwise. The code is in *err. If the host refuses the state, the function result
    is its status and the state is emptied.
    Codes: ErrEmptyInput (x is empty), ErrSizesDisagree (a without b, or b without a; x is
    emptied), ErrInvalidSelector (no such form; x is unchanged), ErrOutOfMemory (the host refuses
    the state), ErrCoefficientSizes (the sizes of a and b do not fit the form; x is emptied).
    NaN: x, a in all results or in some results; b in some results; state in all results or in some
    results or in no result. */
QX_API int32_t IIR_Filter2(QX_INOUT DBL1D x, QX_IN const int32_t *form, QX_IN DBL1D a,
                           QX_IN DBL1D b, QX_INOUT DBL1D state, QX_IN const uint8_t *keepState,
                           QX_OUT ErrorCode *err);
/** As IIR_Filter2, for a complex signal: its parts run through the same coefficients. */
QX_API int32_t CxSigIIR_Filter2(QX_INOUT CDB1D x, QX_IN const int32_t *form, QX_IN DBL1D a,
                                QX_IN DBL1D b, QX_INOUT CDB1D state, QX_IN const uint8_t *keepState,
                                QX_OUT ErrorCode *err);

/** Filters one sample in place. mode: 0 a cascade of second-order sections; 1 a cascade of
    fourth-order sections; 2 direct form with its state in one array; 3 the same as an FIR filter,
    which ignores a unless b is empty. The state is cleared if *reset is not 0, the opposite of
    keepState in the exports for arrays.
    Codes: ErrInvalidSelector (no such mode), ErrSizesDisagree (a without b; in a cascade also b
    without a), ErrOutOfMemory (the host refuses the state), ErrCoefficientSizes (the sizes of a
    and b do not fit the cascade). A failure empties the state and leaves 0 in *x.
    NaN: x, b in some results; a, state in some results or in no result. */
QX_API ErrorCode IIR_Filter_PtbyPt(QX_INOUT DBL *x, int32_t mode, QX_IN DBL1D a, QX_IN DBL1D b,
                                   QX_INOUT DBL1D state, QX_IN const uint8_t *reset);
/** As IIR_Filter_PtbyPt, for a complex sample: its parts run through the same coefficients.
    NaN: x.im, x.re, b in some results; a, state in some results or in no result. */
QX_API ErrorCode CxSigIIR_Filter_PtbyPt(QX_INOUT CDB *x, int32_t mode, QX_IN DBL1D a, QX_IN DBL1D b,
                                        QX_INOUT CDB1D state, QX_IN const uint8_t *reset);

QX_END_DECLS

#endif
