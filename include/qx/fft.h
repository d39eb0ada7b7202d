#ifndef QX_FFT_H
#define QX_FFT_H

/* Fourier transforms of any length,  without padding. Forward: X[k] = sum
   over j of x[j] exp(-2 pi i j k / n), unscaled. Inverse: the opposite sign and the factor 1/n.

   A status of the host that refuses an output is returned as it is. Every status but 0 leaves the
   output empty.

   With `shift` non-zero a spectrum is in shifted order: index j holds frequency (j - n/2) modulo
   n, so that the zero frequency stands at n/2.

   An export keeps its plan from call to call in a slot: a word of the caller's, null at first, of
   which the host is told so that it can clean up. An _IDP export keeps it in the host's instance
   data, which TransformUnreserveProc gives back, and is otherwise its twin. A word that holds what
   a slot of another kind, an _IDP export or a measurement keeps is refused; any other address in it
   cannot be told from a plan and must not stand there. */

#include "qx/types.h"

QX_BEGIN_DECLS

/* The table of one transform length, shared by everybody who works with that length. */
typedef struct FFTPlan FFTPlan;

/* A word of the caller's in which an export keeps its plan from call to call; null at first. */
typedef void *PlanSlot;
/* The word that the host keeps for a call node, for the _IDP exports; null at first. */
typedef void *InstanceWord;

/** The plan for transforms of `length` values, built at the first request and shared after it.
    Every plan is given back with destroy_oxfft_table. Building takes time as n log n, like some
    transforms of that length, and memory of up to 160 bytes for each value: a prime near 2^24 has
    2.5 GB. Null if length is below 1 or memory ran out. */
QX_API FFTPlan *create_oxfft_table(int32_t length);

/** Gives a plan back; the last of its holders releases it. Null is allowed. */
QX_API void destroy_oxfft_table(QX_IN FFTPlan *plan);

/** As CxOXFFTH80, of the whole input, not shifted.
    NaN: in in all results. */
QX_API ErrorCode CxOXFFTH(QX_IN CDB1D in, QX_OUT CDB1D out, QX_INOUT PlanSlot *slot);

/** The transform X[k] = sum over j of x[j] exp(-2 pi i j k / n), k from 0 to n-1, unscaled, of the
    n = `size` values x of `in` from `offset` on, with zeros behind its end; `out` gets X, in
    shifted order if `shift` is non-zero. Any offset is taken: values before the start of `in` count
    as zero, too.
    Codes: ErrEmptyInput (in is empty), ErrFFTSizeNotPositive (size below 1), ErrInternal (the word
    holds something else than a plan), ErrOutOfMemory (no memory), the host's status.
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
    `in`, which is in shifted order if `shift` is non-zero; `out` gets as many values.
    Codes: ErrEmptyInput (in is empty), ErrInternal (the word holds something else than a plan),
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
    x of real data from `offset` on, with zeros behind its end; `out` gets X for all k from 0 to
    n-1, in shifted order if `shift` is non-zero.
    Codes: ErrEmptyInput (in is empty), ErrIndexOutOfRange (offset outside the input),
    ErrFFTSizeNotPositive (size below 1), ErrInternal (the word holds something else than a plan),
    ErrOutOfMemory (no memory), the host's status.
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
    else than a plan), ErrOutOfMemory (no memory).
    NaN: in in some results. */
QX_API ErrorCode ReOXFFTHCH(QX_IN DBL1D in, QX_OUT DBL1D out, QX_INOUT PlanSlot *slot);
/** As ReOXFFTHCH, with its plan in the host's instance data. */
QX_API ErrorCode ReOXFFTHCH_IDP(QX_IN DBL1D in, QX_OUT DBL1D out, QX_INOUT InstanceWord *instance);

/** As InvReOXFFTH80, of a spectrum that is not shifted.
    NaN: in in all results or in no result. */
QX_API ErrorCode InvReOXFFTH(QX_IN CDB1D in, QX_OUT DBL1D out, QX_INOUT PlanSlot *slot);

/** The inverse transform x[j] = 1/n sum over k of X[k] exp(2 pi i j k / n) of the spectrum of real
    data, which is in shifted order if `shift` is non-zero. Only the non-negative frequencies are
    read, and of zero and n/2 only the real part: the output is real whatever the rest holds.
    Codes: ErrEmptyInput (in is empty), ErrInternal (the word holds something else than a plan),
    ErrOutOfMemory (no memory), the host's status.
    NaN: in in all results. */
QX_API ErrorCode InvReOXFFTH80(QX_IN CDB1D in, QX_OUT DBL1D out, QX_INOUT PlanSlot *slot,
                               int32_t shift);
/** As InvReOXFFTH80, with its plan in the host's instance data. */
QX_API ErrorCode InvReOXFFTH80_IDP(QX_IN CDB1D in, QX_OUT DBL1D out,
                                   QX_INOUT InstanceWord *instance, int32_t shift);

/** The inverse of ReOXFFTHCH, with the factor 1/n, of a half-complex spectrum. `in` serves as work
    memory: it is left scaled by 1/n and turned into the Hartley form.
    Codes: ErrEmptyInput (in is empty), the host's status, ErrInternal (the word holds something
    else than a plan), ErrOutOfMemory (no memory).
    NaN: in in some results. */
QX_API ErrorCode InvReOXFFTHCH(QX_INOUT DBL1D in, QX_OUT DBL1D out, QX_INOUT PlanSlot *slot);
/** As InvReOXFFTHCH, with its plan in the host's instance data. */
QX_API ErrorCode InvReOXFFTHCH_IDP(QX_INOUT DBL1D in, QX_OUT DBL1D out,
                                   QX_INOUT InstanceWord *instance);

/** Gives the plans of an _IDP node back and clears its instance-data word. Null is allowed.
    Codes: ErrInternal (the word holds something else than plans, and stays as it is). */
QX_API ErrorCode TransformUnreserveProc(QX_INOUT InstanceWord *instance);

QX_END_DECLS

#endif
