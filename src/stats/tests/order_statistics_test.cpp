#include "frame/scratch.h"
#include "qx/errors.h"
#include "qx/order_statistics.h"
#include "stats/histogram.h"
#include "stats/mode.h"
#include "stats/order.h"
#include "tests/support/heap_probe.h"
#include "tests/support/hostile_host.h"
#include "tests/support/recipe.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <cmath>
#include <functional>
#include <limits>
#include <numeric>
#include <vector>

namespace qx::test {
namespace {

const double nan = std::numeric_limits<double>::quiet_NaN();
constexpr double inf = std::numeric_limits<double>::infinity();

typedef std::vector<double> Values;

// Arrays that are known to be difficult for sorting and selection.
std::vector<Values> HardArrays(int n) {
    Noise noise(static_cast<uint64_t>(n) + 17);
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
        make([n](int i) { return i < n / 3 ? 3 * i : n - i; }),
        make([n](int i) { return i < 5 ? n + i : -i; }),        // the upper half is on one side of
        make([n](int i) { return i < n - 2 ? i : n - 2 * i; }), // the peak, or the lower one
        make([n](int i) { return std::min(i / 4, 2 * (n - 1 - i)) + 0.0; }),
        make([n](int i) { return i < 2 * n / 3 ? i - n / 2
                                 : i == n - 1  ? -0.0
                                               : 0.0; }),
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
            qx::SortNaNsFirst({x.data(), n}, qx::SortOrder::Ascending, {out.data(), n});
            ASSERT_EQ(out, sorted);
            qx::SortNaNsFirst({x.data(), n}, qx::SortOrder::Descending, {out.data(), n});
            ASSERT_TRUE(std::equal(out.rbegin(), out.rend(), sorted.begin()));
            Values inPlace = x;
            qx::SortNaNsFirst({inPlace.data(), n}, qx::SortOrder::Ascending, {inPlace.data(), n});
            ASSERT_EQ(inPlace, sorted);

            for (const int k : {0, n / 3, n / 2, n - 1}) {
                Values a = x;
                qx::SelectKth({a.data(), n}, k);
                ASSERT_EQ(a[static_cast<std::size_t>(k)], sorted[static_cast<std::size_t>(k)]);
                for (int i = 0; i < n; ++i)
                    ASSERT_TRUE(
                        i < k ? a[static_cast<std::size_t>(i)] <= a[static_cast<std::size_t>(k)]
                              : a[static_cast<std::size_t>(i)] >= a[static_cast<std::size_t>(k)]);
                std::sort(a.begin(), a.end());
                ASSERT_EQ(a, sorted) << "an element was lost";
            }
            double median;
            ASSERT_EQ(qx::ArrayMedian({x.data(), n}, &median), 0);
            const auto middle = static_cast<std::size_t>(n / 2);
            const double expected =
                n % 2 != 0 ? sorted[middle] : (sorted[middle - 1] + sorted[middle]) * 0.5;
            ASSERT_TRUE(median == expected || (std::isnan(median) && std::isnan(expected)));
        }
}

TEST(Order, NaNsGoToTheFront) {
    const Values x{3.0, nan, -1.0, nan, 2.0};
    Values out(5);
    for (const qx::SortOrder order : {qx::SortOrder::Ascending, qx::SortOrder::Descending}) {
        qx::SortNaNsFirst({x.data(), 5}, order, {out.data(), 5});
        EXPECT_TRUE(std::isnan(out[0]) && std::isnan(out[1]));
        EXPECT_EQ(Values(out.begin() + 2, out.end()), order == qx::SortOrder::Descending
                                                          ? (Values{3.0, 2.0, -1.0})
                                                          : (Values{-1.0, 2.0, 3.0}));
    }
    // Selection is not meant for NaN, but stays within its array.
    for (int n = 1; n < 40; ++n)
        for (int pattern = 0; pattern < 64; ++pattern) {
            DBLArray a(n);
            for (int i = 0; i < n; ++i)
                a.data()[i] = (pattern * 2654435761U >> (i % 31)) % 2 != 0 ? nan : i * 7 % 11;
            qx::SelectKth({a.data(), n}, n / 2);
        }
    CheckBlocks();
}

// Decides the order of the elements as late as possible while the selection scheme runs, so that
// every pivot turns out to be among the smallest (D. McIlroy: A killer adversary for quicksort,
// 1999). The final values are the worst case for that scheme.
class Adversary {
public:
    explicit Adversary(int n) : values_(static_cast<std::size_t>(n), n), items_(values_.size()) {
        std::iota(items_.begin(), items_.end(), 0);
        select(0, n - 1, n / 2);
    }
    const Values &values() const { return values_; }
    int64_t comparisons() const { return comparisons_; }

private:
    bool isLess(int a, int b) {
        ++comparisons_;
        const double undecided = static_cast<double>(values_.size());
        double &valueA = values_[static_cast<std::size_t>(a)];
        double &valueB = values_[static_cast<std::size_t>(b)];
        if (valueA == undecided && valueB == undecided)
            (a == candidate_ ? valueA : valueB) = decided_++;
        if (valueA == undecided)
            candidate_ = a;
        else if (valueB == undecided)
            candidate_ = b;
        return valueA < valueB;
    }
    int &at(int i) { return items_[static_cast<std::size_t>(i)]; }
    void order(int i, int j) {
        if (isLess(at(j), at(i)))
            std::swap(at(i), at(j));
    }
    void select(int l, int r, int k) {
        while (r > l + 1) {
            std::swap(at((l + r) / 2), at(l + 1));
            order(l, r);
            order(l + 1, r);
            order(l, l + 1);
            int i = l + 1;
            int j = r;
            const int pivot = at(l + 1);
            while (true) {
                while (isLess(at(++i), pivot)) {
                }
                while (isLess(pivot, at(--j))) {
                }
                if (j < i)
                    break;
                std::swap(at(i), at(j));
            }
            at(l + 1) = at(j);
            at(j) = pivot;
            if (j >= k)
                r = j - 1;
            if (j <= k)
                l = i;
        }
    }

