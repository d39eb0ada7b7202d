#include "filters/direct_form.h"

#include "frame/scratch.h"
#include "spectra/recursion.h"
#include "spectra/sliding_sums.h"

#include <algorithm>
#include <cstddef>
#include <cstring>

namespace qx {
namespace {

constexpr auto Real = ElementType::DBL;
constexpr auto Complex = ElementType::CDB;

// y[t] = sum over k of b[nb-1-k] x[t+k], with real and imaginary parts separately if the taps or
// the signal are real.
void Slide(ConstantSteps<Real> taps, int32_t nb, const DBL *x, int64_t length, DBL *y,
           int32_t count) {
    SlidingSums({taps, nb, {x}, length, 0, {y}, count});
}
void Slide(ConstantSteps<Real> taps, int32_t nb, const CDB *x, int64_t length, CDB *y,
           int32_t count) {
    SlidingSums({taps, nb, {&x->re, 2}, length, 0, {&y->re, 2}, count});
    SlidingSums({taps, nb, {&x->im, 2}, length, 0, {&y->im, 2}, count});
}
void Slide(ConstantSteps<Complex> taps, int32_t nb, const CDB *x, int64_t length, CDB *y,
           int32_t count) {
    SlidingSums({taps, nb, {x}, length, 0, {y}, count});
}
void Slide(ConstantSteps<Complex> taps, int32_t nb, const DBL *x, int64_t length, CDB *y,
           int32_t count) {
    const std::ptrdiff_t step = 2 * taps.step;
    SlidingSums({{&taps.at->re, step}, nb, {x}, length, 0, {&y->re, 2}, count});
    SlidingSums({{&taps.at->im, step}, nb, {x}, length, 0, {&y->im, 2}, count});
}

double Product(double b, double x) { return b * x; }
CDB Product(double b, const CDB &x) { return {b * x.re, b * x.im}; }
CDB Product(const CDB &b, double x) { return {b.re * x, b.im * x}; }
CDB Product(const CDB &b, const CDB &x) {
    return {b.re * x.re - b.im * x.im, b.im * x.re + b.re * x.im};
}
double Sum(double a, double b) { return a + b; }
CDB Sum(const CDB &a, const CDB &b) { return {a.re + b.re, a.im + b.im}; }

template <ElementType C, ElementType X>
using Output = VectorView<DirectForm<C, X>::output>;

// The sums over x for a single sample. Needs no memory, because a filter may be called for each
// sample.
template <ElementType C, ElementType X>
void OneSum(ConstVectorView<C> b, const typename Element<X>::type x,
            typename Element<X>::type *state, typename Output<C, X>::T *y) {
    const std::ptrdiff_t past = b.size() - 1;
    typename Output<C, X>::T sum = {};
    for (std::ptrdiff_t k = past; k > 0; --k)
        sum = Sum(sum, Product(b[k], state[past - k]));
    *y = Sum(sum, Product(b[0], x));
    if (past > 0) {
        std::memmove(static_cast<void *>(state), state + 1,
                     sizeof x * static_cast<std::size_t>(past - 1));
        state[past - 1] = x;
    }
}

// The sums over x alone, starting from 0.0. Those that reach into the state use a copy of the state
// followed by the first samples; they are computed last, because the others read these samples in
// place.
template <ElementType C, ElementType X>
ErrorCode Sums(ConstVectorView<C> b, ConstVectorView<X> x, VectorView<X> state, Output<C, X> y) {
    const std::ptrdiff_t n = x.size(), past = b.size() - 1;
    QX_EXPECTS(n > 0 && past >= 0 && state.size() == past && y.size() == n);
    if (n == 1) {
        OneSum<C, X>(b, x[0], state.data(), y.data());
        return 0;
    }
    const ConstantSteps<C> taps = {b.data() + past, -1};
    const auto nb = static_cast<int32_t>(b.size());
    const std::ptrdiff_t head = std::min(n, past);
    Scratch<X> memory;
    if (const ErrorCode failed = memory.allocate(2 * int64_t{past} + head))
        return failed;
    auto *const joined = memory.data(), *const newest = joined + (past + head);
    Copy<X>(state, {joined, past});
    Copy<X>(x.part(0, head), {joined + past, head});
    Copy<X>({n > past ? x.data() + (n - past) : joined + n, past}, {newest, past});
    if (n > past)
        Slide(taps, nb, x.data(), n, y.data() + past, static_cast<int32_t>(n - past));
    Slide(taps, nb, joined, past + head, y.data(), static_cast<int32_t>(head));
    Copy<X>({newest, past}, state);
    return memory.release();
}

} // namespace

template <ElementType C, ElementType X>
ErrorCode DirectForm<C, X>::fir(Coefficients b, ConstVectorView<X> x, VectorView<X> state,
                                VectorView<output> y) {
    QX_EXPECTS(b.size() > 0 && y.size() == x.size());
    if (b.size() > 1)
        return Sums<C, X>(b, x, state, y);
    for (std::ptrdiff_t t = 0; t < x.size(); ++t)
        y[t] = Product(b[0], x[t]);
    return 0;
}

template <ElementType C, ElementType X>
ErrorCode DirectForm<C, X>::iir(Coefficients b, VectorView<X> xState, Coefficients a,
                                VectorView<output> yState, ConstVectorView<X> x,
                                VectorView<output> y) {
    if (const ErrorCode failed = Sums<C, X>(b, x, xState, y))
        return failed;
    RunRecursion(a, yState, y);
    return 0;
}

template struct DirectForm<ElementType::DBL, ElementType::DBL>;
template struct DirectForm<ElementType::DBL, ElementType::CDB>;
template struct DirectForm<ElementType::CDB, ElementType::CDB>;
template struct DirectForm<ElementType::CDB, ElementType::DBL>;

} // namespace qx
