#include "util/scaling.h"

#include "frame/export.h"
#include "qx/scaling.h"

namespace qx {
namespace {

RealVector ElementsOf(const InOut<DBL1D> &x) { return x.view(); }
RealVector ElementsOf(const InOut<DBL2D> &x) { return x.view().elements(); }

template <class Array>
ErrorCode UnitRange(InOut<Array> x, OutDBL scale, OutDBL offset) {
    if (x.isEmpty())
        return ErrEmptyInput;
    ScaleToUnitRange(ElementsOf(x), *scale.address(), *offset.address());
    return 0;
}

template <class Array>
ErrorCode ByMagnitude(InOut<Array> x, OutDBL scale) {
    if (x.isEmpty())
        return ErrEmptyInput;
    ScaleByMagnitude(ElementsOf(x), *scale.address());
    return 0;
}

template <class Array>
ErrorCode Standardised(InOut<Array> x, OutDBL mean, OutDBL deviation) {
    if (x.isEmpty())
        return ErrEmptyInput;
    Standardise(ElementsOf(x), *mean.address(), *deviation.address());
    return 0;
}

template <class Array>
ErrorCode Line(InOut<Array> x, double a, double b) {
    if (x.isEmpty())
        return ErrEmptyInput;
    const RealVector elements = ElementsOf(x);
    MultiplyAndShift(elements.data(), static_cast<int32_t>(elements.size()), a, b);
    return 0;
}

ErrorCode Unwrapped(InOut<DBL1D> x, int32_t mode) {
    if (x.isEmpty())
        return ErrSizesDisagree; // kept: not ErrEmptyInput
    if (mode < 0 || mode > static_cast<int32_t>(UnwrapMode::DegreesToRadians))
        return ErrInvalidSelector;
    UnwrapPhase(x.view(), static_cast<UnwrapMode>(mode));
    return 0;
}

} // namespace
} // namespace qx

using qx::InErr;
using qx::InErrAndReturnedWithHost;
using qx::Returned;

int32_t Scale(DBL2D x, double *scale, double *offset, ErrorCode *err) {
    return InErr(err, qx::UnitRange<DBL2D>, x, scale, offset);
}

int32_t Scale1DCIN(DBL1D x, double *offset, double *scale, ErrorCode *err) {
    return InErr(err, qx::UnitRange<DBL1D>, x, scale, offset);
}

int32_t QScale(DBL2D x, double *scale, ErrorCode *err) {
    return InErr(err, qx::ByMagnitude<DBL2D>, x, scale);
}

int32_t QS1D(DBL1D x, double *scale, ErrorCode *err) {
    return InErr(err, qx::ByMagnitude<DBL1D>, x, scale);
}

int32_t Norm1(DBL1D x, double *mean, double *sd, ErrorCode *err) {
    return InErr(err, qx::Standardised<DBL1D>, x, mean, sd);
}

int32_t Norm2(DBL2D x, double *mean, double *sd, ErrorCode *err) {
    return InErr(err, qx::Standardised<DBL2D>, x, mean, sd);
}

ErrorCode Line1(DBL1D x, const double *a, const double *b) {
    return Returned(qx::Line<DBL1D>, x, *a, *b);
}

ErrorCode LinEv(DBL2D x, double a, double b) { return Returned(qx::Line<DBL2D>, x, a, b); }

ErrorCode unWrap(DBL1D x, ErrorCode *err) {
    return InErrAndReturnedWithHost(err, qx::Unwrapped, x, 0);
}

ErrorCode unWrap85(DBL1D x, int32_t mode) { return Returned(qx::Unwrapped, x, mode); }
