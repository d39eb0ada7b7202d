#ifndef QX_SPECTRA_CONVOLUTION_H
#define QX_SPECTRA_CONVOLUTION_H

#include "frame/views.h"
#include "qx/errors.h"

#include <cstdint>

namespace qx {

// Linear convolution, out[t] = sum over i of x[i] y[t - i], and correlation, which is the
// convolution of x reversed (and conjugated) with y: element nx - 1 is lag zero. No input may be
// empty; the output has nx + ny - 1 values, which must fit into int32, and must not overlap an
// input. The caller chooses the algorithm; it does not depend on the size.
//
// With the direct algorithm the terms of each output are added to 0.0 in ascending order of i;
// complex ones in ascending order of the index of the longer sequence (y if the lengths are equal).
// ErrOutOfMemory.
enum ConvolutionAlgorithm : int32_t { ConvolveDirectly = 0, ConvolveByTransform = 1 };

// kept: any other algorithm succeeds and leaves `out` unchanged.
ErrorCode ConvolveReal(ConstRealVector x, ConstRealVector y, int32_t algorithm, RealVector out);
// For any other algorithm ErrInvalidSelector.
ErrorCode ConvolveComplex(ConstComplexVector x, ConstComplexVector y, int32_t algorithm,
                          ComplexVector out);

// 1 divides each lag by the number of its terms, 2 divides all of them by the larger length. For
// any other value ErrInvalidSelector, after the correlation has been computed.
enum CorrelationNormalization : int32_t { NotNormalized = 0, Unbiased = 1, Biased = 2 };

// With the direct algorithm the terms are added in ascending order of the index of y. With
// transforms, x and y at the same address are treated as an autocorrelation, which needs two
// transforms instead of three.
// kept: for any other algorithm the existing content of `out` is normalized.
ErrorCode CorrelateReal(ConstRealVector x, ConstRealVector y, int32_t algorithm,
                        int32_t normalization, RealVector out);
ErrorCode CorrelateComplex(ConstComplexVector x, ConstComplexVector y, int32_t algorithm,
                           int32_t normalization, ComplexVector out);

// The length of transforms for n values: the smallest m >= n all of whose prime factors are among
// 2, 3, 5, 7, 11, 13, 17, 19, 29, 31, 37, 41, 43, those whose transforms are straight-line code. 0
// if there is none within int32.
// kept: 23 is left out.
int32_t NextTransformLength(int32_t n);

} // namespace qx

#endif
