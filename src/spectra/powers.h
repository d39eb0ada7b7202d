#ifndef QX_SPECTRA_POWERS_H
#define QX_SPECTRA_POWERS_H

#include "frame/widths.h"
#include "qx/types.h"

#include <cstdint>

namespace qx {

// The passes of the power and cross spectra over n frequencies, after the transforms.

// power[k] = |X[k]|^2 scale, exactly symmetric, from the half-complex spectrum h. n is at least 2.
QX_BY_WIDTH(void, PowerOfHalfComplex, (const DBL *h, int32_t n, double scale, DBL *power))
// The same from interleaved values.
QX_BY_WIDTH(void, PowerOfComplex, (const DBL *spectrum, int32_t n, double scale, DBL *power))
// out[k] = conj(X[k]) Y[k] scale; all interleaved.
QX_BY_WIDTH(void, CrossOfComplex, (const DBL *x, const DBL *y, int32_t n, double scale, DBL *out))

} // namespace qx

#endif
