#include "qx/basic_statistics.h"
#include "qx/errors.h"
#include "stats/basic.h"
#include "tests/support/hostile_host.h"
#include "tests/support/recipe.h"

#include <gtest/gtest.h>

#include <bit>
#include <cmath>
#include <limits>
#include <utility>
#include <vector>

namespace qx::test {
namespace {

constexpr double inf = std::numeric_limits<double>::infinity();
const double nan = std::numeric_limits<double>::quiet_NaN();

std::vector<double> Samples(int n, double offset) {
    Noise noise(static_cast<uint64_t>(n));
    std::vector<double> x;
    for (int i = 0; i < n; ++i)
        x.push_back(noise.symmetric() + offset);
    return x;
}

bool IsTheQuietNaN(double value) { return std::bit_cast<uint64_t>(value) == 0x7FF8000000000000U; }

// The definitions in long double, summed from the end, so that both order and precision differ from
// those of the code.
struct Reference {
    explicit Reference(const std::vector<double> &x) {
        const auto n = static_cast<long double>(x.size());
        for (auto i = x.rbegin(); i != x.rend(); ++i)
            mean += *i;
        mean /= n;
        for (auto i = x.rbegin(); i != x.rend(); ++i) {
            square += static_cast<long double>(*i) * *i / n;
            const long double d = *i - mean;
            for (int order = 1; order <= 9; ++order)
                moment[order] += std::pow(d, static_cast<long double>(order)) / n;
        }
    }
    long double mean = 0, square = 0;
    long double moment[10] = {};
};

TEST(BasicStatistics, AgreeWithTheDefinitions) {
    for (const int n : {1, 2, 3, 4, 5, 17, 1000, 4097}) {
        const std::vector<double> samples = Samples(n, 0.75);
        const DBLArray x(samples);
        const Reference exact(samples);
        const double bound = 4e-16 * n;
        double value;
        ErrorCode err = 1;
        EXPECT_EQ(Mean_head(x.handle(), &value, &err), 0);
        EXPECT_EQ(err, 0);
        EXPECT_NEAR(value, static_cast<double>(exact.mean), bound);
        EXPECT_EQ(RMS_head(x.handle(), &value, &err), 0);
        EXPECT_NEAR(value, static_cast<double>(std::sqrt(exact.square)), bound);
        for (const int32_t order : {1, 2, 3, 4, 5, 6, 7, 8, 9}) {
            EXPECT_EQ(Moment_head(x.handle(), &order, &value, &err), 0);
            EXPECT_EQ(err, 0);
            EXPECT_NEAR(value, static_cast<double>(exact.moment[order]), bound) << order;
        }

        CDBArray z(n);
        for (int i = 0; i < n; ++i)
            z.data()[i] = {samples[static_cast<std::size_t>(i)], -1.5};
        EXPECT_EQ(CxRMS_head(z.handle(), &value), 0);
        EXPECT_NEAR(value, static_cast<double>(std::sqrt(exact.square + 2.25L)), bound);
    }
}

TEST(BasicStatistics, SumsRunFromTheFirstElement) {
    // In any other order, or with compensation, these sums differ.
    double value;
    ErrorCode err;
    const DBLArray cancels{1e16, 1.0, -1e16, 1.0};
    Mean_head(cancels.handle(), &value, &err);
    EXPECT_EQ(value, 0.25);
    const DBLArray tiny{1.0, 0x1p-53, 0x1p-53, 0x1p-53};
    Mean_head(tiny.handle(), &value, &err);
    EXPECT_EQ(value, 0.25);
    const DBLArray squares{0x1p27, 1.0, 1.0};
    RMS_head(squares.handle(), &value, &err);
    EXPECT_EQ(value, std::sqrt((0x1p54) / 3.0));
    const CDBArray pair{{0x1p27, 0.0}, {1.0, 1.0}}; // the two squares are added first
    CxRMS_head(pair.handle(), &value);
    EXPECT_EQ(value, std::sqrt((0x1p54 + 2.0) / 2.0 + 0.0));
    // The expanded form of the squared difference, 2^-60, loses all digits.
    const DBLArray x{1.0 + 0x1p-30};
    const DBLArray y{1.0};
    MSE_head(x.handle(), y.handle(), &value, &err);
    EXPECT_EQ(value, 0.0);
}

// Powers by squaring; repeated multiplication would give one unit more in the last place.
TEST(BasicStatistics, MomentsTakePowersBySquaring) {
    const double a = 1.0 + 0x1.555p-13;
    const DBLArray x{-3.0 * a, a, a, a}; // the mean is 0 exactly
    double value;
    ErrorCode err;
    for (const auto &[order, expected] :
         {std::pair{6, 0x1.6e5b881a3b4c9p+7}, {7, -0x1.114fa8b5e1517p+9}}) {
        const int32_t n = order;
        Moment_head(x.handle(), &n, &value, &err);
        EXPECT_EQ(value, expected) << order;
    }
}

TEST(BasicStatistics, OverflowAndNonFiniteValuesPropagate) {
    double value;
    ErrorCode err;
    const DBLArray withNaN{nan, 1.0};
    Mean_head(withNaN.handle(), &value, &err);
    EXPECT_TRUE(std::isnan(value));
    EXPECT_EQ(err, 0);
    const DBLArray withInfinity{inf, 1.0};
    RMS_head(withInfinity.handle(), &value, &err);
    EXPECT_EQ(value, inf);
    const DBLArray huge{1e200, 1e200};
    RMS_head(huge.handle(), &value, &err);
    EXPECT_EQ(value, inf) << "the squares are not protected from overflow";
    const DBLArray spread{-3.0, 3.0};
    const int32_t highest = std::numeric_limits<int32_t>::max();
    Moment_head(spread.handle(), &highest, &value, &err);
    EXPECT_TRUE(std::isnan(value)) << "minus and plus infinity";
    EXPECT_EQ(err, 0);
}

TEST(BasicStatistics, CodesComeInTheirOrder) {
    const DBLArray empty(0);
    const DBLArray one{2.0};
    const CDBArray emptyComplex(0);
    double value = 0;
    ErrorCode err = 0;
    const int32_t badOrder = 0;
    const int32_t goodOrder = 2;
    const auto expectNaN = [&](ErrorCode code) {
        EXPECT_EQ(err, code);
        EXPECT_TRUE(IsTheQuietNaN(value));
        value = err = 0;
    };
    EXPECT_EQ(Mean_head(empty.handle(), &value, &err), 0);
    expectNaN(ErrEmptyInput);
    EXPECT_EQ(RMS_head(empty.handle(), &value, &err), 0);
    expectNaN(ErrEmptyInput);
    err = CxRMS_head(emptyComplex.handle(), &value);
    expectNaN(ErrEmptyInput);
    EXPECT_EQ(Moment_head(empty.handle(), &badOrder, &value, &err), 0);
    expectNaN(ErrEmptyInput);
    EXPECT_EQ(Moment_head(one.handle(), &badOrder, &value, &err), 0);
    expectNaN(ErrOrderNotPositive);
    EXPECT_EQ(Moment_head(one.handle(), &goodOrder, &value, &err), 0);
    EXPECT_EQ(value, 0.0);
    for (const DBLArray *first : {&empty, &one})
        for (const DBLArray *second : {&empty, &one})
            if (first != second || first == &empty) {
                EXPECT_EQ(MSE_head(first->handle(), second->handle(), &value, &err), 0);
                expectNaN(ErrEmptyInput);
            }

    const DBLArray three{1.0, 2.0, 3.0};
    const DBLArray five{1.5, 2.5, 3.5, 9.0, 9.0};
    for (const bool swapped : {false, true}) {
        const DBLArray &x = swapped ? five : three;
        const DBLArray &y = swapped ? three : five;
        EXPECT_EQ(MSE_head(x.handle(), y.handle(), &value, &err), 0);
        EXPECT_EQ(err, WarnLengthsDiffer);
        EXPECT_DOUBLE_EQ(value, 0.25);
    }
}

} // namespace
} // namespace qx::test
