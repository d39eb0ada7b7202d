#ifndef QX_SPECTRA_SPECTRAL_PRODUCTS_H
#define QX_SPECTRA_SPECTRAL_PRODUCTS_H

#include "frame/elements.h"
#include "frame/widths.h"

#include <cstddef>
#include <cstdint>

namespace qx {

// Products of spectra, value by value. The output may be an input.

// out = x y, all three in half-complex form.
QX_BY_WIDTH(void, MultiplyHalfComplex, (const DBL *x, const DBL *y, int32_t n, DBL *out))
// |x|^2 in half-complex form: real, even.
QX_BY_WIDTH(void, SquareHalfComplex, (const DBL *x, int32_t n, DBL *out))
// out[k] = x[k] y[k]: (x.re y.re - x.im y.im, y.re x.im + y.im x.re).
QX_BY_WIDTH(void, MultiplyComplex, (const CDB *x, const CDB *y, std::ptrdiff_t n, CDB *out))

} // namespace qx

#endif
