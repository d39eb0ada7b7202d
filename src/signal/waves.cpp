#include "signal/waves.h"

#include "frame/constants.h"
#include "mathlib/elementary.h"

#include <algorithm>
#include <cmath>

namespace qx {

namespace {

constexpr double toInteger = 0x1.8p52; // adding and subtracting it rounds to an integer

double Raised(double remainder, double modulus) {
    return remainder < 0.0 ? remainder + modulus : remainder;
}
double PhaseAt(int32_t i, double f, double start) {
    return Raised(std::fmod(i * 360.0 * f + start, 360.0), 360.0);
}

// `shape` computes the wave from its phases. Phases that are too large for its remainder are
// computed here.
template <class Shape>
void GenShapedWave(double f, double &phase, RealVector y, const Shape &shape) {
    const int32_t n = Count(y);
    const double reach = std::fabs(phase) + std::fabs(n * 360.0 * f);
    WavePhases phases = {f, phase, !(reach < 0x1p50)};
    if (phases.inPlace)
        for (int32_t i = 0; i < n; ++i)
            y[i] = PhaseAt(i, f, phase);
    shape(phases, n);
    phase = PhaseAt(n, f, phase);
}

} // namespace

void GenSquareWave(double amp, double f, double &phase, double duty, RealVector y) {
    const double threshold = 3.6 * std::min(std::max(duty, 0.0), 100.0);
    GenShapedWave(f, phase, y, [&](const WavePhases &phases, int32_t n) {
        SquareSamples(phases, n, amp, threshold, y.data());
    });
}

void GenTriangleWave(double amp, double f, double &phase, RealVector y) {
    GenShapedWave(f, phase, y, [&](const WavePhases &phases, int32_t n) {
        TriangleSamples(phases, n, amp, y.data());
    });
}

void GenSawtoothWave(double amp, double f, double &phase, RealVector y) {
    GenShapedWave(f, phase, y, [&](const WavePhases &phases, int32_t n) {
        SawtoothSamples(phases, n, amp, y.data());
    });
}

// Sine and cosine two samples apart: sin(a + 2w) = sin(a) + 2 sin(w) cos(a + w), and likewise for
// the cosine. Clipping is part of the method, whose amplitude is not stable over long runs; as
// clipping is rare, a branch keeps it out of the chain of additions.
void GenSineWave(double amp, double f, double &phase, RealVector y) {
    const int32_t n = Count(y);
    const double w = 2.0 * kPi * f;
    const double a = phase * 0.017453292519943295;
    const double k = 2.0 * std::sin(w);
    const double limit = std::fabs(amp);
    double before = amp * std::sin(a);
    double cosBefore = amp * std::cos(a);
    double last = amp * std::sin(a + w);
    double cosLast = amp * std::cos(a + w);
    y[0] = before;
    if (n > 1)
        y[1] = last;
    for (int32_t i = 2; i < n; ++i) {
        double next = before + k * cosLast;
        const double cosNext = cosBefore - k * last;
        if (__builtin_expect(next > limit || next < -limit, 0))
            next = next > limit ? limit : -limit;
        y[i] = next;
        before = last;
        last = next;
        cosBefore = cosLast;
        cosLast = cosNext;
    }
    phase = PhaseAt(n, f, phase);
}

namespace {

// fmod(q, m), increased by m if negative, for a whole m and |q| / m below 2^44.
double ReducedByWhole(double q, double m, double inverse) {
    const double magnitude = std::fabs(q);
    const double quotient = (magnitude * inverse + toInteger) - toInteger;
    const double rest = Raised(magnitude - quotient * m, m);
    return q < 0.0 && rest != 0.0 ? m - rest : rest;
}

template <class Value>
double ReadTable(double position, double step, double m, RealVector y, const Value &value) {
    const int32_t n = Count(y);
    const bool isNear = std::fabs(position) + std::fabs(n * step) < 0x1p44;
    const double inverse = 1.0 / m;
    for (int32_t i = 0; i < n; ++i) {
        double r =
            isNear ? ReducedByWhole(position, m, inverse) : Raised(std::fmod(position, m), m);
        // A tiny negative remainder becomes m by rounding when m is added.
        r = r < m ? r : 0.0;
        y[i] = value(r);
        position += step;
    }
    return position;
}

} // namespace

ErrorCode GenArbitraryWave(double amp, double f, double &phase, ConstRealVector table,
                           int32_t interpolate, RealVector y) {
    const int32_t n = Count(y), m = Count(table);
    if (!std::isfinite(phase) || !std::isfinite(f))
        return ErrNonFiniteInput;
    if (m < 1) {
        Fill(y.data(), n, amp * 0.0);
        phase = 0.0;
        return 0;
    }
    const double length = m;
    const double step = length * f;
    double position = length / 360.0 * phase;
    // Beyond this limit the position would become infinite, and there would be no index into the
    // table.
    if (!std::isfinite(2.0 * (std::fabs(position) + n * std::fabs(step))))
        return ErrNonFiniteInput;
    if (interpolate == 1)
        position = ReadTable(position, step, length, y, [=](double r) {
            const auto i = static_cast<int32_t>(r);
            const double before = table[i];
            const double behind = table[i + 1 < m ? i + 1 : 0];
            return amp * (before + (r - i) * (behind - before));
        });
    else
        position = ReadTable(position, step, length, y,
                             [=](double r) { return amp * table[static_cast<int32_t>(r)]; });
    phase = Raised(std::fmod(360.0 / length * position, 360.0), 360.0);
    return 0;
}

void GenChirp(double amp, double f1, double f2, RealVector y) {
    const int32_t n = Count(y);
    const double step = (f2 - f1) * kPi / n;
    constexpr int32_t atOnce = 1024; // stays in the first cache
    for (int32_t first = 0; first < n; first += std::min(atOnce, n - first)) {
        const int32_t count = std::min(atOnce, n - first);
        DBL *const to = y.data() + first;
        ChirpPhases(step, 2.0 * kPi * f1, first, count, to);
        Sines(to, count, to);
        ScaleSamples(amp, count, to);
    }
}

} // namespace qx
