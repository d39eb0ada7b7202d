#include "qx/decimation.h"

#include "multirate/moving_sums.h"
#include "multirate/tests/streams.h"

#include <gtest/gtest.h>

#include <cmath>
#include <numeric>

namespace qx::test {

namespace {

constexpr auto DBL = ElementType::DBL;
constexpr auto CDB = ElementType::CDB;

std::vector<double> Reals(const Signal &signal) {
    std::vector<double> values;
    for (const auto &value : signal)
        values.push_back(static_cast<double>(value.real()));
    return values;
}
std::vector<double> NoiseValues(int32_t n, uint64_t seed) {
    return Reals(NoiseSignal(n, seed, false));
}
// Whole numbers, so that every sum is exact.
std::vector<double> WholeNumbers(int32_t n, uint64_t seed) {
    std::vector<double> values = NoiseValues(n, seed);
    for (double &value : values)
        value = std::floor(value * 1000);
    return values;
}

// Passes a signal through `filter` in random blocks; filter takes a block and appends to the
// output.
template <class Filter>
std::vector<double> InBlocks(const std::vector<double> &x, uint64_t seed, const Filter &filter) {
    std::vector<double> y;
    auto at = x.begin();
    for (const int32_t n : RandomBlocks(static_cast<int32_t>(x.size()), seed)) {
        for (const double value : filter(std::vector<double>(at, at + n)))
            y.push_back(value);
        at += n;
    }
    return y;
}

TEST(Decimation, OfABlockPicksOrAverages) {
    const double tens[] = {1, 2, 3, 4, 5, 6, 7, 8, 9, 20};
    for (const uint8_t average : {0, 1}) {
        Array1D<DBL> x(std::vector<double>(tens, tens + 10));
        Array1D<CDB> z(10);
        for (int32_t i = 0; i < 10; ++i)
            z.data()[i] = {tens[i], -2 * tens[i]};
        ErrorCode err = 1;
        const int32_t factor = 3;
        EXPECT_EQ(DecimateCIN(x.handle(), &factor, &average, &err), 0);
        EXPECT_EQ(err, 0);
        EXPECT_EQ(CxDecimate_H(z.handle(), factor, average), 0);
        const std::vector<double> expected =
            average ? std::vector<double>{2, 5, 8} : std::vector<double>{1, 4, 7};
        EXPECT_EQ(x.values(), expected);
        ASSERT_EQ(z.size(), 3);
        EXPECT_EQ(+z.data()[2].re, expected[2]);
        EXPECT_EQ(+z.data()[2].im, -2 * expected[2]);
    }
    for (const int32_t factor : {-1, 0, 4}) {
        Array1D<DBL> x(3);
        Array1D<CDB> z(3), empty;
        const uint8_t average = 0;
        ErrorCode err = 1;
        EXPECT_EQ(DecimateCIN(x.handle(), &factor, &average, &err), 0);
        EXPECT_EQ(err, ErrDecimationOutOfRange);
        EXPECT_EQ(x.size(), 0);
        EXPECT_EQ(CxDecimate_H(z.handle(), factor, 0), ErrDecimationOutOfRange);
        EXPECT_EQ(CxDecimate_H(empty.handle(), factor, 0), ErrEmptyInput);
    }
}

TEST(Decimation, OfAStreamEqualsThatOfOneBlock) {
    const std::vector<double> x = NoiseValues(1000, 1);
    for (const bool average : {false, true})
        for (const int32_t factor : {1, 2, 7, 64})
            for (const int32_t skip : {0, 5, 300}) {
                SCOPED_TRACE(factor * 1000 + skip);
                Array1D<DBL> rest(std::vector<double>(x.begin() + skip, x.end()));
                ErrorCode err;
                const uint8_t mean = average;
                DecimateCIN(rest.handle(), &factor, &mean, &err);
                std::vector<double> expected = rest.values();
                if (!average && (1000 - skip) % factor != 0) // picking needs no complete group
                    expected.push_back(x[static_cast<std::size_t>(1000 - (1000 - skip) % factor)]);

                int32_t start = skip, reset = 1, partialCount = 8, zStart = skip;
                int32_t zPartialCount = 8;
                double partialSum = 3;
                ::CDB zPartialSum = {3, 4};
                std::vector<double> imaginary;
                const auto y = InBlocks(x, 2, [&](const std::vector<double> &block) {
                    Array1D<DBL> b(block);
                    Array1D<CDB> z(static_cast<int32_t>(block.size()));
                    for (std::size_t i = 0; i < block.size(); ++i)
                        z.data()[i] = {0, block[i]};
                    EXPECT_EQ(DecimateContinuous_H(b.handle(), factor, average, &start, reset,
                                                   &partialCount, &partialSum),
                              0);
                    EXPECT_EQ(CxDecimateContinuous_H(z.handle(), factor, average, &zStart, reset,
                                                     &zPartialCount, &zPartialSum),
                              0);
                    for (int32_t i = 0; i < z.size(); ++i)
                        imaginary.push_back(+z.data()[i].im);
                    reset = 0;
                    return b.values();
                });
                EXPECT_EQ(y, expected);
                EXPECT_EQ(imaginary, expected);
            }
    // Invalid numbers from the caller do no harm.
    Array1D<DBL> x5(5);
    int32_t start = 100, partialCount = 50;
    double partialSum = 0;
    EXPECT_EQ(DecimateContinuous_H(x5.handle(), 4, 1, &start, 0, &partialCount, &partialSum), 0);
    EXPECT_EQ(DecimateContinuous_H(x5.handle(), 0, 1, &start, 0, &partialCount, &partialSum),
              ErrNotStrictlyPositive);
    start = -1;
    EXPECT_EQ(DecimateContinuous_H(x5.handle(), 1, 1, &start, 0, &partialCount, &partialSum),
              ErrNegativeSetting);
}

enum FIR { Interpolated, Interpolator, Decimator };

struct FIRStream {
    FIRStream(FIR which, int32_t itsFactor, int32_t taps, int32_t itsDelay)
        : kind(which), factor(itsFactor), delay(itsDelay), h(NoiseValues(taps, 7)) {}

