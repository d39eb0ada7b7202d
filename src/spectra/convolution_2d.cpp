#include "spectra/convolution_2d.h"

#include "fft/two_dimensional.h"
#include "frame/scratch.h"
#include "spectra/convolution.h"
#include "spectra/sliding_sums.h"
#include "spectra/spectral_products.h"

#include <algorithm>
#include <cstddef>
#include <cstring>
#include <limits>

namespace qx {
namespace {

template <ElementType Code>
struct Matrix {
    typedef typename Element<Code>::type T;
    const T *elements;
    int32_t rows, cols;

    std::ptrdiff_t count() const { return std::ptrdiff_t{rows} * cols; }
    const T *row(std::ptrdiff_t r) const { return elements + r * cols; }
};

// What real and complex matrices do differently.
struct RealParts {
    static constexpr auto code = ElementType::DBL;
    static bool validPartIsRefused(const Matrix<code> &x, const Matrix<code> &y) {
        return x.rows < y.rows || x.cols < y.cols;
    }
    static void conjugate(DBL *, std::ptrdiff_t) {}
    static ErrorCode forward(const FFTPlan *rowPlan, const FFTPlan *columnPlan, const DBL *x,
                             const MatrixRegion &region, CDB *spectrum) {
        return FFT2DRealForward(rowPlan, columnPlan, x, region, 0, spectrum);
    }
    static ErrorCode inverse(const FFTPlan *rowPlan, const FFTPlan *columnPlan, const CDB *spectrum,
                             int32_t rows, int32_t cols, DBL *out) {
        return FFT2DRealInverse(rowPlan, columnPlan, spectrum, rows, cols, 0, out);
    }
};
struct ComplexParts {
    static constexpr auto code = ElementType::CDB;
    // kept: rows are compared with columns here.
    static bool validPartIsRefused(const Matrix<code> &x, const Matrix<code> &y) {
        return x.rows < x.cols || y.rows < y.cols || x.rows < y.rows || x.cols < y.cols;
    }
    static void conjugate(CDB *z, std::ptrdiff_t count) {
        for (std::ptrdiff_t i = 0; i < count; ++i)
            z[i].im = -z[i].im;
    }
    static ErrorCode forward(const FFTPlan *rowPlan, const FFTPlan *columnPlan, const CDB *x,
                             const MatrixRegion &region, CDB *spectrum) {
        return FFT2DComplexForward(rowPlan, columnPlan, x, region, 0, spectrum);
    }
    static ErrorCode inverse(const FFTPlan *rowPlan, const FFTPlan *columnPlan, const CDB *spectrum,
                             int32_t rows, int32_t cols, CDB *out) {
        return FFT2DComplexInverse(rowPlan, columnPlan, spectrum, rows, cols, 0, out);
    }
};

// Row by row of the result: a sliding sum over the rows of the kernel that reach it.
template <ElementType Code>
void ConvolveDirectly2D(const Matrix<Code> &big, const Matrix<Code> &kernel,
                        typename Element<Code>::type *out) {
    const std::ptrdiff_t rows = std::ptrdiff_t{big.rows} + kernel.rows - 1;
    const std::ptrdiff_t cols = std::ptrdiff_t{big.cols} + kernel.cols - 1;
    for (std::ptrdiff_t r = 0; r < rows; ++r) {
        const std::ptrdiff_t low = std::max<std::ptrdiff_t>(0, r - big.rows + 1);
        const std::ptrdiff_t high = std::min<std::ptrdiff_t>(kernel.rows - 1, r);
        SlidingSums({{kernel.row(low)},
                     kernel.cols,
                     {big.row(r - low) + (big.cols - 1), -1},
                     big.cols,
                     1 - int64_t{kernel.cols},
                     {out + r * cols + (cols - 1), -1},
                     static_cast<int32_t>(cols),
                     static_cast<int32_t>(high - low + 1),
                     kernel.cols,
                     -std::ptrdiff_t{big.cols}});
    }
}

// The transforms have exactly the size of the result.
template <class Parts>
ErrorCode ConvolveByTransform2D(const Matrix<Parts::code> &x, const Matrix<Parts::code> &y,
                                typename Element<Parts::code>::type *out) {
    const int32_t rows = x.rows + y.rows - 1;
    const int32_t cols = x.cols + y.cols - 1;
    const std::ptrdiff_t count = std::ptrdiff_t{rows} * cols;
    Scratch<ElementType::CDB> spectra;
    if (const ErrorCode failed = spectra.allocate(2 * int64_t{count}))
        return failed;
    const PlanReference rowPlan(cols);
    const PlanReference columnPlan(rows);
    if (!rowPlan || !columnPlan)
        return ErrOutOfMemory;
    CDB *const first = spectra.data();
    CDB *const second = first + count;
    const auto transform = [&](const Matrix<Parts::code> &from, CDB *to) {
        const MatrixRegion region = {from.rows, from.cols, 0, 0, rows, cols};
        return Parts::forward(rowPlan.get(), columnPlan.get(), from.elements, region, to);
    };
    if (const ErrorCode failed = transform(x, first))
        return failed;
    if (const ErrorCode failed = transform(y, second))
        return failed;
    MultiplyComplex(first, second, count, first);
    const ErrorCode status =
        Parts::inverse(rowPlan.get(), columnPlan.get(), first, rows, cols, out);
    return Merge(status, spectra.release());
}

template <class Parts>
ErrorCode ConvolveFull(const Matrix<Parts::code> &x, const Matrix<Parts::code> &y,
                       typename Element<Parts::code>::type *out, int32_t algorithm) {
    if (algorithm == ConvolveByTransform)
        return ConvolveByTransform2D<Parts>(x, y, out);
    if (algorithm != ConvolveDirectly)
        return ErrInvalidSelector;
    if (x.count() < y.count())
        ConvolveDirectly2D(y, x, out);
    else
        ConvolveDirectly2D(x, y, out);
    return 0;
}

template <class Parts>
ErrorCode Convolve(const Matrix<Parts::code> &x, const Matrix<Parts::code> &y,
                   typename Element<Parts::code>::type *out, int32_t outputSize,
                   int32_t algorithm) {
    typedef typename Element<Parts::code>::type T;
    if (x.rows < 1 || x.cols < 1 || y.rows < 1 || y.cols < 1)
        return ErrEmptyInput;
    if (outputSize == ValidPart && Parts::validPartIsRefused(x, y))
        return ErrSizesDisagree;
    const int64_t rows = int64_t{x.rows} + y.rows - 1;
    const int64_t cols = int64_t{x.cols} + y.cols - 1;
    if (rows * cols > std::numeric_limits<int32_t>::max())
        return ErrOutOfMemory;
    if (outputSize == FullSize)
        return ConvolveFull<Parts>(x, y, out, algorithm);

    Scratch<Parts::code> full;
    if (const ErrorCode failed = full.allocate(rows * cols))
        return failed;
    if (const ErrorCode failed = ConvolveFull<Parts>(x, y, full.data(), algorithm))
        return Merge(failed, full.release());
    const bool valid = outputSize == ValidPart;
    const std::ptrdiff_t firstRow = valid ? y.rows - 1 : y.rows / 2;
    const std::ptrdiff_t firstCol = valid ? y.cols - 1 : y.cols / 2;
    const std::ptrdiff_t outRows = valid ? x.rows - y.rows + 1 : x.rows;
    const std::ptrdiff_t outCols = valid ? x.cols - y.cols + 1 : x.cols;
    for (std::ptrdiff_t r = 0; r < outRows; ++r)
        std::memcpy(static_cast<void *>(out + r * outCols),
                    full.data() + (firstRow + r) * static_cast<std::ptrdiff_t>(cols) + firstCol,
                    sizeof(T) * static_cast<std::size_t>(outCols));
    return full.release();
}

template <class Parts>
ErrorCode Correlate(const Matrix<Parts::code> &x, const Matrix<Parts::code> &y,
                    typename Element<Parts::code>::type *out, int32_t algorithm) {
    if (x.rows < 1 || x.cols < 1 || y.rows < 1 || y.cols < 1)
        return ErrEmptyInput;
    Scratch<Parts::code> turned;
    if (const ErrorCode failed = turned.allocate(x.count()))
        return failed;
    for (std::ptrdiff_t i = 0; i < x.count(); ++i)
        turned[i] = x.elements[x.count() - 1 - i];
    Parts::conjugate(turned.data(), x.count());
    const ErrorCode status =
        Convolve<Parts>({turned.data(), x.rows, x.cols}, y, out, FullSize, algorithm);
    return Merge(status, turned.release());
}

const CDB *Elements(const DBL *interleaved) { return reinterpret_cast<const CDB *>(interleaved); }
CDB *Elements(DBL *interleaved) { return reinterpret_cast<CDB *>(interleaved); }

} // namespace

ErrorCode Convolve2DReal(const DBL *x, int32_t xRows, int32_t xCols, const DBL *y, int32_t yRows,
                         int32_t yCols, DBL *out, int32_t outputSize, int32_t algorithm) {
    return Convolve<RealParts>({x, xRows, xCols}, {y, yRows, yCols}, out, outputSize, algorithm);
}

ErrorCode Convolve2DComplex(const DBL *x, int32_t xRows, int32_t xCols, const DBL *y, int32_t yRows,
                            int32_t yCols, DBL *out, int32_t outputSize, int32_t algorithm) {
    return Convolve<ComplexParts>({Elements(x), xRows, xCols}, {Elements(y), yRows, yCols},
                                  Elements(out), outputSize, algorithm);
}

ErrorCode Correlate2DReal(const DBL *x, int32_t xRows, int32_t xCols, const DBL *y, int32_t yRows,
                          int32_t yCols, DBL *out, int32_t algorithm) {
    return Correlate<RealParts>({x, xRows, xCols}, {y, yRows, yCols}, out, algorithm);
}

ErrorCode Correlate2DComplex(const DBL *x, int32_t xRows, int32_t xCols, const DBL *y,
                             int32_t yRows, int32_t yCols, DBL *out, int32_t algorithm) {
    return Correlate<ComplexParts>({Elements(x), xRows, xCols}, {Elements(y), yRows, yCols},
                                   Elements(out), algorithm);
}

} // namespace qx
