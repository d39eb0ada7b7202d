#include "spectra/convolution.h"

#include "frame/export.h"
#include "qx/convolution.h"
#include "spectra/deconvolution.h"

#include <limits>

namespace qx {
namespace {

// Resizes to the size of a convolution. A size that does not fit into int32 is refused as out of
// memory.
template <class X, class Y, class Output>
Outcome ResizeToFull(const X &x, const Y &y, Output &out) {
    const int64_t count = int64_t{x.size()} + y.size() - 1;
    if (count > std::numeric_limits<int32_t>::max())
        return ErrOutOfMemory;
    return out.resize(static_cast<int32_t>(count));
}

Outcome Convolve(In<DBL1D> x, In<DBL1D> y, Out<DBL1D> out, int32_t algorithm) {
    if (x.isEmpty() || y.isEmpty())
        return ErrEmptyInput;
    if (const Outcome bad = ResizeToFull(x, y, out))
        return bad;
    return ConvolveReal(x.view(), y.view(), algorithm, out.view());
}

Outcome Correlate(In<DBL1D> x, In<DBL1D> y, Out<DBL1D> out, int32_t algorithm,
                  int32_t normalization) {
    if (x.isEmpty() || y.isEmpty())
        return ErrEmptyInput;
    if (const Outcome bad = ResizeToFull(x, y, out))
        return bad;
    return CorrelateReal(x.view(), y.view(), algorithm, normalization, out.view());
}

Outcome ComplexInto(const In<CDB1D> &x, const In<CDB1D> &y, Out<CDB1D, OnFailure::Keep> &out,
                    int32_t algorithm, int32_t correlate, int32_t normalization) {
    if (const Outcome bad = ResizeToFull(x, y, out))
        return bad;
    if (correlate == 0)
        return ConvolveComplex(x.view(), y.view(), algorithm, out.view());
    if (normalization < NotNormalized || normalization > Biased)
        return ErrInvalidSelector;
    return CorrelateComplex(x.view(), y.view(), algorithm, normalization, out.view());
}

Outcome ConvolveOrCorrelate(In<CDB1D> x, In<CDB1D> y, Out<CDB1D, OnFailure::Keep> out,
                            int32_t algorithm, int32_t correlate, int32_t normalization) {
    // kept: only this failure leaves the output unchanged.
    if (x.isEmpty() || y.isEmpty())
        return ErrEmptyInput;
    const Outcome outcome = ComplexInto(x, y, out, algorithm, correlate, normalization);
    if (outcome.failed())
        out.empty();
    return outcome;
}

// kept: no failure empties x; a refused resize is not a failure, and the size is set to the new
// one.
Outcome AutoCorrelate(InOut<DBL1D, OnFailure::Keep> x, const DBL1D &handle, int32_t normalization) {
    const int32_t n = x.size();
    if (n < 1)
        return ErrEmptyInput;
    if (n > std::numeric_limits<int32_t>::max() / 2)
        return ErrOutOfMemory;
    Scratch<ElementType::DBL> copy, unheld;
    if (const ErrorCode failed = copy.allocate(n))
        return failed;
    std::memcpy(copy.data(), x.data(), sizeof(DBL) * static_cast<std::size_t>(n));
    const ConstRealVector series(copy.data(), n);
    const int32_t count = 2 * n - 1;
    if (!x.resize(count).failed()) {
        // If there is no memory for the work, these zeros follow the n values.
        Fill(x.data() + n, n - 1, 0.0);
        return CorrelateReal(series, series, ConvolveByTransform, normalization, x.view());
    }
    // The block still has room for n values only.
    (*handle)->dimSize = count;
    if (const ErrorCode failed = unheld.allocate(count))
        return failed;
    const ErrorCode status =
        CorrelateReal(series, series, ConvolveByTransform, normalization, {unheld.data(), count});
    std::memcpy(x.data(), unheld.data(), sizeof(DBL) * static_cast<std::size_t>(n));
    return status;
}

Outcome Deconvolve(InOut<DBL1D> xy, const DBL1D &handle, In<DBL1D> y) {
    constexpr int32_t longest = 8388608;
    const int32_t count = xy.size() - y.size() + 1;
    if (const ErrorCode failed =
            FirstFailed({{xy.size() > longest || y.size() > longest, ErrLengthTooLarge},
                         {xy.isEmpty() || y.isEmpty(), ErrEmptyInput},
                         {count < 1, ErrSizesDisagree}}))
        return failed;
    if (const ErrorCode failed = DeconvolveReal(xy.view(), y.view(), xy.view().part(0, count)))
        return failed;
    // kept: the size is set whatever the host returns.
    (void)xy.resize(count);
    (*handle)->dimSize = count;
    return 0;
}

} // namespace
} // namespace qx

using qx::InErr;
using qx::ReturnedWithHost;

int32_t Convolution(DBL1D x, DBL1D y, DBL1D out, const int32_t *algorithm, ErrorCode *err) {
    return InErr(err, qx::Convolve, x, y, out, *algorithm);
}

ErrorCode CxConvolution(CDB1D x, CDB1D y, CDB1D out, int32_t algorithm, int32_t correlate,
                        int32_t normalization) {
    return ReturnedWithHost(qx::ConvolveOrCorrelate, x, y, out, algorithm, correlate,
                            normalization);
}

int32_t Rxy80(DBL1D x, DBL1D y, DBL1D out, const int32_t *algorithm, int32_t normalization,
              ErrorCode *err) {
    return InErr(err, qx::Correlate, x, y, out, *algorithm, normalization);
}

int32_t Rxy(DBL1D x, DBL1D y, DBL1D out, const int32_t *algorithm, ErrorCode *err) {
    return InErr(err, qx::Correlate, x, y, out, *algorithm, qx::NotNormalized);
}

int32_t AutoCorrelation80(DBL1D x, int32_t normalization, ErrorCode *err) {
    return InErr(
        err,
        [&x](qx::InOut<DBL1D, qx::OnFailure::Keep> view, int32_t asked) {
            return qx::AutoCorrelate(view, x, asked);
        },
        x, normalization);
}

int32_t AutoCorrelation(DBL1D x, ErrorCode *err) { return AutoCorrelation80(x, 0, err); }

int32_t Deconvolution(DBL1D xy, DBL1D y, ErrorCode *err) {
    InErr(
        err,
        [&xy](qx::InOut<DBL1D> quotient, qx::In<DBL1D> divisor) {
            return qx::Deconvolve(quotient, xy, divisor);
        },
        xy, y);
    return *err;
}
