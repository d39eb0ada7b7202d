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
CDB Quotient(const CDB &value, const CDB &a) {
    const double square = a.re * a.re + a.im * a.im;
    return {(value.re * a.re + value.im * a.im) / square,
            (value.im * a.re - value.re * a.im) / square};
}

CDB Flush(const CDB &value) { return {qx::Flush(value.re), qx::Flush(value.im)}; }
double Flush(double value) { return qx::Flush(value); }

// A division by 1 gives the value itself: most filters have such an a[0], and can do without the
// slowest of all operations in the loop that nothing else can hide.
bool IsOne(double a) { return a == 1.0; }
bool IsOne(const CDB &) { return false; }

template <bool Divides, ElementType Coefficient, ElementType Signal>
void Run(const typename Element<Coefficient>::type *a, int32_t na,
         const typename Element<Signal>::type *history, typename Element<Signal>::type *y,
         int32_t n) {
    const std::ptrdiff_t order = na - 1;
    for (std::ptrdiff_t t = 0; t < n; ++t) {
        auto sum = y[t];
        std::ptrdiff_t k = order;
        for (; k > t; --k)
            sum = Less(sum, a[k], history[order + t - k]);
        for (; k > 0; --k)
            sum = Less(sum, a[k], y[t - k]);
        y[t] = Flush(Divides ? Quotient(sum, a[0]) : sum);
    }
}

template <ElementType Coefficient, ElementType Signal>
void RunAndRemember(const typename Element<Coefficient>::type *a, int32_t na,
                    typename Element<Signal>::type *history, typename Element<Signal>::type *y,
                    int32_t n) {
    if (IsOne(a[0]))
        Run<false, Coefficient, Signal>(a, na, history, y, n);
    else
        Run<true, Coefficient, Signal>(a, na, history, y, n);
    const std::ptrdiff_t order = na - 1;
    const std::ptrdiff_t fresh = std::min<std::ptrdiff_t>(order, n);
    constexpr std::size_t size = sizeof *y;
    std::memmove(static_cast<void *>(history), history + fresh,
                 size * static_cast<std::size_t>(order - fresh));
    std::memcpy(static_cast<void *>(history + (order - fresh)), y + (n - fresh),
                size * static_cast<std::size_t>(fresh));
}

constexpr auto Real = ElementType::DBL;
constexpr auto Complex = ElementType::CDB;

} // namespace

void RunRecursion(const DBL *a, int32_t na, DBL *history, DBL *y, int32_t n) {
    RunAndRemember<Real, Real>(a, na, history, y, n);
}
void RunRecursion(const CDB *a, int32_t na, CDB *history, CDB *y, int32_t n) {
    RunAndRemember<Complex, Complex>(a, na, history, y, n);
}
void RunRecursion(const DBL *a, int32_t na, CDB *history, CDB *y, int32_t n) {
    RunAndRemember<Real, Complex>(a, na, history, y, n);
}

} // namespace qx
