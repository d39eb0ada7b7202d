#ifndef QX_FILTERS_IIR_DESIGN_H
#define QX_FILTERS_IIR_DESIGN_H

#include "filters/cascade.h"
#include "filters/digital_sections.h"

namespace qx {

// The destination of a design: a cascade of the sections of filters/cascade.h, with the type and
// the order of the analog filter. A band filter has twice that order.
struct IIRDesignRequest {
    int32_t type, order;
    RealVector a, b; // of at least the sizes of SizesOfCascade
    int32_t form;
};

// The native form of a type's sections: in a band filter a pair of poles becomes two pairs.
constexpr int32_t NativeForm(int32_t type) {
    return type == Lowpass || type == Highpass ? SecondOrderSections : FourthOrderSections;
}

// The numbers of values of a design. Both are 0 for an order below 1, or if they do not fit into
// int32.
struct CascadeSizes {
    int32_t a, b;
};
CascadeSizes SizesOfCascade(int32_t type, int32_t order, int32_t form);

// Ripple and attenuation are in decibels. The band must be possible for the type, and the type and
// the form must exist. ErrOutOfMemory. NaN makes all values NaN.
ErrorCode DesignButterworth(const FilterBand &band, const IIRDesignRequest &request);
ErrorCode DesignChebyshev(const FilterBand &band, double ripple, const IIRDesignRequest &request);
ErrorCode DesignInvChebyshev(const FilterBand &band, double attenuation,
                             const IIRDesignRequest &request);
ErrorCode DesignElliptic(const FilterBand &band, double ripple, double attenuation,
                         const IIRDesignRequest &request);
// Also ErrDegenerateValue and the codes of the eigenvalues and roots.
ErrorCode DesignBessel(const FilterBand &band, const IIRDesignRequest &request);

} // namespace qx

#endif
