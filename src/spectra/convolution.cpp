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

const CDB *Elements(const DBL *interleaved) { return reinterpret_cast<const CDB *>(interleaved); }
CDB *Elements(DBL *interleaved) { return reinterpret_cast<CDB *>(interleaved); }

template <ElementType Code>
void CopyPadded(const typename Element<Code>::type *from, std::ptrdiff_t count,
                typename Element<Code>::type *to, std::ptrdiff_t length) {
    std::memcpy(to, from, sizeof *to * static_cast<std::size_t>(count));
    std::memset(static_cast<void *>(to + count), 0,
                sizeof *to * static_cast<std::size_t>(length - count));
}

// out[t] = sum of a[i] b[t - i]. The shorter sequence are the taps; the steps let their order be
// that of ascending or of descending i.
enum class Order { AscendingInA, DescendingInA };

template <ElementType Code>
void ConvolveSliding(ConstantSteps<Code> a, int32_t na, ConstantSteps<Code> b, int32_t nb,
                     Order order, typename Element<Code>::type *out) {
    const auto last = [](ConstantSteps<Code> s, int32_t n) {
        return ConstantSteps<Code>{s.at + (n - 1) * s.step, -s.step};
    };
    const int32_t count = na + nb - 1;
    const Steps<Code> forward = {out, 1};
    const Steps<Code> backward = {out + (count - 1), -1};
    const bool tapsAreA = na < nb;
    const int32_t taps = tapsAreA ? na : nb;
    const int32_t length = tapsAreA ? nb : na;
    // Windows either rise through the longer sequence with the taps from their end, or the other
    // way round.
    const bool rising = tapsAreA == (order == Order::DescendingInA);
    const ConstantSteps<Code> tap = tapsAreA ? a : b;
    const ConstantSteps<Code> signal = tapsAreA ? b : a;
    SlidingSums({rising ? last(tap, taps) : tap, taps, rising ? signal : last(signal, length),
                 length, 1 - int64_t{taps}, rising ? forward : backward, count});
}

// The steps from two padded sequences of L values in `first` and `second` to the transform of
// their convolution, which is left in `first`; `work` has L values as well.
ErrorCode ConvolveCircularly(const FFTPlan *plan, int32_t L, DBL *first, DBL *second, DBL *work) {
    if (const ErrorCode failed = FFTRealForward(plan, first, work, 1, 1, L))
        return failed;
    if (const ErrorCode failed = FFTRealForward(plan, second, first, 1, 1, L))
        return failed;
    MultiplyHalfComplex(work, first, L, second);
    return FFTRealInverse(plan, second, first, 1, 1, L);
}

// The convolution of x, reversed if so asked, and y.
ErrorCode TransformReal(const DBL *x, int32_t nx, bool reversed, const DBL *y, int32_t ny,
                        DBL *out) {
    const int32_t count = nx + ny - 1;
    const int32_t L = NextTransformLength(count);
    Scratch<Real> memory;
    if (const ErrorCode failed = memory.allocate(3 * int64_t{L}))
        return failed;
    const PlanReference plan(L);
    if (!plan)
        return ErrOutOfMemory;
    DBL *const a = memory.data();
    DBL *const b = a + L;
    CopyPadded<Real>(x, nx, a, L);
    if (reversed)
        Reverse(a, nx);
    CopyPadded<Real>(y, ny, b, L);
    if (const ErrorCode failed = ConvolveCircularly(plan.get(), L, a, b, b + L))
        return failed;
    std::memcpy(out, a, sizeof(DBL) * static_cast<std::size_t>(count));
    return memory.release();
}

ErrorCode TransformComplex(const DBL *x, int32_t nx, const DBL *y, int32_t ny, DBL *out) {
    const int32_t count = nx + ny - 1;
    const int32_t L = NextTransformLength(count);
    Scratch<Complex> memory;
    if (const ErrorCode failed = memory.allocate(3 * int64_t{L}))
        return failed;
    const PlanReference plan(L);
    if (!plan)
        return ErrOutOfMemory;
    CDB *const a = memory.data();
    CDB *const b = a + L;
    CDB *const c = b + L;
    const auto forward = [&](const CDB *from, CDB *to) {
        return FFTComplexForward(plan.get(), &from->re, &from->im, &to->re, &to->im, 2, 2, L);
    };
    CopyPadded<Complex>(Elements(x), nx, b, L);
    CopyPadded<Complex>(Elements(y), ny, c, L);
    if (const ErrorCode failed = forward(b, a))
        return failed;
    if (const ErrorCode failed = forward(c, b))
        return failed;
    MultiplyComplex(a, b, L, c);
    if (const ErrorCode failed =
            FFTComplexInverse(plan.get(), &c->re, &c->im, &a->re, &a->im, 2, 2, L))
        return failed;
    std::memcpy(out, a, sizeof(CDB) * static_cast<std::size_t>(count));
    return memory.release();
}

