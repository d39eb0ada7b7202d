#include "qx/filtering.h"

#include "qx/errors.h"
#include "tests/support/hostile_host.h"
#include "tests/support/recipe.h"
#include "tests/support/transform_reference.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <cmath>
#include <functional>
#include <limits>
#include <memory>

namespace qx::test {
namespace {

const uint8_t clears = 0;
const uint8_t keeps = 1;
constexpr double tiny = std::numeric_limits<double>::min();

// Poles inside the unit circle: the moduli of the coefficients after a[0] sum to less than that of
// a[0].
template <class Values>
Values Damped(Values a) {
    for (auto &value : a)
        if constexpr (requires { value.re; })
            value = {value.re / a.size(), value.im / a.size()};
        else
            value /= static_cast<double>(a.size());
    if constexpr (requires { a[0].re; })
        a[0] = {1.5, -0.5};
    else
        a[0] = 1.5;
    return a;
}

// The difference equation from rest.
LongSpectrum Filtered(const LongSpectrum &b, const LongSpectrum &a, const LongSpectrum &x) {
    LongSpectrum y(x.size());
    for (std::size_t t = 0; t < x.size(); ++t) {
        for (std::size_t k = 0; k < b.size() && k <= t; ++k)
            y[t] += b[k] * x[t - k];
        for (std::size_t k = 1; k < a.size() && k <= t; ++k)
            y[t] -= a[k] * y[t - k];
        if (!a.empty())
            y[t] /= a[0];
    }
    return y;
}

// A filter with its state, run by one of the exports.
template <class In, class Out>
using Stream = std::function<std::vector<Out>(const std::vector<In> &)>;

template <class SignalArray, class CoefficientArray, class Export, class Values>
auto TwoStates(Export filter, const Values &a, const Values &b) {
    auto xState = std::make_shared<SignalArray>(), yState = std::make_shared<SignalArray>();
    return [=](const auto &x) {
        const SignalArray signal(x);
        const CoefficientArray denominator(a), numerator(b);
        ErrorCode err = 99;
        EXPECT_EQ(filter(signal.handle(), denominator.handle(), numerator.handle(),
                         xState->handle(), yState->handle(), &keeps, &err),
                  0);
        EXPECT_EQ(err, 0);
        EXPECT_EQ(xState->size(), static_cast<int32_t>(b.size()) - 1);
        EXPECT_EQ(yState->size(), std::max(0, static_cast<int32_t>(a.size()) - 1));
        return signal.values();
    };
}

template <class SignalArray, class Export>
auto OneState(Export filter, const Signal &a, const Signal &b) {
    auto state = std::make_shared<SignalArray>();
    return [=](const auto &x) {
        const SignalArray signal(x);
        const DBLArray denominator(a), numerator(b);
        EXPECT_EQ(filter(signal.handle(), denominator.handle(), numerator.handle(), state->handle(),
                         &keeps),
                  0);
        return signal.values();
    };
}

template <class SignalArray, class Export>
auto Cascade(Export filter, int32_t form, const Signal &a, const Signal &b) {
    auto state = std::make_shared<SignalArray>();
    return [=](const auto &x) {
        const SignalArray signal(x);
        const DBLArray denominator(a), numerator(b);
        ErrorCode err = 99;
        EXPECT_EQ(filter(signal.handle(), &form, denominator.handle(), numerator.handle(),
                         state->handle(), &keeps, &err),
                  0);
        EXPECT_EQ(err, 0);
        EXPECT_EQ(state->size(), static_cast<int32_t>(a.size()));
        return signal.values();
    };
}

template <class SignalArray, class Export>
auto Samples(Export filter, int32_t mode, const Signal &a, const Signal &b) {
    auto state = std::make_shared<SignalArray>();
    return [=](auto x) {
        const DBLArray denominator(a), numerator(b);
        for (auto &sample : x)
            EXPECT_EQ(filter(&sample, mode, denominator.handle(), numerator.handle(),
                             state->handle(), &clears),
                      0);
        return x;
    };
}

template <class Range>
Range Slice(const Range &x, std::size_t from, std::size_t to) {
    return Range(x.begin() + static_cast<std::ptrdiff_t>(from),
                 x.begin() + static_cast<std::ptrdiff_t>(to));
}

// The whole signal in one call, against pieces of all lengths.
template <class Make, class Values>
auto InPiecesToTheBit(const Make &make, const Values &x) {
    auto whole = make();
    const auto expected = whole(x);
    qx::test::Noise noise(x.size());
    for (const uint32_t longest : {1U, 7U, 300U}) {
        auto stream = make();
        auto result = Slice(expected, 0, 0);
        for (std::size_t from = 0; from < x.size();) {
            const std::size_t to =
                std::min<std::size_t>(x.size(), from + 1 + noise.bits() % longest);
            const auto piece = stream(Slice(x, from, to));
            result.insert(result.end(), piece.begin(), piece.end());
            from = to;
        }
        EXPECT_TRUE(SameBits(result, expected)) << "pieces of up to " << longest;
    }
    return expected;
}

TEST(DirectFilter, FollowsTheDifferenceEquationInBlocksOfAnySize) {
    for (const int32_t na : {0, 1, 2, 6})
        for (const int32_t nb : {1, 2, 3, 70}) {
            SCOPED_TRACE(testing::Message() << na << " " << nb);
            constexpr double bound = 3e-15;
            const Signal x = RandomSignal(400, 1), b = RandomSignal(nb, 2);
            const Signal a = na == 0 ? Signal() : Damped(RandomSignal(na, 3));
            const std::vector<CDB> z = RandomComplex(400, 4), d = RandomComplex(nb, 5);
            const std::vector<CDB> c = na == 0 ? std::vector<CDB>() : Damped(RandomComplex(na, 6));
            const LongSpectrum expected = Filtered(ToLong(b), ToLong(a), ToLong(x));
            const LongSpectrum expectedOfComplex = Filtered(ToLong(b), ToLong(a), ToLong(z));

            const auto y = InPiecesToTheBit(
                [&] { return TwoStates<DBLArray, DBLArray>(IIR_Filter, a, b); }, x);
            EXPECT_LT(MaxError(y, expected), bound);
            const auto one =
                InPiecesToTheBit([&] { return OneState<DBLArray>(IIR_Filter_OneState, a, b); }, x);
            EXPECT_TRUE(SameBits(one, y));
            EXPECT_TRUE(
                SameBits(Samples<DBLArray>(IIR_Filter_PtbyPt, na == 0 ? 3 : 2, a, b)(x), y));

            const auto w = InPiecesToTheBit(
                [&] { return TwoStates<CDBArray, DBLArray>(CxSigIIR_Filter, a, b); }, z);
            EXPECT_LT(MaxError(w, expectedOfComplex), bound);
            const auto oneComplex = InPiecesToTheBit(
                [&] { return OneState<CDBArray>(CxSigIIR_Filter_OneState, a, b); }, z);
            EXPECT_TRUE(SameBits(oneComplex, w));
            EXPECT_TRUE(SameBits(Samples<CDBArray>(CxSigIIR_Filter_PtbyPt, 2, a, b)(z), w));

            const auto v = InPiecesToTheBit(
                [&] { return TwoStates<CDBArray, CDBArray>(CxIIR_Filter_H, c, d); }, z);
            EXPECT_LT(MaxError(v, Filtered(ToLong(d), ToLong(c), ToLong(z))), bound);

            const auto u = InPiecesToTheBit(
                [&] {
                    auto xState = std::make_shared<DBLArray>();
                    auto yState = std::make_shared<CDBArray>();
                    return [&, xState, yState](const Signal &piece) {
                        const DBLArray signal(piece);
                        const CDBArray denominator(c), numerator(d), out;
                        EXPECT_EQ(CxIIRReSig_Filter_H(signal.handle(), out.handle(),
                                                      denominator.handle(), numerator.handle(),
                                                      xState->handle(), yState->handle(), &keeps),
                                  0);
                        EXPECT_TRUE(SameBits(signal.values(), piece));
                        return out.values();
                    };
                },
                x);
            EXPECT_LT(MaxError(u, Filtered(ToLong(d), ToLong(c), ToLong(x))), bound);
        }
}

TEST(DirectFilter, SumsFromTheOldestSampleToTheNewest) {
    for (const int32_t nb : {2, 5, 64, 300}) {
        const Signal x = RandomSignal(1500, 1), b = RandomSignal(nb, 2);
        Signal expected(x.size());
        for (std::size_t t = 0; t < x.size(); ++t)
            for (std::size_t k = b.size(); k-- > 0;)
                if (k <= t)
                    expected[t] += b[k] * x[t - k];
        EXPECT_TRUE(SameBits(TwoStates<DBLArray, DBLArray>(IIR_Filter, Signal(), b)(x), expected));
    }
}

// Each section of direct form II in long double.
LongSpectrum ThroughSections(int order, const Signal &a, const Signal &b, LongSpectrum x) {
    for (std::size_t s = 0; s * static_cast<std::size_t>(order) < a.size(); ++s) {
        const auto at = static_cast<std::size_t>(order) * s;
        Signal denominator = Slice(a, at, at + static_cast<std::size_t>(order));
        denominator.insert(denominator.begin(), 1.0);
        x = Filtered(ToLong(Slice(b, at + s, at + s + static_cast<std::size_t>(order) + 1)),
                     ToLong(denominator), x);
    }
    return x;
}

TEST(CascadeFilter, IsItsSectionsInSequenceInBlocksOfAnySize) {
    for (const int32_t form : {0, 1})
        for (const int32_t sections : {1, 2, 3, 4, 5, 7, 8, 9, 12, 17}) {
            SCOPED_TRACE(testing::Message() << form << " " << sections);
            const int order = form == 0 ? 2 : 4;
            Signal a = RandomSignal(order * sections, 1),
                   b = RandomSignal((order + 1) * sections, 2);
            for (double &value : a)
                value *= 0.9 / order;
            for (std::size_t i = 0; i < b.size(); i += static_cast<std::size_t>(order) + 1)
                b[i] += 1.5;
            // A decaying response, and more samples than pass through the sections together.
            Signal x = RandomSignal(5000, 3);
            std::fill(x.begin() + 500, x.begin() + 3000, 0.0);
            const auto y =
                InPiecesToTheBit([&] { return Cascade<DBLArray>(IIR_Filter2, form, a, b); }, x);
            EXPECT_LT(MaxError(y, ThroughSections(order, a, b, ToLong(x))), 1e-14);
            x.resize(300);
            EXPECT_TRUE(
                SameBits(Samples<DBLArray>(IIR_Filter_PtbyPt, form, a, b)(x), Slice(y, 0, 300)));

            const std::vector<CDB> z = RandomComplex(200, 4);
            const auto w = InPiecesToTheBit(
                [&] { return Cascade<CDBArray>(CxSigIIR_Filter2, form, a, b); }, z);
            EXPECT_LT(MaxError(w, ThroughSections(order, a, b, ToLong(z))), 1e-14);
            EXPECT_TRUE(SameBits(Samples<CDBArray>(CxSigIIR_Filter_PtbyPt, form, a, b)(z), w));
        }
}

// A block is passed through in tiles, each longer than the way through the sections.
TEST(CascadeFilter, EndsOfLongBlocksPassThroughAllSections) {
    for (const int32_t form : {0, 1})
        for (const int32_t sections : {5, 17})
            for (const int32_t n : {2047, 2049, 4095, 4097, 4105, 6145}) {
                SCOPED_TRACE(testing::Message() << form << " " << sections << " " << n);
                const int order = form == 0 ? 2 : 4;
                Signal a = RandomSignal(order * sections, 5),
                       b = RandomSignal((order + 1) * sections, 6);
                for (double &value : a)
                    value *= 0.9 / order;
                for (std::size_t i = 0; i < b.size(); i += static_cast<std::size_t>(order) + 1)
                    b[i] += 1.5;
                const Signal x = RandomSignal(n, 7);
                const auto y = Cascade<DBLArray>(IIR_Filter2, form, a, b)(x);
                auto stream = Cascade<DBLArray>(IIR_Filter2, form, a, b);
                Signal inPieces;
                for (std::size_t from = 0; from < x.size(); from += 40) {
                    const Signal piece = stream(Slice(x, from, std::min(x.size(), from + 40)));
                    inPieces.insert(inPieces.end(), piece.begin(), piece.end());
                }
                EXPECT_TRUE(SameBits(y, inPieces));
                EXPECT_LT(MaxError(y, ThroughSections(order, a, b, ToLong(x))), 1e-14);
            }
}

// Unused lanes, a NaN and the flush to zero in one lane must not affect other samples.
TEST(CascadeFilter, NaNAndVanishingValuesDoNotSpread) {
    const Signal a = {-0.5, 0.1, 0.3, 0.2, 0.0, 0.0}, b = {1, 2, 1, 0.5, 0, 0.25, 1e-280, 0, 0};
    Signal x = RandomSignal(400, 5);
    for (std::size_t i = 120; i < 240; ++i)
        x[i] *= 1e-150;
    x[350] = std::nan("");
    const auto whole = Cascade<DBLArray>(IIR_Filter2, 0, a, b)(x);
    const auto single = Samples<DBLArray>(IIR_Filter_PtbyPt, 0, a, b)(x);
    for (std::size_t i = 0; i < 350; ++i) {
        EXPECT_EQ(whole[i], single[i]);
        EXPECT_TRUE(whole[i] == 0.0 || std::fabs(whole[i]) > tiny);
    }
    EXPECT_EQ(whole[230], 0.0);
    for (std::size_t i = 350; i < 400; ++i)
        EXPECT_TRUE(std::isnan(whole[i]));
}

TEST(Filtering, ARecursionDecaysToZeroAndNotToDenormals) {
    Signal x(3000);
    x[0] = 1.0;
    const auto direct = TwoStates<DBLArray, DBLArray>(IIR_Filter, Signal{1, -0.7}, Signal{1})(x);
    const auto cascade = Cascade<DBLArray>(IIR_Filter2, 0, {-0.7, 0}, {1, 0, 0})(x);
    const auto complex = TwoStates<CDBArray, DBLArray>(CxSigIIR_Filter, Signal{2, -1.4}, Signal{1})(
        std::vector<CDB>(1, {1.0, -1e-300}));
    EXPECT_EQ(complex[0].im, -5e-301);
    for (const Signal &y : {direct, cascade}) {
        EXPECT_EQ(y.back(), 0.0);
        for (const double value : y)
            EXPECT_TRUE(value == 0.0 || value > tiny);
        EXPECT_GT(y[1900], 0.0) << "not flushed too early";
    }
    // The last section of a cascade, of however many, has outputs below its states.
    for (std::size_t sections = 1; sections <= 17; ++sections) {
        Signal b(3 * sections);
        for (std::size_t s = 0; s < sections; ++s)
            b[3 * s] = s + 1 < sections ? 1.0 : 1e-300;
        const auto small =
            Cascade<DBLArray>(IIR_Filter2, 0, Signal(2 * sections), b)(Signal(100, 1e-10));
        EXPECT_EQ(small, Signal(100)) << sections << " sections";
    }
    const auto infinite =
        TwoStates<DBLArray, DBLArray>(IIR_Filter, Signal{0}, Signal{1})(Signal{3});
    EXPECT_TRUE(std::isinf(infinite[0])) << "a[0] is not tested";
}

TEST(Filtering, StatesHaveTheSizeOfTheCoefficients) {
    const DBLArray x{1, 2, 3}, one{1}, two{2}, xState{5}, yState{7, 8};
    ErrorCode err = 99;
    IIR_Filter(x.handle(), one.handle(), one.handle(), xState.handle(), yState.handle(), &keeps,
               &err);
    EXPECT_EQ(err, 0);
    EXPECT_EQ(x.values(), (Signal{1, 2, 3}));
    EXPECT_EQ(xState.size() + yState.size(), 0);
    IIR_Filter(x.handle(), two.handle(), one.handle(), xState.handle(), yState.handle(), &keeps,
               &err);
    EXPECT_EQ(x.values(), (Signal{0.5, 1, 1.5}));
}

// One flag keeps the state, the other clears it, and a state of another size is cleared in any
// case.
TEST(Filtering, TheFlagsHaveOppositeMeanings) {
    const DBLArray a{1, -0.5}, b{1, 1};
    for (const int flag : {0, 1, 2, 255}) {
        const auto byte = static_cast<uint8_t>(flag);
        const DBLArray x{1.0}, xState{10.0}, yState{100.0}, joinedX{1.0}, joined{10.0, 100.0};
        ErrorCode err = 99;
        IIR_Filter(x.handle(), a.handle(), b.handle(), xState.handle(), yState.handle(), &byte,
                   &err);
        EXPECT_EQ(x[0], flag == 1 ? 61.0 : 1.0);
        EXPECT_EQ(xState[0], 1.0);
        EXPECT_EQ(yState[0], x[0]);
        IIR_Filter_OneState(joinedX.handle(), a.handle(), b.handle(), joined.handle(), &byte);
        EXPECT_EQ(joinedX[0], x[0]);
        const DBLArray sections{-0.5, 0}, numerators{1, 1, 0}, cascadeX{1.0}, memory{10.0, 0.0};
        const int32_t form = 0;
        IIR_Filter2(cascadeX.handle(), &form, sections.handle(), numerators.handle(),
                    memory.handle(), &byte, &err);
        EXPECT_EQ(cascadeX[0], flag == 1 ? 16.0 : 1.0);
        double sample = 1.0;
        const DBLArray state{10.0, 100.0};
        IIR_Filter_PtbyPt(&sample, 2, a.handle(), b.handle(), state.handle(), &byte);
        EXPECT_EQ(sample, flag == 0 ? 61.0 : 1.0);
    }
    for (const bool xIsWrong : {true, false}) {
        const DBLArray x{1.0}, xState(xIsWrong ? Signal{9, 10} : Signal{10}),
            yState(xIsWrong ? Signal{100} : Signal());
        ErrorCode err = 99;
        IIR_Filter(x.handle(), a.handle(), b.handle(), xState.handle(), yState.handle(), &keeps,
                   &err);
        EXPECT_EQ(x[0], 1.0) << "the other state is discarded, too";
    }
}

TEST(Filtering, TheFIRModeOfOneSampleIgnoresA) {
    const DBLArray a{1, -0.5}, b{3, 2}, none;
    for (const int32_t mode : {2, 3}) {
        const DBLArray state;
        double first = 1.0, second = 0.0;
        IIR_Filter_PtbyPt(&first, mode, a.handle(), b.handle(), state.handle(), &clears);
        IIR_Filter_PtbyPt(&second, mode, a.handle(), b.handle(), state.handle(), &clears);
        EXPECT_EQ(state.size(), mode == 3 ? 1 : 2);
        EXPECT_EQ(second, mode == 3 ? 2.0 : 3.5);
        double missing = 1.0;
        EXPECT_EQ(
            IIR_Filter_PtbyPt(&missing, mode, a.handle(), none.handle(), state.handle(), &clears),
            ErrSizesDisagree);
    }
}

// The sizes of x and of the states after a call whose coefficients do not match.
TEST(Filtering, EachExportCleansUpInItsOwnWay) {
    struct Case {
        Signal x, a, b;
        int32_t form;
        ErrorCode code;
        int32_t xLeft; // with separate states and with the cascade; -1: not checked
        int32_t cascadeLeft;
    };
    const Signal x = {1, 2, 3};
    for (const Case &c :
         {Case{{}, {1, 1}, {1, 1, 1}, 0, ErrEmptyInput, 0, 0}, Case{x, {}, {}, 0, 0, 3, 3},
          Case{x, {1, 1}, {}, 0, ErrSizesDisagree, 0, 0},
          Case{x, {}, {1, 1, 1}, 0, ErrSizesDisagree, -1, 0},
          Case{x, {1, 1}, {1, 1, 1}, 2, ErrInvalidSelector, -1, 3},
          Case{x, {1, 1}, {1, 1, 1}, 1, ErrCoefficientSizes, -1, 0},
          Case{x, {1, 1}, {1, 1}, 0, ErrCoefficientSizes, -1, 0},
          Case{x, {1, 1, 1}, {1, 1, 1}, 0, ErrCoefficientSizes, -1, 0}}) {
        SCOPED_TRACE(testing::Message() << c.code << " " << c.a.size() << " " << c.b.size());
        const DBLArray a(c.a), b(c.b);
        if (c.xLeft >= 0) {
            const DBLArray signal(c.x), xState{1, 2}, yState{3, 4}, joinedSignal(c.x), joined{1, 2};
            ErrorCode err = 99;
            EXPECT_EQ(IIR_Filter(signal.handle(), a.handle(), b.handle(), xState.handle(),
                                 yState.handle(), &keeps, &err),
                      0);
            EXPECT_EQ(err, c.code);
            EXPECT_EQ(signal.size(), c.xLeft);
            EXPECT_EQ(xState.size(), 2);
            EXPECT_EQ(yState.size(), 2);
            EXPECT_EQ(IIR_Filter_OneState(joinedSignal.handle(), a.handle(), b.handle(),
                                          joined.handle(), &keeps),
                      c.code);
            EXPECT_EQ(joinedSignal.size(), c.code == 0 ? 3 : 0);
            EXPECT_EQ(joined.size(), c.code == 0 ? 2 : 0);
        }
        const DBLArray signal(c.x), state{1, 2};
        ErrorCode err = 99;
        EXPECT_EQ(IIR_Filter2(signal.handle(), &c.form, a.handle(), b.handle(), state.handle(),
                              &keeps, &err),
                  0);
        EXPECT_EQ(err, c.code);
        EXPECT_EQ(signal.size(), c.cascadeLeft);
        if (!c.x.empty() && c.form < 2) {
            const DBLArray memory{1, 2};
            double sample = 0.75;
            EXPECT_EQ(IIR_Filter_PtbyPt(&sample, c.form, a.handle(), b.handle(), memory.handle(),
                                        &clears),
                      c.code);
            EXPECT_EQ(sample, c.code == 0 ? 0.75 : 0.0);
            EXPECT_EQ(memory.size(), c.code == 0 ? 2 : 0);
        }
    }
    CDB sample = {1, 2};
    const DBLArray a{1, 1}, b{1, 1, 1};
    const CDBArray state(2);
    EXPECT_EQ(CxSigIIR_Filter_PtbyPt(&sample, 7, a.handle(), b.handle(), state.handle(), &clears),
              ErrInvalidSelector);
    EXPECT_EQ(sample.re, 0.0);
    EXPECT_EQ(sample.im, 0.0);
    EXPECT_EQ(state.size(), 0);
}

TEST(Filtering, ARefusedStateIsEmptiedAndTheSignalIsNot) {
    for (const int32_t refused : {1, 2}) {
        const DBLArray x{1, 2, 3}, a{1, 1}, b{1, 1, 1}, xState{5}, yState{6, 7};
        ErrorCode err = 99;
        ResetHost(refused, 77);
        EXPECT_EQ(IIR_Filter(x.handle(), a.handle(), b.handle(), xState.handle(), yState.handle(),
                             &keeps, &err),
                  77);
        EXPECT_EQ(err, ErrOutOfMemory);
        EXPECT_EQ(x.size(), 3);
        EXPECT_EQ(refused == 1 ? xState.size() : yState.size(), 0);
        if (refused == 2) {
            EXPECT_EQ(xState.values(), (Signal{0, 0})) << "resized and cleared";
        }
    }
    const DBLArray a{1, 1}, b{1, 1, 1}, state;
    double sample = 1.0;
    ResetHost(1, -77);
    EXPECT_EQ(IIR_Filter_PtbyPt(&sample, 0, a.handle(), b.handle(), state.handle(), &clears),
              ErrOutOfMemory);
    EXPECT_EQ(sample, 0.0);
    ResetHost();
}

// Without coefficients, y equals x.
TEST(Filtering, ARealSignalPassesAnAbsentComplexFilter) {
    const DBLArray x{1, -2}, xState{3};
    const CDBArray none, y, yState;
    EXPECT_EQ(CxIIRReSig_Filter_H(x.handle(), y.handle(), none.handle(), none.handle(),
                                  xState.handle(), yState.handle(), &clears),
              0);
    EXPECT_TRUE(SameBits(y.values(), std::vector<CDB>{{1, 0}, {-2, 0}}));
    EXPECT_EQ(xState.size(), 1);
}

} // namespace
} // namespace qx::test