    std::vector<double> filter(const std::vector<double> &block) {
        Array1D<DBL> x(block), y(2);
        int32_t status = 0;
        if (kind == Interpolated)
            status = InterpolatedFIRH(x.handle(), y.handle(), factor, 0.5, h.handle(),
                                      state.handle(), reset, &delay);
        else if (kind == Interpolator)
            status = InterpolatorFIRH(x.handle(), y.handle(), 0.5, factor, h.handle(),
                                      state.handle(), reset, &delay);
        else
            status = DecimatorFIRH(x.handle(), y.handle(), 0.5, factor, h.handle(), state.handle(),
                                   reset, firstPhase, &delay);
        EXPECT_EQ(status, 0);
        reset = 0;
        return y.values();
    }
    // The outputs by definition, including delayed ones.
    Signal expected(const std::vector<double> &x) const {
        Signal taps, signal(x.begin(), x.end()), y;
        for (int32_t k = 0; k < h.size(); ++k) {
            taps.emplace_back(h[k]);
            if (kind == Interpolated && k + 1 < h.size())
                taps.insert(taps.end(), static_cast<std::size_t>(factor - 1), 0);
        }
        const int32_t up = kind == Interpolator ? factor : 1;
        const int32_t down = kind == Decimator ? factor : 1;
        const long double scale = kind == Decimator ? 1.0L : 0.5L * up;
        const Signal all = StuffedAndFiltered(signal, up, taps);
        for (std::size_t t = static_cast<std::size_t>(kind == Decimator ? firstPhase : 0);
             t < x.size() * static_cast<std::size_t>(up); t += static_cast<std::size_t>(down))
            y.push_back(all[t] * scale);
        return y;
    }

