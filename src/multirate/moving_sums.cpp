#include "multirate/moving_sums.h"

#include "multirate/samples.h"

#include <algorithm>

namespace qx {

namespace {

template <MovingSum Kind>
double Next(double v, double x, double oldest) {
    if constexpr (Kind == MovingSum::Plain)
        return v + x - oldest;
    else if constexpr (Kind == MovingSum::AlternateEven)
        return x - v - oldest;
    else
        return x - v + oldest;
}

// `Count` stages in one pass: the running value of a stage waits for its predecessor's last
// addition, and with several stages these waits overlap.
template <ElementType Code, MovingSum Kind, int Count>
void Pass(const MovingSumState<Code> &state, int32_t first, double scale,
          typename Element<Code>::type *x, int32_t n) {
    constexpr int parts = SampleParts<Code>::count;
    RealOf<Code> *rings[Count];
    double v[Count][parts];
    for (int k = 0; k < Count; ++k) {
        rings[k] = Reals<Code>(state.rings + (first + k) * state.ringStep);
        for (int part = 0; part < parts; ++part)
            v[k][part] = Reals<Code>(state.sums + (first + k) * state.sumStep)[part];
    }
    const int64_t end = int64_t{parts} * state.width;
    int64_t at = int64_t{parts} * state.position;
    for (int32_t i = 0; i < n; ++i) {
        for (int part = 0; part < parts; ++part) {
            double value = Reals<Code>(x + i)[part];
            for (int k = 0; k < Count; ++k) {
                RealOf<Code> *oldest = rings[k] + at + part;
                v[k][part] = Next<Kind>(v[k][part], value, *oldest);
                *oldest = value;
                value = v[k][part] * scale;
            }
            Reals<Code>(x + i)[part] = value;
        }
        at = at + parts == end ? 0 : at + parts;
    }
    for (int k = 0; k < Count; ++k)
        for (int part = 0; part < parts; ++part)
            Reals<Code>(state.sums + (first + k) * state.sumStep)[part] = v[k][part];
}

template <ElementType Code, MovingSum Kind>
void Passes(const MovingSumState<Code> &state, double scale, typename Element<Code>::type *x,
            int32_t n) {
    int32_t k = 0;
    if constexpr (Code == ElementType::DBL)
        // Rearranging the rings and back pays only for blocks longer than the rings.
        if (state.width <= wavefrontWidth && n >= wavefrontSamples && n / 2 >= state.width)
            for (; k + wavefrontStages <= state.stages; k += wavefrontStages)
                MovingSumWavefront(state, k, Kind, scale, x, n);
    for (; k + 4 <= state.stages; k += 4)
        Pass<Code, Kind, 4>(state, k, scale, x, n);
    switch (state.stages - k) {
    case 3:
        return Pass<Code, Kind, 3>(state, k, scale, x, n);
    case 2:
        return Pass<Code, Kind, 2>(state, k, scale, x, n);
    case 1:
        return Pass<Code, Kind, 1>(state, k, scale, x, n);
    default:
        return;
    }
}

} // namespace

template <ElementType Code>
void MovingSumStages(MovingSumState<Code> &state, MovingSum kind, double scale,
                     typename Element<Code>::type *x, int32_t n) {
    if (kind == MovingSum::Plain)
        Passes<Code, MovingSum::Plain>(state, scale, x, n);
    else if (kind == MovingSum::AlternateEven)
        Passes<Code, MovingSum::AlternateEven>(state, scale, x, n);
    else
        Passes<Code, MovingSum::AlternateOdd>(state, scale, x, n);
    state.position = static_cast<int32_t>((int64_t{state.position} + n) % state.width);
}

void StraightenRings(MovingSumState<ElementType::DBL> &state) {
    for (int32_t k = 0; k < state.stages; ++k) {
        DBL *ring = state.rings + k * state.ringStep;
        Reverse(ring, state.position);
        Reverse(ring + state.position, state.width - state.position);
        Reverse(ring, state.width);
    }
    state.position = 0;
}

template void MovingSumStages<ElementType::DBL>(MovingSumState<ElementType::DBL> &, MovingSum,
                                                double, DBL *, int32_t);
template void MovingSumStages<ElementType::CDB>(MovingSumState<ElementType::CDB> &, MovingSum,
                                                double, CDB *, int32_t);

} // namespace qx
