#include "qx/window_constants.h"

#include "qx/errors.h"
#include "tests/support/hostile_host.h"

#include <gtest/gtest.h>

#include <cmath>
#include <limits>
#include <utility>
#include <vector>

namespace qx::test {
namespace {

typedef std::vector<double> Values;

const double nan = std::numeric_limits<double>::quiet_NaN();

TEST(WindowConstants, AreStoredOrMeasured) {
    WindowConstants c = {0, 0};
    const DBLArray ones(Values(5, 1.0));
    EXPECT_EQ(NumWinConstH(ones.handle(), &c), 0);
    EXPECT_EQ(c.enbw, 1.0);
    EXPECT_EQ(c.cg, 1.0);
    const DBLArray ramp{1.0, 2.0, 3.0};
    EXPECT_EQ(NumWinConstH(ramp.handle(), &c), 0);
    EXPECT_DOUBLE_EQ(c.enbw, 3.0 * 14.0 / 36.0);
    EXPECT_EQ(c.cg, 2.0);
    const auto expectNaN = [&](ErrorCode status, ErrorCode code) {
        EXPECT_EQ(status, code);
        EXPECT_TRUE(std::isnan(c.enbw) && std::isnan(c.cg));
        c = {0, 0};
    };
    const DBLArray none(0);
    expectNaN(NumWinConstH(none.handle(), &c), ErrEmptyInput);
    expectNaN(WinConstByNameH(0, 1, 0, &c), ErrEmptyInput);
    expectNaN(WinConstByNameH(9, 12, 0, &c), ErrInvalidSelector);
    expectNaN(WinConstByNameH(9, 64, 0, &c), ErrInvalidSelector);
    expectNaN(WinConstByNameH(9, -1, 0, &c), ErrInvalidSelector);
    EXPECT_EQ(WinConstByNameH(1, 30, 0, &c), 0) << "a window of zeros";
    EXPECT_TRUE(std::isnan(c.enbw));
    EXPECT_EQ(c.cg, 0.0);
    expectNaN(WinConstByNameH(9, 61, nan, &c), 0);
    expectNaN(WinConstByNameH_2016(0, 61, nan, &c), ErrEmptyInput);

    EXPECT_EQ(WinConstByNameH(7, 1, 0, &c), 0);
    EXPECT_EQ(c.enbw, 1.5);
    EXPECT_EQ(c.cg, 0.5);
    // Measured over a long window, the constants are close to the figures in the literature.
    for (const auto &[selector, enbw] : std::vector<std::pair<int32_t, double>>{{30, 4.0 / 3.0},
                                                                                {31, 1.45584787},
                                                                                {32, 1.78574087544},
                                                                                {33, 1.91746031746},
                                                                                {34, 1.2}}) {
        EXPECT_EQ(WinConstByNameH(100000, selector, 0, &c), 0);
        EXPECT_NEAR(c.enbw, enbw, 5e-9) << selector;
    }
    // The stored figures are not computed, but are close to those of the coefficients.
    const std::vector<std::pair<int32_t, Values>> sums{
        {1, {0.5, 0.5}},
        {2, {0.54, 0.46}},
        {3, {0.42323, 0.49755, 0.07922}},
        {4, {7938.0 / 18608, 9240.0 / 18608, 1430.0 / 18608}},
        {5, {0.42, 0.5, 0.08}},
        {6, {0.215578948, 0.41663158, 0.277263158, 0.083578947, 0.006947368}},
        {7, {0.35875, 0.48829, 0.14128, 0.01168}},
        {9, {0.323215218, 0.471492057, 0.17553428, 0.028497078, 0.001261367}},
        {11, {0.3635819, 0.4891775, 0.1365995, 0.0106411}}};
    for (const auto &[selector, a] : sums) {
        double enbw = 1.0;
        for (std::size_t k = 1; k < a.size(); ++k)
            enbw += 0.5 * (a[k] / a[0]) * (a[k] / a[0]);
        EXPECT_EQ(WinConstByNameH(3, selector, 0, &c), 0);
        const bool isLong = selector == 6 || selector == 9;
        const double bound = isLong ? 1e-8 : (selector == 11 ? 3e-6 : 6e-7);
        EXPECT_NEAR(c.enbw, enbw, bound) << selector;
        EXPECT_NEAR(c.cg, a[0], selector == 4 ? 6e-12 : 0.0) << selector;
    }
    WindowConstants decibels = {0, 0};
    EXPECT_EQ(WinConstByNameH(50, 61, 1000.0, &c), 0);
    EXPECT_EQ(WinConstByNameH_2016(50, 61, nan, &decibels), 0);
    EXPECT_DOUBLE_EQ(decibels.enbw, c.enbw);
    EXPECT_EQ(WinConstByNameH_2016(50, 62, -1.0, &decibels), 0);
    EXPECT_EQ(WinConstByNameH(50, 62, 0.2, &c), 0);
    EXPECT_EQ(decibels.enbw, c.enbw);
}

} // namespace
} // namespace qx::test
