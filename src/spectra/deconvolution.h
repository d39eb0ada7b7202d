#ifndef QX_SPECTRA_DECONVOLUTION_H
#define QX_SPECTRA_DECONVOLUTION_H

#include "frame/views.h"
#include "qx/errors.h"

namespace qx {

// Finds q such that x is the convolution of q with y, where y is neither empty nor longer than x. q
// has nx - ny + 1 values and may begin at the same address as x. The spectra are divided or, if
// that of y is considered singular, the series: leading zeros of y are then skipped, and the
// quotient is the response of the filter x / y. ErrOutOfMemory.
ErrorCode DeconvolveReal(ConstRealVector x, ConstRealVector y, RealVector quotient);

} // namespace qx

#endif
