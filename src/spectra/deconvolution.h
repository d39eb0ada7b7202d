#ifndef QX_SPECTRA_DECONVOLUTION_H
#define QX_SPECTRA_DECONVOLUTION_H

#include "frame/views.h"
#include "qx/errors.h"

namespace qx {

// Finds q with x = q convolved with y, where y is not empty and not longer than x; q has nx - ny +
// 1 values and may begin where x does. The spectra are divided, or, where that of y counts as
// singular, the series: then leading zeros of y are skipped, and the quotient is the response of
// the filter x / y. ErrOutOfMemory.
ErrorCode DeconvolveReal(ConstRealVector x, ConstRealVector y, RealVector quotient);

} // namespace qx

#endif
