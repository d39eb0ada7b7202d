#ifndef QX_RESAMPLING_H
#define QX_RESAMPLING_H

/* Evaluation of a sampled signal at arbitrary times with an oversampled kernel given by the caller.

   The kernel is a table `proto` with `oversample` entries per input sample and its peak at the
   centre c = (size - 1) / 2. The output at time T, in input samples, is step times the sum over k
   of x[k] proto(c + step (k - T)), summed from the newest sample to the oldest, with step =
   oversample / r, where r, between 1 and oversample, is the factor by which the kernel is
   stretched. The table is read at the nearest entry (mode 1) or by linear interpolation (any other
   mode). */

#include "qx/types.h"

QX_BEGIN_DECLS

/* The design of Resample_Const. */
typedef struct ResampleDesign {
    double ratio; /* the spacing of the outputs, in input samples */
    int32_t mode; /* 1 takes the nearest entry of the table, else linear interpolation */
    double start; /* the time of the first output, in input samples */
    DBL1D proto;  /* the table of the kernel */
    int32_t oversample;
} ResampleDesign;

/* The state of a stream of Resample_Const; kept by the caller, with arrays that the export
   resizes. */
typedef struct ResampleState {
    DBL1D history;
    int32_t historyCount;
    DBL1D taps;
    double tapScale;
    int32_t leftTaps;
    int32_t rightTaps;
    int32_t mode;
    double ratio;
    double fraction;  /* the next output is at position + fraction ... */
    int32_t position; /* ... from the first sample of the history */
} ResampleState;

/* The same for CxResample_Const. */
typedef struct CxResampleState {
    CDB1D history;
    int32_t historyCount;
    DBL1D taps;
    double tapScale;
    int32_t leftTaps;
    int32_t rightTaps;
    int32_t mode;
    double ratio;
    double fraction;
    int32_t position;
} CxResampleState;

#pragma pack(push, 1)
/* The design of the exports for a list of times. */
typedef struct QX_PACKED VariableDesign {
    int32_t mode;
    uint8_t antiAlias; /* stretches the kernel to the interval before each time */
    DBL1D proto;
    int32_t oversample;
} VariableDesign;
#pragma pack(pop)

/** The values of a stream at times start, start + ratio, start + 2 ratio ... With `antiAlias` the
    kernel is stretched by ratio, without it by at most 1. A non-zero `reset` begins a stream; the
    caller passes state back unchanged with each block. y has ceil((size of x + historyCount) /
    ratio) elements: first *outCount outputs, then zeros. Blocks of any size give the same outputs
    up to rounding, since times are computed from the start of each block. After a negative start
    the second output is at time ratio - 1 instead of start + ratio. A failure empties y and the
    arrays of the state and clears its numbers.
    Codes: ErrBufferOverrun (the state has no room for the taps or for the samples to keep, or
    oversample is 0), ErrIndexNotBelowSize (more outputs than y holds), ErrOutOfMemory (no memory,
    or ratio is 0 or NaN).
    NaN: x in some results; state.fraction, design.start refused with ErrBufferOverrun or in no
    result; state.history, state.taps, design.proto in some results or in no result; state.ratio,
    design.ratio refused with ErrOutOfMemory or in no result; state.tapScale in no result. */
QX_API ErrorCode Resample_Const(QX_IN DBL1D x, QX_INOUT ResampleState *state,
                                QX_IN const ResampleDesign *design, int32_t reset, QX_OUT DBL1D y,
                                QX_OUT int32_t *outCount, int32_t antiAlias);
/** As Resample_Const, for complex data. */
QX_API ErrorCode CxResample_Const(QX_IN CDB1D x, QX_INOUT CxResampleState *state,
                                  QX_IN const ResampleDesign *design, int32_t reset, QX_OUT CDB1D y,
                                  QX_OUT int32_t *outCount, int32_t antiAlias);

/** The values at the times in t, given in input samples from x[0], as far as x extends. The first
    *outCount elements of t are replaced by the outputs; the later ones remain times, which are now
    counted from x[*consumed], as is *lastTime, the time of the last output. The caller then removes
    *consumed samples (possibly more than x has), appends new ones and calls again. Samples before
    x[0] count as zeros.
    Codes: ErrBufferOverrun (a time is not finite, or oversample is 0), ErrOutOfMemory (no
    memory).
    NaN: x, design.proto, lastTime in some results or in no result; t refused with ErrBufferOverrun
    or in some results. */
QX_API ErrorCode Resample_Variable(QX_IN DBL1D x, QX_INOUT DBL1D t,
                                   QX_IN const VariableDesign *design, QX_INOUT double *lastTime,
                                   QX_OUT int32_t *outCount, QX_OUT int32_t *consumed);
/** As Resample_Variable, for complex data; times are the real parts of t.
    NaN: x, design.proto in some results or in no result; t refused with ErrBufferOverrun or in some
    results; lastTime refused with ErrBufferOverrun. */
QX_API ErrorCode CxResample_Variable(QX_IN CDB1D x, QX_INOUT CDB1D t,
                                     QX_IN const VariableDesign *design, QX_INOUT double *lastTime,
                                     QX_OUT int32_t *outCount, QX_OUT int32_t *consumed);

/** As Resample_Variable, for channels in the rows of x. The outputs are in y, a row of *outCount
    values for each channel, and the times in t that were processed remain there.
    NaN: x, design.proto in some results or in no result; t refused with ErrBufferOverrun or in some
    results; lastTime refused with ErrBufferOverrun. */
QX_API ErrorCode Resample_Variable_MultiCh(QX_IN DBL2D x, QX_OUT DBL2D y, QX_INOUT DBL1D t,
                                           QX_IN const VariableDesign *design,
                                           QX_INOUT double *lastTime, QX_OUT int32_t *outCount,
                                           QX_OUT int32_t *consumed);
/** As Resample_Variable_MultiCh, for complex data.
    NaN: x, design.proto, lastTime in some results or in no result; t refused with ErrBufferOverrun
    or in some results. */
QX_API ErrorCode CxResample_Variable_MultiCh(QX_IN CDB2D x, QX_OUT CDB2D y, QX_INOUT DBL1D t,
                                             QX_IN const VariableDesign *design,
                                             QX_INOUT double *lastTime, QX_OUT int32_t *outCount,
                                             QX_OUT int32_t *consumed);

QX_END_DECLS

#endif
