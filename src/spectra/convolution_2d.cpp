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

// The plans for the rows and the columns of matrices of one size.
struct Plans {
    PlanReference ofRows, ofColumns;
    Plans(int32_t rows, int32_t cols) : ofRows(cols), ofColumns(rows) {}
    explicit operator bool() const { return ofRows && ofColumns; }
};

// The steps in which real and complex matrices differ.
ErrorCode Forward(const Plans &plans, const DBL *x, const MatrixRegion &region, CDB *spectrum) {
    return FFT2DRealForward(plans.ofRows.get(), plans.ofColumns.get(), x, region, 0, spectrum);
}
ErrorCode Forward(const Plans &plans, const CDB *x, const MatrixRegion &region, CDB *spectrum) {
    return FFT2DComplexForward(plans.ofRows.get(), plans.ofColumns.get(), x, region, 0, spectrum);
}
ErrorCode Inverse(const Plans &plans, const CDB *spectrum, const RealMatrix &out) {
    return FFT2DRealInverse(plans.ofRows.get(), plans.ofColumns.get(), spectrum, out.rows(),
                            out.cols(), 0, out.data());
}
ErrorCode Inverse(const Plans &plans, const CDB *spectrum, const ComplexMatrix &out) {
    return FFT2DComplexInverse(plans.ofRows.get(), plans.ofColumns.get(), spectrum, out.rows(),
                               out.cols(), 0, out.data());
}
double Conjugate(double value) { return value; }
CDB Conjugate(const CDB &value) { return {value.re, -value.im}; }

// Row by row of the result: a sliding sum over the rows of the kernel that contribute to it.
template <ElementType E>
void ConvolveDirectly2D(const ConstMatrixView<E> &big, const ConstMatrixView<E> &kernel,
                        const MatrixView<E> &out) {
    const std::ptrdiff_t cols = out.cols();
    for (std::ptrdiff_t r = 0; r < out.rows(); ++r) {
        const std::ptrdiff_t low = std::max<std::ptrdiff_t>(0, r - big.rows() + 1);
        const std::ptrdiff_t high = std::min<std::ptrdiff_t>(kernel.rows() - 1, r);
        SlidingSums(SlidingJob<E>{{kernel.row(low)},
                                  kernel.cols(),
                                  {big.row(r - low) + (big.cols() - 1), -1},
                                  big.cols(),
                                  1 - int64_t{kernel.cols()},
                                  {out.row(r) + (cols - 1), -1},
                                  out.cols(),
                                  static_cast<int32_t>(high - low + 1),
                                  kernel.cols(),
                                  -std::ptrdiff_t{big.cols()}});
    }
}

// The transforms have exactly the size of the result.
template <ElementType E>
ErrorCode ConvolveByTransform2D(const ConstMatrixView<E> &x, const ConstMatrixView<E> &y,
                                const MatrixView<E> &out) {
    const std::ptrdiff_t count = out.elements().size();
    Scratch<ElementType::CDB> spectra;
    if (const ErrorCode failed = spectra.allocate(2 * int64_t{count}))
        return failed;
    const Plans plans(out.rows(), out.cols());
    if (!plans)
        return ErrOutOfMemory;
    CDB *const first = spectra.data();
    CDB *const second = first + count;
    const auto transform = [&](const ConstMatrixView<E> &from, CDB *to) {
        return Forward(plans, from.data(), {from.rows(), from.cols(), 0, 0, out.rows(), out.cols()},
                       to);
    };
    if (const ErrorCode failed = transform(x, first))
        return failed;
    if (const ErrorCode failed = transform(y, second))
        return failed;
    MultiplyComplex(first, second, count, first);
    const ErrorCode status = Inverse(plans, first, out);
    return Merge(status, spectra.release());
}

template <ElementType E>
ErrorCode ConvolveFull(const ConstMatrixView<E> &x, const ConstMatrixView<E> &y, int32_t algorithm,
                       const MatrixView<E> &out) {
    if (algorithm == ConvolveByTransform)
        return ConvolveByTransform2D(x, y, out);
    if (algorithm != ConvolveDirectly)
        return ErrInvalidSelector;
    if (x.count() < y.count())
        ConvolveDirectly2D(y, x, out);
    else
        ConvolveDirectly2D(x, y, out);
    return 0;
}

} // namespace

template <ElementType E>
ErrorCode Convolve2D(const ConstMatrixView<E> &x, const ConstMatrixView<E> &y,
                     OutputSize outputSize, int32_t algorithm, const MatrixView<E> &out) {
    QX_EXPECTS(!x.isEmpty() && !y.isEmpty() && x.isWhole() && y.isWhole() && out.isWhole());
    const bool valid = outputSize == ValidPart;
    if constexpr (E == ElementType::CDB)
        // kept: rows are compared with columns here.
        if (valid && (x.rows() < x.cols() || y.rows() < y.cols()))
            return ErrSizesDisagree;
    const int64_t rows = int64_t{x.rows()} + y.rows() - 1;
    const int64_t cols = int64_t{x.cols()} + y.cols() - 1;
    if (rows * cols > std::numeric_limits<int32_t>::max())
        return ErrOutOfMemory;
    if (outputSize == FullSize)
        return ConvolveFull(x, y, algorithm, out);

    MatrixView<E> full;
    ScratchParts memory;
    if (const ErrorCode failed =
            memory.take(Sized(full, static_cast<int32_t>(rows), static_cast<int32_t>(cols))))
        return failed;
    if (const ErrorCode failed = ConvolveFull(x, y, algorithm, full))
        return Merge(failed, memory.release());
    const MatrixView<E> part =
        full.block(valid ? y.rows() - 1 : y.rows() / 2, valid ? y.cols() - 1 : y.cols() / 2,
                   out.rows(), out.cols());
    for (std::ptrdiff_t r = 0; r < out.rows(); ++r)
        std::memcpy(static_cast<void *>(out.row(r)), part.row(r),
                    sizeof(typename MatrixView<E>::T) * static_cast<std::size_t>(out.cols()));
    return memory.release();
}

template <ElementType E>
ErrorCode Correlate2D(const ConstMatrixView<E> &x, const ConstMatrixView<E> &y, int32_t algorithm,
                      const MatrixView<E> &out) {
    MatrixView<E> turned;
    ScratchParts memory;
    if (const ErrorCode failed = memory.take(Sized(turned, x.rows(), x.cols())))
        return failed;
    const auto from = x.elements();
    const auto to = turned.elements();
    for (std::ptrdiff_t i = 0; i < from.size(); ++i)
        to[i] = Conjugate(from[from.size() - 1 - i]);
    const ErrorCode status = Convolve2D<E>(turned, y, FullSize, algorithm, out);
    return Merge(status, memory.release());
}

#define QX_INSTANTIATE(E)                                                                          \
    template ErrorCode Convolve2D(const ConstMatrixView<E> &, const ConstMatrixView<E> &,          \
                                  OutputSize, int32_t, const MatrixView<E> &);                     \
    template ErrorCode Correlate2D(const ConstMatrixView<E> &, const ConstMatrixView<E> &,         \
                                   int32_t, const MatrixView<E> &);

QX_INSTANTIATE(ElementType::DBL)
QX_INSTANTIATE(ElementType::CDB)

} // namespace qx