    const FIR kind;
    const int32_t factor;
    int32_t delay, firstPhase = 0;
    uint8_t reset = 1;
    Array1D<DBL> h, state;
};

TEST(Decimation, FIRStreamsAreTheDefinitionInBlocksOfAnySize) {
    const std::vector<double> x = NoiseValues(700, 3);
    struct Case {
        FIR kind;
        int32_t factor, taps, delay, firstPhase;
    };
    const Case cases[] = {
        {Interpolated, 1, 9, 0, 0},   {Interpolated, 5, 12, 30, 0}, {Interpolated, 40, 1, 699, 0},
        {Interpolated, 97, 5, 0, 0},  {Interpolator, 1, 8, 3, 0},   {Interpolator, 4, 33, 16, 0},
        {Interpolator, 7, 3, 250, 0}, {Decimator, 1, 6, 0, 0},      {Decimator, 4, 33, 4, 2},
        {Decimator, 10, 25, 1, 9},    {Decimator, 50, 7, 0, 49},
    };
    for (const Case &c : cases) {
        SCOPED_TRACE(testing::Message() << c.kind << ", factor " << c.factor);
        FIRStream whole(c.kind, c.factor, c.taps, c.delay);
        FIRStream stream(c.kind, c.factor, c.taps, c.delay);
        whole.firstPhase = stream.firstPhase = c.firstPhase;
        const std::vector<double> y = whole.filter(x);
        const Signal expected = whole.expected(x);
        ASSERT_EQ(y.size() + static_cast<std::size_t>(c.delay), expected.size());
        for (std::size_t m = 0; m < y.size(); ++m)
            ASSERT_NEAR(y[m],
                        static_cast<double>(expected[m + static_cast<std::size_t>(c.delay)].real()),
                        9e-16 * c.factor)
                << m;
        EXPECT_EQ(InBlocks(x, 4, [&](const auto &block) { return stream.filter(block); }), y);
        EXPECT_EQ(stream.delay, 0);
        EXPECT_EQ(stream.state.values(), whole.state.values());
    }
}

TEST(Decimation, FIRStreamsCheckTheirArguments) {
    const Array1D<DBL> x(5), h(4), none;
    struct Case {
        DBL1D h;
        int32_t factor, stateSize;
        ErrorCode code;
    };
    const Case cases[] = {{none.handle(), 0, 0, ErrOrderNotPositive},
                          {h.handle(), 0, 0, ErrNotStrictlyPositive},
                          {h.handle(), 2, 11, ErrMultirateStateSize},
                          {h.handle(), INT32_MAX, 11, ErrMultirateStateSize}};
    for (const Case &c : cases) {
        SCOPED_TRACE(c.code);
        for (int kind = 0; kind < 3; ++kind) {
            Array1D<DBL> y(2), state(c.stateSize);
            int32_t delay = 3;
            const ErrorCode status = kind == 0 ? InterpolatedFIRH(x.handle(), y.handle(), c.factor,
                                                                  1, c.h, state.handle(), 0, &delay)
                                     : kind == 1
                                         ? InterpolatorFIRH(x.handle(), y.handle(), 1, c.factor,
                                                            c.h, state.handle(), 0, &delay)
                                         : DecimatorFIRH(x.handle(), y.handle(), 1, c.factor, c.h,
                                                         state.handle(), 0, 0, &delay);
            // A spacing that makes the state larger than any array.
            const bool tooLarge = kind == 0 && c.factor == INT32_MAX;
            EXPECT_EQ(status, tooLarge ? ErrOutOfMemory : c.code);
            EXPECT_EQ(y.size() + state.size(), 0);
            EXPECT_EQ(delay, 3);
        }
    }
}

// Only a refused resize of the state returns the host's own status, and not from every export.
TEST(Decimation, ARefusedStateComesBackAsTheHostsStatus) {
    const Array1D<DBL> x(5), h(4);
    for (const int32_t failAt : {1, 2}) {
        Array1D<DBL> y(2), state;
        int32_t delay = 0;
        ResetHost(failAt, 4711);
        EXPECT_EQ(
            InterpolatedFIRH(x.handle(), y.handle(), 2, 1, h.handle(), state.handle(), 1, &delay),
            failAt == 1 ? 4711 : ErrOutOfMemory);
        ResetHost(failAt, 4711);
        EXPECT_EQ(CICDecimatorByMovH(x.handle(), y.handle(), state.handle(), 2, 2, 1, 0, 1, &delay),
                  failAt == 1 ? 4711 : ErrOutOfMemory);
        ResetHost(failAt, 4711);
        EXPECT_EQ(
            CICInterpolatorByMovH(x.handle(), y.handle(), state.handle(), 2, 2, 1, 0, 1, &delay),
            failAt == 1 ? 4711 : ErrOutOfMemory);
        ResetHost(failAt, 4711);
        EXPECT_EQ(
            InterpolatorFIRH(x.handle(), y.handle(), 1, 2, h.handle(), state.handle(), 1, &delay),
            ErrOutOfMemory);
        ResetHost();
    }
}

struct CICStream {
    CICStream(bool up, int32_t itsStages, int32_t itsFactor, int32_t comb, bool shifted,
              int32_t itsDelay)
        : interpolates(up), stages(itsStages), factor(itsFactor), differentialDelay(comb),
          alternate(shifted), delay(itsDelay) {}

