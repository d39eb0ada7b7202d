#include "qx/zero_phase.h"

#include "qx/errors.h"
#include "qx/filtering.h"
#include "tests/support/hostile_host.h"
#include "tests/support/transform_reference.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <cmath>

namespace qx::test {
namespace {

struct States {
    DBLArray xForward, xBackward, yForward, yBackward;
};

Signal Direct(const Signal &x, const Signal &a, const Signal &b, const States &states = States(),
              int32_t keep = 0) {
    const DBLArray signal(x), denominator(a), numerator(b);
    EXPECT_EQ(zeroPhaseFiltH(signal.handle(), denominator.handle(), numerator.handle(),
                             states.xForward.handle(), states.xBackward.handle(),
                             states.yForward.handle(), states.yBackward.handle(), keep),
              0);
    return signal.values();
}

Signal Cascade(const Signal &x, int32_t form, const Signal &a, const Signal &b) {
    const DBLArray signal(x), denominator(a), numerator(b), forward, backward;
    EXPECT_EQ(zeroPhaseCascadeFiltH(signal.handle(), &form, denominator.handle(),
                                    numerator.handle(), forward.handle(), backward.handle(), 0),
              0);
    EXPECT_EQ(forward.size(), static_cast<int32_t>(a.size()));
    return signal.values();
}

// The impulse response of both passes: the autocorrelation of that of one pass.
LongSpectrum ResponseOfBothPasses(const Signal &a, const Signal &b, int32_t reach) {
    LongSpectrum h(static_cast<std::size_t>(reach) + 1);
    for (std::size_t t = 0; t < h.size(); ++t) {
        h[t] = t < b.size() ? b[t] : 0.0;
        for (std::size_t k = 1; k < a.size() && k <= t; ++k)
            h[t] -= static_cast<long double>(a[k]) * h[t - k];
        h[t] /= a.empty() ? 1.0L : a[0];
    }
    LongSpectrum both(2 * h.size() - 1);
    for (std::size_t i = 0; i < h.size(); ++i)
        for (std::size_t j = 0; j < h.size(); ++j)
            both[h.size() - 1 + i - j] += h[i] * h[j];
    return both;
}

TEST(ZeroPhase, TheResponseIsThatOfTheFilterCorrelatedWithItself) {
    constexpr int32_t middle = 60;
    Signal impulse(2 * middle + 1);
    impulse[middle] = 1.0;
    // Poles of magnitude 0.5, so that the response decays completely before the ends.
    for (const auto &[a, b] : {std::pair<Signal, Signal>{{1, -0.5}, {0.25, 0.25}},
                               {{2, 0, 0.5}, {1, 2, -1, 3}},
                               {{}, {3, -1, 4, 1, 5}},
                               {{4}, {2}}}) {
        const Signal y = Direct(impulse, a, b);
        EXPECT_LT(MaxError(y, ResponseOfBothPasses(a, b, middle)), 1e-15);
        for (std::size_t i = 0; i < middle; ++i)
            EXPECT_NEAR(y[i], y[y.size() - 1 - i], 1e-15 * y[middle]) << "zero phase";
    }
    // 1 - 0.5 z and 1 + 0.25 z z, as sections of second and of fourth order.
    const Signal a = {1, -0.5, 0.25, -0.125};
    const Signal direct = Direct(impulse, a, {0.125, 0.375, 0.25});
    EXPECT_LT(MaxError(Cascade(impulse, 0, {-0.5, 0, 0, 0.25}, {0.125, 0.25, 0, 1, 1, 0}),
                       ToLong(direct)),
              1e-15);
    EXPECT_LT(MaxError(Cascade(impulse, 1, {-0.5, 0.25, -0.125, 0}, {0.125, 0.375, 0.25, 0, 0}),
                       ToLong(direct)),
              1e-15);
}

TEST(ZeroPhase, GainsActTwiceAndNothingElseHappens) {
    const Signal x = RandomSignal(30);
    EXPECT_TRUE(SameBits(Direct(x, {1}, {1}), x));
    EXPECT_TRUE(SameBits(Direct(x, {}, {}), x));
    EXPECT_TRUE(SameBits(Cascade(x, 0, {}, {}), x));
    Signal quarter = x;
    for (double &value : quarter)
        value *= 0.25;
    EXPECT_TRUE(SameBits(Direct(x, {1}, {0.5}), quarter));
    EXPECT_TRUE(SameBits(Cascade(x, 0, {0, 0}, {0.5, 0, 0}), quarter));
}

// Both passes include as many padding zeros as there are coefficients; the tail of a slow filter is
// cut off there. The padding of a cascade depends on the upper coefficients of its first section.
TEST(ZeroPhase, ThePaddingFollowsTheCoefficients) {
    const auto tail = [](const Signal &response, int32_t pad, double pole) {
        // The last output sums the squares of the forward response over the sample and the `pad`
        // samples after it.
        double sum = 0;
        for (int32_t i = 0; i <= pad; ++i)
            sum += std::pow(pole, 2 * i);
        return std::fabs(response.back() - sum) < 1e-13;
    };
    const Signal impulse = {1};
    EXPECT_TRUE(tail(Direct(impulse, {1, -0.99}, {1}), 2, 0.99));
    EXPECT_TRUE(tail(Direct(impulse, {1, -0.99}, {1, 0, 0, 0, 0}), 5, 0.99));
    EXPECT_TRUE(tail(Cascade(impulse, 0, {-0.99, 0}, {1, 0, 0}), 2, 0.99));
    EXPECT_TRUE(tail(Cascade(impulse, 0, {-0.99, 1e-300}, {1, 0, 0}), 3, 0.99));
    EXPECT_TRUE(tail(Cascade(impulse, 0, {-0.99, 0}, {1, 0, 1e-300}), 3, 0.99));
    EXPECT_TRUE(tail(Cascade(impulse, 0, {-0.99, 0, 0, 0}, {1, 0, 0, 1, 0, 0}), 4, 0.99));
    EXPECT_TRUE(tail(Cascade(impulse, 1, {-0.99, 0, 0, 0}, {1, 0, 0, 0, 0}), 3, 0.99));
    EXPECT_TRUE(tail(Cascade(impulse, 1, {-0.99, 0, 1e-300, 0}, {1, 0, 0, 0, 0}), 5, 0.99));
}

TEST(ZeroPhase, StatesCarryOnOrAreCleared) {
    const Signal x = {1, 2, 3}, a = {1, -0.5}, b = {1, 1};
    const States states;
    const Signal fresh = Direct(x, a, b, states, 1);
    EXPECT_EQ(states.xForward.size() + states.xBackward.size(), 2);
    EXPECT_EQ(states.yForward.size() + states.yBackward.size(), 2);
    EXPECT_NE(states.yForward[0], 0.0);
    EXPECT_FALSE(SameBits(Direct(x, a, b, states, 1), fresh)) << "kept";
    EXPECT_TRUE(SameBits(Direct(x, a, b, states, 0), fresh)) << "cleared";
    (*states.xBackward.handle())->dimSize = 0;
    EXPECT_TRUE(SameBits(Direct(x, a, b, states, 1), fresh))
        << "a state of another size clears all";
    // An FIR filter has no y.
    Direct(x, {}, b, states, 1);
    EXPECT_EQ(states.yForward.size() + states.yBackward.size(), 0);
}

TEST(ZeroPhase, FailuresLeaveTheSignal) {
    const DBLArray x{1, 2, 3}, none, a{1, 1}, b{1, 1, 1};
    const States states{DBLArray{1}, DBLArray{2}, DBLArray{3, 4}, DBLArray{5, 6}};
    const auto direct = [&](const DBLArray &signal, const DBLArray &denominator,
                            const DBLArray &numerator) {
        return zeroPhaseFiltH(signal.handle(), denominator.handle(), numerator.handle(),
                              states.xForward.handle(), states.xBackward.handle(),
                              states.yForward.handle(), states.yBackward.handle(), 1);
    };
    EXPECT_EQ(direct(none, a, none), ErrEmptyInput);
    EXPECT_EQ(direct(x, a, none), ErrSizesDisagree);
    EXPECT_EQ(states.yBackward.size(), 2) << "no state is touched";
    ResetHost(3, 77);
    EXPECT_EQ(direct(x, a, b), 77);
    ResetHost();
    EXPECT_EQ(states.xForward.size() + states.xBackward.size() + states.yForward.size() +
                  states.yBackward.size(),
              0);

    const DBLArray forward{1, 2}, backward{3, 4};
    const auto cascade = [&](int32_t form, const DBLArray &signal, const DBLArray &denominator,
                             const DBLArray &numerator) {
        return zeroPhaseCascadeFiltH(signal.handle(), &form, denominator.handle(),
                                     numerator.handle(), forward.handle(), backward.handle(), 1);
    };
    EXPECT_EQ(cascade(0, none, a, none), ErrEmptyInput);
    EXPECT_EQ(cascade(0, x, a, none), ErrSizesDisagree);
    EXPECT_EQ(cascade(0, x, none, b), ErrSizesDisagree);
    EXPECT_EQ(cascade(2, x, a, b), ErrInvalidSelector);
    EXPECT_EQ(cascade(1, x, a, b), ErrCoefficientSizes);
    EXPECT_EQ(cascade(0, x, a, a), ErrCoefficientSizes);
    EXPECT_EQ(forward.size() + backward.size(), 4);
    ResetHost(2, 77);
    const DBLArray sections{1, 1, 1, 1}, numerators{1, 1, 1, 1, 1, 1};
    EXPECT_EQ(cascade(0, x, sections, numerators), 77);
    ResetHost();
    EXPECT_EQ(forward.values(), (Signal{0, 0, 0, 0})) << "resized and cleared";
    EXPECT_EQ(backward.values(), (Signal{3, 4}));
    EXPECT_EQ(x.values(), (Signal{1, 2, 3}));
}

} // namespace
} // namespace qx::test
