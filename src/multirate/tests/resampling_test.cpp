#include "qx/resampling.h"

#include "multirate/tests/streams.h"

#include <gtest/gtest.h>

#include <cmath>

namespace qx::test {

namespace {

constexpr auto DBL = ElementType::DBL;
constexpr auto CDB = ElementType::CDB;

// A windowed sinc of `side` samples to each side.
struct Kernel {
    Kernel(int32_t oversampling, int32_t side)
        : oversample(oversampling), proto(2 * oversampling * side + 1) {
        constexpr double pi = 3.141592653589793;
        for (int32_t i = 0; i < proto.size(); ++i) {
            const double t = static_cast<double>(i) / oversample - side;
            const double sinc = t == 0 ? 1 : std::sin(pi * t) / (pi * t);
            proto.data()[i] = sinc * (0.5 + 0.5 * std::cos(pi * t / side)) / oversample;
        }
    }
    long double centre() const { return (proto.size() - 1) * 0.5L; }
    long double step(long double ratio) const {
        return oversample / std::min<long double>(std::max(ratio, 1.0L), oversample);
    }
    // The table at q, by the nearest entry or interpolated; 0 outside.
    long double at(long double q, bool nearest) const {
        if (q < 0 || q > proto.size() - 1)
            return 0;
        if (nearest)
            return proto[static_cast<int32_t>(q + 0.5L)];
        const auto i = static_cast<int32_t>(q);
        return i + 1 < proto.size() ? proto[i] + (q - i) * (0.0L + proto[i + 1] - proto[i])
                                    : proto[i];
    }
    std::complex<long double> output(const Signal &x, long double time, long double ratio,
                                     bool nearest = false) const {
        const long double s = step(ratio);
        std::complex<long double> sum = 0;
        for (std::size_t k = 0; k < x.size(); ++k)
            sum += x[k] * at(centre() + s * (static_cast<long double>(k) - time), nearest);
        return sum * s;
    }
    // Whether n samples cover the window of an output.
    bool isServed(long double time, long double ratio, std::size_t n) const {
        const long double s = step(ratio), whole = std::floor(time);
        return std::floor((centre() + s * (time - whole)) / s) + whole <=
               static_cast<long double>(n) - 1;
    }

    int32_t oversample;
    Array1D<DBL> proto;
};

template <ElementType Code>
class ConstantStream {
public:
    typedef std::conditional_t<Code == DBL, ResampleState, CxResampleState> State;

    ConstantStream(const Kernel &kernel, double ratio, double start, int32_t mode, bool antiAlias)
        : design{ratio, mode, start, kernel.proto.handle(), kernel.oversample},
          antiAlias_(antiAlias) {}

    Signal resample(const Signal &block) {
        Array1D<Code> x(static_cast<int32_t>(block.size())), y(3);
        Set(x, block);
        int32_t outCount = -1;
        if constexpr (Code == DBL)
            status = Resample_Const(x.handle(), &state, &design, reset, y.handle(), &outCount,
                                    antiAlias_);
        else
            status = CxResample_Const(x.handle(), &state, &design, reset, y.handle(), &outCount,
                                      antiAlias_);
        reset = 0;
        size = y.size();
        for (const auto &behind : Part(Get(y), static_cast<std::size_t>(outCount), size - outCount))
            EXPECT_EQ(behind, 0.0L);
        return Part(Get(y), 0, outCount);
    }

