#ifndef QX_FILTERS_SECTION_FORMS_H
#define QX_FILTERS_SECTION_FORMS_H

#include "filters/cascade.h"

namespace qx {

struct CascadeOutput {
    RealVector a, b;
};

// The same filter in sections of the other order. ErrCoefficientSizes where the sizes do not fit;
// ErrOutOfMemory.

// Two sections are multiplied out to one; of an odd number the first remains alone, with zeros in
// the upper places.
ErrorCode SecondToFourthOrder(const CascadeCoefficients &second, const CascadeOutput &fourth);

// Each section is split between its conjugate pairs of roots, so that the product of the two is the
// section within 1e-12 of its greatest coefficient; one of lower order stays whole, and the section
// beside it is 1. The numerator is one whose first and last values are equal, as that of a band
// filter is.
ErrorCode FourthToSecondOrder(const CascadeCoefficients &fourth, const CascadeOutput &second);

} // namespace qx

#endif
