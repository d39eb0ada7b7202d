#ifndef QX_SPECTRA_CONVOLUTION_2D_H
#define QX_SPECTRA_CONVOLUTION_2D_H

#include "frame/views.h"
#include "qx/errors.h"

#include <cstdint>

namespace qx {

// The two-dimensional convolution of contiguous, nonempty matrices, real or complex; the full
// result has x.rows() + y.rows() - 1 rows and x.cols() + y.cols() - 1 columns. The algorithms are
// those of spectra/convolution.h; any other gives ErrInvalidSelector. With the direct algorithm,
// each output adds its terms to 0.0 in the order of the elements of the matrix with fewer elements
// (y if they are equal). ErrOutOfMemory also if the full result has more elements than fit into
// int32.
enum OutputSize : int32_t {
    FullSize = 0,
    SameSize = 1,  // of the size of x, around the middle of y
    ValidPart = 2, // where y lies entirely within x; there must be such a position
};

// out must have the requested size.
// kept: ValidPart with a complex x or y that is wider than tall gives ErrSizesDisagree, whether it
// fits or not.
template <ElementType E>
ErrorCode Convolve2D(const ConstMatrixView<E> &x, const ConstMatrixView<E> &y,
                     OutputSize outputSize, int32_t algorithm, const MatrixView<E> &out);

// The full convolution of x, rotated by 180 degrees (and conjugated), with y: element
// (x.rows() - 1, x.cols() - 1) is lag zero.
template <ElementType E>
ErrorCode Correlate2D(const ConstMatrixView<E> &x, const ConstMatrixView<E> &y, int32_t algorithm,
                      const MatrixView<E> &out);

} // namespace qx

#endif
