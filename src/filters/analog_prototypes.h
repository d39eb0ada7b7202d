#ifndef QX_FILTERS_ANALOG_PROTOTYPES_H
#define QX_FILTERS_ANALOG_PROTOTYPES_H

#include "filters/digital_sections.h"
#include "qx/errors.h"

namespace qx {

// The analog lowpasses of order n, section by section: first the real pole if n is odd, then the
// pairs from the imaginary axis inwards. Ripple and attenuation are in decibels. Butterworth and
// Bessel are 3 dB down at 1 rad/s, Chebyshev and elliptic filters have the edge of their pass band
// there, and inverse Chebyshev filters that of their stop band.

// Which section takes the factor by which filters of even order and ripple begin below 1 at 0 Hz.
enum class GainIn { FirstSection, LastSection };

void ButterworthPrototype(int32_t n, DigitalSections &sections);
void ChebyshevPrototype(int32_t n, double ripple, GainIn gainIn, DigitalSections &sections);
void InvChebyshevPrototype(int32_t n, double attenuation, DigitalSections &sections);
void EllipticPrototype(int32_t n, double ripple, double attenuation, DigitalSections &sections);

// By the eigenvalues of a tridiagonal matrix. ErrDegenerateValue for a pole of 0; ErrOutOfMemory
// and what the eigenvalues and the roots give.
ErrorCode BesselPrototype(int32_t n, DigitalSections &sections);

} // namespace qx

#endif
