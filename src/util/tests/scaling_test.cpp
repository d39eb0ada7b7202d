#include "qx/qx.h"
#include "tests/support/hostile_host.h"
#include "tests/support/recipe.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <cmath>
#include <limits>
#include <numbers>
#include <vector>

namespace qx::test {
namespace {

typedef std::vector<double> Samples;

constexpr double inf = std::numeric_limits<double>::infinity();
const double nan = std::numeric_limits<double>::quiet_NaN();

Samples Noisy(int32_t n, double offset = 0.0) {
    Noise noise(static_cast<uint64_t>(n));
    Samples x;
    for (int32_t i = 0; i < n; ++i)
        x.push_back(noise.symmetric() + offset);
    return x;
}

void Fill(DBLMatrix &matrix, const Samples &values) {
    std::copy(values.begin(), values.end(), matrix.data());
}

bool AreSame(const Samples &a, const Samples &b) {
    return std::equal(a.begin(), a.end(), b.begin(), b.end(), [](double x, double y) {
        return x == y || (std::isnan(x) && std::isnan(y));
    });
}

// Each export for a vector and for a matrix of the same elements.
struct Scaled {
    Samples x;
    double first, second;
};
Scaled Scale1D(const Samples &samples) {
    DBLArray x(samples);
    Scaled result;
    ErrorCode err = 1;
    EXPECT_EQ(Scale1DCIN(x.handle(), &result.second, &result.first, &err), 0);
    EXPECT_EQ(err, 0);
    result.x = x.values();
    DBLMatrix matrix(static_cast<int32_t>(samples.size()), 1);
    Fill(matrix, samples);
    double scale;
    double offset;
    EXPECT_EQ(Scale(matrix.handle(), &scale, &offset, &err), 0);
    EXPECT_EQ(err, 0);
    EXPECT_TRUE(AreSame(matrix.values(), result.x));
    EXPECT_TRUE(AreSame({scale, offset}, {result.first, result.second}));
    return result;
}
Scaled ByMagnitude(const Samples &samples) {
    DBLArray x(samples);
    Scaled result = {};
    ErrorCode err = 1;
    EXPECT_EQ(QS1D(x.handle(), &result.first, &err), 0);
    EXPECT_EQ(err, 0);
    result.x = x.values();
    DBLMatrix matrix(1, static_cast<int32_t>(samples.size()));
    Fill(matrix, samples);
    double scale;
    EXPECT_EQ(QScale(matrix.handle(), &scale, &err), 0);
    EXPECT_EQ(scale, result.first);
    EXPECT_TRUE(AreSame(matrix.values(), result.x));
    return result;
}

// Sizes around the number of lanes and the blocks, with the extremes in every place.
TEST(Scaling, ReachesMinusOneAndOne) {
    for (const int32_t n : {2, 3, 15, 16, 17, 33, 2047, 2048, 2049, 2080, 5000})
        for (const int32_t at : {0, 1, n / 2, n - 1}) {
            Samples x = Noisy(n, 10.0);
            x[static_cast<std::size_t>(at)] = 14.0;
            x[static_cast<std::size_t>((at + 1) % n)] = 6.0;
            const Scaled scaled = Scale1D(x);
            EXPECT_EQ(scaled.first, 4.0);
            EXPECT_EQ(scaled.second, 10.0);
            for (int32_t i = 0; i < n; ++i)
                ASSERT_NEAR(scaled.x[static_cast<std::size_t>(i)] * 4.0 + 10.0,
                            x[static_cast<std::size_t>(i)], 2e-15);
            x[static_cast<std::size_t>(at)] = -16.0;
            const Scaled divided = ByMagnitude(x);
            EXPECT_EQ(divided.first, 16.0);
            EXPECT_EQ(divided.x[static_cast<std::size_t>(at)], -1.0);
            EXPECT_EQ(divided.x[static_cast<std::size_t>((at + 1) % n)], 6.0 / 16);
        }
}

TEST(Scaling, ConstantsNaNAndInfinity) {
    const Scaled constant = Scale1D(Samples(21, 3.5));
    EXPECT_EQ(constant.x, Samples(21, 0.0));
    EXPECT_EQ(constant.first, 1.0);
    EXPECT_EQ(constant.second, 3.5);
    const Scaled tiny = Scale1D({0.0, 0x1p-1074 * 2}); // 1 / scale is infinite
    EXPECT_EQ(tiny.first, 1.0);
    const Scaled gaps = Scale1D({nan, 1.0, nan, 3.0, nan});
    EXPECT_EQ(gaps.first, 1.0);
    EXPECT_EQ(gaps.second, 2.0);
    EXPECT_EQ(gaps.x[1], -1.0);
    EXPECT_TRUE(std::isnan(gaps.x[4]));
    const Scaled nothing = Scale1D(Samples(40, nan));
    EXPECT_TRUE(std::isnan(nothing.first) && std::isnan(nothing.second));
    EXPECT_EQ(nothing.x.size(), 40U);
    const Scaled infinite = Scale1D({-inf, 1.0});
    EXPECT_EQ(infinite.first, inf);

    EXPECT_EQ(ByMagnitude(Samples(9, 0.0)).first, 0.0);
    EXPECT_EQ(ByMagnitude(Samples(9, 0.0)).x, Samples(9, 0.0));
    EXPECT_EQ(ByMagnitude({nan, -2.0}).first, 2.0);
    EXPECT_EQ(ByMagnitude({nan, nan}).first, 0.0);
    EXPECT_EQ(ByMagnitude({-inf, 1.0}).x[1], 0.0);
}

TEST(Scaling, StandardisesToMeanZeroAndDeviationOne) {
    for (const int32_t n : {2, 5, 15, 16, 17, 100, 4099}) {
        const Samples samples = Noisy(n, 100.0);
        long double mean = 0;
        long double variance = 0;
        for (const double value : samples)
            mean += value / static_cast<long double>(n);
        for (const double value : samples)
            variance += (value - mean) * (value - mean) / n;
        DBLArray x(samples);
        DBLMatrix matrix(1, n);
        Fill(matrix, samples);
        double center;
        double sd;
        ErrorCode err = 1;
        EXPECT_EQ(Norm1(x.handle(), &center, &sd, &err), 0);
        EXPECT_EQ(err, 0);
        EXPECT_NEAR(center, static_cast<double>(mean), 6e-14);
        EXPECT_NEAR(sd, static_cast<double>(std::sqrt(variance)), 1e-14);
        for (int32_t i = 0; i < n; ++i)
            ASSERT_NEAR(x[i] * sd + center, samples[static_cast<std::size_t>(i)], 1e-13);
        double again;
        EXPECT_EQ(Norm2(matrix.handle(), &again, &sd, &err), 0);
        EXPECT_EQ(again, center);
        EXPECT_EQ(matrix.values(), x.values());
    }
    DBLArray constant(Samples(3, 2.0));
    double center;
    double sd;
    ErrorCode err = 1;
    Norm1(constant.handle(), &center, &sd, &err);
    EXPECT_EQ(sd, 0.0);
    EXPECT_TRUE(std::isnan(constant[0]));
}

TEST(Scaling, LinesMultiplyFirst) {
    DBLArray x{1.0, -2.0, 0.5, 1e308, 3.0};
    const double a = 3.0;
    const double b = -1e308;
    EXPECT_EQ(Line1(x.handle(), &a, &b), 0);
    EXPECT_EQ(x[3], inf);
    DBLMatrix matrix(2, 3);
    Fill(matrix, {0, 1, 2, 3, 4, 5});
    EXPECT_EQ(LinEv(matrix.handle(), 2.0, 0.5), 0);
    EXPECT_EQ(matrix.values(), (Samples{0.5, 2.5, 4.5, 6.5, 8.5, 10.5}));
}

TEST(Scaling, EmptyArraysGiveTheirCodes) {
    DBLArray x(0);
    double first = 0;
    double second = 0;
    ErrorCode err = 0;
    const auto expect = [&](ErrorCode code) {
        EXPECT_EQ(err, code);
        EXPECT_TRUE(std::isnan(first) && std::isnan(second));
        first = second = err = 0;
    };
    Scale1DCIN(x.handle(), &first, &second, &err);
    expect(ErrEmptyInput);
    Norm1(x.handle(), &first, &second, &err);
    expect(ErrEmptyInput);
    for (const auto &[rows, cols] : {std::pair{0, 3}, {3, 0}}) {
        DBLMatrix matrix(rows, cols);
        Scale(matrix.handle(), &first, &second, &err);
        expect(ErrEmptyInput);
        EXPECT_EQ(matrix.rows() + matrix.cols(), 0);
        Norm2(matrix.handle(), &first, &second, &err);
        expect(ErrEmptyInput);
        EXPECT_EQ(LinEv(matrix.handle(), 1.0, 1.0), ErrEmptyInput);
        QScale(matrix.handle(), &first, &err);
        second = nan;
        expect(ErrEmptyInput);
    }
    QS1D(x.handle(), &first, &err);
    second = nan;
    expect(ErrEmptyInput);
    EXPECT_EQ(Line1(x.handle(), &first, &second), ErrEmptyInput);
    EXPECT_EQ(unWrap(x.handle(), &err), ErrSizesDisagree);
    EXPECT_EQ(err, ErrSizesDisagree);
    EXPECT_EQ(unWrap85(x.handle(), 9), ErrSizesDisagree);
    for (const int32_t mode : {-1, 4}) {
        DBLArray one{1.0};
        EXPECT_EQ(unWrap85(one.handle(), mode), ErrInvalidSelector);
        EXPECT_EQ(one.size(), 0);
    }
}

// A phase with large slopes, wrapped in long double; unwrapping recovers it up to whole turns.
TEST(Unwrapping, RecoversTheSmoothPhase) {
    for (const int32_t mode : {0, 1, 2, 3}) {
        const long double turn = mode < 2 ? 2 * std::numbers::pi_v<long double> : 360;
        for (const double slope : {0.001, 0.11, -0.3, 0.49, -0.49})
            for (const int32_t n : {1, 2, 3, 4, 5, 9, 1000}) {
                Samples smooth;
                Samples wrapped;
                for (int32_t i = 0; i < n; ++i) {
                    const long double phase =
                        turn * (slope * i + 0.1L * std::sin(0.05L * slope * i));
                    smooth.push_back(static_cast<double>(phase));
                    wrapped.push_back(static_cast<double>(std::remainder(phase, turn)));
                }
                DBLArray x(wrapped);
                EXPECT_EQ(unWrap85(x.handle(), mode), 0);
                const double toResult = mode == 1   ? 180 / std::numbers::pi
                                        : mode == 3 ? std::numbers::pi / 180
                                                    : 1.0;
                for (int32_t i = 0; i < n; ++i) {
                    const double expected = smooth[static_cast<std::size_t>(i)] * toResult;
                    ASSERT_NEAR(x[i], expected, 4e-15 * (std::fabs(expected) + 360 * toResult))
                        << i;
                }
            }
    }
}

// Compared with the rule itself, applied element by element: jumps of any size, including NaN and
// infinity, in any lane.
TEST(Unwrapping, FollowsItsRuleToTheBit) {
    constexpr double turn = 6.283185307179586;
    for (const int32_t n : {1, 2, 3, 8, 31, 500}) {
        for (const double jump : {0.0, 2.0, 6.3, 1e3, 1e17, inf, nan}) {
            Samples x = Noisy(n);
            for (std::size_t i = 0; i < x.size(); i += 7)
                x[i] *= jump;
            DBLArray array(x);
            ErrorCode err = 1;
            EXPECT_EQ(unWrap(array.handle(), &err), 0);
            EXPECT_EQ(err, 0);
            for (std::size_t i = 1; i < x.size(); ++i)
                x[i] = x[i] - std::floor((x[i] - x[i - 1]) / turn + 0.5) * turn;
            for (int32_t i = 0; i < n; ++i) {
                const double expected = x[static_cast<std::size_t>(i)];
                ASSERT_TRUE(array[i] == expected || (std::isnan(array[i]) && std::isnan(expected)))
                    << jump << " " << i;
            }
        }
    }
    // A jump of exactly half a turn goes down, in the lanes as well.
    DBLArray halves(Samples(40, 0.0));
    Samples expected(40, 0.0);
    for (std::size_t i = 20; i < 40; i += 2) {
        halves.data()[i] = 180.0;
        expected[i] = -180.0;
    }
    for (std::size_t i = 21; i < 40; i += 2)
        expected[i] = -360.0;
    for (std::size_t i = 22; i < 40; ++i)
        expected[i] = expected[i - 1] - 180.0;
    EXPECT_EQ(unWrap85(halves.handle(), 2), 0);
    EXPECT_EQ(halves.values(), expected);
    DBLArray pair{0.0, 3.2};
    ErrorCode err;
    unWrap(pair.handle(), &err);
    EXPECT_EQ(pair[1], 3.2 - turn);
    DBLArray one{2.0};
    EXPECT_EQ(unWrap85(one.handle(), 1), 0);
    EXPECT_EQ(one[0], 2.0 * 360.0 / turn);
}

} // namespace
} // namespace qx::test
