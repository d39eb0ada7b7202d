#include "qx/errors.h"
#include "qx/histogram.h"
#include "stats/histogram.h"
#include "tests/support/heap_probe.h"
#include "tests/support/hostile_host.h"
#include "tests/support/recipe.h"

#include <gtest/gtest.h>

#include <cmath>
#include <cstring>
#include <limits>
#include <numeric>
#include <vector>

namespace qx::test {
namespace {

constexpr double inf = std::numeric_limits<double>::infinity();
const double nan = std::numeric_limits<double>::quiet_NaN();

struct Histogram {
    std::vector<int32_t> counts;
    std::vector<double> centres;
    ErrorCode err;
};

Histogram HistogramOf(const std::vector<double> &samples, int32_t bins) {
    const DBLArray x(samples);
    const I32Array counts(2);
    const DBLArray centres(7);
    ErrorCode err = 1;
    EXPECT_EQ(histgran_head(x.handle(), &bins, counts.handle(), centres.handle(), &err), 0);
    return {counts.values(), centres.values(), err};
}

TEST(Histogram, CountsEverySampleOnce) {
    qx::test::Noise noise(3);
    std::vector<double> x;
    for (int i = 0; i < 5000; ++i)
        x.push_back(noise.symmetric() * noise.symmetric());
    for (const int32_t bins : {1, 2, 7, 100, 1000}) {
        const Histogram h = HistogramOf(x, bins);
        ASSERT_EQ(h.err, 0);
        ASSERT_EQ(h.counts.size(), static_cast<std::size_t>(bins));
        EXPECT_EQ(std::accumulate(h.counts.begin(), h.counts.end(), 0), 5000);
        // Compared with the edges rather than by division: a sample that is on an edge up to
        // rounding may be counted in the neighbouring bin.
        const auto [min, max] = std::minmax_element(x.begin(), x.end());
        const long double width = (static_cast<long double>(*max) - *min) / bins;
        for (int32_t k = 0; k < bins; ++k) {
            const long double lower = *min + k * width;
            const long double slack = width * 1e-9L;
            int32_t surely = 0, possibly = 0;
            for (const double value : x) {
                surely += value >= lower + slack && value < lower + width - slack;
                possibly += value >= lower - slack && value <= lower + width + slack;
            }
            EXPECT_GE(h.counts[static_cast<std::size_t>(k)], surely);
            EXPECT_LE(h.counts[static_cast<std::size_t>(k)], possibly);
            EXPECT_NEAR(h.centres[static_cast<std::size_t>(k)],
                        static_cast<double>(lower + width / 2), 1e-12);
        }
    }
}

TEST(Histogram, CentresAreAccumulated) {
    const std::vector<double> centres = HistogramOf({0.0, 1.0}, 10).centres;
    for (std::size_t k = 0; k < 10; ++k)
        EXPECT_NEAR(centres[k], 0.05 + 0.1 * static_cast<double>(k), 3e-16);
    EXPECT_EQ(centres[9], 0.9499999999999998) << "the drift of nine additions";
}

// Ranges whose width or number of bins per unit overflows or underflows.
TEST(Histogram, CountsAtBothEndsOfTheExponents) {
    constexpr double least = std::numeric_limits<double>::denorm_min();
    constexpr double most = std::numeric_limits<double>::max();
    const Histogram tiny = HistogramOf({0.0, 1 * least, 2 * least, 3 * least, 4 * least}, 4);
    EXPECT_EQ(tiny.counts, (std::vector<int32_t>{1, 1, 1, 2}));
    const Histogram wide = HistogramOf({-most, -0.6 * most, -0.1 * most, 1.0, 0.7 * most, most}, 4);
    EXPECT_EQ(wide.counts, (std::vector<int32_t>{2, 1, 1, 2}));
    for (std::size_t k = 0; k < 4; ++k)
        EXPECT_DOUBLE_EQ(wide.centres[k], (0.5 * static_cast<double>(k) - 0.75) * most);
    const Histogram one = HistogramOf({-most, most}, 1);
    EXPECT_EQ(one.counts, (std::vector<int32_t>{2}));
    EXPECT_EQ(one.centres, (std::vector<double>{0.0}));
}

TEST(Histogram, TreatsEdgesConstantsAndNaN) {
    const Histogram edge = HistogramOf({0.0, 1.0, 2.0, 4.0}, 4);
    // The sample is multiplied by the bins per unit; divided by the bin width, 0.3 would be one bin
    // lower.
    EXPECT_EQ(HistogramOf({0.0, 0.3, 1.0}, 10).counts[3], 1);
    EXPECT_EQ(edge.counts, (std::vector<int32_t>{1, 1, 1, 1}));
    const Histogram constant = HistogramOf({3.5, 3.5, 3.5}, 3);
    EXPECT_EQ(constant.counts, (std::vector<int32_t>{0, 0, 3}));
    EXPECT_EQ(constant.centres, (std::vector<double>{3.5, 3.5, 3.5}));
    const Histogram withNaN = HistogramOf({nan, 0.0, nan, 1.0, 0.2}, 2);
    EXPECT_EQ(withNaN.counts, (std::vector<int32_t>{2, 1}));
    EXPECT_EQ(HistogramOf({nan, nan}, 2).counts, (std::vector<int32_t>{0, 0}));
    EXPECT_EQ(HistogramOf({-inf, 0.0, inf}, 2).err, 0);
    EXPECT_EQ(HistogramOf({}, 4).err, ErrEmptyInput);
    EXPECT_EQ(HistogramOf({1.0}, 0).err, ErrEmptyInput);

    I32 counts[2];
    DBL centres[2];
    const DBL x[] = {-1.0, 0.0, 0.5, 1.0, 2.0, nan, 1e300, -0.25};
    EXPECT_EQ(qx::ArrayHistogram({x, 0}, 1.0, 0.0, {counts, 0}, {centres, 0}), ErrRangeReversed);
    EXPECT_EQ(qx::ArrayHistogram({x, 0}, 0.0, 1.0, {counts, 2}, {centres, 2}), ErrEmptyInput);
    EXPECT_EQ(qx::ArrayHistogram({x, 8}, 0.0, 1.0, {counts, 2}, {centres, 2}), 0);
    EXPECT_EQ(counts[0], 1);
    EXPECT_EQ(counts[1], 2) << "samples outside are dropped";
}

TEST(Histogram, ARefusedResizeIsReported) {
    const DBLArray x{1.0, 2.0};
    const int32_t bins = 4;
    for (const int32_t refused : {1, 2}) {
        const I32Array counts(2);
        const DBLArray centres(7);
        ErrorCode err = 0;
        qx::test::ResetHost(refused, 55);
        EXPECT_EQ(histgran_head(x.handle(), &bins, counts.handle(), centres.handle(), &err), 55);
        qx::test::ResetHost();
        EXPECT_EQ(err, ErrOutOfMemory);
        EXPECT_EQ(counts.size(), 0);
        EXPECT_EQ(centres.size(), 0);
    }
}

TEST(GeneralHistogram, ClosuresDecideTheEnds) {
    const auto test = [](int32_t closure, double x) {
        return qx::IntervalTest({1.0, 2.0, closure}, x);
    };
    const std::vector<double> points{0.5, 1.0, 1.5, 2.0, 2.5};
    const std::vector<std::vector<int32_t>> expected{
        {-1, 0, 0, 1, 1}, {-1, -1, 0, 0, 1}, {-1, 0, 0, 0, 1}, {-1, -1, 0, 1, 1}, {0, 0, 0, 0, 0}};
    for (int32_t closure = 0; closure < 5; ++closure)
        for (std::size_t i = 0; i < points.size(); ++i)
            EXPECT_EQ(test(closure, points[i]), expected[static_cast<std::size_t>(closure)][i])
                << closure << " " << points[i];
    EXPECT_EQ(test(0, nan), 1);
}

struct General {
    std::vector<int32_t> counts;
    HistSummary summary;
    ErrorCode err;
};

General GeneralOf(const std::vector<double> &samples, const std::vector<HistInterval> &intervals) {
    const DBLArray x(samples);
    const std::size_t bytes = intervals.size() * sizeof(HistInterval);
    const Array1D<qx::ElementType::U8> records(static_cast<int32_t>(bytes));
    if (bytes > 0)
        std::memcpy(records.data(), intervals.data(), bytes);
    (*records.handle())->dimSize = static_cast<int32_t>(intervals.size());
    const I32Array counts(9);
    General result = {{}, {7, 7, 7}, 1};
    EXPECT_EQ(GenHistH(x.handle(), reinterpret_cast<HistInterval1D>(records.handle()),
                       counts.handle(), &result.summary, &result.err),
              0);
    result.counts = counts.values();
    return result;
}

TEST(GeneralHistogram, WithoutMemoryTheCountsAreSizedAndEmptied) {
    if (!HeapProbe::works())
        GTEST_SKIP();
    const DBLArray x{1.0};
    const Array1D<qx::ElementType::U8> intervals(sizeof(HistInterval));
    (*intervals.handle())->dimSize = 1;
    const I32Array counts(9);
    HistSummary summary = {7, 7, 7};
    ErrorCode err = 0;
    qx::test::ResetHost();
    {
        const HeapProbe probe(1);
        GenHistH(x.handle(), reinterpret_cast<HistInterval1D>(intervals.handle()), counts.handle(),
                 &summary, &err);
    }
    EXPECT_EQ(err, ErrOutOfMemory);
    EXPECT_EQ(qx::test::Host().reshapes,
              (std::vector<qx::test::Reshape>{{QXTypeI32, 1, 1}, {QXTypeI32, 1, 0}}));
    EXPECT_EQ(summary.outside, 0);
}

TEST(GeneralHistogram, CountsInOverlappingIntervalsAndOutsideOfThem) {
    const std::vector<HistInterval> intervals{{0.0, 1.0, 0}, {0.5, 2.0, 2}, {3.0, 4.0, 1}};
    const General g = GeneralOf({-1.0, 0.0, 0.75, 1.0, 2.0, 2.5, 3.0, 4.0, 9.0}, intervals);
    EXPECT_EQ(g.err, 0);
    EXPECT_EQ(g.counts, (std::vector<int32_t>{2, 3, 1}));
    // -1 lies below all intervals, 2.5 and 3.0 in a gap below the last one, 9 above it.
    EXPECT_EQ(g.summary.outside, 4);
    EXPECT_EQ(g.summary.below, 1);
    EXPECT_EQ(g.summary.above, 1);

    const General none = GeneralOf({1.0}, {});
    EXPECT_EQ(none.err, 0);
    EXPECT_TRUE(none.counts.empty());
    EXPECT_EQ(none.summary.outside, 0);

    const General noData = GeneralOf({}, intervals);
    EXPECT_EQ(noData.err, ErrEmptyInput);
    EXPECT_TRUE(noData.counts.empty());
    EXPECT_EQ(noData.summary.outside, 0);

    const DBLArray x{1.0};
    const Array1D<qx::ElementType::U8> negative(0);
    (*negative.handle())->dimSize = -1;
    const I32Array counts(9);
    HistSummary summary = {7, 7, 7};
    ErrorCode err;
    GenHistH(x.handle(), reinterpret_cast<HistInterval1D>(negative.handle()), counts.handle(),
             &summary, &err);
    (*negative.handle())->dimSize = 0;
    EXPECT_EQ(err, ErrSizesDisagree);
    EXPECT_EQ(counts.size(), 0);
    EXPECT_EQ(summary.outside, 0);
}

} // namespace
} // namespace qx::test
