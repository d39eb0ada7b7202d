#ifndef QX_SPECTRA_CONVOLUTION_2D_H
#define QX_SPECTRA_CONVOLUTION_2D_H

#include "qx/errors.h"
#include "qx/types.h"

#include <cstdint>

namespace qx {

// The two-dimensional convolution of row-major matrices, interleaved where complex; the full result
// has xRows + yRows - 1 rows and xCols + yCols - 1 columns. The algorithms are those of
// spectra/convolution.h; any other gives ErrInvalidSelector. Directly, each output adds its terms
// to 0.0 in the order of the elements of the matrix with fewer of them (y if they are equal).
//
// ErrEmptyInput for a size below 1; ErrSizesDisagree where ValidPart has nothing; ErrOutOfMemory.
enum OutputSize : int32_t {
    FullSize = 0,
    SameSize = 1,  // that of x, around the middle of y
    ValidPart = 2, // where y lies wholly on x
};

ErrorCode Convolve2DReal(const DBL *x, int32_t xRows, int32_t xCols, const DBL *y, int32_t yRows,
                         int32_t yCols, DBL *out, int32_t outputSize, int32_t algorithm);
// kept: ValidPart with an x or a y that is wider than tall gives ErrSizesDisagree, fit or not.
ErrorCode Convolve2DComplex(const DBL *x, int32_t xRows, int32_t xCols, const DBL *y, int32_t yRows,
                            int32_t yCols, DBL *out, int32_t outputSize, int32_t algorithm);

// The convolution, of full size, of x turned by 180 degrees (and conjugated) with y: element (xRows
// - 1, xCols - 1) is lag zero.
ErrorCode Correlate2DReal(const DBL *x, int32_t xRows, int32_t xCols, const DBL *y, int32_t yRows,
                          int32_t yCols, DBL *out, int32_t algorithm);
ErrorCode Correlate2DComplex(const DBL *x, int32_t xRows, int32_t xCols, const DBL *y,
                             int32_t yRows, int32_t yCols, DBL *out, int32_t algorithm);

} // namespace qx

#endif
