#include "spectra/convolution.h"

#include "fft/plan.h"
#include "frame/scratch.h"
#include "spectra/sliding_sums.h"
#include "spectra/spectral_products.h"

#include <algorithm>
#include <cstddef>
#include <cstring>
#include <limits>

namespace qx {
namespace {

constexpr auto Real = ElementType::DBL;
constexpr auto Complex = ElementType::CDB;

template <ElementType E>
void CopyPadded(ConstVectorView<E> from, VectorView<E> to) {
    const auto count = static_cast<std::size_t>(from.size());
    const auto length = static_cast<std::size_t>(to.size());
    std::memcpy(to.data(), from.data(), sizeof(typename VectorView<E>::T) * count);
    std::memset(static_cast<void *>(to.data() + from.size()), 0,
                sizeof(typename VectorView<E>::T) * (length - count));
}

template <ElementType E>
void CopyFirst(VectorView<E> from, VectorView<E> to) {
    std::memcpy(to.data(), from.data(),
                sizeof(typename VectorView<E>::T) * static_cast<std::size_t>(to.size()));
}

// out[t] = sum of a[i] b[t - i]. The shorter sequence serves as the taps; the steps make the order
// of the sum ascending or descending in i.
enum class Order { AscendingInA, DescendingInA };

template <ElementType Code>
void ConvolveSliding(ConstantSteps<Code> a, int32_t na, ConstantSteps<Code> b, int32_t nb,
                     Order order, VectorView<Code> out) {
    const auto last = [](ConstantSteps<Code> s, int32_t n) {
        return ConstantSteps<Code>{s.at + (n - 1) * s.step, -s.step};
    };
    const int32_t count = na + nb - 1;
    const Steps<Code> forward = {out.data(), 1};
    const Steps<Code> backward = {out.data() + (count - 1), -1};
    const bool tapsAreA = na < nb;
    const int32_t taps = tapsAreA ? na : nb;
    const int32_t length = tapsAreA ? nb : na;
    // Windows either move forward through the longer sequence with the taps reversed, or the other
    // way round.
    const bool rising = tapsAreA == (order == Order::DescendingInA);
    const ConstantSteps<Code> tap = tapsAreA ? a : b;
    const ConstantSteps<Code> signal = tapsAreA ? b : a;
    SlidingSums({rising ? last(tap, taps) : tap, taps, rising ? signal : last(signal, length),
                 length, 1 - int64_t{taps}, rising ? forward : backward, count});
}

// Transforms two padded sequences in `first` and `second`, and stores their circular convolution in
// `first`; all three arrays have the same length.
ErrorCode ConvolveCircularly(const FFTPlan *plan, RealVector first, RealVector second,
                             RealVector work) {
    const auto L = static_cast<int32_t>(first.size());
    if (const ErrorCode failed = FFTRealForward(plan, first.data(), work.data(), 1, 1, L))
        return failed;
    if (const ErrorCode failed = FFTRealForward(plan, second.data(), first.data(), 1, 1, L))
        return failed;
    MultiplyHalfComplex(work.data(), first.data(), L, second.data());
    return FFTRealInverse(plan, second.data(), first.data(), 1, 1, L);
}

// The convolution of x, reversed if requested, and y.
ErrorCode TransformReal(ConstRealVector x, bool reversed, ConstRealVector y, RealVector out) {
    const int32_t L = NextTransformLength(static_cast<int32_t>(out.size()));
    RealVector a, b, work;
    ScratchParts memory;
    if (const ErrorCode failed = memory.take(Sized(a, L), Sized(b, L), Sized(work, L)))
        return failed;
    const PlanReference plan(L);
    if (!plan)
        return ErrOutOfMemory;
    CopyPadded(x, a);
    if (reversed)
        Reverse(a.data(), x.size());
    CopyPadded(y, b);
    if (const ErrorCode failed = ConvolveCircularly(plan.get(), a, b, work))
        return failed;
    CopyFirst(a, out);
    return memory.release();
}

ErrorCode TransformComplex(ConstComplexVector x, ConstComplexVector y, ComplexVector out) {
    const int32_t L = NextTransformLength(static_cast<int32_t>(out.size()));
    ComplexVector a, b, c;
    ScratchParts memory;
    if (const ErrorCode failed = memory.take(Sized(a, L), Sized(b, L), Sized(c, L)))
        return failed;
    const PlanReference plan(L);
    if (!plan)
        return ErrOutOfMemory;
    const auto forward = [&](ComplexVector from, ComplexVector to) {
        return FFTComplexForward(plan.get(), &from.data()->re, &from.data()->im, &to.data()->re,
                                 &to.data()->im, 2, 2, L);
    };
    CopyPadded(x, b);
    CopyPadded(y, c);
    if (const ErrorCode failed = forward(b, a))
        return failed;
    if (const ErrorCode failed = forward(c, b))
        return failed;
    MultiplyComplex(a.data(), b.data(), L, c.data());
    if (const ErrorCode failed = FFTComplexInverse(plan.get(), &c.data()->re, &c.data()->im,
                                                   &a.data()->re, &a.data()->im, 2, 2, L))
        return failed;
    CopyFirst(a, out);
    return memory.release();
}

// Uses the squared magnitude of a single spectrum; the circular result is rearranged around lag
// zero.
ErrorCode AutoCorrelateByTransform(ConstRealVector x, RealVector out) {
    const int32_t L = NextTransformLength(static_cast<int32_t>(out.size()));
    RealVector a, b;
    ScratchParts memory;
    if (const ErrorCode failed = memory.take(Sized(a, L), Sized(b, L)))
        return failed;
    const PlanReference plan(L);
    if (!plan)
        return ErrOutOfMemory;
    CopyPadded(x, a);
    if (const ErrorCode failed = FFTRealForward(plan.get(), a.data(), b.data(), 1, 1, L))
        return failed;
    SquareHalfComplex(b.data(), L, a.data());
    if (const ErrorCode failed = FFTRealInverse(plan.get(), a.data(), b.data(), 1, 1, L))
        return failed;
    const std::ptrdiff_t n = x.size();
    CopyFirst(b, out.part(n - 1, n));
    CopyFirst(b.part(L - n + 1, n - 1), out.part(0, n - 1));
    return memory.release();
}

void Divide(DBL *value, double divisor) { *value = *value / divisor; }
void Divide(CDB *value, double divisor) {
    value->re = value->re / divisor;
    value->im = value->im / divisor;
}

template <ElementType E>
ErrorCode Normalize(VectorView<E> out, std::ptrdiff_t nx, std::ptrdiff_t ny,
                    int32_t normalization) {
    const std::ptrdiff_t m = std::min(nx, ny), count = out.size();
    switch (normalization) {
    case NotNormalized:
        return 0;
    case Unbiased:
        for (std::ptrdiff_t i = 0; i < count; ++i)
            Divide(&out[i], static_cast<double>(std::min({i + 1, count - i, m})));
        return 0;
    case Biased:
        for (typename VectorView<E>::T &value : out)
            Divide(&value, static_cast<double>(std::max(nx, ny)));
        return 0;
    default:
        return ErrInvalidSelector;
    }
}

template <ElementType E>
[[maybe_unused]] bool HasSizeOfConvolution(VectorView<E> out, ConstVectorView<E> x,
                                           ConstVectorView<E> y) {
    return !x.isEmpty() && !y.isEmpty() && out.size() == x.size() + y.size() - 1 &&
           out.size() <= std::numeric_limits<int32_t>::max();
}

int32_t Length(std::ptrdiff_t size) { return static_cast<int32_t>(size); }

} // namespace

int32_t NextTransformLength(int32_t n) {
    for (int64_t m = std::max(n, 1); m <= std::numeric_limits<int32_t>::max(); ++m) {
        int64_t rest = m;
        for (const int32_t prime : {43, 41, 37, 31, 29, 19, 17, 13, 11, 7, 5, 3, 2})
            while (rest % prime == 0)
                rest /= prime;
        if (rest == 1)
            return static_cast<int32_t>(m);
    }
    return 0;
}

ErrorCode ConvolveReal(ConstRealVector x, ConstRealVector y, int32_t algorithm, RealVector out) {
    QX_EXPECTS(HasSizeOfConvolution(out, x, y));
    if (algorithm == ConvolveByTransform)
        return TransformReal(x, false, y, out);
    if (algorithm == ConvolveDirectly)
        ConvolveSliding<Real>({x.data()}, Length(x.size()), {y.data()}, Length(y.size()),
                              Order::AscendingInA, out);
    return 0;
}

ErrorCode ConvolveComplex(ConstComplexVector x, ConstComplexVector y, int32_t algorithm,
                          ComplexVector out) {
    QX_EXPECTS(HasSizeOfConvolution(out, x, y));
    if (algorithm == ConvolveByTransform)
        return TransformComplex(x, y, out);
    if (algorithm != ConvolveDirectly)
        return ErrInvalidSelector;
    const Order order = x.size() > y.size() ? Order::AscendingInA : Order::DescendingInA;
    ConvolveSliding<Complex>({x.data()}, Length(x.size()), {y.data()}, Length(y.size()), order,
                             out);
    return 0;
}

ErrorCode CorrelateReal(ConstRealVector x, ConstRealVector y, int32_t algorithm,
                        int32_t normalization, RealVector out) {
    QX_EXPECTS(HasSizeOfConvolution(out, x, y));
    ErrorCode status = 0;
    if (algorithm == ConvolveDirectly)
        ConvolveSliding<Real>({x.data() + x.size() - 1, -1}, Length(x.size()), {y.data()},
                              Length(y.size()), Order::DescendingInA, out);
    else if (algorithm == ConvolveByTransform)
        status = x.data() == y.data() && x.size() == y.size() ? AutoCorrelateByTransform(x, out)
                                                              : TransformReal(x, true, y, out);
    return status != 0 ? status : Normalize(out, x.size(), y.size(), normalization);
}

ErrorCode CorrelateComplex(ConstComplexVector x, ConstComplexVector y, int32_t algorithm,
                           int32_t normalization, ComplexVector out) {
    Scratch<Complex> reversed;
    if (const ErrorCode failed = reversed.allocate(x.size()))
        return failed;
    for (std::ptrdiff_t i = 0; i < x.size(); ++i) {
        const CDB &from = x[x.size() - 1 - i];
        reversed[i] = {from.re, -from.im};
    }
    ErrorCode status = ConvolveComplex(ComplexVector(reversed.data(), x.size()), y, algorithm, out);
    status = Merge(status, reversed.release());
    return status != 0 ? status : Normalize(out, x.size(), y.size(), normalization);
}

} // namespace qx
