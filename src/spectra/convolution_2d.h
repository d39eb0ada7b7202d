#ifndef QX_SPECTRA_CONVOLUTION_2D_H
#define QX_SPECTRA_CONVOLUTION_2D_H

#include "frame/views.h"
#include "qx/errors.h"

#include <cstdint>

namespace qx {

// The two-dimensional convolution of matrices that are whole and not empty, real or complex; the
// full result has x.rows() + y.rows() - 1 rows and x.cols() + y.cols() - 1 columns. The algorithms
// are those of spectra/convolution.h; any other gives ErrInvalidSelector. Directly, each output
// adds its terms to 0.0 in the order of the elements of the matrix with fewer of them (y if they
// are equal). ErrOutOfMemory also where the full result has more elements than int32 holds.
enum OutputSize : int32_t {
    FullSize = 0,
    SameSize = 1,  // that of x, around the middle of y
    ValidPart = 2, // where y lies wholly on x; there is such a place
};

// out has the size that is asked for.
// kept: ValidPart with a complex x or y that is wider than tall gives ErrSizesDisagree, fit or not.
template <ElementType E>
ErrorCode Convolve2D(const ConstMatrixView<E> &x, const ConstMatrixView<E> &y,
                     OutputSize outputSize, int32_t algorithm, const MatrixView<E> &out);

// The convolution, of full size, of x turned by 180 degrees (and conjugated) with y: element
// (x.rows() - 1, x.cols() - 1) is lag zero.
template <ElementType E>
ErrorCode Correlate2D(const ConstMatrixView<E> &x, const ConstMatrixView<E> &y, int32_t algorithm,
                      const MatrixView<E> &out);

} // namespace qx

#endif
