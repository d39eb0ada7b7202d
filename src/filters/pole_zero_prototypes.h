#ifndef QX_FILTERS_POLE_ZERO_PROTOTYPES_H
#define QX_FILTERS_POLE_ZERO_PROTOTYPES_H

#include "filters/pole_zero_sections.h"
#include "qx/errors.h"

namespace qx {

// Analog lowpass prototypes of order n as poles and zeros: first the real pole if n is odd, then
// the pairs from the real axis outwards, so that the least damped poles come last. Ripple and
// attenuation are in decibels, positive. Edges are those of filters/analog_prototypes.h.
void ButterworthPoles(int32_t n, PoleZeroSections &sections);
void ChebyshevPoles(int32_t n, double ripple, PoleZeroSections &sections);
void InvChebyshevPoles(int32_t n, double attenuation, PoleZeroSections &sections);
void EllipticPoles(int32_t n, double ripple, double attenuation, PoleZeroSections &sections);
// ErrOutOfMemory, ErrSingularMatrix.
ErrorCode BesselPoles(int32_t n, PoleZeroSections &sections);

// The gain at 0 of a filter with ripple in its pass band.
double GainAt0(int32_t n, double ripple);

} // namespace qx

#endif
