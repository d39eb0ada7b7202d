#ifndef QX_SPECTRA_DECONVOLUTION_H
#define QX_SPECTRA_DECONVOLUTION_H

#include "qx/errors.h"
#include "qx/types.h"

#include <cstdint>

namespace qx {

// Finds q with x = q convolved with y; q has nx - ny + 1 values and may stand on x. The spectra are
// divided, or, where that of y counts as singular, the series: then leading zeros of y are skipped,
// and the quotient is the response of the filter x / y. ErrEmptyInput, ErrSizesDisagree (y is the
// longer one), ErrOutOfMemory.
ErrorCode DeconvolveReal(const DBL *x, int32_t nx, const DBL *y, int32_t ny, DBL *out);

} // namespace qx

#endif
