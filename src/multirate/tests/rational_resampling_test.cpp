#include "qx/rational_resampling.h"

#include "multirate/tests/streams.h"

#include <gtest/gtest.h>

namespace qx::test {

namespace {

constexpr auto DBL = ElementType::DBL;
constexpr auto CDB = ElementType::CDB;

struct Setting {
    int32_t L, M, taps, offset;
};
std::ostream &operator<<(std::ostream &stream, const Setting &s) {
    return stream << s.L << "/" << s.M << ", " << s.taps << " taps from " << s.offset;
}

const Setting settings[] = {
    {1, 1, 1, 0},
    {1, 1, 15, 7},
    {2, 1, 33, 0},
    {1, 2, 33, 16},
    {3, 2, 41, 0},
    {2, 3, 5, 1},
    {160, 147, 321, 0},
    {147, 160, 301, 3},
    {6, 4, 25, 2},
    // Few taps on a wide grid: outputs whose windows contain no sample, and steps over whole
    // blocks.
    {7, 2, 3, 0},
    {9, 40, 5, 13},
    {5, 61, 1, 0},
    {1, 50, 7, 200},
    {4, 3, 1, 1},
};

// y by definition, for outputs whose window ends within the input.
Signal Resampled(const Signal &x, const Setting &s, const Signal &h) {
    const int32_t half = (s.taps - 1) / 2;
    const int64_t end = static_cast<int64_t>(x.size()) * s.L;
    Signal y;
    for (int64_t p = s.offset; p + half < end; p += s.M) {
        std::complex<long double> sum = 0;
        for (int32_t k = 0; k < s.taps; ++k)
            if ((p - half + k) % s.L == 0)
                sum += h[static_cast<std::size_t>(k)] * At(x, (p - half + k) / s.L);
        y.push_back(sum * static_cast<long double>(s.L));
    }
    return y;
}

template <ElementType Code>
class Stream {
public:
    Stream(const Setting &setting, const Signal &h)
        : offset(setting.offset), setting_(setting), h_(static_cast<int32_t>(h.size())) {
        Set(h_, h);
    }
    Signal resample(const Signal &block) {
        Array1D<Code> x(static_cast<int32_t>(block.size())), y(3);
        Set(x, block);
        if constexpr (Code == DBL)
            status = RationalResample_H(x.handle(), setting_.L, setting_.M, reset, &offset,
                                        h_.handle(), state.handle(), &stateCount, y.handle());
        else
            status = CxRationalResample_H(x.handle(), setting_.L, setting_.M, reset, &offset,
                                          h_.handle(), state.handle(), &stateCount, y.handle());
        reset = 0;
        return Get(y);
    }

