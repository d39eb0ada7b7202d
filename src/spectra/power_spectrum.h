#ifndef QX_SPECTRA_POWER_SPECTRUM_H
#define QX_SPECTRA_POWER_SPECTRUM_H

#include "qx/errors.h"
#include "qx/types.h"

#include <cstdint>

namespace qx {

// Two-sided spectra in the order of the plain transform, with X and Y the unscaled transforms:
// power |X[k]|^2 / n^2, cross conj(X[k]) Y[k] / n^2. The sum of a power spectrum is the mean
// square. Strides count values. ErrEmptyInput, ErrOutOfMemory.

// In place; exactly symmetric.
ErrorCode PowerSpectrumReal(DBL *x, int32_t n);
// z consists of n interleaved complex values.
ErrorCode PowerSpectrumComplex(const DBL *z, DBL *out, int32_t n);

// The output serves as the only work memory, so outRe and outIm must not overlap the inputs.
ErrorCode CrossSpectrumReal(const DBL *x, const DBL *y, int32_t inStride, int32_t n, DBL *outRe,
                            DBL *outIm, int32_t outStride);
// Inputs and output are n interleaved complex values.
ErrorCode CrossSpectrumComplex(const DBL *x, const DBL *y, int32_t n, DBL *out);

} // namespace qx

#endif
