#ifndef QX_FILTERS_ANALOG_PROTOTYPES_H
#define QX_FILTERS_ANALOG_PROTOTYPES_H

#include "filters/digital_sections.h"
#include "qx/errors.h"

namespace qx {

// Analog lowpass prototypes of order n, section by section: first the real pole if n is odd, then
// the pairs from the imaginary axis inwards. Ripple and attenuation are in decibels. Butterworth
// and Bessel are 3 dB down at 1 rad/s, Chebyshev and elliptic filters have their pass-band edge
// there, and inverse Chebyshev filters their stop-band edge.

// The section that includes the factor by which the gain at 0 Hz of filters with ripple and even
// order is below 1.
enum class GainIn { FirstSection, LastSection };

void ButterworthPrototype(int32_t n, DigitalSections &sections);
void ChebyshevPrototype(int32_t n, double ripple, GainIn gainIn, DigitalSections &sections);
void InvChebyshevPrototype(int32_t n, double attenuation, DigitalSections &sections);
void EllipticPrototype(int32_t n, double ripple, double attenuation, DigitalSections &sections);

// Uses the eigenvalues of a tridiagonal matrix. ErrDegenerateValue for a pole of 0; ErrOutOfMemory
// and the codes of the eigenvalues and roots.
ErrorCode BesselPrototype(int32_t n, DigitalSections &sections);

} // namespace qx

#endif
