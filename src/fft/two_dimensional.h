#ifndef QX_FFT_TWO_DIMENSIONAL_H
#define QX_FFT_TWO_DIMENSIONAL_H

#include "fft/plan.h"
#include "frame/elements.h"
#include "qx/errors.h"
#include "qx/types.h"

#include <cstdint>

namespace qx {

// Two-dimensional transforms of row-major matrices: rows first, then columns. rowPlan is for
// transforms of `cols` values, columnPlan for those of `rows`. With `shift` non-zero spectra are in
// shifted order in both dimensions. Work memory comes from the heap.

// The part of a matrix that a forward transform reads: rows by cols values from (rowStart,
// colStart) on, with zeros beyond the end of the matrix.
struct MatrixRegion {
    int32_t matrixRows, matrixCols;
    int32_t rowStart, colStart;
    int32_t rows, cols;
};

// X[r][c] = sum over a and b of x[a][b] exp(-2 pi i (r a / rows + c b / cols)).
// ErrIndexOutOfRange for a negative start, ErrOutOfMemory.
ErrorCode FFT2DComplexForward(const FFTPlan *rowPlan, const FFTPlan *columnPlan, const CDB *in,
                              const MatrixRegion &region, int32_t shift, CDB *out);
ErrorCode FFT2DRealForward(const FFTPlan *rowPlan, const FFTPlan *columnPlan, const DBL *in,
                           const MatrixRegion &region, int32_t shift, CDB *out);

// The inverses, with the factor 1/(rows cols). The real inverse takes the input as the spectrum of a
// real matrix and reads no row of negative row frequency. ErrOutOfMemory.
ErrorCode FFT2DComplexInverse(const FFTPlan *rowPlan, const FFTPlan *columnPlan, const CDB *in,
                              int32_t rows, int32_t cols, int32_t shift, CDB *out);
ErrorCode FFT2DRealInverse(const FFTPlan *rowPlan, const FFTPlan *columnPlan, const CDB *in,
                           int32_t rows, int32_t cols, int32_t shift, DBL *out);

} // namespace qx

#endif
