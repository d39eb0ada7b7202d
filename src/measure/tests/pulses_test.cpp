#include "qx/pulses.h"

#include "measure/crossings.h"
#include "measure/search.h"
#include "qx/errors.h"
#include "tests/support/heap_probe.h"
#include "tests/support/hostile_host.h"
#include "tests/support/recipe.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <cmath>
#include <functional>
#include <limits>
#include <numbers>
#include <vector>

namespace qx::test {
namespace {

const double nan = std::numeric_limits<double>::quiet_NaN();
constexpr double inf = std::numeric_limits<double>::infinity();
typedef std::vector<double> Samples;

Samples Sampled(int32_t n, const std::function<double(double)> &f) {
    Samples y;
    for (int32_t i = 0; i < n; ++i)
        y.push_back(f(i));
    return y;
}

// Pulses from 0 to 1 with straight edges: they rise from `begin` on for `rise` samples, stay at 1
// for `high`, fall for `fall`, and repeat every `period`.
struct Trapezoids {
    double begin, rise, high, fall, period;
    double operator()(double t) const {
        const double at = std::fmod(t - begin + 100 * period, period);
        if (at < rise)
            return at / rise;
        if (at < rise + high)
            return 1;
        return std::max(0.0, 1 - (at - rise - high) / fall);
    }
};

// Scalar outputs of the exports, filled with rubbish that a failure must clear.
struct Numbers {
    double values[11] = {9, 9, 9, 9, 9, 9, 9, 9, 9, 9, 9};
    double *operator()(int i) { return &values[i]; }
    bool areZero(int count) const {
        return std::all_of(values, values + count, [](double v) { return v == 0; });
    }
};

struct MeasuredLevels {
    ErrorCode status;
    double high, low, amplitude;
};

// One node: its slot or its instance data.
class Node {
public:
    explicit Node(bool isIDP = false) : isIDP_(isIDP) {}
    ~Node() {
        if (isIDP_)
            EXPECT_EQ(MeasurementUnreserveProc(&word), 0);
        else
            qx::test::RunSweepOf(word);
    }
    Node(const Node &) = delete;
    Node &operator=(const Node &) = delete;

    MeasuredLevels levels(const Samples &y, int32_t method, int32_t bins, int32_t limit = 0,
                          double interval = 1) {
        const DBLArray array(y);
        Numbers r;
        const auto function = isIDP_ ? StateLevels_IDP : StateLevels;
        const ErrorCode status =
            function(array.handle(), 0, interval, method, bins, &word, r(0), r(1), r(2), limit);
        EXPECT_TRUE(status >= 0 || r.areZero(3));
        return {status, r.values[0], r.values[1], r.values[2]};
    }

    struct Pulse {
        ErrorCode status;
        double period, duration, dutyCycle, center, lowRef, midRef, highRef;
    };
    Pulse pulse(const Samples &y, uint16_t polarity, int32_t number, uint16_t partial = 0,
                int32_t limit = 0) {
        const DBLArray array(y);
        Numbers r;
        const auto function = isIDP_ ? PulseMeasEx_IDP : PulseMeasEx;
        const ErrorCode status =
            function(array.handle(), t0, dt, polarity, partial, number, &ref, &hist, &word, r(0),
                     r(1), r(2), r(3), r(4), r(5), r(6), limit);
        EXPECT_TRUE(status >= 0 || r.areZero(7));
        const double *const v = r.values;
        return {status, v[0], v[1], v[2], v[3], v[4], v[5], v[6]};
    }

    struct Transition {
        ErrorCode status;
        double slewRate, duration, start, end, lowRef, midRef, highRef;
        double preUnder, preOver, postUnder, postOver;
    };
    Transition transition(const Samples &y, uint16_t polarity, int32_t number, int32_t limit = 0) {
        const DBLArray array(y);
        Numbers r;
        const auto function = isIDP_ ? TransMeas_IDP : TransMeas;
        latest = ref;
        const ErrorCode status =
            function(array.handle(), t0, dt, polarity, number, &latest, &hist, &word, r(0), r(1),
                     r(2), r(3), r(4), r(5), r(6), r(7), r(8), r(9), r(10), limit);
        EXPECT_TRUE(status >= 0 || (r.areZero(11) && latest.low == ref.low));
        const double *const v = r.values;
        return {status, v[0], v[1], v[2], v[3], v[4], v[5], v[6], v[7], v[8], v[9], v[10]};
    }

    struct Cycle {
        ErrorCode status;
        double mean, rms, start, end, lowRef, midRef, highRef;
    };
    Cycle cycle(const Samples &y, int32_t number, int32_t limit = 0) {
        const DBLArray array(y);
        Numbers r;
        const auto function = isIDP_ ? CycleRMSAverage_IDP : CycleRMSAverage;
        latest = ref;
        const ErrorCode status = function(array.handle(), t0, dt, number, &latest, &hist, &word,
                                          r(0), r(1), r(2), r(3), r(4), r(5), r(6), limit);
        EXPECT_TRUE(status >= 0 || (r.areZero(7) && latest.low == ref.low));
        const double *const v = r.values;
        return {status, v[0], v[1], v[2], v[3], v[4], v[5], v[6]};
    }

