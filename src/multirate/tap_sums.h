#ifndef QX_MULTIRATE_TAP_SUMS_H
#define QX_MULTIRATE_TAP_SUMS_H

#include "frame/elements.h"
#include "frame/widths.h"

#include <cstddef>
#include <cstdint>

namespace qx {

// The inner loop of all filters in this family: rows of adjacent outputs with the same taps,
//
//     sums[w] = scale * sum over j < terms of taps[j tapStep] * samples[offsets[j offsetStep] + w],
//
// for each row and w below `width`, with the terms added to 0 in ascending order of j. Samples of
// complex streams are pairs of reals, so that with real taps they form a stream of twice the width.
template <ElementType Code>
struct TapRow {
    typedef typename Element<Code>::type T;
    const T *taps;
    const I32 *offsets;
    int32_t terms;
    T *sums;
};

QX_BY_WIDTH(void, TapSumsDBL,
            (const TapRow<ElementType::DBL> *rows, int32_t count, std::ptrdiff_t tapStep,
             std::ptrdiff_t offsetStep, const DBL *samples, double scale, int32_t width))
QX_BY_WIDTH(void, TapSumsSGL,
            (const TapRow<ElementType::SGL> *rows, int32_t count, std::ptrdiff_t tapStep,
             std::ptrdiff_t offsetStep, const SGL *samples, float scale, int32_t width))

} // namespace qx

#endif
