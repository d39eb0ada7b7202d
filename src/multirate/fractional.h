#ifndef QX_MULTIRATE_FRACTIONAL_H
#define QX_MULTIRATE_FRACTIONAL_H

#include "frame/views.h"
#include "qx/errors.h"

#include <cstdint>

namespace qx {

// A sampled signal at arbitrary times T, in units of its samples: step times the sum over k of
// s[k] proto(centre + step (k - T)), where proto is the table of a kernel with its peak at the centre
// and `step` entries per sample.

// The prototype table. `nearest` reads the nearest entry; otherwise two entries are interpolated
// linearly.
struct ResampleFilter {
    const DBL *proto;
    int32_t len;
    int32_t oversample;
    bool nearest;
};

// The part of the table that one output uses: `left` taps at or before its position, `right` taps
// after it, from table position `start` on.
struct TapSpan {
    int32_t left;
    int32_t right;
    double step;
    double start;

    int64_t taps() const { return int64_t{left} + right; }
};

// For outputs `ratio` samples apart, to which the kernel is stretched if that is above 1. A span
// that does not fit into int32 is clamped to its largest values.
TapSpan ComputeTapSpan(int32_t len, int32_t oversample, double ratio, double fraction);

// The working state of one stream: its history, oldest sample first, and the taps of its next
// output, which is at `position` (from the first sample of the history) + `fraction`.
template <ElementType Code>
struct ResampleCore {
    typedef typename Element<Code>::type T;

    T *history;
    int32_t historyCapacity;
    int32_t historyCount;
    DBL *taps;
    int32_t tapCapacity;
    double tapScale;
    int32_t leftTaps;
    int32_t rightTaps;
    int32_t position;
    double fraction;

    // Whether the output's window ends within the history and a block of n samples.
    bool canServe(int32_t n) const {
        return int64_t{rightTaps} + position <= int64_t{historyCount} - 1 + n;
    }
    // The index of the first sample that a later output needs; below 1 if all are needed.
    int64_t firstNeeded() const { return int64_t{position} - leftTaps + 1; }
};

// Prepares the core for an output at position + fraction, for outputs `ratio` apart.
// ErrBufferOverrun if there is no room for that many taps.
template <ElementType Code>
ErrorCode LoadFractionalTaps(const ResampleFilter &filter, ResampleCore<Code> &core, double ratio,
                             int32_t position, double fraction);

// The output at the core's position, summed from the newest sample to the oldest; samples before
// the history count as 0.
template <ElementType Code>
typename Element<Code>::type ResampleDot(const ResampleCore<Code> &core,
                                         const typename Element<Code>::type *x);

// Ends a block: keeps in the history what later outputs need. ErrBufferOverrun if that does not
// fit.
template <ElementType Code>
ErrorCode AdvanceHistory(ResampleCore<Code> &core, const typename Element<Code>::type *x,
                         int32_t n);

// Outputs at constant spacing `ratio` from the core's position on, as far as the block x contains
// their samples; ErrIndexNotBelowSize if there are more than y has room for.
template <ElementType Code>
ErrorCode ResampleConstant(const ResampleFilter &filter, ResampleCore<Code> &core, double ratio,
                           bool antiAlias, ConstVectorView<Code> x, VectorView<Code> y,
                           int32_t *outCount);

// Outputs of all channels, the rows of x, at the times of t: those of channel c are stored in row c of
// y, which may be t itself. With `antiAlias` the kernel is stretched to the gap between
// a time and the previous one. outCount and consumed return how many outputs were computed and how
// many samples may be dropped; the other times and lastTime are then relative to the first sample
// that must be kept. Instances for a list with the element of the samples, and for DBL.
template <ElementType Code, ElementType TimeCode>
ErrorCode ResampleAtTimes(const ResampleFilter &filter, bool antiAlias,
                          const ConstMatrixView<Code> &x, VectorView<TimeCode> t, double *lastTime,
                          const MatrixView<Code> &y, int32_t *outCount, int32_t *consumed);

// `number` without its fraction, as the nearest int32; the largest for NaN.
int32_t Truncated(double number);

} // namespace qx

#endif
