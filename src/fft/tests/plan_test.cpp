#include "fft/plan.h"
#include "fft/plan_slot.h"
#include "tests/support/heap_probe.h"
#include "tests/support/hostile_host.h"

#include <gtest/gtest.h>

#include <atomic>
#include <chrono>
#include <cmath>
#include <cstdint>
#include <future>
#include <latch>
#include <limits>
#include <set>
#include <thread>
#include <utility>
#include <vector>

namespace qx::test {
namespace {

typedef std::vector<std::pair<int32_t, int32_t>> Factors; // factor, kind

Factors FactorsOf(const FFTPlan &plan) {
    Factors factors;
    for (int32_t i = 0; i < plan.factorCount; ++i)
        factors.emplace_back(plan.factors[i], plan.kinds[i]);
    return factors;
}

TEST(Plan, FactorisesIntoRadicesAndPrimes) {
    const std::pair<int32_t, Factors> cases[] = {
        {1, {}},
        {20, {{2, 0}, {10, 0}}},
        {48, {{3, 0}, {16, 0}}},
        {1000, {{10, 0}, {10, 0}, {10, 0}}},
        {1024, {{32, 0}, {32, 0}}},
        {2048, {{2, 0}, {32, 0}, {32, 0}}},
        {36, {{2, 0}, {18, 0}}},
        {162, {{9, 0}, {18, 0}}},
        {23, {{23, 1}}},
        {46, {{2, 0}, {23, 1}}},
        {47, {{47, 1}}},
        {53, {{53, 2}}},
        {106, {{2, 0}, {53, 2}}},
        {2809, {{53, 2}, {53, 2}}},
        {23 * 47 * 59, {{23, 1}, {47, 1}, {59, 2}}},
        {23 * 23 * 41, {{23, 1}, {23, 1}, {41, 0}}},
        {99991, {{99991, 2}}},
    };
    for (const auto &[length, expected] : cases) {
        const PlanReference plan(length);
        ASSERT_TRUE(plan) << length;
        EXPECT_EQ(FactorsOf(*plan.get()), expected) << length;
        EXPECT_EQ(plan.get()->length, length);
    }
}

TEST(Plan, SharesOnePlanPerLength) {
    FFTPlan *const first = qx::create_oxfft_table(360);
    FFTPlan *const second = qx::create_oxfft_table(360);
    EXPECT_EQ(first, second);
    EXPECT_EQ(first->refCount, 2);
    qx::destroy_oxfft_table(first);
    EXPECT_EQ(second->refCount, 1);
    qx::destroy_oxfft_table(second);
    qx::destroy_oxfft_table(nullptr);
    EXPECT_EQ(qx::create_oxfft_table(0), nullptr);
    EXPECT_EQ(qx::create_oxfft_table(-7), nullptr);
    EXPECT_EQ(qx::create_oxfft_table(std::numeric_limits<int32_t>::min()), nullptr);
}

TEST(Plan, PrimePlansHoldTheirSubPlans) {
    FFTPlan *const plan107 = qx::create_oxfft_table(107);
    FFTPlan *const plan106 = plan107->stages[0]->raderPlan;
    FFTPlan *const plan52 = plan106->stages[1]->raderPlan;
    EXPECT_EQ(plan106->length, 106);
    EXPECT_EQ(plan52->length, 52);
    EXPECT_EQ(FactorsOf(*plan52), (Factors{{4, 0}, {13, 0}}));
    {
        const PlanReference also52(52);
        const PlanReference also53(53);
        EXPECT_EQ(also52.get(), plan52);
        EXPECT_EQ(plan52->refCount, 3); // 106, 53 and this test
    }
    EXPECT_EQ(plan52->refCount, 1);
    {
        const PlanReference keeps52(52);
        qx::destroy_oxfft_table(plan107);
        EXPECT_EQ(plan52->refCount, 1);
        EXPECT_EQ(plan52->prev, nullptr);
        EXPECT_EQ(plan52->next, nullptr); // 107 and 106 have left the cache
    }
}

// If p - 1 itself has large prime factors, the convolution is padded to a length that avoids
// aliasing and has only factors with kernels.
TEST(Plan, PrimesAboveANumberWithLargeFactorsAreConvolvedWithPadding) {
    for (const int32_t p : {167, 719, 10007, 24469}) {
        const PlanReference plan(p);
        ASSERT_TRUE(plan);
        EXPECT_EQ(FactorsOf(*plan.get()), (Factors{{p, 2}}));
        const FFTPlan &convolution = *plan.get()->stages[0]->raderPlan;
        EXPECT_GE(convolution.length, 2 * p - 3);
        for (const auto &[factor, kind] : FactorsOf(convolution))
            EXPECT_EQ(kind, 0) << factor;
    }
    for (const int32_t p : {53, 107, 257, 8191}) {
        const PlanReference plan(p);
        EXPECT_EQ(plan.get()->stages[0]->raderPlan->length, p - 1);
    }
}

TEST(Plan, HoldsTheRootsAtTheirPlaces) {
    const PlanReference plan(4 * 13 * 23); // factors 4, 13, 23
    const FFTPlan &table = *plan.get();
    int32_t n = table.length;
    const long double turn = 8 * std::atan(1.0L);
    for (int32_t s = 0; s + 1 < table.factorCount; ++s) {
        const int32_t p = table.factors[s];
        for (int32_t k = 1; k < n / p; ++k) {
            for (int32_t j = 1; j < p; ++j) {
                const int32_t at = (k - 1) * (p - 1) + j - 1;
                const long double angle = turn * j * k / n;
                ASSERT_NEAR(table.stages[s]->twiddleCos[at], std::cos(angle), 1.8e-15);
                ASSERT_NEAR(table.stages[s]->twiddleSin[at], -std::sin(angle), 1.8e-15);
            }
        }
        n /= p;
    }
    EXPECT_EQ(table.stages[2]->twiddleCos, nullptr);
    for (int32_t k = 0; k < 23; ++k) {
        EXPECT_NEAR(table.stages[2]->rootCos[k], std::cos(turn * k / 23), 1e-15);
        EXPECT_NEAR(table.stages[2]->rootSin[k], -std::sin(turn * k / 23), 1e-15);
    }

    // 5 is the smallest generator of the units modulo 73.
    const PlanReference prime(73);
    const FFTStage &rader = *prime.get()->stages[0];
    int32_t power = 1;
    for (int32_t i = 1; i < 73; ++i) {
        EXPECT_EQ(rader.raderScatter[i], power);
        EXPECT_EQ(rader.raderGather[i] * power % 73, 1);
        power = power * 5 % 73;
    }
}

// Threads that simultaneously acquire and release the same lengths, among them primes with nested
// plans, share one plan per length and leave none behind.
TEST(Plan, IsSharedByThreadsThatBuildItSimultaneously) {
    constexpr int32_t lengths[] = {53, 106, 5003, 4096, 2809};
    std::atomic<int> faults = 0;
    std::vector<std::thread> threads;
    for (int t = 0; t < 8; ++t)
        threads.emplace_back([&, t] {
            for (int round = 0; round < 200; ++round) {
                const int32_t length = lengths[(round + t) % 5];
                FFTPlan *const plan = qx::create_oxfft_table(length);
                FFTPlan *const again = qx::create_oxfft_table(length);
                faults += plan == nullptr || plan != again || plan->length != length;
                qx::destroy_oxfft_table(again);
                qx::destroy_oxfft_table(plan);
            }
        });
    for (std::thread &thread : threads)
        thread.join();
    EXPECT_EQ(faults, 0);
    for (const int32_t length : lengths) {
        const PlanReference plan(length);
        EXPECT_EQ(plan.get()->refCount, 1) << length;
    }
}

std::latch *builderStands = nullptr, *builderMayGoOn = nullptr;
void StandInTheMiddle() {
    builderStands->count_down();
    builderMayGoOn->wait();
}

// While one thread builds a plan, which may take seconds, other threads can build theirs.
TEST(Plan, OfAnotherLengthIsBuiltConcurrently) {
    if (!HeapProbe::works())
        GTEST_SKIP();
    std::latch stands(1), mayGoOn(1);
    builderStands = &stands;
    builderMayGoOn = &mayGoOn;
    FFTPlan *slow = nullptr;
    std::thread builder([&] {
        const HeapProbe probe(3, StandInTheMiddle);
        slow = qx::create_oxfft_table(1 << 10);
    });
    stands.wait();
    auto quick = std::async(std::launch::async, [] { return qx::create_oxfft_table(8); });
    const bool waits = quick.wait_for(std::chrono::seconds(20)) != std::future_status::ready;
    mayGoOn.count_down();
    builder.join();
    EXPECT_FALSE(waits);
    qx::destroy_oxfft_table(quick.get());
    EXPECT_NE(slow, nullptr);
    qx::destroy_oxfft_table(slow);
}

// The permutations of a prime hold the powers of its smallest generator, that is, all nonzero
// residues once each.
TEST(Plan, OrdersOfPrimesAreThePowersOfAGenerator) {
    for (const auto &[p, generator] :
         {std::pair{53, 2}, {71, 7}, {191, 19}, {409, 21}, {5881, 31}}) {
        const PlanReference plan(p);
        const int32_t *order = plan.get()->stages[0]->raderScatter;
        EXPECT_EQ(order[2], generator) << p;
        EXPECT_EQ((std::set<int32_t>(order + 1, order + p).size()),
                  static_cast<std::size_t>(p - 1));
    }
}

TEST(PlanSlot, IsRefusedIfItsSweepCannotBeRegistered) {
    PlanSlot slot = nullptr;
    Host().sweepStatus = 5;
    EXPECT_EQ(qx::PlanSlotAcquire(&slot, 12), ErrOutOfMemory);
    EXPECT_EQ(slot, nullptr);
    ResetHost();
    {
        const PlanReference plan(12);
        EXPECT_EQ(plan.get()->refCount, 1) << "the refused plan was released";
    }
    ASSERT_EQ(qx::PlanSlotAcquire(&slot, 12), 0);
    RunSweepOf(slot);
}

// Each allocation of a plan with three sub-plans fails in turn, and nothing is left behind.
TEST(Plan, IsBuiltWholeOrNotAtAll) {
    if (!HeapProbe::works())
        GTEST_SKIP();
    const PlanReference held(52);
    int32_t failures = 0;
    for (FFTPlan *plan = nullptr; plan == nullptr; ++failures) {
        const HeapProbe probe(failures + 1);
        plan = qx::create_oxfft_table(107 * 32 * 23);
        const int32_t holders = held.get()->refCount;
        qx::destroy_oxfft_table(plan);
        EXPECT_EQ(probe.liveAllocations(), 0) << "allocation " << failures + 1;
        EXPECT_EQ(holders, plan == nullptr ? 1 : 2);
        ASSERT_LT(failures, 200);
    }
    EXPECT_GT(failures, 30);
    EXPECT_EQ(held.get()->refCount, 1);
    EXPECT_EQ(held.get()->next, nullptr);
}

// Tables grow in proportion to the length, whatever its factors: there are a few dozen of them,
// none with more than eight values per value of the transform.
TEST(Plan, TakesMemoryInProportionToItsLength) {
    if (!HeapProbe::works())
        GTEST_SKIP();
    for (const int32_t n : {10007, 24469, 99991, 1000003, 1 << 20, 1018081, 2 * 500009}) {
        const HeapProbe probe(0, std::size_t{64} * static_cast<std::size_t>(n));
        FFTPlan *const plan = qx::create_oxfft_table(n);
        EXPECT_NE(plan, nullptr) << n;
        EXPECT_LT(probe.liveAllocations(), 60) << n;
        qx::destroy_oxfft_table(plan);
    }
}

TEST(Plan, TableThatCannotBeHeldIsNull) {
    EXPECT_EQ(qx::create_oxfft_table(std::numeric_limits<int32_t>::max()), nullptr);
    EXPECT_EQ(qx::create_oxfft_table(std::numeric_limits<int32_t>::max() - 1), nullptr);
    EXPECT_EQ(qx::create_oxfft_table(1 << 30), nullptr);
}

} // namespace
} // namespace qx::test
