#include "qx/qx.h"
#include "signal/random.h"
#include "tests/support/hostile_host.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <array>
#include <cmath>
#include <map>
#include <numeric>
#include <vector>

namespace qx::test {
namespace {

typedef std::vector<int32_t> Order;

const RandomState start = {11, 222, 3333};

Order Numbers(int32_t count, int32_t seed, RandomState &state, int32_t unbiased) {
    I32Array indices(5);
    const ErrorCode code =
        unbiased < 0 ? RiffleIntNum_head(indices.handle(), count, seed, &state)
                     : RiffleIntNum2012_head(indices.handle(), count, seed, &state, unbiased);
    EXPECT_EQ(code, 0);
    return indices.values();
}

// The definition of the shuffle, number by number, on a list.
Order ByTheRule(int32_t count, RandomState &state, bool isUnbiased) {
    Order order(static_cast<std::size_t>(count));
    std::iota(order.begin(), order.end(), 0);
    for (int32_t step = 0; step < (isUnbiased ? count - 1 : count); ++step) {
        const int32_t i = isUnbiased ? count - 1 - step : step;
        const double choices = isUnbiased ? i + 1 : count;
        const auto j = static_cast<std::size_t>(std::floor(qx::RandomUniform(state) * choices));
        std::swap(order[static_cast<std::size_t>(i)], order[j]);
    }
    return order;
}

TEST(Shuffles, FollowTheStream) {
    for (const int32_t count : {1, 2, 3, 100, 5000})
        for (const bool isUnbiased : {false, true}) {
            RandomState state = start;
            RandomState reference = start;
            EXPECT_EQ(Numbers(count, -1, state, isUnbiased),
                      ByTheRule(count, reference, isUnbiased));
            EXPECT_EQ(Numbers(count, 0, state, isUnbiased), ByTheRule(count, reference, isUnbiased))
                << "a seed of 0 continues the stream";
            EXPECT_EQ(state.s2, reference.s2);
            qx::RandomSeed(5, reference);
            EXPECT_EQ(Numbers(count, 5, state, isUnbiased),
                      ByTheRule(count, reference, isUnbiased));
            if (!isUnbiased) {
                EXPECT_EQ(Numbers(count, 5, state, -1), Numbers(count, 5, state, 0));
            }
        }
}

// Arrays of every element type move like the indices, with and without bias.
TEST(Shuffles, ArraysMoveWithTheirIndices) {
    constexpr int32_t n = 300;
    for (const int32_t unbiased : {-1, 0, 1}) {
        RandomState state = start;
        const Order order = Numbers(n, 9, state, unbiased);
        DBLArray real(n);
        CDBArray complex(n);
        I32Array integers(n);
        for (int32_t i = 0; i < n; ++i) {
            real.data()[i] = i + 0.5;
            complex.data()[i] = {i + 0.25, -1.0 * i};
            integers.data()[i] = 7 * i;
        }
        I32Array indices;
        const auto shuffle = [&](auto handle, auto biased, auto revised) {
            const ErrorCode code = unbiased < 0
                                       ? biased(handle, indices.handle(), 9, &state)
                                       : revised(handle, indices.handle(), 9, &state, unbiased);
            EXPECT_EQ(code, 0);
            EXPECT_EQ(indices.values(), order);
        };
        shuffle(real.handle(), RiffleArrayDBL_head, RiffleArrayDBL2012_head);
        shuffle(complex.handle(), RiffleArrayCDB_head, RiffleArrayCDB2012_head);
        shuffle(integers.handle(), RiffleArrayInt_head, RiffleArrayInt2012_head);
        for (int32_t i = 0; i < n; ++i) {
            const int32_t from = order[static_cast<std::size_t>(i)];
            ASSERT_EQ(real[i], from + 0.5);
            ASSERT_EQ(complex[i].re, from + 0.25);
            ASSERT_EQ(complex[i].im, -1.0 * from);
            ASSERT_EQ(integers[i], 7 * from);
        }
    }
}

// The six orders of three elements are equally likely; in the biased form there are 27 equally
// likely draws, of which three orders get 4 each and three get 5.
TEST(Shuffles, OrdersAreAsLikelyAsDocumented) {
    constexpr int32_t rounds = 270000;
    for (const bool isUnbiased : {true, false}) {
        RandomState state = start;
        std::map<Order, int32_t> counts;
        for (int32_t round = 0; round < rounds; ++round)
            ++counts[Numbers(3, round == 0 ? 4 : -1, state, isUnbiased)];
        ASSERT_EQ(counts.size(), 6U);
        const std::map<Order, int32_t> biased = {{{0, 1, 2}, 4}, {{0, 2, 1}, 5}, {{1, 0, 2}, 5},
                                                 {{1, 2, 0}, 5}, {{2, 0, 1}, 4}, {{2, 1, 0}, 4}};
        for (const auto &[order, count] : counts) {
            const double expected = isUnbiased ? rounds / 6.0 : rounds * biased.at(order) / 27.0;
            EXPECT_NEAR(count, expected, 4.0 * std::sqrt(expected)) << order[0] << order[1];
        }
    }
}

TEST(Shuffles, EmptyArraysAreRefused) {
    RandomState state = start;
    DBLArray x(0);
    I32Array indices(4);
    EXPECT_EQ(RiffleArrayDBL_head(x.handle(), indices.handle(), 1, &state), ErrEmptyInput);
    EXPECT_EQ(indices.size(), 0);
    for (const int32_t count : {0, -1}) {
        I32Array numbers(4);
        EXPECT_EQ(RiffleIntNum2012_head(numbers.handle(), count, 1, &state, 1), ErrEmptyInput);
        EXPECT_EQ(numbers.size(), 0);
    }
    EXPECT_EQ(state.s1, start.s1);
}

Order CounterNumbers(int32_t count, int32_t key, int32_t stream, double position) {
    I32Array indices(5);
    EXPECT_EQ(RiffleIntNum2026_head(indices.handle(), count, key, stream, position), 0);
    return indices.values();
}

// All 24 orders of 4 numbers, by chi-square with 23 degrees of freedom; the position of number 0
// among 300, by chi-square with 299.
TEST(CounterShuffles, MakeAllOrdersEquallyLikely) {
    constexpr int32_t draws = 48000;
    std::map<Order, int> orders;
    for (int32_t i = 0; i < draws; ++i)
        ++orders[CounterNumbers(4, 7, i, 4.0 * i)];
    EXPECT_EQ(orders.size(), 24U);
    double chi = 0;
    for (const auto &[order, count] : orders)
        chi += (count - draws / 24.0) * (count - draws / 24.0) / (draws / 24.0);
    EXPECT_LT(chi, 49.8); // 1 of 1000
    std::vector<double> places(300);
    for (int32_t i = 0; i < 30000; ++i) {
        const Order order = CounterNumbers(300, 8, 0, 300.0 * i);
        places[static_cast<std::size_t>(std::find(order.begin(), order.end(), 0) -
                                        order.begin())] += 1;
    }
    chi = 0;
    for (const double count : places)
        chi += (count - 100) * (count - 100) / 100;
    EXPECT_LT(chi, 381); // 1 of 1000
}

TEST(CounterShuffles, MoveElementsWithTheirNumbers) {
    for (const int32_t n : {1, 2, 255, 256, 257, 1000}) {
        std::vector<double> values(static_cast<std::size_t>(n));
        std::iota(values.begin(), values.end(), 0.0);
        DBLArray x(values);
        I32Array indices, whole(Order(static_cast<std::size_t>(n), 3));
        CDBArray z(n);
        for (int32_t i = 0; i < n; ++i) {
            whole.data()[i] = -i;
            z.data()[i] = {1.0 * i, -2.0 * i};
        }
        EXPECT_EQ(RiffleArrayDBL2026_head(x.handle(), indices.handle(), 5, 6, 1e10), 0);
        const Order order = CounterNumbers(n, 5, 6, 1e10);
        EXPECT_EQ(indices.values(), order);
        EXPECT_EQ(RiffleArrayInt2026_head(whole.handle(), indices.handle(), 5, 6, 1e10), 0);
        EXPECT_EQ(RiffleArrayCDB2026_head(z.handle(), indices.handle(), 5, 6, 1e10), 0);
        for (int32_t i = 0; i < n; ++i) {
            const int32_t from = order[static_cast<std::size_t>(i)];
            EXPECT_EQ(x[i], from);
            EXPECT_EQ(whole[i], -from);
            EXPECT_EQ(z[i].im, -2.0 * from);
        }
        Order sorted = order;
        std::sort(sorted.begin(), sorted.end());
        for (int32_t i = 0; i < n; ++i)
            ASSERT_EQ(sorted[static_cast<std::size_t>(i)], i);
    }
    I32Array indices;
    EXPECT_EQ(RiffleIntNum2026_head(indices.handle(), 3, 1, 1, -1.0), ErrIndexOutOfRange);
    // The last element's number is below 2^53.
    EXPECT_EQ(RiffleIntNum2026_head(indices.handle(), 3, 1, 1, 0x1p53 - 3), 0);
    EXPECT_EQ(RiffleIntNum2026_head(indices.handle(), 3, 1, 1, 0x1p53 - 2), ErrIndexOutOfRange);
}

} // namespace
} // namespace qx::test
