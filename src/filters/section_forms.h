#ifndef QX_FILTERS_SECTION_FORMS_H
#define QX_FILTERS_SECTION_FORMS_H

#include "filters/cascade.h"

namespace qx {

struct CascadeOutput {
    RealVector a, b;
};

// The same filter in sections of the other order. ErrCoefficientSizes if the sizes do not fit;
// ErrOutOfMemory.

// Pairs of sections are multiplied out. If their number is odd, the first remains single, with
// zeros for the upper coefficients.
ErrorCode SecondToFourthOrder(const CascadeCoefficients &second, const CascadeOutput &fourth);

// Each section is split into its conjugate pairs of roots, so that the product of the two is the
// section within 1e-12 of its largest coefficient. A section of lower order is kept whole, and the
// section beside it is 1. The numerator must have equal first and last values, as that of a band
// filter has.
ErrorCode FourthToSecondOrder(const CascadeCoefficients &fourth, const CascadeOutput &second);

} // namespace qx

#endif
