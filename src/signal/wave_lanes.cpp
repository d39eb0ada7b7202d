#include "frame/lanes.h"
#include "signal/waves.h"

namespace qx::QX_WIDTH {

namespace {

constexpr double toInteger = 0x1.8p52; // adding and subtracting it rounds to an integer

template <class L>
__attribute__((always_inline)) inline L Indices(int32_t i) {
    const double from = i;
    const double indices[4] = {from, from + 1.0, from + 2.0, from + 3.0};
    return L::load(indices);
}

// fmod(x, 360), raised by 360 where negative, for |x| below 2^50. The quotient is a whole number
// near |x| / 360, its product with 360 has no error, and the remainder, between -180 and 180 or
// just beyond, has none either.
template <class L>
__attribute__((always_inline)) inline L Reduced(L x) {
    const L zero(0.0);
    const L turn(360.0);
    const L opposite = -x;
    const L magnitude(x.v < zero.v ? opposite.v : x.v);
    const L quotient = (magnitude * L(1.0 / 360.0) + L(toInteger)) - L(toInteger);
    const L nearest = magnitude - quotient * turn;
    const L raised = nearest + turn;
    const L rest(nearest.v < zero.v ? raised.v : nearest.v);
    // fmod gives a zero the sign of x, and a zero is not raised.
    const L mirrored = turn - rest;
    const L minusZero(-0.0);
    const L ofNegative(rest.v == zero.v ? minusZero.v : mirrored.v);
    return L(x.v < zero.v ? ofNegative.v : rest.v);
}

template <class L>
__attribute__((always_inline)) inline L PhasesFrom(int32_t i, const WavePhases &phases,
                                                   const DBL *y) {
    if (phases.inPlace)
        return L::load(y + i);
    return Reduced(Indices<L>(i) * L(360.0) * L(phases.f) + L(phases.start));
}

template <class Shape>
__attribute__((always_inline)) inline void Shaped(const WavePhases &phases, int32_t n, DBL *y,
                                                  Shape shape) {
    typedef Lanes<nativeLanes> L;
    typedef Lanes<1> One;
    int32_t i = 0;
    for (; n - i >= L::count; i += L::count)
        shape(PhasesFrom<L>(i, phases, y)).store(y + i);
    for (; i < n; ++i)
        shape(PhasesFrom<One>(i, phases, y)).store(y + i);
}

} // namespace

void SquareSamples(WavePhases phases, int32_t n, double amp, double threshold, DBL *y) {
    Shaped(phases, n, y, [=]<class L>(L p) {
        const L high(amp);
        const L low(-amp);
        return L(p.v < L(threshold).v ? high.v : low.v);
    });
}

void TriangleSamples(WavePhases phases, int32_t n, double amp, DBL *y) {
    Shaped(phases, n, y, [=]<class L>(L p) {
        const L q = p / L(180.0);
        const L height(amp * 2.0);
        const L rising = height * q;
        const L falling = height * (L(1.0) - q);
        const L returning = height * (q - L(2.0));
        const L early(q.v < L(0.5).v ? rising.v : falling.v);
        return L(q.v < L(1.5).v ? early.v : returning.v);
    });
}

void SawtoothSamples(WavePhases phases, int32_t n, double amp, DBL *y) {
    Shaped(phases, n, y, [=]<class L>(L p) {
        const L q = p * L(0.005555555555555556);
        const L first = q * L(amp);
        const L second = (q - L(2.0)) * L(amp);
        return L(p.v < L(180.0).v ? first.v : second.v);
    });
}

} // namespace qx::QX_WIDTH
