#include "spectra/recursion.h"

#include <algorithm>
#include <cstddef>
#include <cstring>

namespace qx {
namespace {

double Less(double sum, double a, double y) { return sum - a * y; }
CDB Less(const CDB &sum, double a, const CDB &y) { return {sum.re - a * y.re, sum.im - a * y.im}; }
CDB Less(const CDB &sum, const CDB &a, const CDB &y) {
    return {sum.re - (a.re * y.re - a.im * y.im), sum.im - (a.im * y.re + a.re * y.im)};
}

double Quotient(double value, double a) { return value / a; }
CDB Quotient(const CDB &value, double a) { return {value.re / a, value.im / a}; }
// kept: the plain formula, whose square overflows or underflows before the quotient does. The
// operator of frame/complex.h avoids that, but rounds differently.
CDB Quotient(const CDB &value, const CDB &a) {
    const double square = a.re * a.re + a.im * a.im;
    return {(value.re * a.re + value.im * a.im) / square,
            (value.im * a.re - value.re * a.im) / square};
}

CDB Flush(const CDB &value) { return {qx::Flush(value.re), qx::Flush(value.im)}; }
double Flush(double value) { return qx::Flush(value); }

// Division by 1 returns the value itself. Most filters have such an a[0]; skipping the division
// avoids the slowest operation in a loop where nothing else can hide its latency.
bool IsOne(double a) { return a == 1.0; }
bool IsOne(const CDB &) { return false; }

template <bool Divides, ElementType Coefficient, ElementType Signal>
void Run(ConstVectorView<Coefficient> a, ConstVectorView<Signal> history, VectorView<Signal> y) {
    const std::ptrdiff_t order = history.size();
    for (std::ptrdiff_t t = 0; t < y.size(); ++t) {
        auto sum = y[t];
        std::ptrdiff_t k = order;
        for (; k > t; --k)
            sum = Less(sum, a[k], history[order + t - k]);
        for (; k > 0; --k)
            sum = Less(sum, a[k], y[t - k]);
        y[t] = Flush(Divides ? Quotient(sum, a[0]) : sum);
    }
}

} // namespace

template <ElementType Coefficient, ElementType Signal>
void RunRecursion(ConstVectorView<Coefficient> a, VectorView<Signal> history,
                  VectorView<Signal> y) {
    QX_EXPECTS(a.size() > 0 && history.size() == a.size() - 1);
    if (IsOne(a[0]))
        Run<false, Coefficient, Signal>(a, history, y);
    else
        Run<true, Coefficient, Signal>(a, history, y);
    const std::ptrdiff_t order = history.size();
    const std::ptrdiff_t fresh = std::min(order, y.size());
    constexpr std::size_t size = sizeof(typename VectorView<Signal>::T);
    std::memmove(static_cast<void *>(history.data()), history.data() + fresh,
                 size * static_cast<std::size_t>(order - fresh));
    std::memcpy(static_cast<void *>(history.data() + (order - fresh)),
                y.data() + (y.size() - fresh), size * static_cast<std::size_t>(fresh));
}

template void RunRecursion(ConstRealVector a, RealVector history, RealVector y);
template void RunRecursion(ConstComplexVector a, ComplexVector history, ComplexVector y);
template void RunRecursion(ConstRealVector a, ComplexVector history, ComplexVector y);

} // namespace qx
