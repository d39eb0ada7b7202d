#ifndef QX_DECIMATION_H
#define QX_DECIMATION_H

/* Decimation, FIR decimators and interpolators, cascaded integrator-comb filters, moving sums and
   modulators, all for streams in blocks.

   The data that a stream keeps between blocks (`state`, `delay`, `start` and so on) belong to the
   caller, who passes them back unchanged. Blocks of any size then give the results of a single
   block, to the bit, except in the modulators, whose rotation is restarted with each block. A
   failure empties the output arrays and the state arrays; `delay` and other numbers of a stream are
   unchanged. `reset` sizes and clears the state of a FIR or CIC stream. */

#include "qx/types.h"

QX_BEGIN_DECLS

/** Keeps every *factor-th value of x, starting with the first, or, if *average is non-zero, the
    means of *factor neighbours; values after the last whole group are dropped. The function result
    is 0, or the host's own status if it refused the resize.
    Codes: ErrEmptyInput (x is empty), ErrDecimationOutOfRange (*factor is below 1 or above the size
    of x), ErrOutOfMemory (no memory).
    NaN: x in some results or in no result. */
QX_API int32_t DecimateCIN(QX_INOUT DBL1D x, QX_IN const int32_t *factor,
                           QX_IN const uint8_t *average, QX_OUT ErrorCode *err);
/** As DecimateCIN, for complex data, with scalars by value; the code is the function result. */
QX_API ErrorCode CxDecimate_H(QX_INOUT CDB1D x, int32_t factor, int32_t average);

/** Decimates a stream: x becomes every factor-th sample, after *start samples that are skipped, or,
    if `average` is non-zero, the means of groups of factor samples. A group that is incomplete at
    the end of the block is kept in *partialCount and *partialSum, which `reset` clears; *start is
    then the number of samples that it still needs.
    Codes: ErrNotStrictlyPositive (factor is below 1), ErrNegativeSetting (*start is negative),
    ErrOutOfMemory (no memory).
    NaN: x in some results or in no result; partialSum in some results. */
QX_API ErrorCode DecimateContinuous_H(QX_INOUT DBL1D x, int32_t factor, int32_t average,
                                      QX_INOUT int32_t *start, int32_t reset,
                                      QX_INOUT int32_t *partialCount, QX_INOUT double *partialSum);
/** As DecimateContinuous_H, for complex data.
    NaN: x in some results or in no result; partialSum.im, partialSum.re in some results. */
QX_API ErrorCode CxDecimateContinuous_H(QX_INOUT CDB1D x, int32_t factor, int32_t average,
                                        QX_INOUT int32_t *start, int32_t reset,
                                        QX_INOUT int32_t *partialCount, QX_INOUT CDB *partialSum);

/** Filters a stream with taps that are L samples apart: y[i] = gain sum over k of h[k] x[i - k L].
    state has (size of h - 1) L elements, however short x is. The first *delay outputs are dropped.
    Codes: ErrOrderNotPositive (h is empty), ErrNotStrictlyPositive (L is below 1),
    ErrMultirateStateSize (state has the wrong size and there is no reset), the host's status (it
    refuses the state), ErrOutOfMemory (no memory).
    NaN: x, gain, h in some results; state in some results or in no result. */
QX_API ErrorCode InterpolatedFIRH(QX_IN DBL1D x, QX_OUT DBL1D y, int32_t L, double gain,
                                  QX_IN DBL1D h, QX_INOUT DBL1D state, uint8_t reset,
                                  QX_INOUT int32_t *delay);

/** Interpolates a stream by L: y[i L + p] = gain L sum over k of h[p + k L] x[i - k]. state has
    ceil(size of h / L) elements. The first *delay outputs are dropped.
    Codes: ErrOrderNotPositive (h is empty), ErrNotStrictlyPositive (L is below 1),
    ErrMultirateStateSize (state has the wrong size and there is no reset), ErrOutOfMemory (no
    memory).
    NaN: x, gain, h in some results; state in some results or in no result. */
QX_API ErrorCode InterpolatorFIRH(QX_IN DBL1D x, QX_OUT DBL1D y, double gain, int32_t L,
                                  QX_IN DBL1D h, QX_INOUT DBL1D state, uint8_t reset,
                                  QX_INOUT int32_t *delay);

/** Decimates a stream by M: y[m] = sum over k of h[k] x[firstPhase + m M - k]. The gain is not
    applied: scale the taps instead. state has ceil(size of h / M) + 1 elements: outputs that are
    not yet complete, and the phase. The first *delay outputs are dropped.
    Codes: ErrOrderNotPositive (h is empty), ErrNotStrictlyPositive (M is below 1),
    ErrMultirateStateSize (state has the wrong size and there is no reset), ErrOutOfMemory (no
    memory).
    NaN: x in some results; gain in no result; h, state in some results or in no result. */
QX_API ErrorCode DecimatorFIRH(QX_IN DBL1D x, QX_OUT DBL1D y, double gain, int32_t M, QX_IN DBL1D h,
                               QX_INOUT DBL1D state, uint8_t reset, int32_t firstPhase,
                               QX_INOUT int32_t *delay);

