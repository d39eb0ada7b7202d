#include "qx/polyphase.h"

#include "multirate/tests/streams.h"

#include <gtest/gtest.h>

namespace qx::test {

namespace {

constexpr auto SGL = ElementType::SGL;
constexpr auto DBL = ElementType::DBL;
constexpr auto CSG = ElementType::CSG;
constexpr auto CDB = ElementType::CDB;

template <ElementType Code>
struct Export;
#define QX_TEST_EXPORT(Code, Taps, Function)                                                       \
    template <>                                                                                    \
    struct Export<Code> {                                                                          \
        static constexpr auto code = Code;                                                         \
        static constexpr auto taps = Taps;                                                         \
        static constexpr auto function = Function;                                                 \
    };
QX_TEST_EXPORT(SGL, SGL, ppMultiRateFIRH_SGL)
QX_TEST_EXPORT(DBL, DBL, ppMultiRateFIRH_DBL)
QX_TEST_EXPORT(CSG, SGL, ppMultiRateFIRH_CSG)
QX_TEST_EXPORT(CDB, DBL, ppMultiRateFIRH_CDB)
#undef QX_TEST_EXPORT

enum Mode { SameRate, Interpolate, Decimate, Rational };

struct Setting {
    int32_t mode, L, M, taps;
    bool removeDelay;
    // The factors that the mode uses of L and M.
    int32_t up() const { return mode == Interpolate || mode == Rational ? L : 1; }
    int32_t down() const { return mode == Decimate || mode == Rational ? M : 1; }
};
std::ostream &operator<<(std::ostream &stream, const Setting &s) {
    return stream << "mode " << s.mode << ", " << s.L << "/" << s.M << ", " << s.taps << " taps"
                  << (s.removeDelay ? ", delay removed" : "");
}

const Setting settings[] = {
    {SameRate, 1, 1, 1, false},    {SameRate, 3, 2, 9, true},     {SameRate, 1, 1, 64, false},
    {Interpolate, 2, 1, 17, true}, {Interpolate, 5, 7, 3, false}, {Interpolate, 7, 1, 41, true},
    {Decimate, 1, 2, 33, true},    {Decimate, 1, 5, 4, false},    {Decimate, 9, 11, 23, false},
    {Decimate, 1, 1, 5, true},     {Decimate, 1, 40, 101, true},  {Rational, 3, 2, 31, true},
    {Rational, 2, 3, 30, false},   {Rational, 6, 4, 25, true},    {Rational, 16, 15, 161, true},
    {Rational, 15, 16, 77, false}, {Rational, 7, 3, 5, true},     {Rational, 4, 4, 9, false},
    {Rational, 1, 90, 31, true},
};

// A stream of one export with all state that its caller keeps.
template <ElementType Code>
class Stream {
public:
    Stream(const Setting &setting, const Signal &h, double gain)
        : setting_(setting), gain_(gain), h_(static_cast<int32_t>(h.size())) {
        Set(h_, h);
    }

    Signal filter(const Signal &block) {
        Array1D<Code> x(static_cast<int32_t>(block.size()));
        Array1D<Code> y(2);
        Set(x, block);
        const uint8_t removeDelay = setting_.removeDelay;
        typedef std::conditional_t<isSingle<Code>, float, double> Real;
        status = Export<Code>::function(
            x.handle(), y.handle(), state.handle(), setting_.mode, setting_.L, setting_.M,
            h_.handle(), static_cast<Real>(gain_), &reset, &removeDelay, &delayLeft, &phase);
        reset = 0;
        return Get(y);
    }

