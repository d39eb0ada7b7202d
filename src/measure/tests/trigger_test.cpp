#include "qx/trigger.h"

#include "qx/errors.h"
#include "tests/support/hostile_host.h"
#include "tests/support/recipe.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <cmath>
#include <limits>
#include <vector>

namespace qx::test {
namespace {

typedef std::vector<double> Samples;

const double nan = std::numeric_limits<double>::quiet_NaN();
constexpr double inf = std::numeric_limits<double>::infinity();

struct Settings {
    double level, hysteresis;
    int32_t slope, holdoff;
};

struct Hit {
    int64_t index;
    double position;
    bool operator==(const Hit &) const = default;
    friend std::ostream &operator<<(std::ostream &to, const Hit &hit) {
        return to << hit.index << " at " << hit.position;
    }
};
typedef std::vector<Hit> Hits;

// The triggers of a stream in blocks of the given lengths, the last of which repeats.
Hits InBlocks(const Samples &y, const Settings &settings, const std::vector<int32_t> &lengths) {
    Hits hits;
    TriggerState state = {};
    std::size_t block = 0;
    for (std::size_t begin = 0; begin < y.size(); ++block) {
        const auto length =
            std::min(y.size() - begin,
                     static_cast<std::size_t>(lengths[std::min(block, lengths.size() - 1)]));
        const DBLArray samples(Samples(y.begin() + static_cast<std::ptrdiff_t>(begin),
                                       y.begin() + static_cast<std::ptrdiff_t>(begin + length)));
        int32_t index = -1;
        double position = 0;
        do {
            EXPECT_EQ(Triggerh_86(samples.handle(), settings.level, settings.hysteresis,
                                  settings.slope, index + 1, settings.holdoff, &state, &index,
                                  &position),
                      0);
            if (index >= 0)
                hits.push_back(
                    {static_cast<int64_t>(begin) + index, position + static_cast<double>(begin)});
        } while (index >= 0);
        EXPECT_TRUE(std::isnan(position));
        begin += length;
    }
    return hits;
}

// By definition: checks for each sample outside holdoffs whether it is preceded by an arming sample
// that no trigger has used.
std::vector<int64_t> ByDefinition(const Samples &y, const Settings &s) {
    std::vector<int64_t> found;
    const auto isHeldOff = [&](std::size_t i) {
        return !found.empty() && static_cast<int64_t>(i) <= found.back() + s.holdoff;
    };
    std::vector<std::size_t> rising, falling; // arming samples
    for (std::size_t i = 0; i < y.size(); ++i) {
        if (isHeldOff(i))
            continue;
        const bool above = y[i] >= s.level;
        const bool below = y[i] <= s.level;
        if ((s.slope != 1 && above && !rising.empty()) ||
            (s.slope != 0 && below && !falling.empty())) {
            found.push_back(static_cast<int64_t>(i));
            if (above)
                rising.clear();
            if (below)
                falling.clear();
        }
        if (y[i] < s.level - s.hysteresis)
            rising.push_back(i);
        if (y[i] > s.level + s.hysteresis)
            falling.push_back(i);
    }
    return found;
}

Samples Coarse(int seed, std::size_t n) {
    Noise noise(static_cast<uint64_t>(seed));
    Samples y(n);
    for (double &value : y)
        value = std::round(4 * noise.symmetric()) / 4;
    return y;
}

TEST(Trigger, BlocksOfAnySizeGiveWhatTheDefinitionGives) {
    std::size_t all = 0;
    for (int seed = 0; seed < 20; ++seed) {
        const Samples y = Coarse(seed, 300);
        for (const int32_t slope : {0, 1, 2})
            for (const double hysteresis : {0.0, 0.25, 0.6})
                for (const int32_t holdoff : {0, 1, 7}) {
                    const Settings settings = {0.25, hysteresis, slope, holdoff};
                    const Hits whole = InBlocks(y, settings, {300});
                    std::vector<int64_t> indices;
                    for (const Hit &hit : whole)
                        indices.push_back(hit.index);
                    ASSERT_EQ(indices, ByDefinition(y, settings));
                    all += whole.size();
                    for (const std::vector<int32_t> &lengths :
                         {std::vector<int32_t>{1}, {2}, {7}, {299, 1}, {1, 50, 3, 64}}) {
                        const Hits hits = InBlocks(y, settings, lengths);
                        ASSERT_EQ(hits.size(), whole.size());
                        for (std::size_t i = 0; i < hits.size(); ++i) {
                            EXPECT_EQ(hits[i].index, whole[i].index);
                            EXPECT_NEAR(hits[i].position, whole[i].position, 1e-13);
                        }
                    }
                }
    }
    EXPECT_GT(all, 10000u);
}

TEST(Trigger, InterpolatesBetweenTheSamplesAroundTheLevel) {
    const Settings rising = {1.0, 0.0, 0, 0};
    EXPECT_EQ(InBlocks({0, 4, 0.5, 1, 1}, rising, {5}), (Hits{{1, 0.25}, {3, 3}}));
    // Across a block boundary, between the last sample of one block and the first of the next.
    EXPECT_EQ(InBlocks({0, 4}, rising, {1}), (Hits{{1, 0.25}}));
    // The difference of the samples overflows, but the position does not.
    EXPECT_EQ(InBlocks({-1e308, 1e308}, {0.0, 0.0, 0, 0}, {2}), (Hits{{1, 0.5}}));
    // Armed, then above the level within a holdoff: it triggers after the holdoff, at the sample
    // itself.
    EXPECT_EQ(InBlocks({0, 2, 0, 2, 3, 3}, {1.0, 0.0, 2, 2}, {6}), (Hits{{1, 0.5}}));
    EXPECT_EQ(InBlocks({0, 2, 0, 0, 0, 3}, {1.0, 0.0, 2, 2}, {6}), (Hits{{1, 0.5}, {4, 4}}));
    // A sample at the level triggers but does not arm, and jitter within the band triggers once.
    EXPECT_EQ(InBlocks({0, 1, 0.9, 1.1, 0.9, 1.1, 0, 1}, {1.0, 0.25, 0, 0}, {8}),
              (Hits{{1, 1}, {7, 7}}));

    const DBLArray y{3, 0, 4, 0, 4};
    int32_t index = 7;
    double position = 7;
    EXPECT_EQ(Triggerh(y.handle(), 1.0, 0, 2, &index, &position), 0);
    EXPECT_EQ(index, 4); // samples before the start do not arm
    EXPECT_EQ(position, 3.25);
    EXPECT_EQ(Triggerh(y.handle(), 1.0, 0, 5, &index, &position), 0);
    EXPECT_EQ(index, -1);
    EXPECT_TRUE(std::isnan(position));
}

TEST(Trigger, FailuresComeInOrderAndLeaveTheState) {
    const DBLArray empty, y{0, 2, 0, nan, 2};
    const TriggerState before = {0, 1, 2, 1, 5.0};
    const auto fails = [&](const DBLArray &samples, double level, double hysteresis, int32_t slope,
                           int32_t start, int32_t holdoff) {
        TriggerState state = before;
        int32_t index = 7;
        double position = 7;
        const ErrorCode code = Triggerh_86(samples.handle(), level, hysteresis, slope, start,
                                           holdoff, &state, &index, &position);
        EXPECT_EQ(index, -1);
        EXPECT_TRUE(std::isnan(position));
        EXPECT_EQ(state.armedFalling, before.armedFalling);
        EXPECT_EQ(state.holdoffLeft, before.holdoffLeft);
        EXPECT_EQ(state.last, before.last);
        return code;
    };
    EXPECT_EQ(fails(empty, nan, -1, 3, -1, -1), ErrMeasureEmpty);
    EXPECT_EQ(fails(y, nan, -1, 3, -1, -1), ErrInvalidSelector);
    EXPECT_EQ(fails(y, nan, -1, -1, -1, -1), ErrInvalidSelector);
    EXPECT_EQ(fails(y, nan, -1, 0, -1, -1), ErrIndexOutOfRange);
    EXPECT_EQ(fails(y, nan, -1, 0, 6, -1), ErrIndexOutOfRange);
    EXPECT_EQ(fails(y, nan, nan, 0, 5, 0), ErrNegativeSetting);
    EXPECT_EQ(fails(y, nan, 0, 0, 5, -1), ErrNegativeSetting);
    EXPECT_EQ(fails(y, nan, 0, 0, 5, 0), ErrNonFiniteInput);
    EXPECT_EQ(fails(y, 0, inf, 0, 5, 0), ErrNonFiniteInput);
    EXPECT_EQ(fails(y, 1, 0, 0, 0, 0), ErrNonFiniteInput);
    EXPECT_EQ(fails(DBLArray{-inf, -inf, 2}, 1, 0, 0, 0, 0), ErrNonFiniteInput);

    // Samples after the triggering one are not examined.
    int32_t index;
    double position;
    EXPECT_EQ(Triggerh(y.handle(), 1.0, 0, 0, &index, &position), 0);
    EXPECT_EQ(index, 1);
}

} // namespace
} // namespace qx::test
