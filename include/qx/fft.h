#ifndef QX_FFT_H
#define QX_FFT_H

/* Fourier transforms of any length, without padding. Forward: X[k] = sum over j of x[j] exp(-2 pi i
   j k / n), unscaled. Inverse: the opposite sign and the factor 1/n.

   If the host refuses an output, its status is returned. Every status other than 0 leaves the
   output empty.

   With `shift` non-zero a spectrum is in shifted order: index j holds frequency (j - n/2) modulo
   n, so that the zero frequency is at index n/2.

   An export keeps its plan from call to call in a slot: a word of the caller, null at first, which
   is registered with the host for clean-up. Its _IDP twin keeps the plan in the instance data of
   the host instead, which TransformUnreserveProc releases. A word that was filled by another kind
   of slot, by an _IDP export or by a measurement is refused. Any other address in the word cannot
   be distinguished from a plan: never store one there. */

#include "qx/types.h"

QX_BEGIN_DECLS

/* The table of one transform length, shared by all users of that length. */
typedef struct FFTPlan FFTPlan;

/* A word of the caller in which an export keeps its plan from call to call; null at first. */
typedef void *PlanSlot;
/* The word that the host keeps for a call node, for the _IDP exports; null at first. */
typedef void *InstanceWord;

/** Returns the plan for transforms of `length` values, which is built on the first request and then
    shared. Every plan is released with destroy_oxfft_table. Building takes time proportional to n
    log n, about that of a few transforms of that length, and up to 160 bytes of memory for each
    value: 2.5 GB for a prime near 2^24. Returns null if length is below 1 or there is not enough
    memory. */
QX_API FFTPlan *create_oxfft_table(int32_t length);

/** Releases a plan, which is freed when its last holder releases it. Null is allowed. */
QX_API void destroy_oxfft_table(QX_IN FFTPlan *plan);

/** As CxOXFFTH80, of the whole input, not shifted.
    NaN: in in all results. */
QX_API ErrorCode CxOXFFTH(QX_IN CDB1D in, QX_OUT CDB1D out, QX_INOUT PlanSlot *slot);

/** The transform X[k] = sum over j of x[j] exp(-2 pi i j k / n), k from 0 to n-1, unscaled, of the
    n = `size` values x of `in` from index `offset` on, zero-padded after its end. `out` receives X,
    in shifted order if `shift` is non-zero. Any offset is accepted: values before the start of `in`
    count as zero, too.
    Codes: ErrEmptyInput (in is empty), ErrFFTSizeNotPositive (size is below 1), ErrInternal (the
    word holds something other than a plan), ErrOutOfMemory (no memory), the host's status.
    NaN: in in all results or in no result. */
QX_API ErrorCode CxOXFFTH80(QX_IN CDB1D in, QX_OUT CDB1D out, QX_INOUT PlanSlot *slot,
                            int32_t offset, int32_t size, int32_t shift);
/** As CxOXFFTH80, with its plan in the host's instance data.
    NaN: in in all results. */
QX_API ErrorCode CxOXFFTH80_IDP(QX_IN CDB1D in, QX_OUT CDB1D out, QX_INOUT InstanceWord *instance,
                                int32_t offset, int32_t size, int32_t shift);

/** As InvCxOXFFTH80, of a spectrum that is not shifted. */
QX_API ErrorCode InvCxOXFFTH(QX_IN CDB1D in, QX_OUT CDB1D out, QX_INOUT PlanSlot *slot);

/** The inverse transform x[j] = 1/n sum over k of X[k] exp(2 pi i j k / n) of the n values X of
    `in`, which is in shifted order if `shift` is non-zero; `out` receives n values.
    Codes: ErrEmptyInput (in is empty), ErrInternal (the word holds something other than a plan),
    ErrOutOfMemory (no memory), the host's status.
    NaN: in in all results. */
QX_API ErrorCode InvCxOXFFTH80(QX_IN CDB1D in, QX_OUT CDB1D out, QX_INOUT PlanSlot *slot,
                               int32_t shift);
/** As InvCxOXFFTH80, with its plan in the host's instance data. */
QX_API ErrorCode InvCxOXFFTH80_IDP(QX_IN CDB1D in, QX_OUT CDB1D out,
                                   QX_INOUT InstanceWord *instance, int32_t shift);

/** As ReOXFFTH80, of the whole input, not shifted.
    NaN: in in some results. */
