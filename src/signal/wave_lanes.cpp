#include "frame/lane_masks.h"
#include "signal/waves.h"

namespace qx::QX_WIDTH {

namespace {

constexpr double toInteger = 0x1.8p52; // adding and subtracting it rounds to an integer

template <class L>
__attribute__((always_inline)) inline L Indices(int32_t i) {
    const double from = i;
    const double indices[8] = {from,       from + 1.0, from + 2.0, from + 3.0,
                               from + 4.0, from + 5.0, from + 6.0, from + 7.0};
    return L::load(indices);
}

// fmod(x, 360), increased by 360 if negative, for |x| below 2^50. The quotient is a whole number
// near |x| / 360, its product with 360 is exact, and so is the remainder, which is between -180 and
// 180 or slightly beyond.
template <class L>
__attribute__((always_inline)) inline L Reduced(L x) {
    const L zero(0.0);
    const L turn(360.0);
    const L magnitude = Select(x < zero, -x, x);
    const L quotient = (magnitude * L(1.0 / 360.0) + L(toInteger)) - L(toInteger);
    const L nearest = magnitude - quotient * turn;
    const L rest = Select(nearest < zero, nearest + turn, nearest);
    // fmod gives a zero the sign of x, and a zero is not increased.
    const L ofNegative = Select(rest == zero, L(-0.0), turn - rest);
    return Select(x < zero, ofNegative, rest);
}

template <class L>
__attribute__((always_inline)) inline L Unreduced(L indices, const WavePhases &phases) {
    return indices * L(360.0) * L(phases.f) + L(phases.start);
}

// If eight vectors cover less than a turn, most vectors lie within one turn, and their phases are
// the unreduced ones minus the same number of whole turns, exactly.
template <class Shape>
__attribute__((always_inline)) inline int32_t ShapedSlowly(const WavePhases &phases, int32_t n,
                                                           DBL *y, Shape shape) {
    typedef Lanes<nativeLanes> L;
    if (phases.inPlace || !(phases.f >= 0.0 && phases.f * (8 * nativeLanes) < 1.0) ||
        !(phases.start >= 0.0))
        return 0;
    const L step(nativeLanes), turn(360.0);
    L indices = Indices<L>(0);
    double turns = 0.0; // in degrees, at most the phase of the first lane
    int32_t i = 0;
    for (; n - i >= nativeLanes; i += nativeLanes, indices = indices + step) {
        const L x = Unreduced(indices, phases);
        L phase = x - L(turns);
        if (__builtin_expect(Any(phase >= turn), 0)) {
            phase = Reduced(x);
            turns = x[nativeLanes - 1] - phase[nativeLanes - 1];
        }
        shape(phase).store(y + i);
    }
    return i;
}

template <class Shape>
__attribute__((always_inline)) inline void Shaped(const WavePhases &phases, int32_t n, DBL *y,
                                                  Shape shape) {
    typedef Lanes<nativeLanes> L;
    typedef Lanes<1> One;
    const auto phasesFrom = [&]<class V>(V indices, const DBL *at) {
        return phases.inPlace ? V::load(at) : Reduced(Unreduced(indices, phases));
    };
    int32_t i = ShapedSlowly(phases, n, y, shape);
    L indices = Indices<L>(i);
    for (; n - i >= L::count; i += L::count, indices = indices + L(L::count))
        shape(phasesFrom(indices, y + i)).store(y + i);
    for (; i < n; ++i)
        shape(phasesFrom(One(i), y + i)).store(y + i);
}

} // namespace

void SquareSamples(WavePhases phases, int32_t n, double amp, double threshold, DBL *y) {
    Shaped(phases, n, y, [=]<class L>(L p) { return Select(p < L(threshold), L(amp), L(-amp)); });
}

void TriangleSamples(WavePhases phases, int32_t n, double amp, DBL *y) {
    Shaped(phases, n, y, [=]<class L>(L p) {
        const L q = p / L(180.0);
        const L early = Select(q < L(0.5), q, L(1.0) - q);
        return L(amp * 2.0) * Select(q < L(1.5), early, q - L(2.0));
    });
}

void SawtoothSamples(WavePhases phases, int32_t n, double amp, DBL *y) {
    Shaped(phases, n, y, [=]<class L>(L p) {
        const L q = p * L(0.005555555555555556);
        return Select(p < L(180.0), q, q - L(2.0)) * L(amp);
    });
}

void ChirpPhases(double step, double slope, int32_t first, int32_t n, DBL *y) {
    typedef Lanes<nativeLanes> L;
    const auto phases = [=]<class V>(V i) { return i * (V(step) * i + V(slope)); };
    L indices = Indices<L>(first);
    int32_t i = 0;
    for (; n - i >= nativeLanes; i += nativeLanes, indices = indices + L(nativeLanes))
        phases(indices).store(y + i);
    for (; i < n; ++i)
        phases(Lanes<1>(static_cast<double>(first) + i)).store(y + i);
}

void ScaleSamples(double amp, int32_t n, DBL *y) {
    typedef Lanes<nativeLanes> L;
    int32_t i = 0;
    for (; n - i >= nativeLanes; i += nativeLanes)
        (L(amp) * L::load(y + i)).store(y + i);
    for (; i < n; ++i)
        y[i] = amp * y[i];
}

} // namespace qx::QX_WIDTH
