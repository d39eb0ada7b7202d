#ifndef QX_SPECTRA_SLIDING_SUMS_H
#define QX_SPECTRA_SLIDING_SUMS_H

#include "frame/elements.h"
#include "frame/widths.h"

#include <cstddef>
#include <cstdint>

namespace qx {

// Sums of products over a window that slides along a signal: the core of every direct convolution,
// correlation and FIR filter,
//
//     out[t] = 0.0 + taps[0] signal[first + t] + taps[1] signal[first + t + 1] + ...
//
// with the terms added in this order. Taps, signal and output each have a step, which may be
// negative; to sum in the opposite order, the caller negates steps. Terms beyond the ends of the
// signal are omitted. A job of several segments adds the sums over rows of taps and of signals, one
// row after the other. The output may overlap the signal if no window that begins at t or before
// contains the place of out[t], except as its own last value.
// begin at t or before holds the place of out[t], its own last value excepted.
//
// A complex term a b adds (a.re b.re - a.im b.im) to the real sum and (a.im b.re + a.re b.im) to
// the imaginary one.

template <ElementType Code>
struct Steps {
    typename Element<Code>::type *at;
    std::ptrdiff_t step = 1;
};
template <ElementType Code>
struct ConstantSteps {
    const typename Element<Code>::type *at;
    std::ptrdiff_t step = 1;
};

template <ElementType Code>
struct SlidingJob {
    ConstantSteps<Code> taps;
    int32_t tapCount;
    ConstantSteps<Code> signal;
    int64_t length;
    int64_t first;
    Steps<Code> out;
    int32_t count;
    int32_t segments = 1;
    std::ptrdiff_t tapSegment = 0, signalSegment = 0; // from one row to the next
};

void SlidingSums(const SlidingJob<ElementType::DBL> &job);
void SlidingSums(const SlidingJob<ElementType::CDB> &job);

// The same in lanes. Zeros are used beyond the ends of the signal, so the taps must be finite if a
// window extends there: 0 times a finite tap adds nothing to a sum that starts with 0.0.
QX_BY_WIDTH(void, SlidingSumsInLanes, (const SlidingJob<ElementType::DBL> &job))
QX_BY_WIDTH(void, ComplexSlidingSumsInLanes, (const SlidingJob<ElementType::CDB> &job))

} // namespace qx

#endif
