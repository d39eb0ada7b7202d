#include "spectra/convolution_2d.h"

#include "frame/export.h"
#include "qx/convolution_2d.h"

#include <limits>

namespace qx {
namespace {

// The number of rows or columns of a result, which may exceed int32.
int64_t ResultSize(int32_t outputSize, int32_t x, int32_t y) {
    switch (outputSize) {
    case FullSize:
        return int64_t{x} + y - 1;
    case SameSize:
        return x;
    default:
        return int64_t{x} - y + 1;
    }
}

template <class Handle>
Outcome ResizeResult(const In<Handle> &x, const In<Handle> &y, int32_t outputSize,
                     Out<Handle, OnFailure::Keep> &out) {
    const int64_t rows = ResultSize(outputSize, x.rows(), y.rows());
    const int64_t cols = ResultSize(outputSize, x.cols(), y.cols());
    constexpr int64_t most = std::numeric_limits<int32_t>::max();
    if (rows > most || cols > most)
        return ErrOutOfMemory;
    return out.resize(static_cast<int32_t>(rows), static_cast<int32_t>(cols));
}

template <class Output>
Outcome EmptiedOnFailure(Output &out, Outcome outcome) {
    if (outcome.failed())
        out.empty();
    return outcome;
}

// kept: the first checks leave the output unchanged; every later failure empties it.
template <class Handle>
Outcome Convolve(In<Handle> x, In<Handle> y, Out<Handle, OnFailure::Keep> out, int32_t outputSize,
                 int32_t algorithm) {
    if (const ErrorCode failed =
            FirstFailed({{x.isEmpty() || y.isEmpty(), ErrEmptyInput},
                         {outputSize < FullSize || outputSize > ValidPart, ErrInvalidSelector},
                         {outputSize == ValidPart && (x.rows() < y.rows() || x.cols() < y.cols()),
                          ErrSizesDisagree}}))
        return failed;
    if (const Outcome bad = ResizeResult(x, y, outputSize, out))
        return EmptiedOnFailure(out, bad);
    return EmptiedOnFailure(
        out, Convolve2D<HandleTraits<Handle>::code>(
                 x.view(), y.view(), static_cast<OutputSize>(outputSize), algorithm, out.view()));
}

template <class Handle>
Outcome Correlate(In<Handle> x, In<Handle> y, Out<Handle, OnFailure::Keep> out, int32_t algorithm) {
    if (x.isEmpty() || y.isEmpty())
        return ErrEmptyInput;
    if (const Outcome bad = ResizeResult(x, y, FullSize, out))
        return EmptiedOnFailure(out, bad);
    return EmptiedOnFailure(
        out, Correlate2D<HandleTraits<Handle>::code>(x.view(), y.view(), algorithm, out.view()));
}

} // namespace
} // namespace qx

using qx::Returned;

ErrorCode Convolve_2DH(DBL2D x, DBL2D y, DBL2D out, int32_t outputSize, int32_t algorithm) {
    return Returned(qx::Convolve<DBL2D>, x, y, out, outputSize, algorithm);
}

ErrorCode CxConvolve_2DH(CDB2D x, CDB2D y, CDB2D out, int32_t outputSize, int32_t algorithm) {
    return Returned(qx::Convolve<CDB2D>, x, y, out, outputSize, algorithm);
}

ErrorCode Correlation_2DH(DBL2D x, DBL2D y, DBL2D out, int32_t algorithm) {
    return Returned(qx::Correlate<DBL2D>, x, y, out, algorithm);
}

ErrorCode CxCorrelation_2DH(CDB2D x, CDB2D y, CDB2D out, int32_t algorithm) {
    return Returned(qx::Correlate<CDB2D>, x, y, out, algorithm);
}
