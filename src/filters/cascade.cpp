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
                VectorView<Code> x) {
    for (typename VectorView<Code>::T &sample : x) {
        auto v = sample;
        for (std::ptrdiff_t s = 0; s < sections; ++s)
            v = Section<Order, Code>(a + s * Order, b + s * (Order + 1), state + s * Order, v);
        sample = Flushed(v);
    }
}

// From this many samples on the start and the end of the wave in lanes cost little.
constexpr int32_t worthLanes = 100;

} // namespace

template <ElementType E>
ErrorCode FilterIIRCascade(const CascadeCoefficients &filter, VectorView<E> state,
                           VectorView<E> x) {
    const auto &[a, b, form] = filter;
    const int32_t order = SectionOrder(form);
    if (order == 0 || a.size() < order || a.size() % order != 0)
        return ErrCoefficientSizes;
    const auto sections = static_cast<int32_t>(a.size() / order);
    if (int64_t{sections} * (order + 1) != b.size() || state.size() != a.size())
        return ErrCoefficientSizes;
    const auto n = static_cast<int32_t>(x.size());
    if constexpr (E == ElementType::DBL)
        if (n >= worthLanes) {
            RunCascadeInLanes({a.data(), b.data(), state.data(), sections, order, x.data(), n});
            return 0;
        }
    if (order == 2)
        RunSamples<2, E>(a.data(), b.data(), state.data(), sections, x);
    else
        RunSamples<4, E>(a.data(), b.data(), state.data(), sections, x);
    return 0;
}

template ErrorCode FilterIIRCascade(const CascadeCoefficients &filter, RealVector state,
                                    RealVector x);
template ErrorCode FilterIIRCascade(const CascadeCoefficients &filter, ComplexVector state,
                                    ComplexVector x);

} // namespace qx
