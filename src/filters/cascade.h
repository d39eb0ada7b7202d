#ifndef QX_FILTERS_CASCADE_H
#define QX_FILTERS_CASCADE_H

#include "frame/views.h"
#include "frame/widths.h"
#include "qx/errors.h"

#include <cstdint>

namespace qx {

// Cascades of sections of order m, 2 or 4, in direct form II. Each section has m values in `a`
// (without the leading 1), m + 1 values in `b`, and m values w of its memory in `state`, newest
// first:
//
//     w = v - a[0] state[0] - a[1] state[1] - ...        from left to right
//     v = b[0] w + b[1] state[0] + ... + b[m] state[m-1]  on to the next section
// The memory stores flush(w), and the output of the last section is flushed (spectra/recursion.h).
// The memory takes flush(w), and the output of the last section is flushed (spectra/recursion.h).

enum SectionForm : int32_t { SecondOrderSections = 0, FourthOrderSections = 1 };

// The order of the sections of a form; 0 if there is no such form.
constexpr int32_t SectionOrder(int32_t form) {
    return form == SecondOrderSections ? 2 : form == FourthOrderSections ? 4 : 0;
}

struct CascadeCoefficients {
    ConstRealVector a, b;
    int32_t form;
};

// In place. ErrCoefficientSizes if the sizes, including that of the state, do not fit the form.
template <ElementType E>
ErrorCode FilterIIRCascade(const CascadeCoefficients &filter, VectorView<E> state, VectorView<E> x);

struct CascadeRun {
    const DBL *a, *b;
    DBL *state;
    int32_t sections, order;
    DBL *x;
    int32_t n;
};

// Runs all sections over all samples, in lanes. The sections of a group work together, each a few
// samples behind the previous one; every value is the same as in plain order.
QX_BY_WIDTH(void, RunCascadeInLanes, (const CascadeRun &run))

} // namespace qx

#endif
