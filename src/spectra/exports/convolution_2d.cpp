#include "spectra/convolution_2d.h"

#include "frame/export.h"
#include "qx/convolution_2d.h"
#include "spectra/convolution.h"

#include <limits>

namespace qx {
namespace {

// What the twins call.
struct RealMatrices {
    typedef DBL2D Handle;
    static const DBL *values(const In<DBL2D> &in) { return in.data(); }
    static DBL *values(const Out<DBL2D, OnFailure::Keep> &out) { return out.data(); }
    static constexpr auto convolve = Convolve2DReal;
    static constexpr auto correlate = Correlate2DReal;
};
struct ComplexMatrices {
    typedef CDB2D Handle;
    static const DBL *values(const In<CDB2D> &in) { return &in.data()->re; }
    static DBL *values(const Out<CDB2D, OnFailure::Keep> &out) { return &out.data()->re; }
    static constexpr auto convolve = Convolve2DComplex;
    static constexpr auto correlate = Correlate2DComplex;
};

// The number of rows or of columns of a result, beyond int32 perhaps.
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

template <class Matrices>
Outcome ResizeResult(const In<typename Matrices::Handle> &x, const In<typename Matrices::Handle> &y,
                     int32_t outputSize, Out<typename Matrices::Handle, OnFailure::Keep> &out) {
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

// kept: the first checks leave the output as it is; every later failure empties it.
template <class Matrices>
Outcome Convolve(In<typename Matrices::Handle> x, In<typename Matrices::Handle> y,
                 Out<typename Matrices::Handle, OnFailure::Keep> out, int32_t outputSize,
                 int32_t algorithm) {
    if (const ErrorCode failed =
            FirstFailed({{x.isEmpty() || y.isEmpty(), ErrEmptyInput},
                         {outputSize < FullSize || outputSize > ValidPart, ErrInvalidSelector},
                         {outputSize == ValidPart && (x.rows() < y.rows() || x.cols() < y.cols()),
                          ErrSizesDisagree}}))
        return failed;
    if (const Outcome bad = ResizeResult<Matrices>(x, y, outputSize, out))
        return EmptiedOnFailure(out, bad);
    return EmptiedOnFailure(out, Matrices::convolve(Matrices::values(x), x.rows(), x.cols(),
                                                    Matrices::values(y), y.rows(), y.cols(),
                                                    Matrices::values(out), outputSize, algorithm));
}

template <class Matrices>
Outcome Correlate(In<typename Matrices::Handle> x, In<typename Matrices::Handle> y,
                  Out<typename Matrices::Handle, OnFailure::Keep> out, int32_t algorithm) {
    if (x.isEmpty() || y.isEmpty())
        return ErrEmptyInput;
    if (const Outcome bad = ResizeResult<Matrices>(x, y, FullSize, out))
        return EmptiedOnFailure(out, bad);
    return EmptiedOnFailure(out, Matrices::correlate(Matrices::values(x), x.rows(), x.cols(),
                                                     Matrices::values(y), y.rows(), y.cols(),
                                                     Matrices::values(out), algorithm));
}

} // namespace
} // namespace qx

using qx::Returned;

ErrorCode Convolve_2DH(DBL2D x, DBL2D y, DBL2D out, int32_t outputSize, int32_t algorithm) {
    return Returned(qx::Convolve<qx::RealMatrices>, x, y, out, outputSize, algorithm);
}

ErrorCode CxConvolve_2DH(CDB2D x, CDB2D y, CDB2D out, int32_t outputSize, int32_t algorithm) {
    return Returned(qx::Convolve<qx::ComplexMatrices>, x, y, out, outputSize, algorithm);
}

ErrorCode Correlation_2DH(DBL2D x, DBL2D y, DBL2D out, int32_t algorithm) {
    return Returned(qx::Correlate<qx::RealMatrices>, x, y, out, algorithm);
}

ErrorCode CxCorrelation_2DH(CDB2D x, CDB2D y, CDB2D out, int32_t algorithm) {
    return Returned(qx::Correlate<qx::ComplexMatrices>, x, y, out, algorithm);
}
