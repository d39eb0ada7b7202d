#ifndef QX_FILTERS_SECTION_FORMS_H
#define QX_FILTERS_SECTION_FORMS_H

#include "filters/cascade.h"

namespace qx {

struct CascadeOutput {
    DBL *a;
    int32_t aCount;
    DBL *b;
    int32_t bCount;
};

// The same filter in sections of the other order. ErrCoefficientSizes where the sizes do not fit;
// ErrOutOfMemory.

// Two sections are multiplied out to one; of an odd number the first stands alone, with zeros in
// the upper places.
ErrorCode SecondToFourthOrder(const CascadeCoefficients &second, const CascadeOutput &fourth);

// Each section is split between its conjugate pairs of roots; one of lower order stays whole, and
// the section beside it is 1. The numerator is one whose first and last values are equal, as that
// of a band filter is. Accuracy ends where the roots are a multiple one but for 1e-10: in bands
// far below the sampling rate.
ErrorCode FourthToSecondOrder(const CascadeCoefficients &fourth, const CascadeOutput &second);

} // namespace qx

#endif
