#include "qx/smoothing.h"

#include "qx/errors.h"
#include "tests/support/hostile_host.h"
#include "tests/support/transform_reference.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <cmath>
#include <limits>
#include <vector>

namespace qx::test {
namespace {

constexpr double nan = std::numeric_limits<double>::quiet_NaN();

// The fit by polynomials that are orthogonal under the weights, in long double.
class OrthogonalFit {
public:
    OrthogonalFit(int order, int frame, const Signal &weights) : half_(frame / 2) {
        for (int i = 0; i < frame; ++i)
            weights_.push_back(weights.empty() ? 1 : std::fabs(weights[i]));
        std::vector<Long> one(frame, 1.0L), before(frame, 0.0L);
        Long normBefore = 1;
        for (int k = 0; k <= order; ++k) {
            basis_.push_back(one);
            const Long norm = product(one, one), middle = product(one, one, 1) / norm;
            norms_.push_back(norm);
            std::vector<Long> next(frame);
            for (int i = 0; i < frame; ++i)
                next[i] =
                    (i - half_ - middle) * one[i] - (k > 0 ? norm / normBefore : 0) * before[i];
            before = one;
            one = next;
            normBefore = norm;
        }
    }
    // The weight of sample j in the value at place i.
    Long element(int i, int j) const {
        Long sum = 0;
        for (std::size_t k = 0; k < basis_.size(); ++k)
            sum += basis_[k][i] * basis_[k][j] * weights_[j] / norms_[k];
        return sum;
    }

private:
    Long product(const std::vector<Long> &a, const std::vector<Long> &b, int power = 0) const {
        Long sum = 0;
        for (std::size_t i = 0; i < a.size(); ++i)
            sum += a[i] * b[i] * weights_[i] * (power > 0 ? static_cast<Long>(i) - half_ : 1.0L);
        return sum;
    }
    int half_;
    std::vector<Long> weights_, norms_;
    std::vector<std::vector<Long>> basis_;
};

Signal SomeWeights(int frame) {
    Signal weights;
    for (int i = 0; i < frame; ++i)
        weights.push_back((i % 3 == 1 ? -1 : 1) * (0.5 + i % 5));
    return weights;
}

struct Shape {
    int order, frame;
    double bound;
};
// Four times the measured error; the inverse of the normal equations loses digits according to
// their condition number.
constexpr Shape shapes[] = {{1, 3, 2e-15},   {2, 5, 2e-15},    {2, 3, 4e-15},
                            {4, 5, 4e-14},   {3, 21, 4e-15},   {5, 31, 3e-14},
                            {6, 101, 5e-14}, {1, 1001, 1e-16}, {8, 33, 3e-12}};

TEST(SavitzkyGolay, MatricesAreTheProjectionOntoPolynomials) {
    for (const bool isWeighted : {false, true}) {
        for (const auto &[order, frame, bound] : shapes) {
            const Signal weights = isWeighted ? SomeWeights(frame) : Signal();
            const OrthogonalFit reference(order, frame, weights);
            const DBLArray w(weights);
            const DBLMatrix smoothing(1, 2), differentiators(1, 2);
            ASSERT_EQ(SavitzkyGolayCoefH(order, frame, w.handle(), 1, smoothing.handle(),
                                         differentiators.handle()),
                      0);
            ASSERT_EQ(smoothing.rows(), frame);
            ASSERT_EQ(smoothing.cols(), frame);
            ASSERT_EQ(differentiators.rows(), order + 1);
            ASSERT_EQ(differentiators.cols(), frame);
            double worst = 0;
            for (int i = 0; i<frame; i += frame> 100 ? 50 : 1)
                for (int j = 0; j<frame; j += frame> 100 ? 25 : 1)
                    worst = std::max(worst, static_cast<double>(std::fabs(
                                                smoothing.at(i, j) - reference.element(i, j))));
            EXPECT_LT(worst, bound) << order << " " << frame;
            // Row i gives the coefficient of t^i, in units of half the frame.
            const double half = frame / 2;
            for (int power = 0; power <= order; ++power) {
                for (int i = 0; i <= order; ++i) {
                    double found = 0;
                    for (int j = 0; j < frame; ++j)
                        found += differentiators.at(i, j) * std::pow(j / half - 1, power);
                    EXPECT_NEAR(found * std::pow(half, i), i == power, (20 + frame) * bound)
                        << order << " " << frame;
                }
            }
        }
    }
}

TEST(SavitzkyGolay, OnlyTheMagnitudeOfWeightsCounts) {
    const DBLMatrix plain(1, 1), weighted(1, 1), kept(2, 3);
    const DBLArray none, ones{1, -1, 1, 1, -1};
    ASSERT_EQ(SavitzkyGolayCoefH(2, 5, none.handle(), 0, plain.handle(), kept.handle()), 0);
    ASSERT_EQ(SavitzkyGolayCoefH(2, 5, ones.handle(), 0, weighted.handle(), kept.handle()), 0);
    EXPECT_TRUE(SameBits(plain.values(), weighted.values()));
    EXPECT_EQ(kept.rows() * 10 + kept.cols(), 23) << "differentiators were not requested";
}

Signal Smooth(const Signal &x, int order, int frame, const Signal &weights = {}) {
    const DBLArray in(x), w(weights), y(1);
    EXPECT_EQ(SavitzkyGolayFiltH(in.handle(), order, frame, w.handle(), y.handle()), 0);
    return y.values();
}

TEST(SavitzkyGolay, TheFilterTakesTheFrameAroundEachSampleAndTheEndsFromTheOuterFrames) {
    for (const auto &[order, frame, bound] : shapes) {
        for (const int n : {frame, frame + 1, 2 * frame, 3 * frame + 40}) {
            const Signal x = RandomSignal(n), weights = SomeWeights(frame);
            const Signal y = Smooth(x, order, frame, weights);
            ASSERT_EQ(y.size(), x.size());
            const OrthogonalFit reference(order, frame, weights);
            for (int i = 0; i < n; i += 1 + n / 50) {
                const int start = std::clamp(i - frame / 2, 0, n - frame);
                Long sum = 0;
                for (int j = 0; j < frame; ++j)
                    sum += reference.element(i - start, j) * x[start + j];
                EXPECT_NEAR(y[i], static_cast<double>(sum), 4 * bound) << frame << " " << i;
            }
        }
    }
}

TEST(SavitzkyGolay, PolynomialsPassUnchangedIncludingTheirEnds) {
    Signal quadratic;
    for (int i = 0; i < 40; ++i)
        quadratic.push_back(3 - 2 * i + 0.25 * i * i);
    const Signal y = Smooth(quadratic, 2, 5);
    for (int i = 0; i < 40; ++i)
        EXPECT_NEAR(y[i], quadratic[i], 1e-12);
}

TEST(SavitzkyGolay, Failures) {
    const DBLArray x{1, 2, 3, 4}, none, three{1, 2, 3}, y{1};
    const DBLArray zeros{0, 0, 0}, notFinite{1, nan, 1};
    const DBLMatrix smoothing(1, 1), differentiators(1, 1);
    const auto coefficients = [&](int order, int frame, const DBLArray &weights) {
        return SavitzkyGolayCoefH(order, frame, weights.handle(), 0, smoothing.handle(),
                                  differentiators.handle());
    };
    const auto filter = [&](int order, int frame, const DBLArray &weights) {
        return SavitzkyGolayFiltH(x.handle(), order, frame, weights.handle(), y.handle());
    };
    for (int which = 0; which < 2; ++which) {
        const auto run = [&](int order, int frame, const DBLArray &weights) {
            return which == 0 ? coefficients(order, frame, weights) : filter(order, frame, weights);
        };
        EXPECT_EQ(run(0, 0, three), ErrBadCoefficients);
        EXPECT_EQ(run(3, 3, none), ErrPolynomialOrderTooHigh);
        EXPECT_EQ(run(2, 4, three), ErrSizeMismatch);
        EXPECT_EQ(run(2, 4, none), ErrBadTapCount);
        EXPECT_EQ(run(1, 3, zeros), ErrSingularMatrix);
        EXPECT_EQ(run(1, 3, notFinite), ErrNonFiniteInput);
    }
    qx::test::ResetHost();
    EXPECT_EQ(coefficients(2, 46340, none), ErrBadTapCount);
    for (const qx::test::Reshape &reshape : qx::test::Host().reshapes)
        EXPECT_EQ(reshape.count, 0) << "a refused call requests no memory from the host";
    EXPECT_EQ(filter(2, 5, none), ErrSizesDisagree);
    EXPECT_EQ(y.size() + smoothing.rows() + differentiators.rows(), 0);
    // Powers that are linearly dependent in double precision.
    EXPECT_EQ(coefficients(8, 223, none), 0);
    EXPECT_EQ(coefficients(8, 225, none), ErrSingularMatrix);
}

Signal MedianFilter(const Signal &x, int left, int right) {
    const DBLArray array(x);
    EXPECT_EQ(MedianFilter81_H(array.handle(), left, right), 0);
    return array.values();
}

// Each window on its own, sorted so that equal values keep their order.
Signal MediansByDefinition(const Signal &x, int left, int right) {
    Signal padded(left, 0.0), medians;
    padded.insert(padded.end(), x.begin(), x.end());
    padded.insert(padded.end(), right, 0.0);
    const int width = left + right + 1;
    for (std::size_t i = 0; i < x.size(); ++i) {
        Signal window(padded.begin() + i, padded.begin() + i + width);
        std::stable_sort(window.begin(), window.end());
        medians.push_back(width % 2 != 0 ? window[width / 2]
                                         : (window[width / 2 - 1] + window[width / 2]) * 0.5);
    }
    return medians;
}

// Few different values, among them zeros of both signs and infinities.
Signal Coarse(int n) {
    Signal x;
    for (const double value : RandomSignal(n, 7)) {
        const double step = std::trunc(value * 4) / 2;
        x.push_back(std::fabs(value) > 0.98 ? value * HUGE_VAL : step);
    }
    return x;
}

TEST(MedianFilter, EveryWindowHasItsMedian) {
    for (const int n : {1, 2, 5, 20, 100, 700, 5000})
        for (const auto &[left, right] :
             {std::pair(0, 1), {1, 0}, {1, 1}, {2, 3}, {7, 7}, {0, 30}, {31, 0}, {40, 41}, {90, 3}})
            for (const Signal &x : {RandomSignal(n), Coarse(n)})
                if (right < n) {
                    ASSERT_TRUE(
                        SameBits(MedianFilter(x, left, right), MediansByDefinition(x, left, right)))
                        << n << ": " << left << ", " << right;
                }
    // Several tiles, of which the last may be short, and windows too wide for lanes.
    for (const auto &[n, left, right] : {std::tuple(70000, 3, 2),
                                         {4099, 3, 2},
                                         {6200, 9, 0},
                                         {30000, 20, 20},
                                         {9000, 128, 127},
                                         {3000, 200, 150},
                                         {500, 2000, 10}})
        for (const Signal &x : {RandomSignal(n), Coarse(n)})
            ASSERT_TRUE(SameBits(MedianFilter(x, left, right), MediansByDefinition(x, left, right)))
                << n << ": " << left << ", " << right;
}

// The reference: a sorted list that is searched and updated value by value.
Signal MediansOfAList(const Signal &x, int left, int right) {
    std::vector<double> line(left, 0.0);
    line.insert(line.end(), x.begin(), x.end());
    line.insert(line.end(), right + 1, 0.0);
    const int width = left + right + 1;
    std::vector<double> list(line.begin(), line.begin() + width);
    std::stable_sort(list.begin(), list.end(),
                     [](double a, double b) { return a < b || (std::isnan(a) && !std::isnan(b)); });
    Signal medians;
    for (std::size_t i = 0; i < x.size(); ++i) {
        medians.push_back(width % 2 != 0 ? list[width / 2]
                                         : (list[width / 2 - 1] + list[width / 2]) * 0.5);
        const auto leaving = std::find(list.begin(), list.end(), line[i]);
        list.erase(leaving == list.end() ? list.end() - 1 : leaving);
        const double entering = line[i + width];
        list.insert(std::find_if(list.begin(), list.end(), [&](double v) { return v > entering; }),
                    entering);
    }
    return medians;
}

TEST(MedianFilter, NaNBehavesAsInASortedListSearchedByEquality) {
    int affected = 0;
    for (const int n : {10, 300, 2000}) {
        for (const int at : {0, 1, 4, n / 2, n - 1}) {
            Signal x = RandomSignal(n, 3);
            x[at] = nan;
            x[(at + 5) % n] = nan;
            for (const auto &[left, right] : {std::pair(1, 1), {2, 3}, {0, 4}, {9, 9}}) {
                const Signal expected = MediansOfAList(x, left, right);
                const Signal y = MedianFilter(x, left, right);
                ASSERT_EQ(y.size(), expected.size());
                for (int i = 0; i < n; ++i) {
                    affected += std::isnan(y[i]);
                    ASSERT_TRUE(y[i] == expected[i] ||
                                (std::isnan(y[i]) && std::isnan(expected[i])))
                        << n << " " << at << " " << left;
                }
            }
        }
    }
    EXPECT_GT(affected, 100);
}

TEST(MedianFilter, BothExportsAndTheirLimits) {
    const auto symmetric = [](const DBLArray &x, int32_t rank) {
        ErrorCode err = 1;
        EXPECT_EQ(MedianFilterCIN(x.handle(), &rank, &err), 0);
        return err;
    };
    const DBLArray x{5, 1, 4};
    EXPECT_EQ(symmetric(x, 1), 0);
    EXPECT_EQ(x.values(), (Signal{1, 4, 1}));
    EXPECT_EQ(symmetric(x, 2), 0);
    EXPECT_EQ(x.values(), (Signal{1, 1, 1})) << "padded with two zeros at either end";
    EXPECT_EQ(MedianFilter({5, 1, 4}, 1, -1), (Signal{1, 4, 1}));
    EXPECT_TRUE(SameBits(MedianFilter({5, nan, -0.0}, 0, 0), {5, nan, -0.0}));

    EXPECT_EQ(symmetric(x, 3), ErrSizesDisagree);
    EXPECT_EQ(x.size(), 0);
    EXPECT_EQ(symmetric(x, 3), 0) << "nothing to filter";
    EXPECT_EQ(symmetric(x, -1), ErrNegativeCount);
    const DBLArray two{1, 2};
    EXPECT_EQ(MedianFilter81_H(two.handle(), -1, 1), ErrNegativeCount);
    EXPECT_EQ(two.size(), 0);
    const DBLArray wide{1, 2};
    EXPECT_EQ(MedianFilter81_H(wide.handle(), 2147483647, 1), 0) << "no memory for all the zeros";
    EXPECT_EQ(wide.values(), (Signal{0, 0}));
}

} // namespace
} // namespace qx::test