// By the squared magnitude of one spectrum; the circular result is laid out around lag zero.
ErrorCode AutoCorrelateByTransform(const DBL *x, int32_t n, DBL *out) {
    const int32_t L = NextTransformLength(2 * n - 1);
    Scratch<Real> memory;
    if (const ErrorCode failed = memory.allocate(2 * int64_t{L}))
        return failed;
    const PlanReference plan(L);
    if (!plan)
        return ErrOutOfMemory;
    DBL *const a = memory.data();
    DBL *const b = a + L;
    CopyPadded<Real>(x, n, a, L);
    if (const ErrorCode failed = FFTRealForward(plan.get(), a, b, 1, 1, L))
        return failed;
    SquareHalfComplex(b, L, a);
    if (const ErrorCode failed = FFTRealInverse(plan.get(), a, b, 1, 1, L))
        return failed;
    const auto size = sizeof(DBL) * static_cast<std::size_t>(n);
    std::memcpy(out + (n - 1), b, size);
    std::memcpy(out, b + (L - n + 1), size - sizeof(DBL));
    return memory.release();
}

void Divide(DBL *value, double divisor) { *value = *value / divisor; }
void Divide(CDB *value, double divisor) {
    value->re = value->re / divisor;
    value->im = value->im / divisor;
}

template <ElementType Code>
ErrorCode Normalize(typename Element<Code>::type *out, int32_t nx, int32_t ny,
                    int32_t normalization) {
    const int32_t m = std::min(nx, ny);
    const int32_t M = std::max(nx, ny);
    const std::ptrdiff_t count = std::ptrdiff_t{m} + M - 1;
    switch (normalization) {
    case NotNormalized:
        return 0;
    case Unbiased:
        for (std::ptrdiff_t i = 0; i < count; ++i)
            Divide(out + i, static_cast<double>(std::min({i + 1, count - i, std::ptrdiff_t{m}})));
        return 0;
    case Biased:
        for (std::ptrdiff_t i = 0; i < count; ++i)
            Divide(out + i, M);
        return 0;
    default:
        return ErrInvalidSelector;
    }
}

// Empty or too long together for an output array.
ErrorCode CheckLengths(int32_t nx, int32_t ny) {
    if (nx < 1 || ny < 1)
        return ErrEmptyInput;
    return int64_t{nx} + ny - 1 > std::numeric_limits<int32_t>::max() ? ErrOutOfMemory : 0;
}

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

ErrorCode ConvolveReal(const DBL *x, int32_t nx, const DBL *y, int32_t ny, int32_t algorithm,
                       DBL *out) {
    if (const ErrorCode failed = CheckLengths(nx, ny))
        return failed;
    if (algorithm == ConvolveByTransform)
        return TransformReal(x, nx, false, y, ny, out);
    if (algorithm == ConvolveDirectly)
        ConvolveSliding<Real>({x}, nx, {y}, ny, Order::AscendingInA, out);
    return 0;
}

ErrorCode ConvolveComplex(const DBL *x, int32_t nx, const DBL *y, int32_t ny, DBL *out,
                          int32_t algorithm) {
    if (const ErrorCode failed = CheckLengths(nx, ny))
        return failed;
    if (algorithm == ConvolveByTransform)
        return TransformComplex(x, nx, y, ny, out);
    if (algorithm != ConvolveDirectly)
        return ErrInvalidSelector;
    const Order order = nx > ny ? Order::AscendingInA : Order::DescendingInA;
    ConvolveSliding<Complex>({Elements(x)}, nx, {Elements(y)}, ny, order, Elements(out));
    return 0;
}

ErrorCode CorrelateReal(const DBL *x, int32_t nx, const DBL *y, int32_t ny, int32_t algorithm,
                        DBL *out, int32_t normalization) {
    if (const ErrorCode failed = CheckLengths(nx, ny))
        return failed;
    ErrorCode status = 0;
    if (algorithm == ConvolveDirectly)
        ConvolveSliding<Real>({x + (nx - 1), -1}, nx, {y}, ny, Order::DescendingInA, out);
    else if (algorithm == ConvolveByTransform)
        status = x == y && nx == ny ? AutoCorrelateByTransform(x, nx, out)
                                    : TransformReal(x, nx, true, y, ny, out);
    return status != 0 ? status : Normalize<Real>(out, nx, ny, normalization);
}

ErrorCode CorrelateComplex(const DBL *x, int32_t nx, const DBL *y, int32_t ny, DBL *out,
                           int32_t algorithm, int32_t normalization) {
    if (const ErrorCode failed = CheckLengths(nx, ny))
        return failed;
    Scratch<Complex> reversed;
    if (const ErrorCode failed = reversed.allocate(nx))
        return failed;
    for (std::ptrdiff_t i = 0; i < nx; ++i) {
        const CDB &from = Elements(x)[nx - 1 - i];
        reversed[i] = {from.re, -from.im};
    }
    ErrorCode status = ConvolveComplex(&reversed.data()->re, nx, y, ny, out, algorithm);
    status = Merge(status, reversed.release());
    return status != 0 ? status : Normalize<Complex>(Elements(out), nx, ny, normalization);
}

} // namespace qx
