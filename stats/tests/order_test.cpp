#include "frame/scratch.h"
#include "qx/qx.h"
#include "stats/mode.h"
#include "stats/order.h"
#include "tests/support/hostile_host.h"
#include "tests/support/recipe.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <chrono>
#include <cmath>
#include <functional>
#include <limits>
#include <vector>

namespace {

using qx::test::DBLArray;

const double nan = std::numeric_limits<double>::quiet_NaN();
constexpr double inf = std::numeric_limits<double>::infinity();

typedef std::vector<double> Values;

// Arrays that sorting and selection are known to stumble over.
std::vector<Values> HardArrays(int n) {
    qx::test::Noise noise(static_cast<uint64_t>(n) + 17);
    const auto make = [n](const std::function<double(int)> &value) {
        Values x;
        for (int i = 0; i < n; ++i)
            x.push_back(value(i));
        return x;
    };
    return {
        make([&](int) { return noise.symmetric(); }),
        make([](int i) { return i; }),
        make([](int i) { return -i; }),
        make([](int) { return 3.0; }),
        make([&](int) { return noise.bits() % 4; }),
        make([n](int i) { return std::min(i, n - i); }),
        make([n](int i) { return std::abs(i - n / 2); }),
        make([](int i) { return i % 17; }),
        make([n](int i) { return i == n - 1 ? -1.0 : i; }),
        make([](int i) { return i % 2 == 0 ? -0.0 : 0.0; }),
        make([](int i) { return i % 5 == 0 ? inf : (i % 7 == 0 ? -inf : i); }),
    };
}

TEST(Order, SortingAndSelectionAgreeWithTheLibrarysSort) {
    for (const int n : {1, 2, 3, 4, 5, 19, 20, 21, 22, 64, 129, 200, 257, 1000, 5000})
        for (const Values &x : HardArrays(n)) {
            Values sorted = x;
            std::sort(sorted.begin(), sorted.end());
            Values out(x.size());
            ASSERT_EQ(qx::SortAscending(x.data(), n, 0, out.data()), 0);
            ASSERT_EQ(out, sorted);
            ASSERT_EQ(qx::SortAscending(x.data(), n, 1, out.data()), 0);
            ASSERT_TRUE(std::equal(out.rbegin(), out.rend(), sorted.begin()));
            Values inPlace = x;
            ASSERT_EQ(qx::SortAscending(inPlace.data(), n, 0, nullptr), 0);
            ASSERT_EQ(inPlace, sorted);

            for (const int k : {0, n / 3, n / 2, n - 1}) {
                Values a = x;
                qx::SelectKth(a.data(), n, k);
                ASSERT_EQ(a[static_cast<std::size_t>(k)], sorted[static_cast<std::size_t>(k)]);
                for (int i = 0; i < n; ++i)
                    ASSERT_TRUE(
                        i < k ? a[static_cast<std::size_t>(i)] <= a[static_cast<std::size_t>(k)]
                              : a[static_cast<std::size_t>(i)] >= a[static_cast<std::size_t>(k)]);
                std::sort(a.begin(), a.end());
                ASSERT_EQ(a, sorted) << "an element was lost";
            }
            double median;
            ASSERT_EQ(qx::ArrayMedian(x.data(), n, &median), 0);
            const auto middle = static_cast<std::size_t>(n / 2);
            const double expected =
                n % 2 != 0 ? sorted[middle] : (sorted[middle - 1] + sorted[middle]) * 0.5;
            ASSERT_TRUE(median == expected || (std::isnan(median) && std::isnan(expected)));
        }
}

TEST(Order, NaNsGoToTheFront) {
    const Values x{3.0, nan, -1.0, nan, 2.0};
    Values out(5);
    for (const int descending : {0, 1}) {
        qx::SortAscending(x.data(), 5, descending, out.data());
        EXPECT_TRUE(std::isnan(out[0]) && std::isnan(out[1]));
        EXPECT_EQ(Values(out.begin() + 2, out.end()),
                  descending != 0 ? (Values{3.0, 2.0, -1.0}) : (Values{-1.0, 2.0, 3.0}));
    }
    // Selection is not meant for NaN, but stays within its array.
    for (int n = 1; n < 40; ++n)
        for (int pattern = 0; pattern < 64; ++pattern) {
            DBLArray a(n);
            for (int i = 0; i < n; ++i)
                a.data()[i] = (pattern * 2654435761U >> (i % 31)) % 2 != 0 ? nan : i * 7 % 11;
            qx::SelectKth(a.data(), n, n / 2);
        }
    qx::test::CheckBlocks();
}

// The rounds of a selection by the median of three can be made to shorten the range by two
// elements only. The array is built from the answers that the selection asks for (after D.
// McIlroy, "A killer adversary for quicksort", 1999) by laying the values out along the scheme's
// own exchanges.
Values KillerOfMedianOfThree(int n) {
    // The classical layout of Musser, 1997: n = 2k, 1, k+1, 3, k+3, ... then the even numbers.
    Values x(static_cast<std::size_t>(n));
    const int k = n / 2;
    for (int i = 0; i < k; ++i) {
        x[static_cast<std::size_t>(i)] = i % 2 == 0 ? i + 1 : k + i + i % 2;
        x[static_cast<std::size_t>(k + i)] = 2 * (i + 1);
    }
    return x;
}

TEST(Order, NoDataMakeTheWorkQuadratic) {
    constexpr int n = 200000;
    std::vector<Values> arrays = HardArrays(n);
    arrays.push_back(KillerOfMedianOfThree(n));
    for (const Values &x : arrays) {
        Values a = x;
        const auto start = std::chrono::steady_clock::now();
        qx::SelectKth(a.data(), n, n / 2);
        Values out(x.size());
        qx::SortAscending(x.data(), n, 0, out.data());
        const auto took = std::chrono::steady_clock::now() - start;
        // Quadratic work would take more than ten seconds.
        EXPECT_LT(took, std::chrono::seconds(3));
        EXPECT_TRUE(std::is_sorted(out.begin(), out.end()));
        EXPECT_EQ(a[n / 2], out[n / 2]);
    }
}

TEST(Order, MedianKeepsItsInputAndRefusesNaN) {
    double median;
    ErrorCode err;
    for (const auto &[values, expected] :
         std::vector<std::pair<Values, double>>{{{1.0, 2.0, 3.0, 4.0}, 2.5},
                                                {{1.0, 1.0}, 1.0},
                                                {{7.0}, 7.0},
                                                {{9.0, -4.0, 5.0}, 5.0}}) {
        const DBLArray x(values);
        EXPECT_EQ(Median_head(x.handle(), &median, &err), 0);
        EXPECT_EQ(err, 0);
        EXPECT_EQ(median, expected);
        EXPECT_EQ(x.values(), values);
    }
    const DBLArray withNaN{nan, 1.0};
    Median_head(withNaN.handle(), &median, &err);
    EXPECT_EQ(err, ErrNaNInData);
    EXPECT_TRUE(std::isnan(median));
    const DBLArray empty(0);
    Median_head(empty.handle(), &median, &err);
    EXPECT_EQ(err, ErrEmptyInput);
    EXPECT_TRUE(std::isnan(median));
}

TEST(Order, ExtremesSkipNaNAndTakeTheFirstOfEquals) {
    const auto find = [](const Values &x) {
        double max, min;
        int32_t maxIndex, minIndex;
        EXPECT_EQ(qx::ArrayMaxMin(x.data(), static_cast<int32_t>(x.size()), &max, &maxIndex, &min,
                                  &minIndex),
                  0);
        return std::vector<double>{max, static_cast<double>(maxIndex), min,
                                   static_cast<double>(minIndex)};
    };
    EXPECT_EQ(find({nan, 2.0, 5.0, -1.0, 5.0, nan, -1.0}), (Values{5.0, 2, -1.0, 3}));
    EXPECT_EQ(find({4.0}), (Values{4.0, 0, 4.0, 0}));
    EXPECT_EQ(find({inf, -inf}), (Values{inf, 0, -inf, 1}));
    const Values none = find({nan, nan});
    EXPECT_TRUE(std::isnan(none[0]) && std::isnan(none[2]));
    EXPECT_EQ(none[1], -1);
    EXPECT_EQ(none[3], -1);
    double value;
    int32_t index;
    EXPECT_EQ(qx::ArrayMaxMin(nullptr, 0, &value, &index, &value, &index), ErrEmptyInput);
}

Values ModesOf(const Values &samples, int32_t intervals, ErrorCode expected = 0) {
    const DBLArray x(samples);
    const DBLArray modes(4);
    EXPECT_EQ(ModeH(x.handle(), intervals, modes.handle()), expected);
    return modes.values();
}

TEST(Mode, ExactModesAreTheLongestRuns) {
    EXPECT_EQ(ModesOf({3, 1, 2, 3, 1, 5}, 0), (Values{1, 3}));
    EXPECT_EQ(ModesOf({3, 1, 2, 3, 1, 3}, -4), (Values{3}));
    EXPECT_EQ(ModesOf({1, 2, 3, 4}, 0), Values());
    EXPECT_EQ(ModesOf({5, 5, 5}, 0), (Values{5}));
    EXPECT_EQ(ModesOf({5}, 0), Values());
    EXPECT_EQ(ModesOf({5}, 3), Values());
    EXPECT_EQ(ModesOf({}, 0, ErrEmptyInput), Values());
    EXPECT_EQ(ModesOf({nan, 2, nan, nan, 2, 1}, 0), (Values{2})) << "NaNs form no run";
    // Equal is what lies within an epsilon of the first of the run.
    const double next = std::nextafter(1.0, 2.0);
    EXPECT_EQ(ModesOf({next, 1.0, 7.0, 9.0}, 0), (Values{1.0}));
    // At 0 the tolerance is 0, so only zeros are equal to it.
    EXPECT_EQ(ModesOf({0.0, 5e-324, 1.0, 2.0}, 0), Values());
    EXPECT_EQ(ModesOf({0.0, -0.0, 1.0, 2.0}, 0), (Values{0.0}));
}

TEST(Mode, BinnedModesAreCentresOfTheFullestBins) {
    EXPECT_EQ(ModesOf({0.0, 0.1, 0.2, 3.9, 4.0, 4.0, 2.0}, 4), (Values{0.5, 3.5}));
    EXPECT_EQ(ModesOf({0.0, 1.0, 2.0, 4.0}, 4), Values()) << "no bin has two";
    EXPECT_EQ(ModesOf({2.5, 2.5}, 10), (Values{2.5}));
    EXPECT_EQ(ModesOf({-2.0, -1.0, 0.0, -0.1, -1.9}, 2), (Values{-0.5}))
        << "a maximum of 0 has no tolerance";
    EXPECT_EQ(ModesOf({nan, nan}, 3), Values());
}

} // namespace