/** Decimates a stream by `factor` after a cascade of `stages` moving averages over w = factor
    differentialDelay samples. This equals a cascaded integrator-comb filter with unit gain at zero
    frequency or, with `alternate`, at half the sampling rate; a stage then replaces its running
    value v by x[i] - v - x[i - w] for even w and by x[i] - v + x[i - w] for odd w. Running values
    are plain sums, which accumulate rounding errors unless the data are integers. state has (w + 1)
    stages + 1 elements, up to 2^31 - 1. A reset clears them and every call traverses them, however
    short x is. The first output is that of input *delay.
    Codes: ErrNotStrictlyPositive (stages, factor or differentialDelay is below 1),
    ErrMultirateStateSize (state has the wrong size and there is no reset), the host's status (it
    refuses the state), ErrOutOfMemory (no memory), WarnMultirateEmpty (x is empty).
    NaN: x in some results; state in some results or in no result. */
QX_API ErrorCode CICDecimatorByMovH(QX_IN DBL1D x, QX_OUT DBL1D y, QX_INOUT DBL1D state,
                                    int32_t stages, int32_t factor, int32_t differentialDelay,
                                    int16_t alternate, uint8_t reset, QX_INOUT int32_t *delay);
/** Interpolates a stream by `factor`: the input, multiplied by factor and with factor - 1 zeros
    after each sample, is filtered by the cascade of CICDecimatorByMovH. state has (w + 1) stages
    elements, with the same cost. The first *delay outputs are dropped.
    Codes: ErrNotStrictlyPositive (stages, factor or differentialDelay is below 1),
    ErrMultirateStateSize (state has the wrong size and there is no reset), the host's status (it
    refuses the state), ErrOutOfMemory (no memory), WarnMultirateEmpty (x is empty).
    NaN: x, state in some results. */
QX_API ErrorCode CICInterpolatorByMovH(QX_IN DBL1D x, QX_OUT DBL1D y, QX_INOUT DBL1D state,
                                       int32_t stages, int32_t factor, int32_t differentialDelay,
                                       int16_t alternate, uint8_t reset, QX_INOUT int32_t *delay);

/** Sums of groups of `factor` samples of a stream, in the first *outCount elements of x, which
    keeps its size. They are sums, not means: scale them by 1 / factor. The incomplete group is kept
    in *sum and *count. A factor below 2 leaves x unchanged.
    Codes: none.
    NaN: x, sum in some results. */
QX_API ErrorCode ReDecimatedMovingAverageH(QX_INOUT DBL1D x, int32_t factor, QX_INOUT double *sum,
                                           QX_INOUT int32_t *count, int32_t reset,
                                           QX_OUT int32_t *outCount);
/** As ReDecimatedMovingAverageH, for complex data.
    Codes: none.
    NaN: x, sum.im, sum.re in some results. */
QX_API ErrorCode CxDecimatedMovingAverageH(QX_INOUT CDB1D x, int32_t factor, QX_INOUT CDB *sum,
                                           QX_INOUT int32_t *count, int32_t reset,
                                           QX_OUT int32_t *outCount);

/** Filters x by a cascade of moving sums over `width` samples, v + x[i] - x[i - width], without
    scaling. The running values are in sums, and the latest inputs of each stage in a row of
    buffers, the oldest at *position. If their sizes do not match the arguments, they are resized
    and cleared as by reset. sums has `stages` elements and buffers stages by width, whatever the
    size of x; the time is proportional to the size of x times stages. The call is a no-op for
    stages below 1, and without reset also for a width below 2.
    Codes: ErrOutOfMemory (no memory).
    NaN: x in some results; sums, buffers in some results or in no result. */
QX_API ErrorCode ReCascadedMovingAverageH(QX_INOUT DBL1D x, int32_t stages, int32_t width,
                                          QX_INOUT DBL1D sums, QX_INOUT DBL2D buffers,
                                          QX_INOUT int32_t *position, int32_t reset);
/** As ReCascadedMovingAverageH, for complex data. */
QX_API ErrorCode CxCascadedMovingAverageH(QX_INOUT CDB1D x, int32_t stages, int32_t width,
                                          QX_INOUT CDB1D sums, QX_INOUT CDB2D buffers,
                                          QX_INOUT int32_t *position, int32_t reset);

/** Shifts a stream in frequency: x[i] becomes x[i] exp(i (*phase + 2 pi i frequency / sampleRate)),
    and *phase, in radians, becomes the phase of the next sample, in 0 to 2 pi. If the ratio of
    frequency to rate is exactly 0, neither x nor *phase changes. With a rate of 0, or one so small
    that the ratio times 2 pi is not finite, *phase and all outputs but the first become NaN with
    code 0, and so does every later block of the stream. The rotation accumulates about one rounding
    error per sample; a ratio far above 1 loses the digits of its fractional part.
    Codes: none.
    NaN: x, frequency, sampleRate in some results; phase in all results. */
QX_API ErrorCode CxComplexModulatorH(QX_INOUT CDB1D x, double frequency, double sampleRate,
                                     QX_INOUT double *phase);
/** As CxComplexModulatorH, for real data, with the result in y. An empty x leaves y unchanged.
    Codes: ErrOutOfMemory (no memory). */
QX_API ErrorCode ReComplexModulatorH(QX_IN DBL1D x, double frequency, double sampleRate,
                                     QX_INOUT double *phase, QX_OUT CDB1D y);

QX_END_DECLS

#endif
