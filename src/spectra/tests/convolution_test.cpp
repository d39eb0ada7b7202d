#include "qx/convolution.h"

#include "qx/errors.h"
#include "spectra/convolution.h"
#include "spectra/deconvolution.h"
#include "tests/support/heap_probe.h"
#include "tests/support/hostile_host.h"
#include "tests/support/transform_reference.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <cmath>
#include <limits>

namespace qx::test {
namespace {

const double inf = std::numeric_limits<double>::infinity();
const double nan = std::numeric_limits<double>::quiet_NaN();

int32_t SizeOf(const std::vector<double> &x) { return static_cast<int32_t>(x.size()); }

template <class Range>
LongSpectrum Convolved(const Range &x, const Range &y) {
    const LongSpectrum a = ToLong(x), b = ToLong(y);
    LongSpectrum sums(a.size() + b.size() - 1);
    for (std::size_t i = 0; i < a.size(); ++i)
        for (std::size_t j = 0; j < b.size(); ++j)
            sums[i + j] += a[i] * b[j];
    return sums;
}

template <class Range>
Range ReversedConjugate(Range x) {
    std::reverse(x.begin(), x.end());
    if constexpr (requires { x[0].im; })
        for (CDB &z : x)
            z.im = -z.im;
    return x;
}

// The promised order of summation, term by term.
Signal InOrder(const Signal &outer, const Signal &inner) {
    Signal sums(outer.size() + inner.size() - 1);
    for (std::size_t i = 0; i < outer.size(); ++i)
        for (std::size_t j = 0; j < inner.size(); ++j)
            sums[i + j] += outer[i] * inner[j];
    return sums;
}

// All NaNs are equal, regardless of their bits.
bool SameValues(const Signal &a, const Signal &b) {
    return std::equal(a.begin(), a.end(), b.begin(), b.end(), [](double x, double y) {
        return (std::isnan(x) && std::isnan(y)) || std::memcmp(&x, &y, sizeof x) == 0;
    });
}

qx::ConstRealVector View(const Signal &x) { return {x.data(), SizeOf(x)}; }
qx::RealVector View(Signal &x) { return {x.data(), SizeOf(x)}; }

Signal Directly(const Signal &x, const Signal &y) {
    Signal out(x.size() + y.size() - 1, 99.0);
    EXPECT_EQ(qx::ConvolveReal(View(x), View(y), qx::ConvolveDirectly, View(out)), 0);
    return out;
}

Signal CorrelatedDirectly(const Signal &x, const Signal &y) {
    Signal out(x.size() + y.size() - 1, 99.0);
    EXPECT_EQ(
        qx::CorrelateReal(View(x), View(y), qx::ConvolveDirectly, qx::NotNormalized, View(out)), 0);
    return out;
}

struct Lengths {
    int32_t nx, ny;
};
// Lengths around the number of sums kept in registers, and of outputs and taps in a tile.
const Lengths DirectLengths[] = {{1, 1},   {1, 5},    {5, 1},    {3, 3},     {2, 47},   {49, 13},
                                 {64, 64}, {257, 40}, {40, 513}, {700, 701}, {1200, 3}, {3, 1201}};

TEST(Convolution, DirectSumsKeepTheirOrderToTheBit) {
    for (const auto &[nx, ny] : DirectLengths) {
        SCOPED_TRACE(testing::Message() << nx << " " << ny);
        const Signal x = RandomSignal(nx, 1), y = RandomSignal(ny, 2);
        EXPECT_TRUE(SameBits(Directly(x, y), InOrder(x, y)));
        EXPECT_TRUE(SameBits(CorrelatedDirectly(x, y), InOrder(y, ReversedConjugate(x))));
    }
}

TEST(Convolution, InfinitiesAffectOnlyTheirOutputs) {
    for (const auto &[nx, ny] : {Lengths{300, 40}, Lengths{40, 300}, Lengths{50, 50}})
        for (const double broken : {inf, -inf, nan})
            for (const int32_t at : {ny / 3, 0, ny - 1}) { // the outer taps pass the ends last
                Signal x = RandomSignal(nx, 1), y = RandomSignal(ny, 2);
                y[static_cast<std::size_t>(at)] = broken;
                EXPECT_TRUE(SameValues(Directly(x, y), InOrder(x, y))) << at;
                EXPECT_TRUE(SameValues(Directly(y, x), InOrder(y, x))) << at;
                x[static_cast<std::size_t>(nx) - 2] = inf;
                EXPECT_TRUE(SameValues(Directly(x, y), InOrder(x, y))) << at;
            }
}

// The window of the longer sequence is traversed in ascending order; x counts as the shorter one if
// the lengths are equal.
TEST(Convolution, ComplexDirectSumsKeepTheirOrderToTheBit) {
    for (const auto &[nx, ny] : DirectLengths) {
        SCOPED_TRACE(testing::Message() << nx << " " << ny);
        const std::vector<CDB> x = RandomComplex(nx, 1), y = RandomComplex(ny, 2);
        const std::vector<CDB> &longer = nx > ny ? x : y, &shorter = nx > ny ? y : x;
        std::vector<CDB> expected(x.size() + y.size() - 1), out = expected;
        for (std::size_t i = 0; i < longer.size(); ++i)
            for (std::size_t j = 0; j < shorter.size(); ++j) {
                const CDB a = shorter[j], b = longer[i];
                expected[i + j].re += a.re * b.re - a.im * b.im;
                expected[i + j].im += a.im * b.re + a.re * b.im;
            }
        ASSERT_EQ(qx::ConvolveComplex({x.data(), nx}, {y.data(), ny}, qx::ConvolveDirectly,
                                      {out.data(), nx + ny - 1}),
                  0);
        EXPECT_TRUE(SameBits(out, expected));
    }
}

TEST(Convolution, BothAlgorithmsAgreeWithTheDefinition) {
    for (const auto &[nx, ny] : {Lengths{1, 1}, Lengths{2, 1}, Lengths{12, 12}, Lengths{100, 7},
                                 Lengths{7, 100}, Lengths{333, 517}}) {
        SCOPED_TRACE(testing::Message() << nx << " " << ny);
        const Signal x = RandomSignal(nx, 1), y = RandomSignal(ny, 2);
        const std::vector<CDB> z = RandomComplex(nx, 3), w = RandomComplex(ny, 4);
        const LongSpectrum convolved = Convolved(x, y), complexConvolved = Convolved(z, w);
        const LongSpectrum correlated = Convolved(ReversedConjugate(x), y);
        const LongSpectrum complexCorrelated = Convolved(ReversedConjugate(z), w);
        const LongSpectrum own = Convolved(ReversedConjugate(x), x);
        const DBLArray realX(x), realY(y);
        const CDBArray complexZ(z), complexW(w);
        DBLArray out(3);
        CDBArray complexOut(3);
        for (const int32_t algorithm : {0, 1}) {
            ErrorCode err = 99;
            constexpr double bound = 2e-15;
            EXPECT_EQ(Convolution(realX.handle(), realY.handle(), out.handle(), &algorithm, &err),
                      0);
            EXPECT_EQ(err, 0);
            EXPECT_LT(MaxError(out.values(), convolved), bound);
            EXPECT_EQ(Rxy(realX.handle(), realY.handle(), out.handle(), &algorithm, &err), 0);
            EXPECT_EQ(err, 0);
            EXPECT_LT(MaxError(out.values(), correlated), bound);
            EXPECT_EQ(Rxy(realX.handle(), realX.handle(), out.handle(), &algorithm, &err), 0);
            EXPECT_LT(MaxError(out.values(), own), bound) << "with itself";
            EXPECT_EQ(CxConvolution(complexZ.handle(), complexW.handle(), complexOut.handle(),
                                    algorithm, 0, 9),
                      0)
                << "a convolution has no normalization";
            EXPECT_LT(MaxError(complexOut.values(), complexConvolved), bound);
            EXPECT_EQ(CxConvolution(complexZ.handle(), complexW.handle(), complexOut.handle(),
                                    algorithm, 1, 0),
                      0);
            EXPECT_LT(MaxError(complexOut.values(), complexCorrelated), bound);
        }
        const DBLArray inPlace(x);
        ErrorCode err = 99;
        EXPECT_EQ(AutoCorrelation(inPlace.handle(), &err), 0);
        EXPECT_EQ(err, 0);
        EXPECT_LT(MaxError(inPlace.values(), own), 2e-15);
    }
}

TEST(Convolution, NormalizationDividesByTheNumberOfTermsOrByTheLength) {
    const double terms[] = {1, 2, 3, 3, 3, 2, 1};
    const Signal x = RandomSignal(5, 1), y = RandomSignal(3, 2);
    const DBLArray longer(x), shorter(y);
    const CDBArray z(RandomComplex(3, 1)), w(RandomComplex(5, 2));
    const int32_t direct = 0;
    ErrorCode err = 0;
    DBLArray plain, unbiased, biased;
    CDBArray plainComplex, unbiasedComplex;
    for (const auto &[a, b] : {std::pair(&longer, &shorter), std::pair(&shorter, &longer)}) {
        Rxy80(a->handle(), b->handle(), plain.handle(), &direct, 0, &err);
        Rxy80(a->handle(), b->handle(), unbiased.handle(), &direct, 1, &err);
        Rxy80(a->handle(), b->handle(), biased.handle(), &direct, 2, &err);
        for (int i = 0; i < 7; ++i) {
            EXPECT_EQ(unbiased[i], plain[i] / terms[i]);
            EXPECT_EQ(biased[i], plain[i] / 5);
        }
    }
    CxConvolution(z.handle(), w.handle(), plainComplex.handle(), 0, 1, 0);
    CxConvolution(z.handle(), w.handle(), unbiasedComplex.handle(), 0, 1, 1);
    for (int i = 0; i < 7; ++i) {
        EXPECT_EQ(unbiasedComplex[i].re, plainComplex[i].re / terms[i]);
        EXPECT_EQ(unbiasedComplex[i].im, plainComplex[i].im / terms[i]);
    }
    const DBLArray single{-3.0};
    AutoCorrelation80(single.handle(), 2, &err);
    EXPECT_EQ(single[0], 9.0);
}

TEST(Convolution, TransformLengthsHaveSmallPrimesButNot23) {
    const auto isSmooth = [](int32_t m) {
        for (int32_t p = 2; p <= 43; ++p)
            while (p != 23 && m % p == 0)
                m /= p;
        return m == 1;
    };
    for (int32_t n = 1; n < 3000; ++n) {
        const int32_t m = qx::NextTransformLength(n);
        ASSERT_GE(m, n);
        ASSERT_TRUE(isSmooth(m));
        for (int32_t between = n; between < m; ++between)
            ASSERT_FALSE(isSmooth(between)) << between;
    }
    EXPECT_EQ(qx::NextTransformLength(23), 24);
    EXPECT_EQ(qx::NextTransformLength(46), 48);
    EXPECT_EQ(qx::NextTransformLength(std::numeric_limits<int32_t>::max()), 0);
}

TEST(Convolution, UnknownSelectorsAreHandledDifferentlyByEachExport) {
    const DBLArray x(RandomSignal(4)), y(RandomSignal(3));
    const CDBArray z(RandomComplex(4));
    const int32_t none = 7, direct = 0;
    ErrorCode err = 99;
    DBLArray out{1, 2, 3, 4, 5, 6};
    const auto before = out.values();
    EXPECT_EQ(Convolution(x.handle(), y.handle(), out.handle(), &none, &err), 0);
    EXPECT_EQ(err, 0);
    EXPECT_EQ(out.values(), before) << "nothing is done, without a code";
    Rxy80(x.handle(), y.handle(), out.handle(), &none, 2, &err);
    EXPECT_EQ(err, 0);
    EXPECT_EQ(out.values(), (Signal{0.25, 0.5, 0.75, 1.0, 1.25, 1.5})) << "still normalized";
    Rxy80(x.handle(), y.handle(), out.handle(), &direct, 3, &err);
    EXPECT_EQ(err, ErrInvalidSelector);
    EXPECT_EQ(out.size(), 0);
    for (const auto &[algorithm, correlate, normalization] :
         {std::tuple{7, 0, 0}, {7, 1, 0}, {0, 1, 3}, {0, 1, -1}}) {
        CDBArray complexOut(2);
        EXPECT_EQ(CxConvolution(z.handle(), z.handle(), complexOut.handle(), algorithm, correlate,
                                normalization),
                  ErrInvalidSelector);
        EXPECT_EQ(complexOut.size(), 0);
    }
}

TEST(Convolution, TheFirstFailureOfTheComplexFormLeavesTheOutput) {
    const CDBArray z(RandomComplex(4)), none;
    CDBArray out(3);
    EXPECT_EQ(CxConvolution(z.handle(), none.handle(), out.handle(), 0, 0, 0), ErrEmptyInput);
    EXPECT_EQ(out.size(), 3);
    for (const int32_t hostStatus : {77, -4242}) {
        CDBArray refused(3);
        ResetHost(1, hostStatus);
        EXPECT_EQ(CxConvolution(z.handle(), z.handle(), refused.handle(), 0, 1, 9), hostStatus);
        EXPECT_EQ(refused.size(), 0);
    }
    ResetHost();
}

TEST(AutoCorrelation, ContinuesAfterARefusedResizeWithinItsBlock) {
    const Signal values = RandomSignal(40);
    const DBLArray whole(values), refused(values), none;
    ErrorCode err = 99;
    AutoCorrelation80(whole.handle(), 2, &err);
    ResetHost(1, 77);
    EXPECT_EQ(AutoCorrelation80(refused.handle(), 2, &err), 0);
    EXPECT_EQ(err, 0);
    EXPECT_EQ(refused.size(), 79);
    for (int i = 0; i < 40; ++i)
        EXPECT_EQ(refused[i], whole[i]);
    qx::test::CheckBlocks();
    (*refused.handle())->dimSize = 40;
    ResetHost();

    AutoCorrelation80(none.handle(), 0, &err);
    EXPECT_EQ(err, ErrEmptyInput);
    EXPECT_TRUE(Host().reshapes.empty());
    const DBLArray unnormalized(values);
    AutoCorrelation80(unnormalized.handle(), 3, &err);
    EXPECT_EQ(err, ErrInvalidSelector);
    EXPECT_EQ(unnormalized.size(), 79) << "the result is kept";

    // Without work memory the values are unchanged, followed by zeros.
    if (!qx::test::HeapProbe::works())
        return;
    const DBLArray unfinished(values);
    {
        const qx::test::HeapProbe secondFails(2);
        AutoCorrelation80(unfinished.handle(), 0, &err);
    }
    EXPECT_EQ(err, ErrOutOfMemory);
    Signal expected = values;
    expected.resize(79);
    EXPECT_EQ(unfinished.values(), expected);
}

struct Division {
    ErrorCode status;
    Signal quotient;
};
Division Divided(const Signal &xy, const Signal &y) {
    const DBLArray product(xy), divisor(y);
    ErrorCode err = 99;
    const int32_t result = Deconvolution(product.handle(), divisor.handle(), &err);
    EXPECT_EQ(result, err) << "both return the code";
    return {err, product.values()};
}

TEST(Deconvolution, UndoesAConvolution) {
    for (const auto &[nq, ny] :
         {Lengths{1, 1}, Lengths{30, 3}, Lengths{3, 30}, Lengths{1000, 25}, Lengths{64, 65}}) {
        SCOPED_TRACE(testing::Message() << nq << " " << ny);
        const Signal q = RandomSignal(nq, 1);
        Signal y = RandomSignal(ny, 2);
        y[0] = 20; // keeps zeros away from the unit circle
        const Division division = Divided(Directly(q, y), y);
        EXPECT_EQ(division.status, 0);
        EXPECT_LT(MaxError(division.quotient, ToLong(q)), 2.7e-15);
    }
}

TEST(Deconvolution, DividesTheSeriesWhereTheSpectrumIsSingular) {
    // 1 + z is zero at half the sampling rate; leading zeros are skipped.
    for (const Signal &y : {Signal{1, 1}, Signal{0, 0, 2, 2}, Signal{0, 1, 0, 0, -1}}) {
        const Signal q = {3, -1, 4, 1, -5, 9, 2, -6};
        const Division division = Divided(Directly(q, y), y);
        EXPECT_EQ(division.status, 0);
        EXPECT_EQ(division.quotient, q) << "exact for integers";
    }
    const Division decaying = Divided({1e-300, 0, 0, 0, 0, 0, 0, 0}, {1e5, 1e5});
    EXPECT_EQ(decaying.quotient[1], -1e-305);
    // A sum over the taps times an impulse: the infinite one gives its own value only where the
    // impulse meets it, and NaN elsewhere.
    const Division infinite = Divided({inf, 1, 2, 3}, {1, 1});
    EXPECT_TRUE(SameValues(infinite.quotient, {inf, nan, nan}));
    const Division flushed = Divided({1e-300, 0, 0, 0, 0, 0, 0, 0}, {1e10, 1e10});
    EXPECT_EQ(flushed.quotient, Signal(7, 0.0)) << "no denormals";
}

// The test for a singular spectrum examines the real part of one frequency and the imaginary part
// of another.
TEST(Deconvolution, PairsTheSpectrumInItsOwnWay) {
    const double root = std::sqrt(2.0);
    const Signal impulse = {1, 0, 0, 0, 0, 0, 0, 0};
    // Re H[1] and Im H[3] are zero: the spectrum counts as singular, so the series is divided.
    const Division bySeries = Divided(impulse, {root, 1, 2 * root, 3});
    EXPECT_EQ(bySeries.quotient[0], 1 / root);
    // H[1] is zero but not detected: the spectra are divided, and the quotient is wrong.
    const Signal q = {3, -1, 4, 1, -5, 9};
    const Signal y = {1, -root, 1};
    const Division bySpectrum = Divided(Directly(q, y), y);
    EXPECT_EQ(bySpectrum.status, 0);
    EXPECT_GT(MaxError(bySpectrum.quotient, ToLong(q)), 1e-4);
}

TEST(Deconvolution, AnAllZeroDivisorStaysInsideItsBlocks) {
    const Signal x = {1, 2, 3, 4, 5, 6, 7, 8}; // as long as its transform
    EXPECT_EQ(Divided(x, {0, 0, 0}).quotient, (Signal{4, 5, 6, 7, 8, 0}));
    EXPECT_EQ(Divided(x, Signal(8)).quotient, (Signal{0}));
    EXPECT_EQ(Divided({5}, {0}).quotient, (Signal{0}));
    const Division broken = Divided({1, inf, 3, 4}, {0, 0});
    EXPECT_TRUE(std::isnan(broken.quotient[0])) << "the infinity enters every sum";
    qx::test::CheckBlocks();
}

TEST(Deconvolution, ChecksComeInOrderAndEmptyTheOutput) {
    constexpr int32_t longest = 8388608;
    const Signal tooLong(longest + 1), x = RandomSignal(3);
    for (const auto &[xy, y, code] : {std::tuple{tooLong, Signal(), ErrLengthTooLarge},
                                      {Signal(), tooLong, ErrLengthTooLarge},
                                      {Signal(longest), Signal(), ErrEmptyInput},
                                      {Signal(), x, ErrEmptyInput},
                                      {x, RandomSignal(4), ErrSizesDisagree}}) {
        const Division division = Divided(xy, y);
        EXPECT_EQ(division.status, code);
        EXPECT_TRUE(division.quotient.empty());
    }
    const DBLArray product(Directly(x, {5, 1})), divisor{5, 1};
    ErrorCode err = 99;
    ResetHost(1, 77);
    Deconvolution(product.handle(), divisor.handle(), &err);
    EXPECT_EQ(err, 0) << "the status of the resize is not checked";
    EXPECT_EQ(product.size(), 3);
    ResetHost();
}

} // namespace
} // namespace qx::test