QX_API ErrorCode ReOXFFTH(QX_IN DBL1D in, QX_OUT CDB1D out, QX_INOUT PlanSlot *slot);

/** The transform X[k] = sum over j of x[j] exp(-2 pi i j k / n), unscaled, of the n = `size` values
    x of real data from index `offset` on, zero-padded after its end. `out` receives X for all k
    from 0 to n-1, in shifted order if `shift` is non-zero.
    Codes: ErrEmptyInput (in is empty), ErrIndexOutOfRange (offset is outside the input),
    ErrFFTSizeNotPositive (size is below 1), ErrInternal (the word holds something other than a
    plan), ErrOutOfMemory (no memory), the host's status.
    NaN: in in some results or in no result. */
QX_API ErrorCode ReOXFFTH80(QX_IN DBL1D in, QX_OUT CDB1D out, QX_INOUT PlanSlot *slot,
                            int32_t offset, int32_t size, int32_t shift);
/** As ReOXFFTH80, with its plan in the host's instance data.
    NaN: in in some results. */
QX_API ErrorCode ReOXFFTH80_IDP(QX_IN DBL1D in, QX_OUT CDB1D out, QX_INOUT InstanceWord *instance,
                                int32_t offset, int32_t size, int32_t shift);

/** The transform X[k] = sum over j of x[j] exp(-2 pi i j k / n) of real data, unscaled, in
    half-complex form: out[0] = Re X[0]; out[k] = Re X[k] and out[n-k] = Im X[k] for k from 1 to
    (n-1)/2; for even n out[n/2] = Re X[n/2].
    Codes: ErrEmptyInput (in is empty), the host's status, ErrInternal (the word holds something
    other than a plan), ErrOutOfMemory (no memory).
    NaN: in in all results or in some results. */
QX_API ErrorCode ReOXFFTHCH(QX_IN DBL1D in, QX_OUT DBL1D out, QX_INOUT PlanSlot *slot);
/** As ReOXFFTHCH, with its plan in the host's instance data. */
QX_API ErrorCode ReOXFFTHCH_IDP(QX_IN DBL1D in, QX_OUT DBL1D out, QX_INOUT InstanceWord *instance);

/** As InvReOXFFTH80, of a spectrum that is not shifted.
    NaN: in in all results or in no result. */
QX_API ErrorCode InvReOXFFTH(QX_IN CDB1D in, QX_OUT DBL1D out, QX_INOUT PlanSlot *slot);

/** The inverse transform x[j] = 1/n sum over k of X[k] exp(2 pi i j k / n) of the spectrum of real
    data, which is in shifted order if `shift` is non-zero. Only the non-negative frequencies are
    read, and at zero and n/2 only the real part: the output is real whatever the remaining values
    are.
    Codes: ErrEmptyInput (in is empty), ErrInternal (the word holds something other than a plan),
    ErrOutOfMemory (no memory), the host's status.
    NaN: in in all results or in no result. */
QX_API ErrorCode InvReOXFFTH80(QX_IN CDB1D in, QX_OUT DBL1D out, QX_INOUT PlanSlot *slot,
                               int32_t shift);
/** As InvReOXFFTH80, with its plan in the host's instance data. */
QX_API ErrorCode InvReOXFFTH80_IDP(QX_IN CDB1D in, QX_OUT DBL1D out,
                                   QX_INOUT InstanceWord *instance, int32_t shift);

/** The inverse of ReOXFFTHCH, with the factor 1/n, of a half-complex spectrum. `in` serves as
    working memory: afterwards it holds the Hartley form, scaled by 1/n.
    Codes: ErrEmptyInput (in is empty), the host's status, ErrInternal (the word holds something
    other than a plan), ErrOutOfMemory (no memory).
    NaN: in in some results. */
QX_API ErrorCode InvReOXFFTHCH(QX_INOUT DBL1D in, QX_OUT DBL1D out, QX_INOUT PlanSlot *slot);
/** As InvReOXFFTHCH, with its plan in the host's instance data. */
QX_API ErrorCode InvReOXFFTHCH_IDP(QX_INOUT DBL1D in, QX_OUT DBL1D out,
                                   QX_INOUT InstanceWord *instance);

/** Releases the plans of an _IDP node and clears its instance-data word. Null is allowed.
    Codes: ErrInternal (the word holds something other than plans, and is unchanged). */
QX_API ErrorCode TransformUnreserveProc(QX_INOUT InstanceWord *instance);

QX_END_DECLS

#endif
