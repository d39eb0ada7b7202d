#include "multirate/modulator.h"

#include <cmath>

namespace qx {

namespace {

CDB Rotated(double x, double c, double s) { return {x * c, x * s}; }
CDB Rotated(const CDB &z, double c, double s) { return {z.re * c - z.im * s, z.re * s + z.im * c}; }
CDB AsComplex(double x) { return {x, 0.0}; }
CDB AsComplex(const CDB &z) { return z; }

} // namespace

template <ElementType Code>
void Modulate(const typename Element<Code>::type *x, int32_t n, double ratio, double *phase,
              CDB *y) {
    constexpr double twoPi = 6.283185307179586;
    if (ratio == 0.0) { // kept: the phase is not applied either
        for (int32_t i = 0; i < n; ++i)
            y[i] = AsComplex(x[i]);
        return;
    }
    const double step = ratio * twoPi;
    double c = std::cos(*phase), s = std::sin(*phase);
    const double stepCos = std::cos(step), stepSin = std::sin(step);
    const double end = n * step + *phase;
    *phase = end - twoPi * std::floor(end / twoPi);
    for (int32_t i = 0; i < n; ++i) {
        y[i] = Rotated(x[i], c, s);
        const double rotated = c * stepCos - s * stepSin;
        s = s * stepCos + c * stepSin;
        c = rotated;
    }
}

template void Modulate<ElementType::DBL>(const DBL *, int32_t, double, double *, CDB *);
template void Modulate<ElementType::CDB>(const CDB *, int32_t, double, double *, CDB *);

} // namespace qx