    std::vector<double> filter(const std::vector<double> &block) {
        Array1D<DBL> x(block), y(2);
        const auto function = interpolates ? CICInterpolatorByMovH : CICDecimatorByMovH;
        EXPECT_EQ(function(x.handle(), y.handle(), state.handle(), stages, factor,
                           differentialDelay, alternate, reset, &delay),
                  block.empty() ? WarnMultirateEmpty : 0);
        reset = 0;
        return y.values();
    }
    // The impulse response of the cascade by definition, at the high rate.
    Signal response() const {
        const auto width = static_cast<std::size_t>(factor * differentialDelay);
        Signal average(width), h{1};
        for (std::size_t k = 0; k < width; ++k)
            average[k] = (alternate && k % 2 == 1 ? -1.0L : 1.0L) / static_cast<long double>(width);
        for (int32_t stage = 0; stage < stages; ++stage)
            h = StuffedAndFiltered(h, 1, average);
        return h;
    }
    std::vector<double> expected(const std::vector<double> &x) const {
        const int32_t up = interpolates ? factor : 1, down = interpolates ? 1 : factor;
        const Signal all = StuffedAndFiltered(Signal(x.begin(), x.end()), up, response());
        std::vector<double> y;
        for (std::size_t t = static_cast<std::size_t>(delay);
             t < x.size() * static_cast<std::size_t>(up); t += static_cast<std::size_t>(down))
            y.push_back(static_cast<double>(all[t].real()) * up);
        return y;
    }

