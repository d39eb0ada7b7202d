#ifndef QX_DZT_H
#define QX_DZT_H

/* A narrow band of a long transform.

   Plans are kept in slots or, by the _IDP twins, in the host's instance data, as described in
   qx/fft.h. If the host refuses an output, its status is returned. */

#include "qx/fft.h"

QX_BEGIN_DECLS

/** A band of bins of a transform of length L = S N from S transforms of length N: out[i] = sum over
    u of x[u] exp(-2 pi i u (start + i) / L) for i from 0 to size-1, cyclic in frequency. An input
    shorter than L is zero-padded. A longer input is folded in place: its elements from index N on
    (not from L) are added, one after the other, to elements 0 to L-1, cyclically. The time is a
    transform of length N and `size` rotations for each of min(S, elements of x) sub-sequences. The
    memory, besides `out`, is the plan of length N (see create_oxfft_table) and at least 16 N bytes
    of working memory, 32 N for complex data. N is the caller's choice: all this memory is used
    however short the input is.
    Codes: ErrOrderNotPositive (S is below 1), ErrFFTSizeNotPositive (size or N is below 1),
    ErrInternal (the word holds something other than a plan), ErrOutOfMemory (no memory), the host's
    status, ErrLengthTooLarge (an index would exceed int32_t). A negative status empties `out`. An
    empty input gives an empty output and 0.
    NaN: in in some results. */
QX_API ErrorCode ReDZTH(QX_INOUT DBL1D in, int32_t S, int32_t N, int32_t start, int32_t size,
                        QX_OUT CDB1D out, QX_INOUT PlanSlot *slot);
/** As ReDZTH, with its plan in the host's instance data. */
QX_API ErrorCode ReDZTH_IDP(QX_INOUT DBL1D in, int32_t S, int32_t N, int32_t start, int32_t size,
                            QX_OUT CDB1D out, QX_INOUT InstanceWord *instance);

/** As ReDZTH, of complex data. */
QX_API ErrorCode CxDZTH(QX_INOUT CDB1D in, int32_t S, int32_t N, int32_t start, int32_t size,
                        QX_OUT CDB1D out, QX_INOUT PlanSlot *slot);
/** As CxDZTH, with its plan in the host's instance data. */
QX_API ErrorCode CxDZTH_IDP(QX_INOUT CDB1D in, int32_t S, int32_t N, int32_t start, int32_t size,
                            QX_OUT CDB1D out, QX_INOUT InstanceWord *instance);

QX_END_DECLS

#endif
