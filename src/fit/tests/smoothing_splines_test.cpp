#include "fit/tests/least_squares.h"
#include "qx/qx.h"
#include "tests/support/recipe.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <cmath>
#include <numeric>

namespace qx::test {
namespace {

typedef std::vector<std::vector<Long>> Square;

struct Smoothed {
    ErrorCode code;
    Samples values, second, pieces;
    double lambda, effective;
};
Smoothed Smooth(const Samples &x, const Samples &y, const Samples &d, int32_t method,
                double parameter) {
    const DBLArray values, second;
    const DBLMatrix pieces;
    Smoothed result = {};
    result.code = CubicSplineFit_head(
        DBLArray(x).handle(), DBLArray(y).handle(), DBLArray(d).handle(), method, parameter,
        values.handle(), pieces.handle(), second.handle(), &result.lambda, &result.effective);
    result.values = values.values();
    result.second = second.values();
    result.pieces.assign(pieces.data(), pieces.data() + pieces.rows() * pieces.cols());
    return result;
}

struct Data {
    Samples x, y, d;
};
Data Noisy(int n) {
    Noise noise(static_cast<uint64_t>(n));
    Data data;
    double x = -3.0;
    for (int i = 0; i < n; ++i) {
        x += 0.1 + noise.positive();
        data.x.push_back(x);
        data.y.push_back(std::sin(12.0 * i / n) + 0.2 * noise.symmetric());
        data.d.push_back(0.5 + noise.positive());
    }
    return data;
}

// The matrix from y to the values, dense: (D^-2 + lambda Q R^-1 Q')^-1 D^-2.
Square Influence(const Data &data, Long lambda) {
    const std::size_t n = data.x.size(), m = n - 2;
    Square q(n, std::vector<Long>(m)), r(m, std::vector<Long>(m)), sum(n, std::vector<Long>(n));
    for (std::size_t j = 0; j < m; ++j) {
        const Long h = Long{data.x[j + 1]} - data.x[j], next = Long{data.x[j + 2]} - data.x[j + 1];
        q[j][j] = 1 / h;
        q[j + 1][j] = -1 / h - 1 / next;
        q[j + 2][j] = 1 / next;
        r[j][j] = (h + next) / 3;
        if (j + 1 < m)
            r[j][j + 1] = r[j + 1][j] = next / 6;
    }
    const Square inverse = Inverse(r);
    for (std::size_t i = 0; i < n; ++i) {
        sum[i][i] = 1 / (Long{data.d[i]} * data.d[i]);
        for (std::size_t k = 0; k < n; ++k)
            for (std::size_t j = i < 2 ? 0 : i - 2; j <= i && j < m; ++j)
                for (std::size_t l = k < 2 ? 0 : k - 2; l <= k && l < m; ++l)
                    sum[i][k] += lambda * q[i][j] * inverse[j][l] * q[k][l];
    }
    Square a = Inverse(sum);
    for (auto &row : a)
        for (std::size_t k = 0; k < n; ++k)
            row[k] /= Long{data.d[k]} * data.d[k];
    return a;
}

struct Exact {
    std::vector<Long> values;
    Long trace, squares, score;
};
Exact Densely(const Data &data, Long lambda) {
    const Square a = Influence(data, lambda);
    Exact exact = {{}, 0, 0, 0};
    for (std::size_t i = 0; i < a.size(); ++i) {
        exact.values.push_back(
            std::inner_product(a[i].begin(), a[i].end(), data.y.begin(), Long{0}));
        exact.trace += a[i][i];
        const Long u = (data.y[i] - exact.values[i]) / data.d[i];
        exact.squares += u * u;
    }
    const Long rest = a.size() - exact.trace;
    exact.score = exact.squares / (rest * rest);
    return exact;
}

TEST(SmoothingSplines, AgreeWithTheDenseSolution) {
    for (const int n : {3, 4, 9, 60}) {
        const Data data = Noisy(n);
        for (const double lambda : {1e-9, 1e-3, 1.0, 1e4}) {
            const Exact exact = Densely(data, lambda);
            const Smoothed found = Smooth(data.x, data.y, data.d, 1, lambda);
            ASSERT_EQ(found.code, 0);
            EXPECT_EQ(found.lambda, lambda);
            EXPECT_NEAR(found.effective, static_cast<double>(exact.trace), 1e-10) << n;
            for (int i = 0; i < n; ++i)
                ASSERT_NEAR(found.values[i], static_cast<double>(exact.values[i]), 1e-12) << lambda;
        }
    }
}

TEST(SmoothingSplines, CrossValidationFindsTheLeastScore) {
    for (const int n : {40, 150}) {
        const Data data = Noisy(n);
        const Smoothed found = Smooth(data.x, data.y, data.d, 0, nan);
        ASSERT_EQ(found.code, 0);
        const Long least = Densely(data, found.lambda).score;
        for (const double factor : {1e-3, 0.1, 0.9, 1.1, 10.0, 1e3})
            EXPECT_LT(least, Densely(data, found.lambda * factor).score) << factor;
    }
}

TEST(SmoothingSplines, SmoothestWithinASumOfSquares) {
    const Data data = Noisy(30);
    for (const double limit : {1e-6, 0.02, 1.0}) {
        const Smoothed found = Smooth(data.x, data.y, data.d, 2, limit);
        const Exact exact = Densely(data, found.lambda);
        EXPECT_NEAR(static_cast<double>(exact.squares) / limit, 1.0, 1e-9);
    }
    const Smoothed line = Smooth(data.x, data.y, data.d, 2, 1e6);
    EXPECT_EQ(line.lambda, infinity);
    EXPECT_EQ(line.effective, 2.0);
    Rows terms;
    Samples w;
    for (std::size_t i = 0; i < data.x.size(); ++i) {
        terms.push_back({1.0, data.x[i]});
        w.push_back(1.0 / (data.d[i] * data.d[i]));
    }
    const auto exact = SolveNormal(terms, data.y, w);
    for (std::size_t i = 0; i < data.x.size(); ++i)
        EXPECT_NEAR(line.values[i], static_cast<double>(exact.c[0] + exact.c[1] * data.x[i]),
                    1e-13);
}

// Samples that nearly coincide have the effect, also on the trace, of one sample with their mean
// and the sum of their weights. Formulas with differences of neighbours lose all digits here.
TEST(SmoothingSplines, CrowdedSamplesCountAsOne) {
    Data merged = Noisy(60), crowded;
    Noise noise(5);
    for (std::size_t i = 0; i < merged.x.size(); ++i) {
        const double d = merged.d[i], u = noise.symmetric();
        for (const double side : {-1.0, 0.0, 1.0}) {
            crowded.x.push_back(merged.x[i] + 1e-10 * side);
            crowded.y.push_back(merged.y[i] + side * u);
            crowded.d.push_back(d);
        }
        merged.d[i] = d / std::sqrt(3.0);
    }
    for (const double lambda : {1e-3, 1.0, 1e4, 1e8}) {
        const Smoothed one = Smooth(merged.x, merged.y, merged.d, 1, lambda);
        const Smoothed three = Smooth(crowded.x, crowded.y, crowded.d, 1, lambda);
        EXPECT_NEAR(three.effective, one.effective, 1e-8) << lambda;
        for (std::size_t i = 0; i < merged.x.size(); ++i) {
            ASSERT_NEAR(three.values[3 * i + 1], one.values[i], 1e-8) << lambda;
            ASSERT_NEAR(three.second[3 * i + 1], one.second[i], 1e-9 / lambda + 1e-10) << lambda;
        }
    }
}

TEST(SmoothingSplines, CrossValidationOfSamplesAtRandom) {
    Noise noise(9);
    Data data;
    for (int i = 0; i < 20000; ++i)
        data.x.push_back(10.0 * noise.positive());
    std::sort(data.x.begin(), data.x.end());
    for (const double x : data.x)
        data.y.push_back(std::sin(x) + noise.symmetric());
    const Smoothed found = Smooth(data.x, data.y, {}, 0, 0);
    ASSERT_EQ(found.code, 0);
    EXPECT_GT(found.effective, 5.0);
    EXPECT_LT(found.effective, 60.0);
    double squares = 0.0;
    for (std::size_t i = 0; i < data.x.size(); ++i)
        squares += std::pow(found.values[i] - std::sin(data.x[i]), 2);
    // The bound is three times the part of the noise, of variance 1/3, that so many parameters
    // absorb.
    EXPECT_LT(squares, found.effective);
}

// The score of three samples does not depend on lambda: it is that of the line.
TEST(SmoothingSplines, CrossValidationOfThreeIsTheLine) {
    EXPECT_EQ(Smooth({1, 2, 4}, {1, 5, 2}, {}, 0, 0).lambda, infinity);
}

// Weights of very different sizes; no sample has more than one effective parameter.
TEST(SmoothingSplines, EffectiveParametersOfUnequalDeviations) {
    Data data = Noisy(40);
    for (std::size_t i = 0; i < data.d.size(); ++i)
        data.d[i] = i % 5 == 0 ? 1e-15 : 1.0;
    for (const double lambda : {1e-30, 1e-10, 1.0}) {
        const Smoothed found = Smooth(data.x, data.y, data.d, 1, lambda);
        EXPECT_GE(found.effective, 8.0 - 1e-9);
        EXPECT_LE(found.effective, 40.0);
        for (std::size_t i = 0; i < data.x.size(); i += 5)
            EXPECT_NEAR(found.values[i], data.y[i], 1e-14);
    }
}

TEST(SmoothingSplines, PiecesMeetSmoothlyAndInterpolateWithoutLambda) {
    const Data data = Noisy(12);
    for (const double lambda : {0.0, 0.3}) {
        const Smoothed found = Smooth(data.x, data.y, {}, 1, lambda);
        ASSERT_EQ(found.code, 0);
        ASSERT_EQ(found.pieces.size(), 44U);
        EXPECT_EQ(found.second.front(), 0.0);
        EXPECT_EQ(found.second.back(), 0.0);
        for (int i = 0; i < 11; ++i) {
            const double *const c = found.pieces.data() + 4 * i, h = data.x[i + 1] - data.x[i];
            EXPECT_NEAR(c[0] + h * (c[1] + h * (c[2] + h * c[3])), found.values[i + 1], 1e-13);
            if (i < 10) {
                EXPECT_NEAR(c[1] + h * (2 * c[2] + 3 * h * c[3]), c[5], 1e-12);
                EXPECT_NEAR(2 * c[2] + 6 * h * c[3], found.second[i + 1], 1e-12);
            }
            if (lambda == 0.0) {
                EXPECT_EQ(found.values[i], data.y[i]);
            }
        }
    }
    const Smoothed one = Smooth({2}, {5}, {}, 0, 0), two = Smooth({2, 4}, {5, 9}, {}, 2, 0);
    EXPECT_EQ(one.values, Samples{5});
    EXPECT_EQ(one.effective, 1.0);
    EXPECT_EQ(two.pieces, (Samples{5, 2, 0, 0}));
    EXPECT_EQ(two.lambda, 0.0);
}

struct Fitted {
    ErrorCode code;
    Samples knots, c, values;
    double mse;
};
Fitted FitB(const Samples &x, const Samples &y, const Samples &w, int32_t degree, int32_t interior,
            const Samples &given = {}) {
    const DBLArray knots, c, values;
    Fitted result = {};
    result.code = BSplineFit_head(DBLArray(x).handle(), DBLArray(y).handle(), DBLArray(w).handle(),
                                  degree, interior, DBLArray(given).handle(), knots.handle(),
                                  c.handle(), values.handle(), &result.mse);
    result.knots = knots.values();
    result.c = c.values();
    result.values = values.values();
    return result;
}

// The basis from its recursive definition, closed at the right end.
template <class T = double>
T Basis(const Samples &t, std::size_t i, int degree, T x) {
    if (degree == 0)
        return (t[i] <= x && x < t[i + 1]) ||
               (x == t.back() && t[i] < t[i + 1] && t[i + 1] == t.back());
    const T left = T{t[i + degree]} - t[i], right = T{t[i + degree + 1]} - t[i + 1];
    return (left > 0 ? (x - t[i]) / left * Basis<T>(t, i, degree - 1, x) : T{0}) +
           (right > 0 ? (t[i + degree + 1] - x) / right * Basis<T>(t, i + 1, degree - 1, x) : T{0});
}

TEST(SmoothingSplines, LeastSquaresInTheirDefinition) {
    const Data data = Noisy(80);
    for (const int degree : {1, 2, 3, 5, 9})
        for (const bool isGiven : {false, true}) {
            const double middle = data.x[40];
            const Samples given = isGiven ? Samples{data.x[20], middle, middle} : Samples();
            const Fitted found = FitB(data.x, data.y, data.d, degree, 4, given);
            ASSERT_EQ(found.code, 0) << degree;
            Rows rows;
            for (const double x : data.x) {
                rows.emplace_back();
                for (std::size_t j = 0; j < found.c.size(); ++j)
                    rows.back().push_back(Basis(found.knots, j, degree, x));
            }
            const auto exact = SolveNormal(rows, data.y, data.d);
            for (std::size_t j = 0; j < found.c.size(); ++j)
                EXPECT_NEAR(found.c[j], static_cast<double>(exact.c[j]), 1e-10) << degree;
            const auto model = [&](std::size_t i) {
                return std::inner_product(rows[i].begin(), rows[i].end(), exact.c.begin(), Long{0});
            };
            EXPECT_NEAR(found.values[79], static_cast<double>(model(79)), 1e-11);
            EXPECT_NEAR(found.mse, static_cast<double>(qx::test::MeanSquare(data.y, data.d, model)),
                        1e-13);
            EXPECT_EQ(found.knots[degree], data.x[0]);
            if (!isGiven) {
                EXPECT_NEAR(found.knots[degree + 1], data.x[15] * 0.2 + data.x[16] * 0.8, 1e-14);
            }
        }
}

// The residuals of least squares are orthogonal to each column, to within the rounding errors of
// the columns and y, for any knots; normal equations would be too ill-conditioned here.
TEST(SmoothingSplines, ResidualsAreOrthogonalForAnyKnots) {
    Noise noise(7);
    Samples x, y, w;
    for (int i = 0; i < 600; ++i) {
        x.push_back(noise.positive() * (i % 3 == 0 ? 1.0 : 1e-5));
        w.push_back(std::pow(10.0, 6.0 * noise.symmetric()));
    }
    std::sort(x.begin(), x.end());
    for (const double at : x)
        y.push_back(1e3 + std::sin(9.0 * at) + noise.symmetric());
    const Samples narrow = {2e-6, 3e-6, 4e-6, 4e-6 + 1e-12, 8e-6, 0.4, 0.4 + 1e-9, 0.4 + 2e-9, 0.7};
    for (const int degree : {3, 6, 9})
        for (const Samples &given : {narrow, Samples()}) {
            const Fitted found = FitB(x, y, w, degree, 40, given);
            ASSERT_EQ(found.code, 0) << degree;
            const std::size_t count = found.c.size();
            std::vector<Long> product(count), squares(count);
            Long all = 0;
            for (std::size_t i = 0; i < x.size(); ++i) {
                std::vector<Long> row;
                Long rest = y[i];
                for (std::size_t j = 0; j < count; ++j) {
                    row.push_back(Basis<Long>(found.knots, j, degree, x[i]));
                    rest -= row[j] * found.c[j];
                }
                const Long weight = std::fabs(w[i]);
                all += weight * y[i] * y[i];
                for (std::size_t j = 0; j < count; ++j) {
                    product[j] += weight * row[j] * rest;
                    squares[j] += weight * row[j] * row[j];
                }
            }
            for (std::size_t j = 0; j < count; ++j)
                EXPECT_LT(std::fabs(product[j]), 6 * 0x1p-52L * std::sqrt(squares[j] * all))
                    << degree << ' ' << j;
        }
}

TEST(SmoothingSplines, LeastSquaresWithWeightsAtTheEdgesOfTheRange) {
    const Data data = Noisy(80);
    Samples small, large;
    for (const double w : data.d) {
        small.push_back(std::ldexp(w, -1000));
        large.push_back(std::ldexp(w, 1022));
    }
    const Fitted found = FitB(data.x, data.y, data.d, 3, 6);
    EXPECT_EQ(FitB(data.x, data.y, small, 3, 6).c, found.c);
    EXPECT_EQ(FitB(data.x, data.y, large, 3, 6).c, found.c);
}

// Quantiles among equal x equal that x to the bit.
TEST(SmoothingSplines, KnotsAmongEqualSamples) {
    Samples x(300), y(300);
    for (int i = 0; i < 300; ++i) {
        x[i] = 0.06 * (1 + i / 30);
        y[i] = i % 7;
    }
    const Fitted found = FitB(x, y, {}, 1, 5);
    ASSERT_EQ(found.code, 0);
    for (const int i : {2, 3, 5, 6})
        EXPECT_TRUE(std::find(x.begin(), x.end(), found.knots[i]) != x.end()) << i;
    EXPECT_NEAR(found.knots[4], (x[149] + x[150]) / 2, 1e-15);
}

TEST(SmoothingSplines, CodesInTheirOrder) {
    const Samples x = {1, 2, 3, 4}, y = {1, 3, 2, 4};
    EXPECT_EQ(Smooth({}, y, {}, 9, 0).code, ErrEmptyInput);
    EXPECT_EQ(Smooth(x, {1, 2}, {}, 9, 0).code, ErrSizeMismatch);
    EXPECT_EQ(Smooth(x, y, {1}, 9, 0).code, ErrSizeMismatch);
    EXPECT_EQ(Smooth(x, {1, 2, 3, nan}, {}, 3, 0).code, ErrInvalidSelector);
    EXPECT_EQ(Smooth(x, {1, 2, 3, nan}, {1, 1, 1, 0}, 1, -1).code, ErrNonFiniteInput);
    EXPECT_EQ(Smooth(x, y, {}, 2, infinity).code, ErrNonFiniteInput);
    EXPECT_EQ(Smooth(x, y, {1, 1, 1, 0}, 1, -1).code, ErrNotStrictlyPositive);
    for (const double parameter : {-1.0, nan, -infinity})
        EXPECT_EQ(Smooth({1, 1, 3, 4}, y, {}, 1, parameter).code, ErrNegativeSetting);
    EXPECT_EQ(Smooth({1, 1, 3, 4}, y, {}, 1, 0).code, ErrAbscissaeOrder);
    EXPECT_TRUE(std::isnan(Smooth({1, 1, 3, 4}, y, {}, 1, 0).lambda));

    EXPECT_EQ(FitB({}, y, {}, 0, 0).code, ErrEmptyInput);
    EXPECT_EQ(FitB(x, y, {1}, 0, 0).code, ErrSizeMismatch);
    EXPECT_EQ(FitB(x, y, {}, 0, -1).code, ErrOrderNotPositive);
    EXPECT_EQ(FitB(x, y, {}, 10, -1).code, ErrOrderNotPositive);
    EXPECT_EQ(FitB({1, 2, 3, nan}, y, {}, 1, -1).code, ErrNegativeCount);
    EXPECT_EQ(FitB({1, 2, 0, nan}, y, {}, 1, 0).code, ErrNonFiniteInput);
    EXPECT_EQ(FitB(x, y, {}, 1, 0, {nan}).code, ErrNonFiniteInput);
    EXPECT_EQ(FitB({1, 2, 0, 4}, y, {}, 9, 0).code, ErrAbscissaeOrder);
    for (const Samples &knots :
         {Samples{1.0}, Samples{4.0}, Samples{3, 2}, Samples{2, 2, 2}, Samples{-1.0}})
        EXPECT_EQ(FitB(x, y, {}, 1, 0, knots).code, ErrAbscissaeOrder);
    EXPECT_EQ(FitB(x, y, {}, 1, 3).code, ErrPolynomialOrderTooHigh);
    EXPECT_EQ(FitB(x, y, {}, 9, 2147483647).code, ErrPolynomialOrderTooHigh);
    EXPECT_EQ(FitB({2, 2, 2, 2}, y, {}, 1, 0).code, ErrPolynomialOrderTooHigh);
    EXPECT_EQ(FitB({1, 1, 1, 4}, y, {}, 2, 0).code, ErrPolynomialOrderTooHigh);
    EXPECT_EQ(FitB(x, y, {1, 0, 0, 1}, 2, 0).code, ErrPolynomialOrderTooHigh);
    EXPECT_EQ(FitB({1, 1, 2, 4}, y, {}, 2, 0).code, 0);
}

} // namespace
} // namespace qx::test
