#ifndef QX_MULTIRATE_FRACTIONAL_H
#define QX_MULTIRATE_FRACTIONAL_H

#include "frame/elements.h"
#include "qx/errors.h"

#include <cstdint>

namespace qx {

// A sampled signal at arbitrary times T, in units of its samples: step times the sum over k of
// s[k] proto(centre + step (k - T)), with proto a table of a kernel, peak at its centre, that has
// `step` entries per sample.

// The prototype table. `nearest` takes the nearest entry, else the line between two.
struct ResampleFilter {
    const DBL *proto;
    int32_t len;
    int32_t oversample;
    bool nearest;
};

// The part of the table that one output meets: `left` taps at or before its position, `right` ones
// after it, from table position `start` on.
struct TapSpan {
    int32_t left;
    int32_t right;
    double step;
    double start;

    int64_t taps() const { return int64_t{left} + right; }
};

// For outputs `ratio` samples apart, which the kernel is stretched to where that is above 1. A span
// that int32 cannot hold is one of its greatest values.
TapSpan ComputeTapSpan(int32_t len, int32_t oversample, double ratio, double fraction);

// The work of one stream: its history, oldest sample first, and the taps of its next output, at
// `position` (from the first sample of the history) + `fraction`.
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
    // The samples that no later output needs; below 1 for none.
    int64_t firstNeeded() const { return int64_t{position} - leftTaps + 1; }
};

// Makes the core ready for an output at position + fraction, for outputs `ratio` apart.
// ErrBufferOverrun if it has no room for so many taps.
template <ElementType Code>
ErrorCode LoadFractionalTaps(const ResampleFilter &filter, ResampleCore<Code> &core, double ratio,
                             int32_t position, double fraction);

// The output at the core's position, summed from the newest sample to the oldest; what stands
// before the history counts as 0.
template <ElementType Code>
typename Element<Code>::type ResampleDot(const ResampleCore<Code> &core,
                                         const typename Element<Code>::type *x);

// Ends a block: the history becomes what later outputs need. ErrBufferOverrun if that exceeds it.
template <ElementType Code>
ErrorCode AdvanceHistory(ResampleCore<Code> &core, const typename Element<Code>::type *x,
                         int32_t n);

// Outputs at constant spacing `ratio` from the core's position on, as long as the block serves
// them; ErrIndexNotBelowSize if they are more than `room`.
template <ElementType Code>
ErrorCode ResampleConstant(const ResampleFilter &filter, ResampleCore<Code> &core, double ratio,
                           bool antiAlias, const typename Element<Code>::type *x, int32_t n,
                           typename Element<Code>::type *y, int32_t room, int32_t *outCount);

// Outputs of all channels at the m times of t: channel c of the i-th one goes to y[c pitch + i],
// where y may be t itself. With `antiAlias` the kernel is stretched to the gap between a time and
// the one before it. What was served, and how many samples may go, stands in outCount and consumed;
// the other times and lastTime then count from the first sample that must stay. Instances for a
// list of the element of the samples, and for DBL.
template <ElementType Code, ElementType TimeCode>
ErrorCode ResampleAtTimes(const ResampleFilter &filter, bool antiAlias,
                          const typename Element<Code>::type *x, int32_t n, int32_t channels,
                          typename Element<TimeCode>::type *t, int32_t m, double *lastTime,
                          int32_t *outCount, int32_t *consumed, typename Element<Code>::type *y,
                          int32_t pitch);

// `number` without its fraction, as the nearest int32; the greatest for NaN.
int32_t Truncated(double number);

} // namespace qx

#endif
