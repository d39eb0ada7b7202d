#include "qx/qx.hpp"
#include "tests/support/heap_probe.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <cmath>
#include <complex>
#include <cstring>
#include <limits>
#include <thread>
#include <vector>

namespace {

typedef std::complex<double> Complex;
typedef std::vector<double> Samples;

template <class T>
T Value(std::size_t i) {
    const double x = std::sin(static_cast<double>(i * i % 1000)) + 0.001 * static_cast<double>(i);
    if constexpr (std::is_arithmetic_v<T>)
        return static_cast<T>(x);
    else
        return T(static_cast<typename T::value_type>(x),
                 static_cast<typename T::value_type>(0.5 - x));
}

template <class T>
std::vector<T> Signal(std::size_t n) {
    std::vector<T> x(n);
    for (std::size_t i = 0; i < n; ++i)
        x[i] = Value<T>(i);
    return x;
}

template <class T>
bool SameBits(std::span<const T> x, std::span<const T> y) {
    return x.size() == y.size() &&
           (x.empty() || std::memcmp(x.data(), y.data(), x.size_bytes()) == 0);
}

// Exports take their scratch memory from a separate region during the lifetime of this object.
class Workspace {
public:
    Workspace() {
        InitializeAnalysisWorkspaceH(1 << 20, &status_);
        EnableAnalysisWorkspaceH(&status_);
        EXPECT_EQ(status_.code, 0);
    }
    ~Workspace() {
        DisableAnalysisWorkspaceH(&status_);
        UninitializeAnalysisWorkspaceH(&status_);
    }

private:
    WorkspaceStatus status_{};
};

// All blocks together give the bits of one block, and again after a reset; then no block takes
// memory.
template <class In, class Out, class Stream>
void HasTheBitsOfTheWhole(const char *name, Stream stream, std::size_t mostPerInput = 1) {
    SCOPED_TRACE(name);
    const std::vector<In> x = Signal<In>(3000);
    const std::vector<Out> whole = stream(x);
    ASSERT_FALSE(whole.empty());
    for (int pass = 0; pass < 2; ++pass) {
        stream.reset();
        std::vector<Out> found(mostPerInput * x.size() + 64);
        std::size_t from = 0, filled = 0;
        for (const std::size_t size : {0, 700, 1, 2, 13, 699, 60, 700, 700, 125}) {
            const qx::test::HeapProbe heap;
            const auto part = stream(qx::returned, std::span<const In>(x).subspan(from, size),
                                     std::span(found).subspan(filled));
            ASSERT_TRUE(part) << part.status().text();
            EXPECT_TRUE(pass == 0 || heap.allocations() == 0) << "in a block of " << size;
            from += size;
            filled += part->size();
        }
        ASSERT_EQ(from, x.size());
        found.resize(filled);
        EXPECT_TRUE(SameBits<Out>(found, whole));
    }
}

TEST(Streams, HaveTheBitsOfTheWholeAndTakeNoMemory) {
    const Workspace workspace;
    const auto [a, b, zeros, poles, gain] = qx::filters::butterworth(0.1, 4);
    HasTheBitsOfTheWhole<double, double>("cascade", qx::filters::CascadeStream(a, b));
    HasTheBitsOfTheWhole<Complex, Complex>("complex cascade",
                                           qx::filters::CascadeComplexStream(a, b));
    const Samples forward{0.2, 0.3, 0.1}, back{1, -0.5, 0.2};
    HasTheBitsOfTheWhole<double, double>("direct", qx::filters::DirectStream(back, forward));
    HasTheBitsOfTheWhole<Complex, Complex>("complex direct",
                                           qx::filters::DirectComplexStream(back, forward));
    const std::vector<Complex> zForward{{0.2, 0.1}, {0.3, 0}}, zBack{{1, 0}, {0.1, 0.4}};
    HasTheBitsOfTheWhole<Complex, Complex>("complex filter",
                                           qx::filters::ComplexFilterStream(zBack, zForward));
    HasTheBitsOfTheWhole<double, Complex>("of real",
                                          qx::filters::ComplexFilterOfRealStream(zBack, zForward));

    const Samples taps = Signal<double>(31);
    const std::vector<float> singleTaps(taps.begin(), taps.end());
    constexpr auto rational = qx::multirate::Mode::rational;
    HasTheBitsOfTheWhole<double, double>("resample", qx::multirate::ResampleStream(3, 2, taps), 2);
    HasTheBitsOfTheWhole<Complex, Complex>(
        "resample", qx::multirate::ResampleComplexStream(3, 2, taps, rational, 1, 1), 2);
    HasTheBitsOfTheWhole<float, float>("resample",
                                       qx::multirate::ResampleSingleStream(2, 3, singleTaps));
    HasTheBitsOfTheWhole<std::complex<float>, std::complex<float>>(
        "resample", qx::multirate::ResampleComplexSingleStream(2, 3, singleTaps));
    HasTheBitsOfTheWhole<double, double>("interpolated",
                                         qx::multirate::InterpolatedFIRStream(3, taps));
    HasTheBitsOfTheWhole<double, double>("decimate", qx::multirate::DecimateStream(7, 1));
    HasTheBitsOfTheWhole<Complex, Complex>("decimate", qx::multirate::DecimateComplexStream(7));
    HasTheBitsOfTheWhole<double, double>("moving sum", qx::multirate::MovingSumStream(2, 5));
    HasTheBitsOfTheWhole<Complex, Complex>("moving sum",
                                           qx::multirate::MovingSumComplexStream(2, 5));
    HasTheBitsOfTheWhole<double, double>("CIC", qx::multirate::CICDecimateStream(3, 4));
    HasTheBitsOfTheWhole<double, double>("CIC", qx::multirate::CICInterpolateStream(3, 4), 4);
}

// After a first block of one sample, which allocates the state, one of 512, all that was declared.
template <class In, class Out, class Stream>
void TakesNoMemory(const char *name, Stream stream) {
    SCOPED_TRACE(name);
    const std::vector<In> x = Signal<In>(512);
    std::vector<Out> y(3000);
    stream(std::span<const In>(x).first(1), y);
    const qx::test::HeapProbe heap;
    EXPECT_TRUE(stream(qx::returned, std::span<const In>(x), std::span(y)));
    EXPECT_EQ(heap.allocations(), 0);
}

TEST(Streams, WithADeclaredLongestBlockTakeNoMemoryAfterTheFirst) {
    using qx::multirate::Mode;
    const Workspace workspace;
    const auto [a, b, zeros, poles, gain] = qx::filters::butterworth(0.1, 4);
    constexpr auto second = qx::filters::Form::second_order;
    TakesNoMemory<double, double>("cascade", qx::filters::CascadeStream(a, b, second, 512));
    const Samples taps = Signal<double>(31);
    const std::vector<float> singleTaps(taps.begin(), taps.end());
    for (const Mode mode : {Mode::same_rate, Mode::interpolate, Mode::decimate, Mode::rational})
        TakesNoMemory<double, double>("resample",
                                      qx::multirate::ResampleStream(5, 3, taps, mode, 1, 0, 512));
    TakesNoMemory<std::complex<float>, std::complex<float>>(
        "resample",
        qx::multirate::ResampleComplexSingleStream(7, 2, singleTaps, Mode::rational, 1, 0, 512));
    TakesNoMemory<double, double>("CIC", qx::multirate::CICInterpolateStream(3, 4, 1, false, 512));
    TakesNoMemory<double, double>("CIC", qx::multirate::CICDecimateStream(3, 4, 1, false, 512));
    TakesNoMemory<double, Complex>("shift", qx::multirate::FrequencyShiftStream(0.1, 1, 512));
    // 2^32 elements are refused, and not taken for 0.
    qx::multirate::CICInterpolateStream huge(1, 1 << 30, 1, false, 4);
    const Samples x(1);
    Samples y(1);
    EXPECT_EQ(huge(qx::returned, x, y).code(), ErrOutOfMemory);
    EXPECT_STREQ(huge(qx::returned, x, y).status().argument, "longest");
}

template <class In, class Stream>
void AgreesWithTheWhole(Stream stream) {
    const std::vector<In> x = Signal<In>(3000);
    const std::vector<Complex> whole = stream(x);
    stream.reset();
    std::size_t from = 0;
    for (const std::size_t size : {700, 1, 2, 13, 699, 60, 1525})
        for (const Complex &z : stream(std::span<const In>(x).subspan(from, size))) {
            EXPECT_NEAR(std::abs(z - whole[from]), 0, 1e-12) << from;
            ++from;
        }
    EXPECT_EQ(from, x.size());
}

TEST(Streams, ThatShiftFrequenciesAgreeWithTheWhole) {
    AgreesWithTheWhole<double>(qx::multirate::FrequencyShiftStream(0.123));
    AgreesWithTheWhole<Complex>(qx::multirate::FrequencyShiftComplexStream(-77, 1000));
}

TEST(Streams, ReportFailuresAndRestart) {
    const auto [a, b, zeros, poles, gain] = qx::filters::butterworth(0.1, 4);
    qx::filters::CascadeStream stream(a, Samples{1});
    const Samples x = Signal<double>(10);
    Samples y(10);
    EXPECT_EQ(stream(qx::returned, x, y).code(), ErrCoefficientSizes);
    EXPECT_THROW(stream(x), qx::Error);
    qx::filters::CascadeStream right(a, b);
    const auto found = right(qx::returned, x, std::span(y).first(9));
    EXPECT_EQ(found.code(), ErrSizeMismatch);
    EXPECT_STREQ(found.status().argument, "into");
    qx::multirate::DecimateStream never(0);
    EXPECT_STREQ(never(qx::returned, x, y).status().argument, "factor");
}

TEST(Failures, NameFunctionArgumentAndCode) {
    const Samples x{1, 2, 4};
    try {
        qx::stats::moment(x, 0);
        FAIL();
    } catch (const qx::Error &error) {
        EXPECT_STREQ(error.function(), "stats::moment");
        EXPECT_STREQ(error.argument(), "order");
        EXPECT_EQ(error.code(), ErrOrderNotPositive);
        EXPECT_STREQ(error.name(), "ErrOrderNotPositive");
        EXPECT_EQ(std::string(error.what()).find("stats::moment, order: "), 0U);
    }
    const auto none = qx::stats::moment(qx::returned, {}, 2);
    EXPECT_FALSE(none);
    EXPECT_EQ(none.code(), ErrEmptyInput);
    EXPECT_STREQ(none.status().argument, "x");
    const auto either = qx::stats::mse(qx::returned, x, {});
    EXPECT_EQ(either.code(), ErrEmptyInput);
    EXPECT_STREQ(either.status().argument, "") << "x or y is empty";
    EXPECT_EQ(qx::stats::mse(qx::returned, x, Samples{1}).code(), WarnLengthsDiffer);
    EXPECT_NO_THROW(qx::stats::mse(x, Samples{1})) << "warnings do not throw";
    EXPECT_TRUE(qx::stats::mse(qx::returned, x, Samples{1}));
    // Elements that do not make up a matrix give an empty one.
    EXPECT_EQ(qx::linalg::det(qx::returned, qx::Matrix<double>(2, 2, {1})).code(), ErrEmptyInput);
}

TEST(Failures, OfMemoryAreReturned) {
    if (!qx::test::HeapProbe::works())
        GTEST_SKIP() << "allocations cannot be made to fail here";
    const Samples x = Signal<double>(100);
    const auto all = [&] {
        const qx::test::HeapProbe heap;
        qx::filters::savgol(qx::returned, x, 2, 5);
        return heap.allocations();
    }();
    EXPECT_GT(all, 3);
    for (int32_t i = 1; i <= all; ++i) {
        const qx::test::HeapProbe heap(i);
        const auto found = qx::filters::savgol(qx::returned, x, 2, 5);
        EXPECT_EQ(found.code(), ErrOutOfMemory) << i;
        EXPECT_TRUE(found->empty());
    }
    const void *const far = x.data();
    const std::span<const double> tooLong(static_cast<const double *>(far), std::size_t{1} << 31);
    EXPECT_EQ(qx::stats::mean(qx::returned, tooLong).code(), ErrOutOfMemory);
}

TEST(Results, HaveTheBitsOfTheExports) {
    const Samples x = Signal<double>(50);
    const std::vector<Complex> spectrum = qx::fft::rfft(x);
    const auto in = static_cast<DBL1D>(QXHostCopy1D(QXTypeDBL, 50, x.data()));
    const auto out = static_cast<CDB1D>(QXHostNew1D(QXTypeCDB, 0));
    PlanSlot plan = nullptr;
    ASSERT_EQ(ReOXFFTH(in, out, &plan), 0);
    EXPECT_TRUE(SameBits<Complex>(spectrum, {static_cast<Complex *>(QXHostElements1D(out)),
                                             static_cast<std::size_t>((*out)->dimSize)}));
    std::vector<Complex> place(60);
    const auto filled = qx::fft::rfft(qx::into(place), x);
    EXPECT_EQ(filled.data(), place.data());
    EXPECT_TRUE(SameBits<Complex>(filled, spectrum));
    const auto few = qx::fft::rfft(qx::returned, qx::into(place = std::vector<Complex>(49)), x);
    EXPECT_EQ(few.code(), ErrSizeMismatch);
    EXPECT_STREQ(few.status().argument, "into");
    EXPECT_TRUE(few->empty());
    QXHostReleaseObject(plan);
    QXHostFree(out);
    QXHostFree(in);
}

TEST(Results, OfEveryKind) {
    // Several results, matrices, records, three dimensions, whole numbers, complex scalars.
    const qx::Matrix<double> a(2, 2, {0, 1, -1, 0});
    const auto eig = qx::linalg::eig(a);
    EXPECT_EQ(eig.values.size(), 2U);
    EXPECT_NEAR(std::abs(eig.values[0].imag()), 1, 1e-15);
    EXPECT_EQ(eig.vectors.rows, 2U);
    std::vector<double> inverse(4);
    EXPECT_EQ(qx::linalg::inv(qx::into(inverse), a).size(), 4U);
    EXPECT_EQ(inverse, (Samples{0, -1, 1, 0}));
    EXPECT_EQ(qx::linalg::det(qx::Matrix<Complex>(1, 1, {{3, 4}})), Complex(3, 4));
    EXPECT_EQ(qx::linalg::trace(qx::Matrix<double>(2, 2, {1, 9, 9, 2})), 3);

    const HistInterval intervals[] = {{0, 1, 1}, {1, 2, 1}};
    const auto histogram = qx::stats::histogram_intervals(Samples{0.5, 0.6, 1.5, 7}, intervals);
    EXPECT_EQ(histogram.counts, (std::vector<int32_t>{2, 1}));
    EXPECT_EQ(histogram.summary.above, 1);

    const Samples cube(27, 2.0), steps{0.5, 0.5, 0.5};
    const qx::CubeView<double> view{cube.data(), 3, 3, 3};
    EXPECT_NEAR(qx::calculus::integrate3(view, steps), 2, 1e-14);

    const auto [sine, phase] = qx::signals::sine(4, 0.25);
    EXPECT_NEAR(sine[1], 1, 1e-15);
    EXPECT_NEAR(phase, 0, 1e-9);
    EXPECT_EQ(qx::special::jv(0, 0.0), 1);
    EXPECT_EQ(qx::special::jv(0, Complex(0, 0)), Complex(1, 0));
    const auto [c, s] = qx::special::fresnel(0);
    EXPECT_EQ(c, 0);
    EXPECT_EQ(s, 0);
}

TEST(Results, OfRandomNumbersGoOn) {
    const Samples whole = qx::noise::uniform(100, 5);
    Samples both = qx::noise::uniform(40, 5);
    const Samples rest = qx::noise::uniform(60, 5, 1.0, 0, 40);
    both.insert(both.end(), rest.begin(), rest.end());
    EXPECT_TRUE(SameBits<double>(both, whole));
}

TEST(Defaults, AreThoseOfMost) {
    const Samples x = Signal<double>(200), t = [] {
        Samples all(200);
        for (std::size_t i = 0; i < all.size(); ++i)
            all[i] = 0.01 * static_cast<double>(i);
        return all;
    }();
    // A lowpass of unit gain at 0, a line without weights, the two-norm.
    const auto [a, b, zeros, poles, gain] = qx::filters::chebyshev1(0.1, 0.5, 3);
    EXPECT_NEAR(qx::filters::filter_cascade(Samples(500, 1.0), a, b).back(), 1, 1e-9);
    const auto line = qx::fit::line(t, t);
    EXPECT_NEAR(line.a, 1, 1e-12);
    EXPECT_NEAR(qx::linalg::norm(qx::Matrix<double>(1, 2, {3, 4})), 5, 1e-14);
    EXPECT_EQ(qx::linalg::matrix_rank(qx::Matrix<double>(2, 2, {1, 2, 2, 4})), 1);
    EXPECT_EQ(
        qx::linalg::lstsq(qx::Matrix<double>(2, 1, {1, 1}), qx::Matrix<double>(2, 1, {1, 3})).rows,
        1U);
    EXPECT_EQ(qx::windows::apply(Samples(8, 1.0), qx::windows::Selector::hanning).size(), 8U);
    const auto smooth = qx::fit::smoothing_spline(t, x);
    EXPECT_EQ(smooth.values.size(), x.size());
    EXPECT_EQ(qx::fit::b_spline(t, x, 3, 5).values.size(), x.size());
    EXPECT_NEAR(qx::signals::convolve(Samples{1, 2}, Samples{1, 1})[1], 3, 1e-15);
    EXPECT_EQ(qx::signals::unwrap(Samples{0, 6.2}).size(), 2U);
    EXPECT_EQ(qx::fft::dct(x, 200).size(), 200U);
    EXPECT_EQ(qx::poly::multiply(Samples{1, 1}, Samples{1, 1}), (Samples{1, 2, 1}));
    EXPECT_EQ(qx::poly::derivative(Samples{1, 1, 3}), (Samples{1, 6}));
    EXPECT_NEAR(qx::stats::norm_point(0.975), 1.959963984540054, 1e-15);
    EXPECT_NEAR(qx::stats::norm(1.959963984540054), 0.975, 1e-15);
    EXPECT_NEAR(qx::stats::norm(20, qx::stats::What::sf), 2.7536241186062337e-89, 1e-102);
    EXPECT_EQ(qx::special::gamma(5), 24);
    EXPECT_NEAR(qx::special::gammainc(2, 3), 0.8008517265285442, 1e-15);
    EXPECT_NEAR(qx::special::beta(2, 3), 1. / 12, 1e-16);
    EXPECT_NEAR(qx::special::ellipk(0.5), 1.8540746773013719, 1e-15);
    EXPECT_EQ(qx::stats::mode(Samples{1, 1, 2}, 0).size(), 1U);
    EXPECT_GT(qx::measure::tones(x, 2).amplitudes.size(), 0U);
    Samples pulse(100, 0.0);
    std::fill(pulse.begin() + 30, pulse.begin() + 60, 1.0);
    EXPECT_NEAR(qx::measure::levels(pulse).high, 1, 0.01);
    EXPECT_EQ(qx::measure::trigger(pulse, 0.5).index, 30);
    EXPECT_NEAR(qx::calculus::integrate(t, 0.01), 1.99 * 1.99 / 2, 1e-9);
}

TEST(Threads, HavePlansOfTheirOwn) {
    const Samples x = Signal<double>(64), y = Signal<double>(100);
    const auto first = qx::fft::rfft(x), second = qx::fft::rfft(y);
    const auto alternate = [&](bool &right) {
        for (int i = 0; i < 100; ++i)
            right = right && qx::fft::rfft(x) == first && qx::fft::rfft(y) == second;
    };
    bool right[2] = {true, true};
    std::thread one(alternate, std::ref(right[0])), other(alternate, std::ref(right[1]));
    one.join();
    other.join();
    EXPECT_TRUE(right[0] && right[1]);
}

// The block sizes of a stream that restarts after each failure and reset.
const std::size_t kBlocks[] = {0, 700, 1, 2, 13, 699, 60, 1525};

TEST(RunningStream, HasTheBitsOfTheWholeAndTheDefinitions) {
    const Samples x = Signal<double>(3000);
    qx::stats::RunningStream stream;
    EXPECT_TRUE(std::isnan(stream.summary().mean));
    const qx::stats::Summary whole = stream(x);
    stream.reset();
    std::size_t from = 0;
    for (const std::size_t size : kBlocks) {
        const qx::test::HeapProbe heap;
        stream(std::span(x).subspan(from, size));
        EXPECT_EQ(heap.allocations(), 0);
        from += size;
    }
    const qx::stats::Summary found = stream.summary();
    EXPECT_EQ(found.count, 3000);
    const auto bits = [](const qx::stats::Summary &one) {
        return Samples{one.mean, one.std, one.rms, one.least, one.greatest};
    };
    EXPECT_EQ(bits(found), bits(whole));
    EXPECT_NEAR(found.mean, qx::stats::mean(x), 1e-14);
    EXPECT_NEAR(found.std * found.std, qx::stats::moment(x, 2), 1e-13);
    EXPECT_NEAR(found.rms, qx::stats::rms(x), 1e-14);
    EXPECT_EQ(found.greatest, *std::max_element(x.begin(), x.end()));
}

TEST(TriggerStream, HasTheTriggersOfTheWholeAndReportsFailures) {
    const Samples x = Signal<double>(3000);
    typedef qx::measure::TriggerStream Stream;
    for (const auto slope :
         {Stream::Direction::rising, Stream::Direction::falling, Stream::Direction::either}) {
        Stream stream(1.5, slope, 0.1, 3);
        const qx::measure::Triggers whole = stream(x);
        ASSERT_GT(whole.indices.size(), 100U);
        for (std::size_t i = 0; i < whole.indices.size(); ++i) {
            const auto at = static_cast<std::size_t>(whole.indices[i]);
            EXPECT_LE(std::abs(whole.positions[i] - static_cast<double>(at) + 0.5), 0.5);
            if (slope == Stream::Direction::rising) {
                EXPECT_GE(x[at], 1.5);
            }
        }
        stream.reset();
        qx::measure::Triggers found;
        std::size_t from = 0;
        for (const std::size_t size : kBlocks) {
            const qx::measure::Triggers part = stream(std::span(x).subspan(from, size));
            found.positions.insert(found.positions.end(), part.positions.begin(),
                                   part.positions.end());
            found.indices.insert(found.indices.end(), part.indices.begin(), part.indices.end());
            from += size;
        }
        EXPECT_EQ(found.indices, whole.indices);
        ASSERT_EQ(found.positions.size(), whole.positions.size());
        for (std::size_t i = 0; i < found.positions.size(); ++i)
            EXPECT_NEAR(found.positions[i], whole.positions[i], 1e-12);
    }
    if (qx::test::HeapProbe::works()) {
        Stream shortOfMemory(1.5);
        shortOfMemory(std::span(x)); // allocates its own array
        for (const int32_t i : {1, 2, 9}) {
            const qx::test::HeapProbe heap(i);
            const auto found = shortOfMemory(qx::returned, std::span(x));
            EXPECT_EQ(found.code(), ErrOutOfMemory) << i;
            EXPECT_TRUE(found->indices.empty());
        }
        EXPECT_EQ(shortOfMemory(x).indices, Stream(1.5)(x).indices) << "restarted by the failure";
    }
    Stream wrong(1.5, Stream::Direction::rising, -1);
    const auto refused = wrong(qx::returned, std::span(x));
    EXPECT_FALSE(refused);
    EXPECT_EQ(refused.code(), ErrNegativeSetting);
}

TEST(PeakFinder, HasThePeaksOfTheWholeInBlocksOfAnySize) {
    const std::size_t n = 3060;
    Samples x(n);
    for (std::size_t i = 0; i < n; ++i)
        x[i] = std::cos(static_cast<double>(i) * 0.1 - 1); // periods of 62.8 samples
    for (const bool valleys : {false, true}) {
        qx::measure::PeakFinder finder(valleys ? -0.5 : 0.5, 5, valleys);
        const qx::measure::Peaks whole = finder.last(x);
        ASSERT_EQ(whole.locations.size(), valleys ? 48U : 49U);
        for (std::size_t i = 0; i < whole.locations.size(); ++i) {
            const double turns = static_cast<double>(i) + (valleys ? 0.5 : 0);
            EXPECT_NEAR(whole.locations[i], 10 + 20 * 3.141592653589793 * turns, 0.02);
            EXPECT_NEAR(whole.amplitudes[i], valleys ? -1 : 1, 0.001);
            EXPECT_NEAR(whole.derivatives[i], valleys ? 0.01 : -0.01, 0.001);
        }
        finder(std::span(x).first(100));
        finder.reset(); // forgets these samples
        qx::measure::Peaks found;
        const auto append = [&](const qx::measure::Peaks &part) {
            found.locations.insert(found.locations.end(), part.locations.begin(),
                                   part.locations.end());
            found.amplitudes.insert(found.amplitudes.end(), part.amplitudes.begin(),
                                    part.amplitudes.end());
        };
        std::size_t from = 0;
        for (const std::size_t size : {3, 1, 0, 4, 700, 1, 2, 13, 699, 60, 1525, 52}) {
            append(finder(std::span(x).subspan(from, size)));
            from += size;
        }
        ASSERT_EQ(from, n);
        append(finder.last());
        EXPECT_EQ(found.locations, whole.locations);
        EXPECT_EQ(found.amplitudes, whole.amplitudes);
        EXPECT_TRUE(finder.last(std::span(x).first(4)).locations.empty()) << "less than a window";
        EXPECT_EQ(finder.last(x).locations, whole.locations) << "a new stream";
    }
    EXPECT_EQ(qx::measure::PeakFinder(0.5).last(x).locations,
              qx::measure::PeakFinder(0.5, 5).last(x).locations)
        << "the width of Python";
    const auto refused = qx::measure::PeakFinder(0.5, 2)(qx::returned, x);
    EXPECT_EQ(refused.code(), ErrInvalidSelector);
    EXPECT_STREQ(refused.status().argument, "width");
}

} // namespace