    const bool interpolates;
    const int32_t stages, factor, differentialDelay;
    const int16_t alternate;
    int32_t delay;
    uint8_t reset = 1;
    Array1D<DBL> state;
};

TEST(Decimation, CICFiltersAreCascadesOfMovingAveragesInBlocksOfAnySize) {
    const std::vector<double> x = WholeNumbers(1300, 5);
    struct Case {
        int32_t stages, factor, differentialDelay, delay;
        bool alternate;
    };
    const Case cases[] = {
        {1, 1, 4, 0, false},  {1, 8, 1, 7, false},   {2, 4, 2, 3, false},
        {3, 5, 1, 40, false}, {4, 2, 2, 0, true},    {5, 3, 1, 100, true},
        {9, 2, 1, 0, false},  {3, 25, 2, 600, true}, {2, 700, 1, 9, false},
    };
    for (const bool interpolates : {false, true})
        for (const Case &c : cases) {
            SCOPED_TRACE(testing::Message() << c.stages << " stages, factor " << c.factor
                                            << (interpolates ? " up" : " down"));
            CICStream whole(interpolates, c.stages, c.factor, c.differentialDelay, c.alternate,
                            c.delay);
            const std::vector<double> expected = whole.expected(x);
            const std::vector<double> y = whole.filter(x);
            ASSERT_EQ(y.size(), expected.size());
            for (std::size_t m = 0; m < y.size(); ++m)
                ASSERT_NEAR(y[m], expected[m], 6e-12 * (interpolates ? c.factor : 1)) << m;

            CICStream stream(interpolates, c.stages, c.factor, c.differentialDelay, c.alternate,
                             c.delay);
            EXPECT_EQ(InBlocks(x, 6, [&](const auto &block) { return stream.filter(block); }), y);
            EXPECT_EQ(stream.delay, 0);
            EXPECT_EQ(stream.state.values(), whole.state.values());
        }
}

TEST(Decimation, CICFiltersCheckTheirArguments) {
    const Array1D<DBL> x(5);
    struct Case {
        int32_t stages, factor, differentialDelay, stateSize;
        ErrorCode code;
    };
    const Case cases[] = {
        {0, 2, 1, 1, ErrNotStrictlyPositive},     {2, 0, 1, 1, ErrNotStrictlyPositive},
        {2, 2, -1, 1, ErrNotStrictlyPositive},    {2, 1 << 20, 1 << 20, 1, ErrOutOfMemory},
        {1 << 20, 1 << 20, 1, 1, ErrOutOfMemory}, {2, 2, 1, 3, ErrMultirateStateSize}};
    for (const Case &c : cases)
        for (const auto function : {CICDecimatorByMovH, CICInterpolatorByMovH}) {
            SCOPED_TRACE(c.code);
            Array1D<DBL> y(2), state(c.stateSize);
            int32_t delay = 0;
            EXPECT_EQ(function(x.handle(), y.handle(), state.handle(), c.stages, c.factor,
                               c.differentialDelay, 0, 0, &delay),
                      c.code);
            EXPECT_EQ(y.size() + state.size(), 0);
        }
    // Invalid phases in the state.
    for (const double phase : {-7.0, 1e300, std::nan("")}) {
        Array1D<DBL> y(2), state{0, 0, 0, phase};
        int32_t delay = 0;
        EXPECT_EQ(CICDecimatorByMovH(x.handle(), y.handle(), state.handle(), 1, 2, 1, 0, 0, &delay),
                  0);
        EXPECT_EQ(y.size(), phase < 0 ? 3 : 0);
    }
}

TEST(Decimation, GroupsOfAStreamAreSummed) {
    const std::vector<double> x = NoiseValues(1000, 8);
    for (const int32_t factor : {1, 2, 9, 400}) {
        std::vector<double> expected;
        if (factor == 1)
            expected = x;
        else
            for (auto at = x.begin(); x.end() - at >= factor; at += factor)
                expected.push_back(std::accumulate(at, at + factor, 0.0));
        double sum = 4;
        ::CDB zSum = {4, 5};
        int32_t count = 3, zCount = 3, reset = 1;
        std::vector<double> imaginary;
        EXPECT_EQ(InBlocks(x, 9,
                           [&](const std::vector<double> &block) {
                               Array1D<DBL> b(block);
                               Array1D<CDB> z(static_cast<int32_t>(block.size()));
                               for (std::size_t i = 0; i < block.size(); ++i)
                                   z.data()[i] = {1, block[i]};
                               int32_t outCount, zOutCount;
                               ReDecimatedMovingAverageH(b.handle(), factor, &sum, &count, reset,
                                                         &outCount);
                               CxDecimatedMovingAverageH(z.handle(), factor, &zSum, &zCount, reset,
                                                         &zOutCount);
                               reset = 0;
                               EXPECT_EQ(b.size(), static_cast<int32_t>(block.size()));
                               EXPECT_EQ(zOutCount, outCount);
                               for (int32_t i = 0; i < zOutCount; ++i) {
                                   EXPECT_EQ(+z.data()[i].re, factor);
                                   imaginary.push_back(+z.data()[i].im);
                               }
                               return std::vector<double>(b.data(), b.data() + outCount);
                           }),
                  expected);
        EXPECT_EQ(imaginary, expected);
    }
    // An impossible count is reduced modulo the group size.
    for (const int32_t wrong : {7, -1}) {
        Array1D<DBL> b{1, 2, 4, 8, 16};
        double sum = 100;
        int32_t count = wrong, outCount;
        EXPECT_EQ(ReDecimatedMovingAverageH(b.handle(), 4, &sum, &count, 0, &outCount), 0);
        EXPECT_EQ(outCount, 2);
        EXPECT_EQ(b[0], 101);
        EXPECT_EQ(count, 0);
    }
}

// Long blocks of many stages are computed as a wavefront, single samples are not. Values and ring
// buffers agree to the bit.
TEST(Decimation, CascadesOfMovingSumsAreTheSameSampleBySample) {
    constexpr int32_t n = 700;
    const std::vector<double> x = NoiseValues(n, 12);
    for (const auto kind : {MovingSum::Plain, MovingSum::AlternateEven, MovingSum::AlternateOdd})
        for (const int32_t stages : {8, 11, 16})
            for (const int32_t width : {1, 2, 21, 64, 256}) {
                SCOPED_TRACE(testing::Message() << stages << " stages of " << width);
                const auto run = [&](int32_t step, std::vector<double> &state) {
                    state = NoiseValues((width + 1) * stages, 13);
                    const Array1D<DBL> cells(state), signal(x);
                    MovingSumState<DBL> sums{cells.data(), width + 1, cells.data() + width,
                                             width + 1,    stages,    width,
                                             width / 3};
                    for (int32_t i = 0; i < n; i += step)
                        MovingSumStages(sums, kind, 1.0 / width, signal.data() + i, step);
                    EXPECT_EQ(sums.position, (width / 3 + n) % width);
                    state = cells.values();
                    return signal.values();
                };
                std::vector<double> whole, parts;
                EXPECT_EQ(run(n, whole), run(1, parts));
                EXPECT_EQ(whole, parts);
            }
}

TEST(Decimation, CascadedMovingSumsSizeTheirOwnState) {
    const std::vector<double> x = WholeNumbers(800, 10);
    for (const int32_t stages : {1, 2, 3, 6})
        for (const int32_t width : {2, 7, 100}) {
            SCOPED_TRACE(stages * 1000 + width);
            Signal sums(x.begin(), x.end());
            for (int32_t stage = 0; stage < stages; ++stage)
                sums = Part(StuffedAndFiltered(sums, 1, Signal(static_cast<std::size_t>(width), 1)),
                            0, 800);
            Array1D<DBL> state(1);
            Array1D<CDB> zState(1);
            DBLMatrix buffers;
            CDBMatrix zBuffers;
            int32_t position = -1, zPosition = -1;
            std::vector<double> imaginary;
            EXPECT_EQ(InBlocks(x, 11,
                               [&](const std::vector<double> &block) {
                                   Array1D<DBL> b(block);
                                   Array1D<CDB> z(b.size());
                                   for (std::size_t i = 0; i < block.size(); ++i)
                                       z.data()[i] = {-1, block[i]};
                                   EXPECT_EQ(ReCascadedMovingAverageH(
                                                 b.handle(), stages, width, state.handle(),
                                                 buffers.handle(), &position, 0),
                                             0);
                                   EXPECT_EQ(CxCascadedMovingAverageH(
                                                 z.handle(), stages, width, zState.handle(),
                                                 zBuffers.handle(), &zPosition, 0),
                                             0);
                                   EXPECT_EQ(zPosition, position);
                                   for (int32_t i = 0; i < z.size(); ++i)
                                       imaginary.push_back(+z.data()[i].im);
                                   return b.values();
                               }),
                      Reals(sums));
            EXPECT_EQ(imaginary, Reals(sums));
            EXPECT_EQ(position, 800 % width);
        }
    Array1D<DBL> y(3), state(9);
    DBLMatrix buffers(9, 9);
    int32_t position = 5;
    // If there is nothing to do, not even the state is read.
    EXPECT_EQ(
        ReCascadedMovingAverageH(y.handle(), 2, 1, state.handle(), buffers.handle(), &position, 0),
        0);
    EXPECT_EQ(
        ReCascadedMovingAverageH(y.handle(), 0, 4, state.handle(), buffers.handle(), &position, 1),
        0);
    EXPECT_EQ(position + state.size() + buffers.cols(), 23);
    // A refused resize matters only if it leaves the state too small.
    Array1D<DBL> right(2);
    DBLMatrix rightBuffers(2, 4);
    ResetHost(1, 4711);
    EXPECT_EQ(ReCascadedMovingAverageH(y.handle(), 2, 4, right.handle(), rightBuffers.handle(),
                                       &position, 1),
              0);
    ResetHost(1, 4711);
    EXPECT_EQ(
        ReCascadedMovingAverageH(y.handle(), 2, 4, state.handle(), buffers.handle(), &position, 1),
        ErrOutOfMemory);
    ResetHost();
    EXPECT_EQ(state.size() + buffers.rows() + y.size(), 0);
}

TEST(Decimation, ModulatorsShiftAStreamInFrequency) {
    const Signal x = NoiseSignal(5000, 12, true);
    for (const double frequency : {0.037, -0.3, 1.75}) {
        SCOPED_TRACE(frequency);
        const double startPhase = 0.4;
        double phase = startPhase, rePhase = startPhase;
        std::size_t at = 0;
        for (const int32_t n : RandomBlocks(5000, 13)) {
            Array1D<CDB> z(n), y(2);
            Array1D<DBL> r(n);
            Set(z, Part(x, at, n));
            Set(r, Part(x, at, n));
            ASSERT_EQ(CxComplexModulatorH(z.handle(), 2 * frequency, 2, &phase), 0);
            ASSERT_EQ(ReComplexModulatorH(r.handle(), frequency, 1, &rePhase, y.handle()), 0);
            ASSERT_EQ(phase, rePhase);
            for (int32_t i = 0; i < n; ++i, ++at) {
                const long double turns = static_cast<long double>(at) * frequency;
                const long double angle =
                    startPhase + 6.283185307179586476925L * (turns - std::floor(turns));
                const std::complex<long double> w(std::cos(angle), std::sin(angle));
                ASSERT_LE(std::abs(Get(z)[static_cast<std::size_t>(i)] - x[at] * w), 1.1e-11L)
                    << at;
                ASSERT_LE(std::abs(Get(y)[static_cast<std::size_t>(i)] - x[at].real() * w),
                          1.1e-11L);
            }
            EXPECT_GE(phase, 0);
            EXPECT_LT(phase, 6.2832);
        }
    }
    Array1D<CDB> z(3), y(2);
    Array1D<DBL> r(3), none;
    Set(z, Part(x, 0, 3));
    Set(r, Part(x, 0, 3));
    double phase = 1;
    EXPECT_EQ(CxComplexModulatorH(z.handle(), 0, 10, &phase), 0);
    EXPECT_EQ(ReComplexModulatorH(r.handle(), 0, 10, &phase, y.handle()), 0);
    EXPECT_EQ(phase, 1);
    EXPECT_TRUE(SameBits(Get(z), Part(x, 0, 3)));
    EXPECT_TRUE(SameBits(Get(y), Get(r)));
    EXPECT_EQ(ReComplexModulatorH(none.handle(), 1, 10, &phase, y.handle()), 0);
    EXPECT_EQ(y.size(), 3);
    // A sampling rate of 0, or one too small for the ratio, ends the stream without a code.
    for (const double frequency : {0.0, 1.0, 1e300}) {
        phase = 0;
        const double rate = frequency > 1 ? 1e-300 : 0.0;
        EXPECT_EQ(ReComplexModulatorH(r.handle(), frequency, rate, &phase, y.handle()), 0);
        EXPECT_EQ(Get(y)[0].real(), Get(r)[0]);
        EXPECT_TRUE(std::isnan(Get(y)[1].real()) && std::isnan(phase));
    }
}

} // namespace

} // namespace qx::test
