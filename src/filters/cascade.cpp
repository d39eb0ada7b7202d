#include "filters/cascade.h"

#include "spectra/recursion.h"

#include <cstddef>

namespace qx {
namespace {

double Flushed(double value) { return Flush(value); }
CDB Flushed(const CDB &value) { return {Flush(value.re), Flush(value.im)}; }

double Times(double factor, double value) { return factor * value; }
CDB Times(double factor, const CDB &value) { return {factor * value.re, factor * value.im}; }
double Plus(double a, double b) { return a + b; }
CDB Plus(const CDB &a, const CDB &b) { return {a.re + b.re, a.im + b.im}; }
double Minus(double a, double b) { return a - b; }
CDB Minus(const CDB &a, const CDB &b) { return {a.re - b.re, a.im - b.im}; }

// One sample through one section.
template <int Order, ElementType Code>
auto Section(const DBL *a, const DBL *b, typename Element<Code>::type *state,
             const typename Element<Code>::type &in) {
    auto w = in;
    for (int j = 0; j < Order; ++j)
        w = Minus(w, Times(a[j], state[j]));
    auto v = Times(b[0], w);
    for (int j = 0; j < Order; ++j)
        v = Plus(v, Times(b[j + 1], state[j]));
    for (int j = Order - 1; j > 0; --j)
        state[j] = state[j - 1];
    state[0] = Flushed(w);
    return v;
}

template <int Order, ElementType Code>
void RunSamples(const DBL *a, const DBL *b, typename Element<Code>::type *state, int32_t sections,
                typename Element<Code>::type *x, int32_t n) {
    for (std::ptrdiff_t i = 0; i < n; ++i) {
        auto v = x[i];
        for (std::ptrdiff_t s = 0; s < sections; ++s)
            v = Section<Order, Code>(a + s * Order, b + s * (Order + 1), state + s * Order, v);
        x[i] = Flushed(v);
    }
}

// From so many samples on the start and the end of the lanes' wave cost little.
constexpr int32_t worthLanes = 100;

template <ElementType Code>
ErrorCode Filter(const CascadeCoefficients &filter, typename Element<Code>::type *state,
                 int32_t stateCount, typename Element<Code>::type *x, int32_t n) {
    const int32_t order = SectionOrder(filter.form);
    if (order == 0 || filter.aCount < order || filter.aCount % order != 0)
        return ErrCoefficientSizes;
    const int32_t sections = filter.aCount / order;
    if (int64_t{sections} * (order + 1) != filter.bCount || stateCount != filter.aCount)
        return ErrCoefficientSizes;
    if constexpr (Code == ElementType::DBL)
        if (n >= worthLanes) {
            RunCascadeInLanes({filter.a, filter.b, state, sections, order, x, n});
            return 0;
        }
    if (order == 2)
        RunSamples<2, Code>(filter.a, filter.b, state, sections, x, n);
    else
        RunSamples<4, Code>(filter.a, filter.b, state, sections, x, n);
    return 0;
}

} // namespace

ErrorCode FilterIIRCascade(const CascadeCoefficients &filter, DBL *state, int32_t stateCount,
                           DBL *x, int32_t n) {
    return Filter<ElementType::DBL>(filter, state, stateCount, x, n);
}
ErrorCode FilterIIRCascade(const CascadeCoefficients &filter, CDB *state, int32_t stateCount,
                           CDB *x, int32_t n) {
    return Filter<ElementType::CDB>(filter, state, stateCount, x, n);
}

} // namespace qx