    void *word = nullptr;
    double t0 = 0, dt = 1;
    ReferenceLevels ref = {90, 50, 10, 1};
    ReferenceLevels latest = {};
    HistogramOptions hist = {QXLevelsByHistogram, 100};

private:
    bool isIDP_;
};

// Two states at -1 and 3 with the given numbers of samples, and the rest spread between them.
Samples TwoStates(int32_t low, int32_t high, int32_t between) {
    Samples y(static_cast<std::size_t>(low), -1.0);
    y.insert(y.end(), static_cast<std::size_t>(high), 3.0);
    for (int32_t i = 0; i < between; ++i)
        y.push_back(-1 + 4 * (i + 0.5) / between);
    return y;
}

TEST(StateLevels, AreThoseOfTheFullestBinsOrTheExtremes) {
    for (const bool isIDP : {false, true}) {
        Node node(isIDP);
        const Samples y = TwoStates(30, 20, 50);
        // The states are the outer bins, whose centres are half a bin inside.
        for (const int32_t bins : {10, 64, 400}) {
            const MeasuredLevels levels = node.levels(y, QXLevelsByHistogram, bins);
            EXPECT_EQ(levels.status, 0);
            EXPECT_NEAR(levels.low, -1 + 2.0 / bins, 1e-12);
            EXPECT_NEAR(levels.high, 3 - 2.0 / bins, 1e-12);
            EXPECT_NEAR(levels.amplitude, 4 - 4.0 / bins, 1e-12);
        }
        const MeasuredLevels peaks = node.levels(y, QXLevelsByPeaks, 10);
        EXPECT_EQ(peaks.low, -1);
        EXPECT_EQ(peaks.high, 3);
        EXPECT_EQ(peaks.amplitude, 4);
    }
    // An overshoot does not shift a state, and one sample in the wrong half does not create one.
    Samples ringing = TwoStates(50, 50, 0);
    ringing[50] = 4;
    ringing[51] = 2;
    const MeasuredLevels levels = Node().levels(ringing, QXLevelsByHistogram, 100);
    EXPECT_NEAR(levels.low, -1, 0.03);
    EXPECT_NEAR(levels.high, 3, 0.03);
    // Among equally full bins, the outermost one is the state.
    const MeasuredLevels even =
        Node().levels(Sampled(100, [](double i) { return i; }), QXLevelsByHistogram, 10);
    EXPECT_NEAR(even.low, 4.95, 1e-12);
    EXPECT_NEAR(even.high, 94.05, 1e-12);
}

TEST(StateLevels, TheAutomaticMethodDependsOnTheShareOfAState) {
    Node node;
    const Samples thin = TwoStates(2, 3, 95); // the outer bins hold 4% and 5%
    EXPECT_EQ(node.levels(thin, QXLevelsByHistogram, 50).status, WarnMeasurePartial);
    EXPECT_EQ(node.levels(thin, QXLevelsAutomatic, 50).status, 0);
    EXPECT_EQ(node.levels(thin, QXLevelsAutomatic, 50).low, -1);
    const Samples high = TwoStates(2, 40, 95);
    for (const int32_t limit : {0, 1}) {
        const MeasuredLevels levels = node.levels(high, QXLevelsAutomatic, 50, limit);
        EXPECT_EQ(levels.low, -1) << "no low state, so the minimum";
        EXPECT_NEAR(levels.high, limit == 0 ? 3 - 0.04 : 3, 1e-12) << "one state is not enough";
    }
    const Samples both = TwoStates(30, 40, 95);
    for (const int32_t limit : {0, 1}) {
        EXPECT_NEAR(node.levels(both, QXLevelsAutomatic, 50, limit).low, -1 + 0.04, 1e-12);
        EXPECT_NEAR(node.levels(both, QXLevelsAutomatic, 50, limit).high, 3 - 0.04, 1e-12);
    }
}

TEST(StateLevels, RefuseWaveformsWithoutStates) {
    Node node;
    const Samples flat(20, 2.5);
    EXPECT_EQ(node.levels(flat, QXLevelsByHistogram, 10).status, ErrMeasureNotPositive);
    EXPECT_EQ(node.levels(flat, QXLevelsAutomatic, 10).status, ErrMeasureNotPositive);
    const MeasuredLevels peaks = node.levels(flat, QXLevelsByPeaks, 10);
    EXPECT_EQ(peaks.status, 0);
    EXPECT_EQ(peaks.high, 2.5);
    EXPECT_EQ(peaks.amplitude, 0);
    for (const int32_t method : {0, 1, 2})
        for (const Samples &y : {Samples(5, nan), Samples{-1e308, 1e308}, Samples{0, inf}})
            EXPECT_EQ(node.levels(y, method, 10).status, ErrMeasureNotPositive);
    const MeasuredLevels some =
        node.levels({nan, 0, 0, 1, nan, 1, nan, nan}, QXLevelsByHistogram, 10);
    EXPECT_EQ(some.status, 0);
    EXPECT_NEAR(some.low, 0.05, 1e-15);
    // In the order of the checks.
    EXPECT_EQ(node.levels({}, 7, 0, 5, 0).status, ErrMeasureEmptyChannel);
    EXPECT_EQ(node.levels({}, 3, 1, 5, 0).status, ErrMeasureTooManyChannels);
    EXPECT_EQ(node.levels({}, -1, 1, 5, 0).status, ErrMeasureTooManyChannels);
    EXPECT_EQ(node.levels({}, 2, std::numeric_limits<int32_t>::max(), 5, 0).status, ErrOutOfMemory);
    EXPECT_EQ(node.levels({}, 2, 1, 5, 0).status, ErrMeasureEmpty);
    EXPECT_EQ(node.levels({1}, 2, 1, 5, 0).status, ErrMeasureLevelsReversed);
    EXPECT_EQ(node.levels({1}, 2, 1, 5, nan).status, ErrMeasureLevelsReversed);
    EXPECT_EQ(node.levels({1}, 2, 1, 5).status, ErrInvalidSelector);
    Numbers r;
    const DBLArray y({0, 1});
    EXPECT_EQ(StateLevels(y.handle(), 0, 1, 0, 5, nullptr, r(0), r(1), r(2), 0),
              ErrMeasureNullState);
    EXPECT_EQ(StateLevels(y.handle(), 0, 1, 0, 5, &node.word, r(0), nullptr, r(2), 0),
              ErrMeasureNullState);
    EXPECT_EQ(r.values[2], 0);
}

TEST(Slots, BelongToTheHostOrToTheNode) {
    qx::test::ResetHost();
    const int before = qx::test::RegisteredSweeps();
    const Samples y = TwoStates(5, 5, 5);
    {
        Node node;
        EXPECT_EQ(node.levels(y, 0, 10).status, 0);
        void *const first = node.word;
        EXPECT_NE(first, nullptr);
        EXPECT_EQ(qx::test::RegisteredSweeps(), before + 1);
        int32_t allocations;
        {
            const HeapProbe probe;
            Node same; // takes over the word for one call
            same.word = node.word;
            const DBLArray array(y);
            Numbers r;
            EXPECT_EQ(StateLevels(array.handle(), 0, 1, 0, 10, &same.word, r(0), r(1), r(2), 0), 0);
            EXPECT_EQ(same.word, first);
            same.word = nullptr;
            allocations = probe.allocations();
        }
        if (HeapProbe::works()) {
            EXPECT_LE(allocations, 4) << "for the array alone";
        }
        EXPECT_EQ(node.levels(y, 0, 20).status, 0);
        EXPECT_EQ(qx::test::RegisteredSweeps(), before + 1)
            << "the sweep of the old block is unregistered";
        qx::test::Host().sweepStatus = 5;
        EXPECT_EQ(node.levels(y, 0, 30).status, ErrOutOfMemory);
        EXPECT_EQ(node.word, nullptr);
        qx::test::ResetHost();
        EXPECT_EQ(node.levels(y, 0, 30).status, 0);
        qx::test::RunSweeps(); // the host discards the node and its word
        node.word = nullptr;
    }
    {
        Node node(true);
        EXPECT_EQ(node.levels(y, 0, 10).status, 0);
        void *const first = node.word;
        EXPECT_EQ(node.levels(y, 0, 5000).status, 0);
        EXPECT_EQ(node.word, first) << "resized in place";
        Node slot;
        EXPECT_EQ(slot.levels(y, 0, 10).status, 0);
        void *wrong = slot.word;
        EXPECT_EQ(MeasurementUnreserveProc(&wrong), ErrInternal) << "a word that the host sweeps";
        EXPECT_EQ(wrong, slot.word);
        qx::test::RunSweepOf(std::exchange(slot.word, nullptr));
        EXPECT_EQ(qx::test::RegisteredSweeps(), 0);
        EXPECT_EQ(MeasurementUnreserveProc(&node.word), 0);
        EXPECT_EQ(node.word, nullptr);
        EXPECT_EQ(MeasurementUnreserveProc(&node.word), 0);
        EXPECT_EQ(MeasurementUnreserveProc(nullptr), 0);
    }
    measurements_create();
    measurements_clear();
    measurements_destroy();
}

// The first events, found by checking each sample.
TEST(Search, FindsTheFirstOfEveryKind) {
    Noise noise(5);
    for (int round = 0; round < 400; ++round) {
        const auto n = static_cast<int32_t>(2 + noise.bits() % 120);
        Samples y;
        for (int32_t i = 0; i < n; ++i)
            y.push_back(noise.bits() % 40 == 0 ? nan : noise.symmetric());
        const double scale = std::pow(2.0, -static_cast<int>(noise.bits() % 6));
        for (double &value : y)
            value = value * scale + 0.25;
        const double lower = noise.bits() % 3 == 0 ? nan : -0.5;
        const double upper = noise.bits() % 3 == 0 ? nan : 0.9;
        const double a = noise.bits() % 2 == 0 ? nan : 0.0;
        const double b = noise.bits() % 2 == 0 ? nan : 0.5;
        const auto crosses = [](double u, double v, double level) {
            return (u - level) * (v - level) <= 0;
        };
        for (int32_t from = 0; from < n; from += 7) {
            int32_t beyond = from, event = from;
            while (beyond < n - 1 && !(y[static_cast<std::size_t>(beyond)] <= lower) &&
                   !(y[static_cast<std::size_t>(beyond)] >= upper))
                ++beyond;
            while (event < n - 1) {
                const double u = y[static_cast<std::size_t>(event)];
                const double v = y[static_cast<std::size_t>(event) + 1];
                if (u <= lower || u >= upper || crosses(u, v, a) || crosses(u, v, b))
                    break;
                ++event;
            }
            EXPECT_EQ(qx::FirstBeyond(y.data(), from, n - 1, lower, upper), beyond);
            EXPECT_EQ(qx::FirstBeyondOrCrossing(y.data(), from, n - 1, lower, upper, a, b), event);
        }
    }
}

TEST(Crossings, CountOncePerExcursion) {
    qx::Crossing list[20];
    const auto crossings = [&](const Samples &y, double mid, double h, int32_t limit = 20) {
        const int32_t count =
            qx::FindMidCrossings(0, y.data(), static_cast<int32_t>(y.size()), mid, h, list, limit);
        Samples found; // positions, negative where the waveform falls
        for (int32_t i = 0; i < count; ++i)
            found.push_back(list[i].direction == qx::rising ? list[i].position : -list[i].position);
        return found;
    };
    EXPECT_EQ(crossings({-2, 2, -2, 2}, 0, 1), (Samples{0.5, -1.5, 2.5}));
    EXPECT_EQ(crossings({-2, 2, -2, 2}, 0, 1, 2), (Samples{0.5, -1.5}));
    // Values that stay within the band do not arm.
    EXPECT_EQ(crossings({-2, 0.5, -0.5, 0.5, 2, -0.5, 3}, 0, 1), (Samples{0.8, -4.8}));
    EXPECT_EQ(crossings({0.5, -0.5, 0.5}, 0, 1), Samples());
    EXPECT_EQ(crossings({-2, 0, 0, 0, 2, -2}, 0, 1), (Samples{1, -4.5}));
    EXPECT_EQ(crossings({}, 0, 1), Samples());
    EXPECT_EQ(crossings({3}, 0, 1), Samples());
    // Distances so small that their product underflows.
    EXPECT_EQ(crossings({1e-200, 2e-200, 1e-200, -1e-200}, 0, 0), (Samples{-2.5}));
    // A gap hides a crossing, so the next crossing has the same direction.
    EXPECT_EQ(crossings({2, -2, nan, 2, -2}, 0, 1), (Samples{-0.5, -3.5}));
    // Long constant stretches.
    Samples y(1000, -3);
    y[500] = 5;
    EXPECT_EQ(crossings(y, 0, 1), (Samples{499.375, -500.625}));
}

TEST(Pulses, OfTrapezoidsAreKnown) {
    const Trapezoids f = {10.25, 4, 21, 10, 60};
    const Samples y = Sampled(400, f);
    for (const bool isIDP : {false, true})
        for (const double dt : {1.0, 0.02})
            for (const double t0 : {0.0, -3.5, 1000.0}) {
                Node node(isIDP);
                node.dt = dt;
                node.t0 = t0;
                node.hist = {QXLevelsByPeaks, 100};
                for (int32_t k = 1; k <= 5; ++k) {
                    const auto up = node.pulse(y, 1, k);
                    EXPECT_EQ(up.status, 0);
                    EXPECT_NEAR(up.duration, 28 * dt, 1e-9 * dt);
                    EXPECT_NEAR(up.period, 60 * dt, 1e-9 * dt);
                    EXPECT_NEAR(up.dutyCycle, 28 / 60.0, 1e-10);
                    EXPECT_NEAR(up.center, t0 + (26.25 + 60 * (k - 1)) * dt, 1e-9);
                    const auto down = node.pulse(y, 0, k);
                    EXPECT_NEAR(down.duration, 32 * dt, 1e-9 * dt);
                    EXPECT_NEAR(down.center, t0 + (56.25 + 60 * (k - 1)) * dt, 1e-9);
                }
                const auto last = node.pulse(y, 1, 6);
                EXPECT_EQ(last.status, 0) << "13 crossings";
                EXPECT_EQ(last.lowRef, 0.1);
                EXPECT_EQ(last.midRef, 0.5);
                EXPECT_EQ(last.highRef, 0.9);
                EXPECT_EQ(node.pulse(y, 1, 7).status, ErrMeasureSearchShort);
            }
}

TEST(Pulses, AtTheEndOfTheRecordMayBePartial) {
    const Samples y = Sampled(60, Trapezoids{10, 4, 21, 10, 100});
    Node node;
    EXPECT_EQ(node.pulse(y, 1, 1).status, ErrMeasureSearchShort);
    const auto pulse = node.pulse(y, 1, 1, 1);
    EXPECT_EQ(pulse.status, 0);
    EXPECT_NEAR(pulse.duration, 28, 0.2);
    EXPECT_EQ(pulse.period, 0);
    EXPECT_EQ(pulse.dutyCycle, 0);
    EXPECT_EQ(node.pulse(y, 0, 1, 1).status, ErrMeasureSearchShort) << "its end is missing";
    // Two edges of the same direction, with a gap between them, are not a pulse.
    node.ref = {1, 0, -1, 0};
    EXPECT_EQ(node.pulse({-2, 2, nan, -2, 2}, 1, 1, 1).status, ErrMeasureSearchShort);
    node.ref = {90, 50, 10, 1};
    // A whole period with the gap does not count either.
    const Samples more = Sampled(150, Trapezoids{10, 4, 21, 10, 50});
    EXPECT_NEAR(node.pulse(more, 1, 1, 0).period, 50, 1e-9);
    EXPECT_EQ(node.pulse(more, 1, 1, 1).period, 0);

    // PulseMeas measures whole periods only.
    const DBLArray array(more);
    Numbers r;
    EXPECT_EQ(PulseMeas(array.handle(), 0, 1, 1, 1, &node.ref, &node.hist, &node.word, r(0), r(1),
                        r(2), r(3), r(4), r(5), r(6), 0),
              0);
    EXPECT_NEAR(r.values[0], 50, 1e-9);
}

TEST(Pulses, ReferencesMayBeAbsolute) {
    const Samples y = Sampled(150, Trapezoids{10, 4, 21, 10, 50});
    Node node;
    node.ref = {0.8, 0.25, 0.2, 0};
    const auto pulse = node.pulse(y, 1, 1);
    EXPECT_EQ(pulse.status, 0);
    EXPECT_NEAR(pulse.duration, 3 + 21 + 7.5, 1e-12);
    EXPECT_EQ(pulse.midRef, 0.25);
    // Absolute references need no histogram, so a flat waveform is not refused for its levels.
    EXPECT_EQ(node.pulse(Samples(50, 1.0), 1, 1).status, ErrMeasureSearchShort);
    node.ref.low = 0.3;
    EXPECT_EQ(node.pulse(y, 1, 1).status, ErrMeasureRangeReversed);
    node.ref.low = nan;
    EXPECT_EQ(node.pulse(y, 1, 1).status, ErrMeasureRangeReversed);
    node.ref = {0.8, 0.25, 0.2, 0};
    EXPECT_EQ(node.pulse({}, 1, 0).status, ErrMeasureBadCount);
    EXPECT_EQ(node.pulse({}, 1, 1).status, ErrMeasureEmpty);
    EXPECT_EQ(node.pulse(y, 2, 1).status, ErrInvalidSelector);
    EXPECT_EQ(node.pulse(y, 1, 1, 0, 2).status, ErrInvalidSelector);
    EXPECT_EQ(node.pulse(y, 1, std::numeric_limits<int32_t>::max()).status, ErrMeasureOutOfMemory);
    { // no memory is allocated for crossings that cannot exist
        const HeapProbe probe(0, 1 << 16);
        EXPECT_EQ(node.pulse(y, 1, 1000000).status, ErrMeasureSearchShort);
    }
    node.dt = -1;
    EXPECT_EQ(node.pulse(y, 1, 1).status, ErrMeasureLevelsReversed);
    Numbers r;
    const DBLArray array(y);
    EXPECT_EQ(PulseMeasEx(array.handle(), 0, 1, 1, 0, 1, nullptr, &node.hist, &node.word, r(0),
                          r(1), r(2), r(3), r(4), r(5), r(6), 0),
              ErrMeasureNullState);
    EXPECT_TRUE(r.areZero(7));
}

// Memory is proportional to the number of samples, not to the requested pulse.
TEST(Pulses, AreSearchedInAListNoLongerThanTheWaveform) {
    if (!HeapProbe::works())
        GTEST_SKIP();
    const Samples y = Sampled(60, Trapezoids{10, 4, 21, 10, 50});
    Node node;
    node.ref = {0.8, 0.25, 0.2, 0};
    node.hist = {QXLevelsByPeaks, 10};
    const HeapProbe probe(0, 100000);
    EXPECT_EQ(node.pulse(y, 1, 1 << 24).status, ErrMeasureSearchShort);
    EXPECT_EQ(node.cycle(y, 1 << 24).status, ErrMeasureSearchShort);
    EXPECT_EQ(node.transition(y, 1, 1 << 24).status, ErrMeasureTooFewPoints);
    EXPECT_EQ(node.pulse(y, 1, 1, 1).status, 0);
}

// The bounds follow the measured errors, which depend on the noise.
TEST(Pulses, TolerateNoise) {
    Noise noise(11);
    Samples y = Sampled(3000, Trapezoids{40, 20, 80, 20, 200});
    for (double &value : y)
        value += 0.02 * (noise.symmetric() + noise.symmetric());
    Node node;
    node.hist.bins = 50;
    for (int32_t k = 1; k <= 14; ++k) {
        const auto pulse = node.pulse(y, 1, k);
        EXPECT_EQ(pulse.status, 0);
        EXPECT_NEAR(pulse.duration, 100, 2);
        EXPECT_NEAR(pulse.period, 200, 2);
        for (const uint16_t polarity : {0, 1}) {
            const auto edge = node.transition(y, polarity, k);
            EXPECT_EQ(edge.status, 0);
            EXPECT_NEAR(edge.duration, 16, 3);
            EXPECT_NEAR(edge.start, 200 * (k - 1) + (polarity == 1 ? 42 : 142), 2);
        }
    }
}

// A step through a resonance: y = 1 - exp(-a t) (cos(b t) + a / b sin(b t)).
Samples RingingStep(double damping, double frequency, int32_t begin, int32_t n) {
    const double b = 2 * std::numbers::pi * frequency;
    const double a = b * damping / std::sqrt(1 - damping * damping);
    return Sampled(n, [=](double i) {
        const double t = i - begin;
        return t < 0 ? 0 : 1 - std::exp(-a * t) * (std::cos(b * t) + a / b * std::sin(b * t));
    });
}

TEST(Transitions, OfRingingStepsHaveKnownOvershoots) {
    for (const double damping : {0.2, 0.4, 0.6})
        for (const bool isTurned : {false, true})
            for (const int32_t limit : {0, 1}) {
                SCOPED_TRACE(testing::Message() << damping << isTurned << limit);
                Samples y = RingingStep(damping, 0.004, 1000, 5000);
                for (double &value : y)
                    value = isTurned ? 3 - 2 * value : 3 + 2 * value;
                Node node;
                node.hist.bins = 1000;
                const auto edge = node.transition(y, isTurned ? 0 : 1, 1, limit);
                EXPECT_EQ(edge.status, 0);
                const double over =
                    100 * std::exp(-std::numbers::pi * damping / std::sqrt(1 - damping * damping));
                EXPECT_NEAR(isTurned ? edge.postUnder : edge.postOver, over, 0.4);
                // The opposite excursion is the first trough, unless the region ends before it.
                if (limit == 0) {
                    EXPECT_NEAR(isTurned ? edge.postOver : edge.postUnder, over * over / 100, 0.4);
                }
                EXPECT_EQ(edge.preOver, 0);
                EXPECT_EQ(edge.preUnder, 0);
                EXPECT_NEAR(edge.slewRate * edge.duration, 0.8 * 2, 0.01);
                EXPECT_NEAR(edge.lowRef, isTurned ? 1.2 : 3.2, 0.005);
                EXPECT_EQ(node.latest.low, edge.lowRef);
                EXPECT_EQ(node.latest.percent, 1);
            }
}

TEST(Transitions, OfTrapezoidsAreKnown) {
    const Samples y = Sampled(400, Trapezoids{10, 4, 21, 10, 60});
    for (const bool isIDP : {false, true}) {
        Node node(isIDP);
        node.dt = 0.5;
        node.t0 = 7;
        node.ref = {0.9, 0.5, 0.1, 0};
        for (int32_t k = 1; k <= 6; ++k)
            for (const uint16_t polarity : {0, 1})
                for (const uint32_t method : {0U, 1U, 2U})
                    for (const int32_t limit : {0, 1}) {
                        node.hist.method = method;
                        const auto edge = node.transition(y, polarity, k, limit);
                        const double length = polarity == 1 ? 4 : 10;
                        const double begin = 10 + 60 * (k - 1) + (polarity == 1 ? 0 : 25);
                        EXPECT_EQ(edge.status, 0);
                        EXPECT_NEAR(edge.duration, 0.8 * length * 0.5, 1e-10);
                        EXPECT_NEAR(edge.slewRate, 2 / length, 1e-10);
                        EXPECT_NEAR(edge.start, 7 + 0.5 * (begin + 0.1 * length), 1e-9);
                        EXPECT_NEAR(edge.end, 7 + 0.5 * (begin + 0.9 * length), 1e-9);
                    }
        EXPECT_EQ(node.transition(y, 1, 8).status, ErrMeasureTooFewPoints);
    }
}

TEST(Transitions, MayBeAlone) {
    Samples up = Sampled(100, [](double i) { return i < 40 ? 0.0 : 1.0; });
    up[10] = -0.25;
    up[20] = 0.5; // below the high reference
    up[60] = 1.5;
    up[80] = 0.75;
    Node node;
    node.hist.bins = 351;
    const auto rise = node.transition(up, 1, 1);
    EXPECT_EQ(rise.status, 0);
    EXPECT_NEAR(rise.preUnder, 25, 0.3);
    EXPECT_NEAR(rise.preOver, 50, 0.3);
    EXPECT_NEAR(rise.postOver, 50, 0.3);
    EXPECT_NEAR(rise.postUnder, 25, 0.3);
    // With the limit the regions are three samples long.
    const auto near = node.transition(up, 1, 1, 1);
    EXPECT_EQ(near.preUnder + near.preOver + near.postOver + near.postUnder, 0);
    EXPECT_EQ(node.transition(up, 1, 2).status, ErrMeasureTooFewPoints);
    EXPECT_EQ(node.transition(up, 0, 1).status, ErrMeasureTooFewPoints);

    // The first transition has the other direction, and none follows the second.
    Samples dip = up;
    for (int i = 0; i < 8; ++i)
        dip[static_cast<std::size_t>(i)] = 1.0;
    const auto second = node.transition(dip, 1, 1);
    EXPECT_EQ(second.status, 0);
    EXPECT_NEAR(second.start, 39.1, 0.01);
    EXPECT_EQ(second.preUnder, 0) << "the region ends halfway back to the first transition";
    EXPECT_NEAR(second.postOver, 50, 0.3);
    const auto first = node.transition(dip, 0, 1);
    EXPECT_EQ(first.status, 0);
    EXPECT_NEAR(first.postUnder, 25, 0.3);
    EXPECT_NEAR(first.postOver, 50, 0.3);
}

TEST(Transitions, RefuseWaveformsWithoutTransitions) {
    Node node;
    const Samples y = Sampled(100, Trapezoids{10, 4, 21, 10, 60});
    EXPECT_EQ(node.transition({}, 5, 0).status, ErrMeasureBadCount);
    EXPECT_EQ(node.transition({}, 5, 1).status, ErrMeasureEmpty);
    EXPECT_EQ(node.transition(y, 5, 1, 3).status, ErrInvalidSelector);
    EXPECT_EQ(node.transition(y, 5, 1).status, ErrInvalidSelector);
    EXPECT_EQ(node.transition(Samples(9, 1.0), 1, 1).status, ErrMeasureNotPositive);
    node.hist = {QXLevelsByPeaks, 10};
    EXPECT_EQ(node.transition(Samples(9, 1.0), 1, 1).status, ErrMeasureNotPositive);
    node.ref = {0.9, 0.95, 0.1, 0};
    EXPECT_EQ(node.transition(y, 1, 1).status, ErrMeasureRangeReversed);
    node.ref = {0.5, 0.5, 0.5, 0};
    EXPECT_EQ(node.transition(y, 1, 1).status, ErrMeasureRangeReversed);
    node.ref = {0.9, 0.5, 0.1, 0};
    EXPECT_EQ(node.transition(y, 1, std::numeric_limits<int32_t>::max()).status,
              ErrMeasureOutOfMemory);
    {
        const HeapProbe probe(0, 1 << 16);
        EXPECT_EQ(node.transition(y, 1, 1000000).status, ErrMeasureTooFewPoints);
    }
    node.hist = {QXLevelsByHistogram, 1};
    EXPECT_EQ(node.transition(y, 1, 1).status, ErrMeasureNotPositive)
        << "one bin holds both states";
    // Extremes that hardly any samples reach.
    node.hist = {QXLevelsByPeaks, 40};
    Samples spikes = Sampled(400, [](double i) { return i < 200 ? 0.3 : 0.7; });
    spikes[3] = 0;
    spikes[390] = 1;
    node.ref = {0.65, 0.5, 0.35, 0};
    EXPECT_EQ(node.transition(spikes, 1, 1).status, 0);
    for (std::size_t i = 0; i < spikes.size(); i += 2)
        spikes[i] = static_cast<double>(i) / 400;
    for (std::size_t i = 1; i < spikes.size(); i += 2)
        spikes[i] = static_cast<double>(i) / 400;
    EXPECT_EQ(node.transition(spikes, 1, 1).status, WarnMeasurePartial);
    EXPECT_NEAR(node.transition(spikes, 1, 1).duration, 120, 1e-9);
}

TEST(Cycles, OfASineHaveItsMeanAndRMS) {
    for (const bool isIDP : {false, true}) {
        Node node(isIDP);
        node.dt = 0.001;
        node.t0 = 2;
        node.hist.method = QXLevelsByPeaks;
        const Samples y = Sampled(
            1000, [](double i) { return 3 + 2 * std::sin(2 * std::numbers::pi * (i + 0.5) / 80); });
        for (int32_t k = 1; k <= 11; ++k) {
            const auto cycle = node.cycle(y, k);
            EXPECT_EQ(cycle.status, 0);
            EXPECT_NEAR(cycle.mean, 3, 1e-12);
            EXPECT_NEAR(cycle.rms, std::sqrt(9 + 2), 1e-12);
            EXPECT_NEAR(cycle.start, 2 + 0.001 * (39.5 + 80 * (k - 1)), 2e-6);
            EXPECT_NEAR(cycle.end - cycle.start, 0.08, 1e-9);
            EXPECT_EQ(cycle.midRef, node.latest.mid);
            EXPECT_NEAR(node.latest.mid, 3, 1e-3);
        }
        EXPECT_EQ(node.cycle(y, 12).status, ErrMeasureSearchShort);
        EXPECT_EQ(node.cycle(y, 0).status, ErrMeasureBadCount);
        EXPECT_EQ(node.cycle(y, 1, 9).status, ErrInvalidSelector);
    }
    Node node;
    const Samples y = Sampled(100, [](double i) { return std::sin(i); });
    node.ref = {0.5, 0, -0.5, 0};
    node.t0 = 1e300;
    EXPECT_EQ(node.cycle(y, 1).status, ErrMeasureNotFound)
        << "a start time too large to distinguish the samples";
    node.t0 = 1e16;
    EXPECT_GE(node.cycle(y, 5).status, ErrMeasureNotFound)
        << "the search stays within the waveform";
}

struct FirstPulse {
    ErrorCode err;
    double top, base, amplitude, delay, width, slewRate, fallTime, riseTime, overshoot, undershoot;
};
FirstPulse FirstPulseOf(const Samples &samples) {
    const DBLArray y(samples);
    Numbers r;
    FirstPulse p{};
    EXPECT_EQ(PulseParameters(y.handle(), r(0), r(1), r(2), r(3), r(4), r(5), r(6), r(7), r(8),
                              r(9), &p.err),
              0);
    EXPECT_TRUE(p.err == 0 || r.areZero(10));
    const double *const v = r.values;
    return {p.err, v[0], v[1], v[2], v[3], v[4], v[5], v[6], v[7], v[8], v[9]};
}

TEST(PulseParameters, OfATrapezoidAreKnown) {
    Samples y = Sampled(200, Trapezoids{20.25, 10, 60, 20, 200});
    y[15] = -0.1;
    y[40] = 1.15;
    // Each state is in one of 101 bins over 1.25.
    const double bin = 1.25 / 101;
    const FirstPulse up = FirstPulseOf(y);
    EXPECT_EQ(up.err, 0);
    EXPECT_NEAR(up.base, 0, bin / 2);
    EXPECT_NEAR(up.top, 1, bin / 2);
    EXPECT_NEAR(up.amplitude, 1, bin);
    EXPECT_NEAR(up.overshoot, 0.15, bin / 2);
    EXPECT_NEAR(up.undershoot, 0.1, bin / 2);
    EXPECT_NEAR(up.delay, 25.25, 10 * bin);
    EXPECT_NEAR(up.width, 75, 30 * bin);
    EXPECT_NEAR(up.riseTime, 8, 10 * bin);
    EXPECT_NEAR(up.fallTime, 16, 20 * bin);
    EXPECT_NEAR(up.slewRate, 0.1, 0.1 * bin);
    // The crossings are those of the straight edges with the measured levels.
    EXPECT_NEAR(up.delay, 20.25 + 10 * (up.base + 0.5 * up.amplitude), 1e-9);
    EXPECT_NEAR(up.riseTime, 8 * up.amplitude, 1e-9);
    EXPECT_NEAR(up.fallTime, 16 * up.amplitude, 1e-9);

    for (double &value : y)
        value = -value;
    const FirstPulse down = FirstPulseOf(y);
    EXPECT_NEAR(down.top, -1, bin / 2);
    EXPECT_NEAR(down.base, 0, bin / 2);
    EXPECT_NEAR(down.amplitude, -1, bin);
    EXPECT_NEAR(down.delay, 25.25, 10 * bin);
    EXPECT_NEAR(down.width, 75, 30 * bin);
    EXPECT_NEAR(down.riseTime, 8, 10 * bin);
    EXPECT_NEAR(down.fallTime, 16, 20 * bin);
    EXPECT_NEAR(down.slewRate, -0.1, 0.1 * bin);
    EXPECT_NEAR(down.overshoot, 0.1, bin / 2);
}

TEST(PulseParameters, AcceptsWaveformsWithoutAPulse) {
    const FirstPulse flat = FirstPulseOf(Samples(30, 4.5));
    EXPECT_EQ(flat.err, 0);
    EXPECT_EQ(flat.top, 4.5);
    EXPECT_EQ(flat.base, 4.5);
    for (const double value : {flat.amplitude, flat.overshoot, flat.undershoot, flat.delay,
                               flat.width, flat.riseTime, flat.fallTime})
        EXPECT_EQ(value, 0);
    EXPECT_EQ(flat.slewRate, 1e30);
    // A step that does not fall again.
    const FirstPulse step = FirstPulseOf(Sampled(100, [](double i) { return i < 40 ? 0. : 1.; }));
    EXPECT_NEAR(step.delay, 39.5, 0.01);
    EXPECT_NEAR(step.width, 99 - 39.5, 0.01);
    EXPECT_NEAR(step.riseTime, 0.8, 0.01);
    EXPECT_EQ(step.fallTime, 1) << "counted from the last sample on";
    EXPECT_EQ(FirstPulseOf({}).err, ErrEmptyInput);
    EXPECT_EQ(FirstPulseOf({2}).amplitude, 0);
    EXPECT_EQ(FirstPulseOf(Samples(5, nan)).err, 0);
    EXPECT_EQ(FirstPulseOf({nan, 0, 1, nan, 1, 0, nan}).err, 0);
    // Begins at half its height, with no sample below.
    EXPECT_EQ(FirstPulseOf({1, 2, 2, 0, 0}).err, 0);
}

} // namespace
} // namespace qx::test