    Values values_;
    std::vector<int> items_;
    int candidate_ = -1;
    int decided_ = 0;
    int64_t comparisons_ = 0;
};

// A selection that has examined a few times n elements abandons its scheme and sorts the remaining
// range, which for the worst data is nearly the whole array.
TEST(Order, NoDataMakeTheWorkQuadratic) {
    constexpr int n = 10000;
    const Adversary adversary(n);
    ASSERT_GT(adversary.comparisons(), int64_t{n} * n / 16) << "the scheme alone is quadratic";
    std::vector<Values> arrays = HardArrays(n);
    arrays.push_back(adversary.values());
    for (const Values &x : arrays) {
        Values a = x;
        qx::SelectKth({a.data(), n}, n / 2);
        Values sorted = x;
        std::sort(sorted.begin(), sorted.end());
        EXPECT_EQ(a[n / 2], sorted[n / 2]);
        EXPECT_LE(*std::max_element(a.begin(), a.begin() + n / 2), a[n / 2]);
        const auto tail = a.end() - n / 3; // of the range that the first passes leave
        if (x == adversary.values()) {
            EXPECT_TRUE(std::is_sorted(tail, a.end()));
        }
    }
}

TEST(Order, AMedianOfZeroHasTheSignThatSelectionGives) {
    Noise noise(5);
    const auto check = [](const Values &x) {
        const auto n = static_cast<int32_t>(x.size());
        Values a = x;
        qx::SelectKth({a.data(), n}, n / 2);
        double below = a[0];
        for (int i = 1; i < n / 2; ++i)
            below = a[static_cast<std::size_t>(i)] > below ? a[static_cast<std::size_t>(i)] : below;
        const double upper = a[static_cast<std::size_t>(n / 2)];
        const double expected = n % 2 != 0 ? upper : (below + upper) * 0.5;
        double median;
        ASSERT_EQ(qx::ArrayMedian({x.data(), n}, &median), 0);
        ASSERT_EQ(std::signbit(median), std::signbit(expected)) << n;
        ASSERT_EQ(median, expected) << n;
    };
    // Zeros of both signs among few values, so that the median is one of them.
    for (const int n : {1, 2, 3, 8, 51, 599, 600, 601, 4000, 4001})
        for (int round = 0; round < 20; ++round) {
            Values x;
            for (int i = 0; i < n; ++i) {
                const uint32_t bits = noise.bits();
                x.push_back(bits % 8 < 2 ? noise.symmetric() : (bits % 8 < 5 ? 0.0 : -0.0));
            }
            check(x);
            std::sort(x.begin(), x.end());
            check(x);
        }
}

double MedianByTheLibrary(Values x) {
    const auto middle = x.begin() + static_cast<std::ptrdiff_t>(x.size() / 2);
    std::nth_element(x.begin(), middle, x.end());
    return x.size() % 2 != 0 ? *middle : (*std::max_element(x.begin(), middle) + *middle) * 0.5;
}

TEST(Order, AMedianOfManyEqualsThatOfTheSortedArray) {
    // The median of long arrays is located by a sample, which these arrays mislead.
    constexpr int n = 300001;
    std::vector<Values> arrays = HardArrays(n);
    Values outliers(n, 1.0);
    Values steps(n);
    for (int i = 0; i < n; ++i) {
        outliers[static_cast<std::size_t>(i)] += i % 1000 == 0 ? 1e300 * (i % 3 - 1) : 0.0;
        steps[static_cast<std::size_t>(i)] = i < n / 2 ? 0.25 * (i % 2) : 5.0 + i % 3;
    }
    arrays.push_back(outliers);
    arrays.push_back(steps);
    for (const Values &x : arrays)
        for (const int count : {n, n - 1}) {
            Values values(x.begin(), x.begin() + count);
            double median;
            ASSERT_EQ(qx::ArrayMedian({values.data(), count}, &median), 0);
            EXPECT_EQ(median, MedianByTheLibrary(values));
            values[static_cast<std::size_t>(count - count / 7)] = nan;
            EXPECT_EQ(qx::ArrayMedian({values.data(), count}, &median), ErrNaNInData);
        }
    // With this many arrays, the sample of some narrowly misses the middle, on either side.
    Noise noise(11);
    for (int round = 0; round < 10000; ++round) {
        Values x(static_cast<std::size_t>(600 + round % 2));
        std::generate(x.begin(), x.end(), [&] { return noise.symmetric(); });
        double median;
        ASSERT_EQ(qx::ArrayMedian({x.data(), static_cast<std::ptrdiff_t>(x.size())}, &median), 0);
        ASSERT_EQ(median, MedianByTheLibrary(x)) << round;
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
        qx::Extremes found;
        EXPECT_EQ(qx::ArrayMaxMin({x.data(), static_cast<std::ptrdiff_t>(x.size())}, &found), 0);
        return std::vector<double>{found.max, static_cast<double>(found.maxIndex), found.min,
                                   static_cast<double>(found.minIndex)};
    };
    EXPECT_EQ(find({nan, 2.0, 5.0, -1.0, 5.0, nan, -1.0}), (Values{5.0, 2, -1.0, 3}));
    EXPECT_EQ(find({4.0}), (Values{4.0, 0, 4.0, 0}));
    EXPECT_EQ(find({inf, -inf}), (Values{inf, 0, -inf, 1}));
    const Values none = find({nan, nan});
    EXPECT_TRUE(std::isnan(none[0]) && std::isnan(none[2]));
    EXPECT_EQ(none[1], -1);
    EXPECT_EQ(none[3], -1);
    qx::Extremes unused;
    EXPECT_EQ(qx::ArrayMaxMin({}, &unused), ErrEmptyInput);
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
    // Values within an epsilon of the first of the run are equal,
    const double next = std::nextafter(1.0, 2.0);
    EXPECT_EQ(ModesOf({next, 1.0, 7.0, 9.0}, 0), (Values{1.0}));
    // not those within an epsilon of their neighbour: a chain of four values makes two runs, three
    // make one.
    const double second = std::nextafter(next, 2.0);
    const double third = std::nextafter(second, 2.0);
    EXPECT_EQ(ModesOf({third, second, next, 1.0, 9.0}, 0), (Values{1.0, second}));
    EXPECT_EQ(ModesOf({second, next, 1.0, 9.0}, 0), (Values{1.0}));
    // At 0 the tolerance is 0, so only zeros are equal to it.
    EXPECT_EQ(ModesOf({0.0, 5e-324, 1.0, 2.0}, 0), Values());
    EXPECT_EQ(ModesOf({0.0, -0.0, 1.0, 2.0}, 0), (Values{0.0}));
}

TEST(Mode, BinnedModesAreCentresOfTheFullestBins) {
    EXPECT_EQ(ModesOf({0.0, 0.1, 0.2, 3.9, 4.0, 4.0, 2.0}, 4), (Values{0.5, 3.5}));
    EXPECT_EQ(ModesOf({0.0, 1.0, 2.0, 4.0}, 4), Values()) << "no bin has two";
    EXPECT_EQ(ModesOf({2.5, 2.5}, 10), (Values{2.5}));
    const double next = std::nextafter(1.0, 2.0);
    EXPECT_EQ(ModesOf({1.0, next}, 4), (Values{next})) << "equal within an epsilon";
    EXPECT_EQ(ModesOf({-2.0, -1.0, 0.0, -0.1, -1.9}, 2), (Values{-0.5}))
        << "a maximum of 0 has no tolerance";
    EXPECT_EQ(ModesOf({nan, nan}, 3), Values());
}

// Many bins for few samples are never allocated; their modes are those of the histogram.
TEST(Mode, BinsWithoutSamplesTakeNoMemory) {
    for (const Values &x : HardArrays(40))
        for (const int32_t intervals : {39, 319, 320, 328, 5000}) {
            const int32_t n = 40;
            const auto [min, max] = std::minmax_element(x.begin(), x.end());
            if (*min == *max || std::isinf(*max))
                continue;
            std::vector<I32> counts(static_cast<std::size_t>(intervals));
            std::vector<DBL> centres(counts.size());
            const DBLArray data(x);
            qx::ArrayHistogram({data.data(), n}, *min, *max, {counts.data(), intervals},
                               {centres.data(), intervals});
            const int32_t most = *std::max_element(counts.begin(), counts.end());
            Values expected;
            for (std::size_t k = 0; most > 1 && k < counts.size(); ++k)
                if (counts[k] == most)
                    expected.push_back(centres[k]);
            EXPECT_EQ(ModesOf(x, intervals), expected) << intervals;
        }
    const HeapProbe probe(0, 1 << 16);
    constexpr int32_t most = std::numeric_limits<int32_t>::max() / 8;
    EXPECT_EQ(ModesOf({0.0, 0.0, 1.0}, most), (Values{0.5 * (1.0 / most)}));
    ModesOf({0.0, 0.0, 1.0}, most + 1, ErrOutOfMemory);
}

} // namespace
} // namespace qx::test
