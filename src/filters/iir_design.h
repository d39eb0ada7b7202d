#ifndef QX_FILTERS_IIR_DESIGN_H
#define QX_FILTERS_IIR_DESIGN_H

#include "filters/cascade.h"
#include "filters/digital_sections.h"

namespace qx {

// Where a design goes: a cascade of the sections of filters/cascade.h, with the type and the order
// of the analog filter, whose order a band filter has twice.
struct IIRDesignRequest {
    int32_t type, order;
    RealVector a, b; // of SizesOfCascade or more
    int32_t form;
};

// The form that the sections of a type come in: a pair of poles becomes two pairs in a band filter.
constexpr int32_t NativeForm(int32_t type) {
    return type == Lowpass || type == Highpass ? SecondOrderSections : FourthOrderSections;
}

// The values that a design has. Both are 0 for an order below 1, and beyond what int32 holds.
struct CascadeSizes {
    int32_t a, b;
};
CascadeSizes SizesOfCascade(int32_t type, int32_t order, int32_t form);

// Ripple and attenuation in decibels. The band is one that the type can have, and the type and the
// form exist. ErrOutOfMemory. NaN makes all values NaN.
ErrorCode DesignButterworth(const FilterBand &band, const IIRDesignRequest &request);
ErrorCode DesignChebyshev(const FilterBand &band, double ripple, const IIRDesignRequest &request);
ErrorCode DesignInvChebyshev(const FilterBand &band, double attenuation,
                             const IIRDesignRequest &request);
ErrorCode DesignElliptic(const FilterBand &band, double ripple, double attenuation,
                         const IIRDesignRequest &request);
// Also ErrDegenerateValue and what eigenvalues and roots give.
ErrorCode DesignBessel(const FilterBand &band, const IIRDesignRequest &request);

} // namespace qx

#endif