    Array1D<Code> state;
    uint8_t reset = 1;
    int32_t delayLeft = 77, phase = 55;
    ErrorCode status = 0;

private:
    const Setting setting_;
    const double gain_;
    Array1D<Export<Code>::taps> h_;
};

template <class T>
class Polyphase : public testing::Test {};
typedef testing::Types<Export<SGL>, Export<DBL>, Export<CSG>, Export<CDB>> Exports;
TYPED_TEST_SUITE(Polyphase, Exports);

TYPED_TEST(Polyphase, IsStuffingFilteringAndPicking) {
    constexpr auto Code = TypeParam::code;
    for (const Setting &setting : settings) {
        SCOPED_TRACE(setting);
        const Signal x = NoiseSignal(331, 1, isComplex<Code>);
        const Signal h = NoiseSignal(setting.taps, 2, false);
        Stream<Code> stream(setting, h, -1.5);
        const Signal y = stream.filter(x);
        ASSERT_EQ(stream.status, 0);

        const Signal whole = StuffedAndFiltered(x, setting.up(), h);
        const long double scale = setting.mode == Decimate ? 1.0L : -1.5L * setting.up();
        const long double bound = setting.taps * SumBound(h, scale, epsilon<Code>) / 6;
        const int64_t end = int64_t{331} * setting.up();
        std::size_t m = 0;
        // With the delay removed the first output is that at the centre of the taps.
        for (int64_t t = setting.removeDelay ? (setting.taps - 1) / 2 : 0; t < end;
             t += setting.down(), ++m) {
            ASSERT_LT(m, y.size());
            ASSERT_LE(std::abs(y[m] - scale * At(whole, t)), bound) << m;
        }
        EXPECT_EQ(y.size(), m);
        EXPECT_EQ(stream.delayLeft, 0);
    }
}

TYPED_TEST(Polyphase, BlocksOfAnySizeGiveTheBitsOfOne) {
    constexpr auto Code = TypeParam::code;
    uint64_t seed = 10;
    for (const Setting &setting : settings) {
        SCOPED_TRACE(setting);
        const Signal x = NoiseSignal(1201, 3, isComplex<Code>);
        const Signal h = NoiseSignal(setting.taps, 4, false);
        Stream<Code> whole(setting, h, 0.7);
        const Signal expected = whole.filter(x);
        Stream<Code> stream(setting, h, 0.7);
        Signal y;
        std::size_t at = 0;
        for (const int32_t n : RandomBlocks(1201, ++seed)) {
            Append(y, stream.filter(Part(x, at, n)));
            ASSERT_EQ(stream.status, n > 0 ? 0 : WarnEmptyResult);
            at += static_cast<std::size_t>(n);
        }
        EXPECT_TRUE(SameBits(y, expected));
        EXPECT_EQ(stream.delayLeft, whole.delayLeft);
        if (setting.mode == Decimate || setting.mode == Rational) {
            EXPECT_EQ(stream.phase, whole.phase);
        }
        // The caller's state is the same as well, so that the streams remain identical.
        EXPECT_TRUE(SameBits(Get(stream.state), Get(whole.state)));
    }
}

// A block that is processed in several pieces, with short and with long windows.
TEST(Polyphase, LongBlocksGiveTheSameBits) {
    for (const Setting &setting :
         {Setting{SameRate, 1, 1, 5000, false}, Setting{Interpolate, 2, 1, 31, true},
          Setting{Decimate, 1, 5, 44, false}, Setting{Rational, 16, 15, 99, true}}) {
        SCOPED_TRACE(setting);
        const Signal x = NoiseSignal(12000, 8, true);
        const Signal h = NoiseSignal(setting.taps, 9, false);
        Stream<CSG> whole(setting, h, 1), halves(setting, h, 1);
        const Signal expected = whole.filter(x);
        Signal y = halves.filter(Part(x, 0, 4099));
        Append(y, halves.filter(Part(x, 4099, 12000 - 4099)));
        EXPECT_TRUE(SameBits(y, expected));
    }
}

TEST(Polyphase, IsTheSumOfSciPysUpfirdn) {
    const std::vector<SciPyCase> cases = SciPyCases("upfirdn");
    ASSERT_EQ(cases.size(), 6U);
    for (const SciPyCase &c : cases) {
        const auto taps = static_cast<int32_t>(c.h.size());
        // Every mode that supports it; upfirdn continues past the end of the input.
        for (int32_t mode = 0; mode < 4; ++mode) {
            const Setting setting{mode, c.up, c.down, taps, false};
            if (setting.up() != c.up || setting.down() != c.down)
                continue;
            SCOPED_TRACE(setting);
            Stream<DBL> stream(setting, c.h, 1.0 / c.up);
            const Signal y = stream.filter(c.x);
            ASSERT_EQ(static_cast<int32_t>(y.size()), (40 * c.up - 1) / c.down + 1);
            for (std::size_t m = 0; m < y.size(); ++m)
                EXPECT_LE(std::abs(y[m] - c.y[m]), 7e-15L) << m;
        }
    }
}

TEST(Polyphase, AnEmptyStateBeginsAStreamAndAnEmptyBlockChangesNothing) {
    for (const int32_t mode : {Interpolate, Decimate, Rational}) {
        const Setting setting{mode, 3, 2, 12, false};
        const Signal h = NoiseSignal(12, 5, false);
        Stream<DBL> stream(setting, h, 1);
        stream.reset = 0;
        stream.filter(NoiseSignal(8, 6, false));
        ASSERT_EQ(stream.status, 0);
        const Signal state = Get(stream.state);
        EXPECT_EQ(state.size(), mode == Decimate ? 7U : 4U);
        const int32_t phase = stream.phase;
        EXPECT_TRUE(stream.filter({}).empty());
        EXPECT_EQ(stream.status, WarnEmptyResult);
        EXPECT_TRUE(SameBits(Get(stream.state), state));
        EXPECT_EQ(stream.phase, phase);
    }
}

TEST(Polyphase, ALongDelayMaySpanSeveralBlocks) {
    const Setting setting{Interpolate, 4, 1, 101, true};
    Stream<DBL> stream(setting, NoiseSignal(101, 5, false), 1);
    EXPECT_TRUE(stream.filter(NoiseSignal(7, 6, false)).empty());
    EXPECT_EQ(stream.delayLeft, 50 - 28);
    EXPECT_EQ(stream.filter(NoiseSignal(7, 6, false)).size(), 28U - 22U);
    EXPECT_EQ(stream.delayLeft, 0);
}

TEST(Polyphase, ChecksComeInOrderAndFailuresEmptyTheStream) {
    struct Case {
        int32_t mode, L, M, taps, n;
        uint8_t reset, removeDelay;
        int32_t delayLeft, stateSize;
        ErrorCode code;
    };
    const Case cases[] = {
        {9, 0, 1, 0, 0, 1, 1, 0, 0, ErrOrderNotPositive},
        {9, 0, 1, 4, 3, 1, 1, 0, 0, ErrNotStrictlyPositive},
        {0, 1, 0, 4, 3, 1, 1, 0, 0, ErrNotStrictlyPositive},
        {4, 1, 1, 4, 3, 0, 1, -1, 3, ErrInvalidSelector},
        {-1, 1, 1, 4, 3, 0, 1, -1, 3, ErrInvalidSelector},
        {0, 1, 1, 4, 3, 0, 1, -1, 3, ErrNegativeSetting},
        {0, 1, 1, 4, 3, 1, 1, 0, 3, ErrBadTapCount},
        {0, 1, 1, 4, 0, 1, 1, 0, 3, ErrBadTapCount},
        {1, 3, 1, 4, 3, 0, 0, 0, 3, ErrStateSizeMismatch},
        {2, 3, 2, 4, 3, 0, 0, 0, 2, ErrStateSizeMismatch},
    };
    for (const Case &c : cases) {
        SCOPED_TRACE(c.code);
        Array1D<DBL> x(c.n), y(2), state(c.stateSize), h(c.taps);
        int32_t delayLeft = c.delayLeft, phase = 1;
        EXPECT_EQ(ppMultiRateFIRH_DBL(x.handle(), y.handle(), state.handle(), c.mode, c.L, c.M,
                                      h.handle(), 1.0, &c.reset, &c.removeDelay, &delayLeft,
                                      &phase),
                  c.code);
        EXPECT_EQ(y.size(), 0);
        EXPECT_EQ(state.size(), 0);
        EXPECT_EQ(delayLeft, 0);
        EXPECT_EQ(phase, 0);
    }
}

} // namespace

} // namespace qx::test