    Array1D<Code> history;
    Array1D<DBL> taps;
    ResampleDesign design;
    State state{history.handle(), 7, taps.handle(), 7, 7, 7, 7, 7, 7, 7};
    int32_t reset = 1, size = 0;
    ErrorCode status = 0;

private:
    const bool antiAlias_;
};

struct Setting {
    double ratio, start;
    int32_t mode;
    bool antiAlias;
};
std::ostream &operator<<(std::ostream &stream, const Setting &s) {
    return stream << s.ratio << " from " << s.start << ", mode " << s.mode << ", "
                  << (s.antiAlias ? "stretched" : "natural");
}
const Setting settings[] = {
    {1, 0, 0, false},        {0.75, 2.25, 0, true},    {0.3, 0, 2, false},
    {1.71875, 0.5, 1, true}, {1.71875, 0.5, 1, false}, {0.71875, 0, 1, true},
    {2.6, 9.1, 0, true},     {2.6, 100.4, 0, false},   {40.5, 0, 0, true},
};
bool isDyadic(double number) { return number * 32 == std::floor(number * 32); }

template <ElementType Code>
void ConstantIsTheDefinitionInBlocksOfAnySize() {
    const Kernel kernel(20, 6);
    uint64_t seed = 30;
    for (const Setting &s : settings) {
        SCOPED_TRACE(s);
        const Signal x = NoiseSignal(700, 1, Code == CDB);
        ConstantStream<Code> whole(kernel, s.ratio, s.start, s.mode, s.antiAlias);
        const Signal y = whole.resample(x);
        ASSERT_EQ(whole.status, 0);
        const long double stretch = s.antiAlias ? s.ratio : std::min(s.ratio, 1.0);
        for (std::size_t m = 0; m < y.size(); ++m) {
            const long double time = s.start + static_cast<long double>(m) * s.ratio;
            ASSERT_LE(std::abs(y[m] - kernel.output(x, time, stretch, s.mode == 1)), 5.8e-13L) << m;
        }
        const auto timeOf = [&](std::size_t m) {
            return s.start + static_cast<long double>(m) * s.ratio;
        };
        EXPECT_TRUE(kernel.isServed(timeOf(y.size() - 1) - 1e-9L, stretch, x.size()));
        EXPECT_FALSE(kernel.isServed(timeOf(y.size()) + 1e-9L, stretch, x.size()));

        ConstantStream<Code> stream(kernel, s.ratio, s.start, s.mode, s.antiAlias);
        Signal joined;
        std::size_t at = 0;
        for (const int32_t n : RandomBlocks(700, ++seed)) {
            Append(joined, stream.resample(Part(x, at, n)));
            ASSERT_EQ(stream.status, 0);
            at += static_cast<std::size_t>(n);
        }
        ASSERT_EQ(joined.size(), y.size());
        for (std::size_t m = 0; m < y.size(); ++m)
            ASSERT_LE(std::abs(joined[m] - y[m]),
                      isDyadic(s.ratio) && isDyadic(s.start) ? 0 : 6.4e-13L)
                << m;
    }
}

TEST(Resampling, ConstantIsTheDefinitionInBlocksOfAnySize) {
    ConstantIsTheDefinitionInBlocksOfAnySize<DBL>();
    ConstantIsTheDefinitionInBlocksOfAnySize<CDB>();
}

TEST(Resampling, AUnitKernelReturnsTheSamples) {
    Kernel kernel(1, 2);
    Set(kernel.proto, Signal{0, 0, 1, 0, 0});
    const Signal x = NoiseSignal(50, 2, false);
    ConstantStream<DBL> stream(kernel, 1, 0, 0, true);
    EXPECT_TRUE(SameBits(stream.resample(x), Part(x, 0, 48)));
    EXPECT_EQ(stream.size, 50); // sized for all outputs, with zeros after those computed
    // A block too short for the next output is kept.
    const int32_t held = stream.state.historyCount;
    EXPECT_TRUE(stream.resample({}).empty());
    EXPECT_EQ(stream.state.historyCount, held);
    EXPECT_TRUE(SameBits(stream.resample({5}), Part(x, 48, 1)));
}

TEST(Resampling, AfterANegativeStartTheSecondOutputFollowsTheRatioLessOne) {
    const Kernel kernel(16, 4);
    const Signal x = NoiseSignal(60, 3, false);
    ConstantStream<DBL> stream(kernel, 0.75, -0.5, 0, true);
    const Signal y = stream.resample(x);
    ASSERT_GT(y.size(), 60U);
    EXPECT_LE(std::abs(y[0] - kernel.output(x, -0.5L, 1)), 1.6e-16L);
    EXPECT_LE(std::abs(y[1] - kernel.output(x, -0.25L, 1)), 1.6e-16L);
    EXPECT_LE(std::abs(y[9] - kernel.output(x, 9 * 0.75L - 1, 1)), 1.6e-16L);
}

TEST(Resampling, InvalidArgumentsEndTheStreamWithACode) {
    const Kernel kernel(20, 6);
    typedef ConstantStream<DBL> Stream;
    struct Case {
        void (*spoil)(Stream &);
        ErrorCode code;
    };
    const Case cases[] = {
        {[](Stream &s) { s.design.oversample = 0, s.reset = 1; }, ErrBufferOverrun},
        {[](Stream &s) { s.design.oversample = 2; }, ErrBufferOverrun},
        {[](Stream &s) { s.state.historyCount = 1000; }, ErrBufferOverrun},
        {[](Stream &s) { s.state.historyCount = -1; }, ErrBufferOverrun},
        {[](Stream &s) { s.state.fraction = std::nan(""); }, ErrBufferOverrun},
        {[](Stream &s) { s.state.ratio = 0; }, ErrOutOfMemory},
        {[](Stream &s) { s.state.ratio = -1; }, ErrIndexNotBelowSize},
    };
    for (const Case &c : cases) {
        SCOPED_TRACE(c.code);
        Stream stream(kernel, 0.9, 0, 0, false);
        stream.resample(NoiseSignal(40, 4, false));
        ASSERT_EQ(stream.status, 0);
        c.spoil(stream);
        EXPECT_TRUE(stream.resample(NoiseSignal(40, 4, false)).empty());
        EXPECT_EQ(stream.status, c.code);
        EXPECT_EQ(stream.history.size() + stream.taps.size() + stream.size, 0);
        EXPECT_EQ(stream.state.historyCount, 0);
        EXPECT_EQ(stream.state.ratio, 0);
    }
}

// Irregularly spaced ascending times, multiples of 1/64.
std::vector<double> Times(int32_t m, double rate, uint64_t seed) {
    Noise noise(seed);
    std::vector<double> times;
    double t = 0;
    for (int32_t i = 0; i < m; ++i) {
        t += rate * noise.positive();
        times.push_back(std::floor(t * 64) / 64);
    }
    return times;
}

TEST(Resampling, OutputsAtAListOfTimesAreTheDefinition) {
    const Kernel kernel(20, 6);
    const Signal x = NoiseSignal(300, 5, true);
    Array1D<CDB> samples(300);
    Set(samples, x);
    for (const uint8_t antiAlias : {0, 1})
        // With a stretched kernel, the nearest entry may depend on rounding.
        for (const int32_t mode : {0, 1 - antiAlias}) {
            SCOPED_TRACE(mode + 10 * antiAlias);
            const std::vector<double> times = Times(400, 2.5, 6);
            const VariableDesign design{mode, antiAlias, kernel.proto.handle(), 20};
            Array1D<CDB> t(400);
            for (int32_t i = 0; i < 400; ++i)
                t.data()[i] = {times[static_cast<std::size_t>(i)], 0};
            double lastTime = -3;
            int32_t outCount, consumed;
            ASSERT_EQ(CxResample_Variable(samples.handle(), t.handle(), &design, &lastTime,
                                          &outCount, &consumed),
                      0);
            double previous = -3;
            const auto served = static_cast<std::size_t>(outCount);
            for (std::size_t i = 0; i < served; ++i) {
                const double gap = antiAlias ? times[i] - previous : 1;
                const auto expected = kernel.output(x, times[i], gap, mode == 1);
                EXPECT_LE(std::abs(Get(t)[i] - expected), 1.6e-14L) << i;
                previous = times[i];
            }
            // The first time beyond the data ends the call and is stored relative to the next
            // block.
            const double gap = antiAlias ? times[served] - previous : 1;
            EXPECT_FALSE(kernel.isServed(times[served], gap, 300));
            EXPECT_EQ(+t.data()[served].re, times[served] - consumed);
            EXPECT_EQ(lastTime, previous - consumed);
            const long double step = kernel.step(gap);
            EXPECT_EQ(consumed,
                      std::floor(times[served]) -
                          std::floor((kernel.centre() -
                                      step * (times[served] - std::floor(times[served]))) /
                                     step));
        }
}

TEST(Resampling, AListOfTimesContinuesAcrossBlocksAndChannels) {
    const Kernel kernel(16, 4);
    const VariableDesign design{0, 1, kernel.proto.handle(), 16};
    const std::vector<double> times = Times(500, 1.5, 7);
    const Signal rows[2] = {NoiseSignal(380, 8, false), NoiseSignal(380, 9, false)};

    // A separate call for each channel.
    std::vector<double> expected[2];
    for (int c = 0; c < 2; ++c) {
        Array1D<DBL> x(380), t(times);
        Set(x, rows[c]);
        double lastTime = 0;
        int32_t outCount, consumed;
        ASSERT_EQ(
            Resample_Variable(x.handle(), t.handle(), &design, &lastTime, &outCount, &consumed), 0);
        ASSERT_GT(outCount, 300);
        expected[c].assign(t.data(), t.data() + outCount);
    }

    // Both channels, with samples arriving gradually and used ones dropped.
    std::vector<double> joined[2], left = times;
    double lastTime = 0;
    int32_t first = 0;
    for (int32_t end : {3, 10, 120, 121, 300, 380}) {
        DBLMatrix x(2, end - first), y;
        for (int32_t c = 0; c < 2; ++c)
            for (int32_t i = first; i < end; ++i)
                x.data()[c * (end - first) + i - first] =
                    static_cast<double>(rows[c][static_cast<std::size_t>(i)].real());
        Array1D<DBL> t(left);
        int32_t outCount, consumed;
        ASSERT_EQ(Resample_Variable_MultiCh(x.handle(), y.handle(), t.handle(), &design, &lastTime,
                                            &outCount, &consumed),
                  0);
        ASSERT_EQ(y.rows(), 2);
        ASSERT_EQ(y.cols(), outCount);
        for (int32_t c = 0; c < 2; ++c)
            for (int32_t i = 0; i < outCount; ++i)
                joined[c].push_back(y.at(c, i));
        left.assign(t.data() + outCount, t.data() + t.size());
        first += consumed;
        ASSERT_LE(first, end);
    }
    EXPECT_EQ(joined[0], expected[0]);
    EXPECT_EQ(joined[1], expected[1]);
}

TEST(Resampling, TimesThatCannotBeServedAreHarmless) {
    const Kernel kernel(16, 4);
    const VariableDesign design{0, 0, kernel.proto.handle(), 16};
    const VariableDesign none{0, 0, kernel.proto.handle(), 0};
    const Array1D<DBL> x(20);
    struct Case {
        double time;
        const VariableDesign *design;
        ErrorCode code;
        int32_t consumed;
    };
    const Case cases[] = {
        {-50, &design, 0, 0}, // all times before the samples: an output of zeros
        {1e15, &design, 0, INT32_MAX - 4},
        {std::nan(""), &design, ErrBufferOverrun, 0},
        {INFINITY, &design, ErrBufferOverrun, 0},
        {1, &none, ErrBufferOverrun, 0},
    };
    for (const Case &c : cases) {
        SCOPED_TRACE(c.time);
        Array1D<DBL> t{c.time};
        double lastTime = 0;
        int32_t outCount, consumed;
        EXPECT_EQ(
            Resample_Variable(x.handle(), t.handle(), c.design, &lastTime, &outCount, &consumed),
            c.code);
        EXPECT_EQ(outCount, c.time < 0);
        EXPECT_EQ(consumed, c.consumed);
        EXPECT_EQ(t.size(), c.code == 0 ? 1 : 0);
    }
}

} // namespace

} // namespace qx::test
