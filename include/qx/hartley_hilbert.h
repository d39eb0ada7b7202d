#ifndef QX_HARTLEY_HILBERT_H
#define QX_HARTLEY_HILBERT_H

/* Hartley and Hilbert transforms, in place.

   Plans are kept in slots or, by the _IDP twins, in the host's instance data, as described in
   qx/fft.h. */

#include "qx/fft.h"

QX_BEGIN_DECLS

/** Replaces x by its Hartley transform: H[k] = sum over j of x[j] (cos(2 pi j k / n) + sin(2 pi j k
    / n)), unscaled.
    Codes: ErrEmptyInput (x is empty), ErrInternal (the word holds something other than a plan),
    ErrOutOfMemory (no memory). A failure empties x.
    NaN: x in all results. */
QX_API ErrorCode FHTH(QX_INOUT DBL1D x, QX_INOUT PlanSlot *slot);
/** As FHTH, with its plan in the host's instance data. */
QX_API ErrorCode FHTH_IDP(QX_INOUT DBL1D x, QX_INOUT InstanceWord *instance);

/** The inverse of FHTH: the same transform with the factor 1/n.
    Codes: ErrEmptyInput (x is empty), ErrInternal (the word holds something other than a plan),
    ErrOutOfMemory (no memory). A failure empties x, except that x is unchanged if no plan can be
    made.
    NaN: x in all results. */
QX_API ErrorCode InvFHTH(QX_INOUT DBL1D x, QX_INOUT PlanSlot *slot);
/** As InvFHTH, with its plan in the host's instance data. */
QX_API ErrorCode InvFHTH_IDP(QX_INOUT DBL1D x, QX_INOUT InstanceWord *instance);

/** Replaces x by its Hilbert transform: the spectrum times -i for positive and i for negative
    frequencies, 0 at the zero and the Nyquist frequency. A cosine becomes a sine.
    Codes: ErrEmptyInput (x is empty), ErrInternal (the word holds something other than a plan),
    ErrOutOfMemory (no memory). A failure empties x.
    NaN: x in all results. */
QX_API ErrorCode FastHilbertTransformH(QX_INOUT DBL1D x, QX_INOUT PlanSlot *slot);
/** As FastHilbertTransformH, with its plan in the host's instance data. */
QX_API ErrorCode FastHilbertTransformH_IDP(QX_INOUT DBL1D x, QX_INOUT InstanceWord *instance);

/** The negative of FastHilbertTransformH. Applied to the transform of x, it returns x without its
    mean and, for even n, without its Nyquist component.
    Codes: those of FastHilbertTransformH.
    NaN: x in all results. */
QX_API ErrorCode InvFastHilbertTransformH(QX_INOUT DBL1D x, QX_INOUT PlanSlot *slot);
/** As InvFastHilbertTransformH, with its plan in the host's instance data. */
QX_API ErrorCode InvFastHilbertTransformH_IDP(QX_INOUT DBL1D x, QX_INOUT InstanceWord *instance);

QX_END_DECLS

#endif
