#ifndef QX_POWER_SPECTRUM_H
#define QX_POWER_SPECTRUM_H

/* Power and cross spectra: two-sided, in the order of the plain transform (index 0 is zero
   frequency), scaled by 1/n^2, with no window, averaging or frequency axis.

   An _IDP export keeps its plan in the host's instance data and is otherwise its twin. */

#include "qx/fft.h"

QX_BEGIN_DECLS

/** Replaces x by its power spectrum: S[k] = |X[k]|^2 / n^2 for k from 0 to n-1, with X the unscaled
    transform. The sum of S is the mean square of x; S[k] equals S[n-k] to the bit.
    Codes: ErrEmptyInput (x is empty), ErrInternal (the word holds something other than a plan),
    ErrOutOfMemory (no memory). A failure empties x.
    NaN: x in all results. */
QX_API ErrorCode SpectrumH(QX_INOUT DBL1D x, QX_INOUT PlanSlot *slot);
/** As SpectrumH, with its plan in the host's instance data. */
QX_API ErrorCode SpectrumH_IDP(QX_INOUT DBL1D x, QX_INOUT InstanceWord *instance);

/** The power spectrum of complex data: spectrum[k] = |X[k]|^2 / n^2, n values.
    Codes: ErrEmptyInput (x is empty), ErrInternal (the word holds something other than a plan),
    ErrOutOfMemory (no memory, or the host refuses the output).
    NaN: x in all results. */
QX_API ErrorCode CxSpectrumH(QX_IN CDB1D x, QX_OUT DBL1D spectrum, QX_INOUT PlanSlot *slot);
/** As CxSpectrumH, with its plan in the host's instance data. */
QX_API ErrorCode CxSpectrumH_IDP(QX_IN CDB1D x, QX_OUT DBL1D spectrum,
                                 QX_INOUT InstanceWord *instance);

/** The cross spectrum: cross[k] = conj(X[k]) Y[k] / n^2, n values. Element 0 and, for even n,
    element n/2 have a zero imaginary part; element n-k is the conjugate of element k to the bit.
    Codes: ErrEmptyInput (x or y is empty), ErrSizeMismatch (their sizes differ), the host's status
    (it refuses the output; a positive status leaves the output unchanged), ErrInternal (the word
    holds something other than a plan), ErrOutOfMemory (no memory).
    NaN: x, y in some results. */
QX_API ErrorCode CrossSpectrumH(QX_IN DBL1D x, QX_IN DBL1D y, QX_OUT CDB1D cross,
                                QX_INOUT PlanSlot *slot);
/** As CrossSpectrumH, with its plan in the host's instance data. */
QX_API ErrorCode CrossSpectrumH_IDP(QX_IN DBL1D x, QX_IN DBL1D y, QX_OUT CDB1D cross,
                                    QX_INOUT InstanceWord *instance);

/** The cross spectrum of complex data: cross[k] = conj(X[k]) Y[k] / n^2, n values.
    Codes: ErrEmptyInput (x or y is empty), ErrSizeMismatch (their sizes differ), ErrOutOfMemory
    (the host refuses the output), ErrInternal (the word holds something other than a plan),
    ErrOutOfMemory (no memory).
    NaN: x, y in all results. */
QX_API ErrorCode CxCrossSpectrumH(QX_IN CDB1D x, QX_IN CDB1D y, QX_OUT CDB1D cross,
                                  QX_INOUT PlanSlot *slot);
/** As CxCrossSpectrumH, with its plan in the host's instance data. */
QX_API ErrorCode CxCrossSpectrumH_IDP(QX_IN CDB1D x, QX_IN CDB1D y, QX_OUT CDB1D cross,
                                      QX_INOUT InstanceWord *instance);

QX_END_DECLS

#endif