    Array1D<Code> state;
    int32_t reset = 1, offset, stateCount = 9;
    ErrorCode status = 0;

private:
    const Setting setting_;
    Array1D<DBL> h_;
};

template <ElementType Code>
void IsTheDefinitionInBlocksOfAnySize() {
    uint64_t seed = 20;
    for (const Setting &setting : settings) {
        SCOPED_TRACE(setting);
        const Signal x = NoiseSignal(1500, 1, Code == CDB);
        const Signal h =
            NoiseSignal(setting.taps, 2, false); // not symmetric, so that the order of taps matters
        const Signal expected = Resampled(x, setting, h);
        Stream<Code> whole(setting, h);
        const Signal y = whole.resample(x);
        ASSERT_EQ(whole.status, 0);
        ASSERT_EQ(y.size(), expected.size());
        const long double bound = setting.taps * SumBound(h, setting.L, epsilon<Code>) / 22;
        for (std::size_t m = 0; m < y.size(); ++m)
            ASSERT_LE(std::abs(y[m] - expected[m]), bound) << m;

        for (int round = 0; round < 4; ++round) {
            Stream<Code> stream(setting, h);
            Signal joined;
            std::size_t at = 0;
            for (const int32_t n : RandomBlocks(1500, ++seed)) {
                Append(joined, stream.resample(Part(x, at, n)));
                ASSERT_EQ(stream.status, 0);
                ASSERT_LE(stream.stateCount, stream.state.size());
                at += static_cast<std::size_t>(n);
            }
            EXPECT_TRUE(SameBits(joined, y));
            EXPECT_EQ(stream.offset, whole.offset);
            EXPECT_EQ(stream.stateCount, whole.stateCount);
        }
    }
}

TEST(RationalResampling, IsTheDefinitionInBlocksOfAnySize) {
    IsTheDefinitionInBlocksOfAnySize<DBL>();
    IsTheDefinitionInBlocksOfAnySize<CDB>();
}

TEST(RationalResampling, IsSciPysResamplePoly) {
    const std::vector<SciPyCase> cases = SciPyCases("resample_poly");
    ASSERT_EQ(cases.size(), 4U);
    for (const SciPyCase &c : cases) {
        const Setting setting{c.up, c.down, static_cast<int32_t>(c.h.size()), 0};
        SCOPED_TRACE(setting);
        Stream<DBL> stream(setting, c.h);
        Signal y = stream.resample(c.x);
        // SciPy's outputs continue to the end, with zeros after it.
        Append(y, stream.resample(Signal(40)));
        ASSERT_GE(y.size(), c.y.size());
        for (std::size_t m = 0; m < c.y.size(); ++m)
            EXPECT_LE(std::abs(y[m] - c.y[m]), 6e-14L) << m;
    }
}

TEST(RationalResampling, ChannelsAreStreamsThatShareTheirPositions) {
    const Setting setting{3, 2, 23, 4};
    const Signal h = NoiseSignal(23, 3, false);
    Array1D<DBL> taps(23);
    Set(taps, h);
    Stream<CDB> alone[2] = {{setting, h}, {setting, h}};
    CDBMatrix state, y;
    int32_t offset = setting.offset, stateCount = 0;
    // The empty state starts the stream; the last block has no output.
    for (const int32_t n : {40, 7, 0, 31, 1}) {
        const Signal rows[2] = {NoiseSignal(n, 4, true), NoiseSignal(n, 5, true)};
        CDBMatrix x(2, n);
        for (int32_t c = 0; c < 2; ++c)
            for (int32_t i = 0; i < n; ++i) {
                const auto value = rows[c][static_cast<std::size_t>(i)];
                x.data()[c * n + i] = {static_cast<double>(value.real()),
                                       static_cast<double>(value.imag())};
            }
        ASSERT_EQ(CxRationalResampleMCh_H(x.handle(), 3, 2, 0, &offset, taps.handle(),
                                          state.handle(), &stateCount, y.handle()),
                  0);
        ASSERT_EQ(y.rows(), 2);
        for (int32_t c = 0; c < 2; ++c) {
            const Signal expected = alone[c].resample(rows[c]);
            ASSERT_EQ(y.cols(), static_cast<int32_t>(expected.size()));
            for (int32_t m = 0; m < y.cols(); ++m) {
                EXPECT_EQ(+y.at(c, m).re, expected[static_cast<std::size_t>(m)].real());
                EXPECT_EQ(+y.at(c, m).im, expected[static_cast<std::size_t>(m)].imag());
            }
        }
    }
    DBLMatrix wrongState(3, 8), x(2, 4), z;
    EXPECT_EQ(RationalResampleMultiCh_H(x.handle(), 3, 2, 0, &offset, taps.handle(),
                                        wrongState.handle(), &stateCount, z.handle()),
              ErrSizesDisagree);
    EXPECT_EQ(wrongState.rows(), 0);
}

TEST(RationalResampling, ABlockWithoutOutputIsKeptOrSkipped) {
    Stream<DBL> stream({2, 1, 41, 0}, NoiseSignal(41, 1, false));
    EXPECT_TRUE(stream.resample(NoiseSignal(4, 2, false)).empty());
    EXPECT_EQ(stream.stateCount, 4);
    EXPECT_EQ(stream.state.size(), 21);
    EXPECT_TRUE(stream.resample(NoiseSignal(5, 2, false)).empty());
    EXPECT_EQ(stream.stateCount, 9);
    EXPECT_EQ(stream.offset, 0);

    Stream<DBL> ahead({2, 1, 41, 300}, NoiseSignal(41, 1, false));
    EXPECT_TRUE(ahead.resample(NoiseSignal(100, 2, false)).empty());
    EXPECT_EQ(ahead.stateCount, 0);
    EXPECT_EQ(ahead.offset, 100);
    // The window of position 100 covers samples 40 to 60 of these 50.
    EXPECT_TRUE(ahead.resample(NoiseSignal(50, 2, false)).empty());
    EXPECT_EQ(ahead.stateCount, 10);
    EXPECT_EQ(ahead.offset, 20);
}

TEST(RationalResampling, ChecksComeInOrder) {
    struct Case {
        int32_t L, M, reset, offset, stateCount, taps;
        ErrorCode code;
    };
    const Case cases[] = {
        {0, 1, 1, -1, 0, 4, ErrNegativeSetting},
        {0, 1, 1, 0, -1, 4, ErrNegativeSetting},
        {0, 1, 1, 0, 0, 4, ErrNotStrictlyPositive},
        {1, 0, 1, 0, 0, 4, ErrNotStrictlyPositive},
        {1 << 28, 1, 1, 0, 0, 4, ErrOverflow}, // 10 samples need 4 bits
        {1 << 26, 1 << 30, 1, 0, 0, 4, ErrBadTapCount},
        {1, 1, 1, 0, 0, 0, ErrBadTapCount},
        {1, 1, 0, 0, 6, 3, ErrOverflow},  // more than the state of 5 holds
        {1, 1, 0, 0, 5, 31, ErrOverflow}, // no room for the remaining samples
    };
    for (const Case &c : cases) {
        SCOPED_TRACE(c.code);
        Array1D<DBL> x(10), y(2), state(5), h(c.taps);
        int32_t offset = c.offset, stateCount = c.stateCount;
        EXPECT_EQ(RationalResample_H(x.handle(), c.L, c.M, c.reset, &offset, h.handle(),
                                     state.handle(), &stateCount, y.handle()),
                  c.code);
        EXPECT_EQ(y.size(), 0);
        EXPECT_EQ(state.size(), 0);
    }
}

} // namespace

} // namespace qx::test
