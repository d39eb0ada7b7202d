#include "fit/general.h"
#include "fit/polynomial.h"
#include "fit/robust.h"
#include "fit/sequential_qr.h"
#include "fit/tests/least_squares.h"
#include "qx/qx.h"
#include "tests/support/recipe.h"
#include "tests/support/test_data.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <cmath>
#include <fstream>
#include <map>
#include <string>

namespace qx::test {
namespace {

double RelativeError(double found, Long exact) {
    const Long error = std::fabs(found - exact);
    return static_cast<double>(exact == 0 ? error : error / std::fabs(exact));
}

struct GeneralFit {
    ErrorCode code;
    Samples c, fit;
    Rows covariance;
    double mse;
};
template <class Export>
GeneralFit FitRows(Export fitExport, const Rows &rows, const Samples &y, const Samples &w,
                   int32_t algorithm, int32_t wantCovariance) {
    const auto n = static_cast<int32_t>(rows.size());
    const int32_t k = n > 0 ? static_cast<int32_t>(rows[0].size()) : 0;
    const DBLMatrix h(n, k), covariance;
    for (int32_t i = 0; i < n; ++i)
        for (int32_t j = 0; j < k; ++j)
            h.data()[i * k + j] = rows[i][j];
    const DBLArray c, fit;
    GeneralFit result = {};
    result.code =
        fitExport(h.handle(), DBLArray(y).handle(), DBLArray(w).handle(), algorithm, wantCovariance,
                  c.handle(), fit.handle(), covariance.handle(), &result.mse);
    result.c = c.values();
    result.fit = fit.values();
    for (int32_t i = 0; i < covariance.rows(); ++i) {
        result.covariance.emplace_back();
        for (int32_t j = 0; j < covariance.cols(); ++j)
            result.covariance.back().push_back(covariance.at(i, j));
    }
    return result;
}

struct PolynomialFit {
    ErrorCode code;
    Samples c, fit;
    double mse;
};
PolynomialFit FitPowers(const Samples &x, const Samples &y, int32_t order, int32_t algorithm,
                        const Samples &w = {}, const std::vector<int32_t> &orders = {},
                        const Samples &values = {}) {
    const DBLArray fit, c;
    PolynomialFit result = {};
    result.code = PolyFit81_head(DBLArray(x).handle(), DBLArray(y).handle(), order,
                                 DBLArray(w).handle(), algorithm, I32Array(orders).handle(),
                                 DBLArray(values).handle(), fit.handle(), c.handle(), &result.mse);
    result.c = c.values();
    result.fit = fit.values();
    return result;
}
Rows Powers(const Samples &x, const std::vector<int32_t> &orders) {
    Rows rows;
    for (const double t : x) {
        rows.emplace_back();
        for (const int32_t order : orders)
            rows.back().push_back(static_cast<double>(std::pow(Long{t}, order)));
    }
    return rows;
}

// NIST's sets.

struct ReferenceSet {
    bool isPolynomial;
    Samples c, deviations;
    double squares;
    Samples x, y;
    Rows rows;
};
std::map<std::string, ReferenceSet> ReferenceSets() {
    std::ifstream file(TestData("nist_linear.dat"));
    std::map<std::string, ReferenceSet> sets;
    std::string name, kind;
    for (int n, k, predictors; file >> name >> kind >> n >> k >> predictors;) {
        ReferenceSet &set = sets[name];
        set.isPolynomial = kind == "polynomial";
        set.c.resize(k);
        set.deviations.resize(k);
        for (int j = 0; j < k; ++j)
            file >> set.c[j] >> set.deviations[j];
        file >> set.squares;
        for (int i = 0; i < n; ++i) {
            double y;
            file >> y;
            set.y.push_back(y);
            set.rows.emplace_back(predictors);
            for (double &value : set.rows.back())
                file >> value;
            set.x.push_back(set.rows.back()[0]);
        }
        if (set.isPolynomial) {
            std::vector<int32_t> orders;
            for (int j = 0; j < k; ++j)
                orders.push_back(j);
            set.rows = Powers(set.x, orders);
        }
    }
    return sets;
}

// The largest error of a coefficient.
double ErrorOf(const Samples &found, const Samples &exact) {
    double worst = found.size() == exact.size() ? 0.0 : infinity;
    for (std::size_t j = 0; j < exact.size() && j < found.size(); ++j)
        worst = std::max(worst, RelativeError(found[j], exact[j]));
    return worst;
}

TEST(LinearFits, ReferenceSetsOfNIST) {
    struct Bounds {
        double bySVD, byQR, byLU;
    };
    // Filip and Pontius have normal equations beyond double precision.
    const std::map<std::string, Bounds> bounds = {
        {"Norris", {2e-12, 2e-12, 4e-12}}, {"Pontius", {2e-12, 1e-12, 4e-11}},
        {"NoInt1", {1e-15, 1e-15, 1e-15}}, {"NoInt2", {1e-15, 1e-15, 1e-15}},
        {"Filip", {1e-7, 1e-7, infinity}}, {"Longley", {1e-11, 1e-11, 2e-7}},
        {"Wampler1", {1e-9, 1e-9, 1e-6}},  {"Wampler2", {1e-12, 1e-12, 4e-9}},
        {"Wampler3", {1e-9, 1e-9, 1e-6}},  {"Wampler4", {2e-8, 2e-8, 1e-6}},
        {"Wampler5", {1e-6, 1e-6, 1e-6}},
    };
    const auto sets = ReferenceSets();
    ASSERT_EQ(sets.size(), bounds.size());
    for (const auto &[name, set] : sets) {
        SCOPED_TRACE(name);
        const Bounds &bound = bounds.at(name);
        const auto order = static_cast<int32_t>(set.c.size()) - 1;
        for (const auto &[algorithm, limit] :
             {std::pair(0, bound.bySVD), std::pair(1, bound.byQR), std::pair(2, bound.byQR),
              std::pair(4, bound.byLU)}) {
            const GeneralFit general = FitRows(GenLSFit80_head, set.rows, set.y, {}, algorithm, 1);
            EXPECT_EQ(general.code, 0);
            EXPECT_LT(ErrorOf(general.c, set.c), limit) << algorithm;
            if (set.isPolynomial) {
                EXPECT_LT(ErrorOf(FitPowers(set.x, set.y, order, algorithm).c, set.c), limit)
                    << algorithm;
            }
            if (algorithm != 0)
                continue;
            const auto n = static_cast<double>(set.y.size());
            EXPECT_NEAR(general.mse * n, set.squares, 1e-7 * set.squares + 1e-2 * (order == 5));
            Samples deviations;
            for (std::size_t j = 0; j < set.c.size(); ++j)
                deviations.push_back(std::sqrt(general.covariance[j][j] * set.squares /
                                               (n - static_cast<double>(set.c.size()))));
            EXPECT_LT(ErrorOf(deviations, set.deviations), 2e-7);
        }
    }
    const ReferenceSet &norris = sets.at("Norris");
    const DBLArray y(norris.y);
    double slope, intercept, mse;
    EXPECT_EQ(LinFit_head(y.handle(), DBLArray(norris.x).handle(), DBLArray().handle(), &slope,
                          &intercept, &mse),
              0);
    EXPECT_LT(ErrorOf({intercept, slope}, norris.c), 4e-12);
    EXPECT_LT(RelativeError(mse * 36, norris.squares), 1e-11);
}

// Random problems.

struct Problem {
    Rows rows;
    Samples y, w;
};
Problem RandomProblem(int32_t n, int32_t k, uint64_t seed) {
    Noise noise(seed);
    Problem problem;
    for (int32_t i = 0; i < n; ++i) {
        problem.rows.emplace_back(k);
        for (double &value : problem.rows.back())
            value = noise.symmetric();
        problem.y.push_back(noise.symmetric());
        problem.w.push_back(0.1 + 2.0 * noise.symmetric()); // of either sign
    }
    return problem;
}

TEST(LinearFits, AllMethodsSolveTheNormalEquations) {
    // Sizes at and beyond the blocks of rows that are reduced together.
    for (const auto &[n, k] :
         {std::pair(1, 1), std::pair(3, 3), std::pair(20, 4), std::pair(1528, 1),
          std::pair(1537, 1), std::pair(5000, 5), std::pair(300, 60)}) {
        const Problem problem = RandomProblem(n, k, static_cast<uint64_t>(n));
        for (const bool isWeighted : {false, true}) {
            const Samples w = isWeighted ? problem.w : Samples();
            const Solution exact = SolveNormal(problem.rows, problem.y, w);
            for (int32_t algorithm = 0; algorithm < 7; ++algorithm) {
                SCOPED_TRACE(std::to_string(n) + " " + std::to_string(k) + " " +
                             std::to_string(algorithm) + (isWeighted ? " weighted" : ""));
                const GeneralFit found =
                    FitRows(GenLSFit80_head, problem.rows, problem.y, w, algorithm, 1);
                ASSERT_EQ(found.code, 0);
                for (int32_t j = 0; j < k; ++j) {
                    EXPECT_NEAR(found.c[j], static_cast<double>(exact.c[j]), 2e-12);
                    for (int32_t l = 0; l < k; ++l)
                        EXPECT_NEAR(found.covariance[j][l],
                                    static_cast<double>(exact.covariance[j][l]),
                                    1e-10 * static_cast<double>(exact.covariance[j][j]));
                }
                const auto model = [&](std::size_t i) {
                    Long f = 0;
                    for (std::size_t j = 0; j < exact.c.size(); ++j)
                        f += exact.c[j] * problem.rows[i][j];
                    return f;
                };
                EXPECT_NEAR(found.mse, static_cast<double>(MeanSquare(problem.y, w, model)), 1e-13);
                EXPECT_NEAR(found.fit[n / 2], static_cast<double>(model(n / 2)), 2e-12);
            }
        }
    }
}

TEST(LinearFits, ScalingOfColumnsCostsNoDigits) {
    const Problem problem = RandomProblem(100, 4, 7);
    const Solution exact = SolveNormal(problem.rows, problem.y, {});
    Rows scaled = problem.rows;
    const Samples factors = {0x1p-600, 1.0, 0x1p550, 0x1p-1000};
    for (Samples &row : scaled)
        for (int j = 0; j < 4; ++j)
            row[j] *= factors[j];
    for (const int32_t algorithm : {0, 1}) {
        const GeneralFit found = FitRows(GenLSFit80_head, scaled, problem.y, {}, algorithm, 0);
        for (int j = 0; j < 4; ++j)
            EXPECT_NEAR(found.c[j] * factors[j], static_cast<double>(exact.c[j]), 2e-15)
                << algorithm << " " << j;
    }
}

GeneralFit FitRefined(const Rows &rows, const Samples &y, const Samples &w, double tolerance) {
    return FitRows(
        [&](auto h, auto target, auto weights, int32_t, int32_t covariance, auto c, auto fit,
            auto inverse, double *mse) {
            return GenLSFit2026_head(h, target, weights, tolerance, covariance, c, fit, inverse,
                                     mse);
        },
        rows, y, w, 0, 1);
}
PolynomialFit FitPowersRefined(const Samples &x, const Samples &y, int32_t order,
                               const Samples &w = {}, const std::vector<int32_t> &orders = {},
                               const Samples &values = {}) {
    const DBLArray fit, c;
    PolynomialFit result = {};
    result.code =
        PolyFit2026_head(DBLArray(x).handle(), DBLArray(y).handle(), order, DBLArray(w).handle(),
                         -1.0, I32Array(orders).handle(), DBLArray(values).handle(), fit.handle(),
                         c.handle(), &result.mse);
    result.c = c.values();
    result.fit = fit.values();
    return result;
}

TEST(LinearFits, RevisionsKeepTheDigitsOfNISTsSets) {
    // The certified values are those of the decimal data. Norris, Pontius and Wampler2 lose digits
    // in the conversion to binary, as do the powers of Filip as a matrix.
    const std::map<std::string, double> bounds = {{"Norris", 2e-14},
                                                  {"Pontius", 1e-13},
                                                  {"Filip", 5e-8},
                                                  {"Longley", 5e-15},
                                                  {"Wampler2", 2e-13}};
    for (const auto &named : ReferenceSets()) {
        const ReferenceSet &set = named.second;
        SCOPED_TRACE(named.first);
        const double bound = bounds.count(named.first) != 0 ? bounds.at(named.first) : 1e-15;
        const GeneralFit general = FitRefined(set.rows, set.y, {}, -1.0);
        ASSERT_EQ(general.code, 0);
        EXPECT_LE(ErrorOf(general.c, set.c), bound);
        const auto n = static_cast<double>(set.y.size());
        EXPECT_NEAR(general.mse * n, set.squares, 1e-8 * set.squares + 1e-20);
        Samples deviations;
        for (std::size_t j = 0; j < set.c.size(); ++j)
            deviations.push_back(std::sqrt(general.covariance[j][j] * set.squares /
                                           (n - static_cast<double>(set.c.size()))));
        EXPECT_LT(ErrorOf(deviations, set.deviations), 2e-8);
        if (!set.isPolynomial)
            continue;
        const auto order = static_cast<int32_t>(set.c.size()) - 1;
        const PolynomialFit found = FitPowersRefined(set.x, set.y, order);
        ASSERT_EQ(found.code, 0);
        EXPECT_LE(ErrorOf(found.c, set.c), named.first == "Filip" ? 1e-14 : bound);
        EXPECT_NEAR(found.mse * n, set.squares, 1e-13 * set.squares + 1e-20);
    }
}

TEST(LinearFits, RevisionsSolveProblemsOfAnySize) {
    for (const auto &sizes : {std::pair(3, 3), std::pair(1537, 1), std::pair(300, 60)}) {
        const Problem problem = RandomProblem(sizes.first, sizes.second, 31);
        const Solution exact = SolveNormal(problem.rows, problem.y, problem.w);
        // Rows, weights and targets whose squares overflow or underflow.
        for (const auto &scales : {std::pair(0, 0), std::pair(-400, 380), std::pair(420, -440)}) {
            SCOPED_TRACE(std::to_string(sizes.first) + " " + std::to_string(scales.first));
            Problem scaled = problem;
            for (Samples &row : scaled.rows)
                for (std::size_t j = 0; j < row.size(); ++j)
                    row[j] = std::ldexp(row[j], j % 2 == 0 ? scales.first : scales.second);
            for (std::size_t i = 0; i < scaled.y.size(); ++i) {
                scaled.y[i] = std::ldexp(scaled.y[i], scales.first / 9);
                scaled.w[i] = std::ldexp(scaled.w[i], scales.second / 9);
            }
            const GeneralFit found = FitRefined(scaled.rows, scaled.y, scaled.w, -1.0);
            ASSERT_EQ(found.code, 0);
            for (std::size_t j = 0; j < exact.c.size(); ++j) {
                const int size = j % 2 == 0 ? scales.first : scales.second;
                EXPECT_LT(
                    RelativeError(std::ldexp(found.c[j], size - scales.first / 9), exact.c[j]),
                    1e-14);
                EXPECT_LT(
                    RelativeError(std::ldexp(found.covariance[j][j], 2 * size + scales.second / 9),
                                  exact.covariance[j][j]),
                    1e-12);
            }
        }
    }
    Problem low = RandomProblem(30, 3, 8);
    for (Samples &row : low.rows)
        row[2] = 2.0 * row[0];
    const GeneralFit shortest = FitRefined(low.rows, low.y, {}, -1.0);
    EXPECT_EQ(shortest.code, WarnRankDeficient);
    Rows two = low.rows;
    for (Samples &row : two)
        row.pop_back();
    const Solution exact = SolveNormal(two, low.y, {});
    EXPECT_LT(RelativeError(shortest.c[0] + 2.0 * shortest.c[2], exact.c[0]), 1e-14);
    EXPECT_LT(RelativeError(shortest.c[1], exact.c[1]), 1e-14);
    low.rows[4][1] = infinity;
    EXPECT_EQ(FitRefined(low.rows, low.y, {}, -1.0).code, ErrNonFiniteInput);
}

TEST(LinearFits, RevisedPolynomialsAreExact) {
    // Integers, so that the data represent the polynomial exactly. Far from 0, the constant is what
    // remains of terms that are 4e12 times as large.
    for (const double middle : {0.0, 1000.0}) {
        Samples x, y;
        for (int i = -40; i <= 40; ++i) {
            const Long t = middle + i;
            x.push_back(static_cast<double>(t));
            y.push_back(static_cast<double>(3 - t + 2 * t * t + t * t * t - 4 * t * t * t * t));
        }
        const Samples truth = {3, -1, 2, 1, -4, 0};
        const PolynomialFit found = FitPowersRefined(x, y, 5);
        EXPECT_EQ(found.code, 0);
        for (int j = 0; j < 6; ++j)
            EXPECT_NEAR(found.c[j], truth[j],
                        truth[j] == 0.0 ? 1e-20
                        : middle == 0.0 ? 1e-15
                                        : 1e-13)
                << middle << " " << j;
        EXPECT_EQ(found.fit, y);
        const PolynomialFit fixed = FitPowersRefined(x, y, 5, y, {0, 2, 9, 2}, {3, 7, 1, 2});
        for (int j = 0; j < 5; ++j)
            EXPECT_NEAR(fixed.c[j], truth[j], 1e-15 * std::fabs(truth[j])) << middle << " " << j;
        const PolynomialFit given = FitPowersRefined(x, y, 1, {}, {0, 1}, {3, -1});
        EXPECT_EQ(given.c, (Samples{3, -1}));
        EXPECT_EQ(given.fit[0], static_cast<double>(3 - (Long{middle} - 40)));
    }
    // Extremes of x and y, order 50, and fewer abscissae than terms.
    EXPECT_NEAR(FitPowersRefined({1e-300, 2e-300, 3e-300}, {1e-5, 4e-5, 9e-5}, 1).c[1] / 4e295, 1.0,
                1e-14);
    Samples x, y;
    for (int i = 0; i <= 200; ++i) {
        x.push_back(std::cos(0.005 * 3.14159265358979 * i));
        y.push_back(std::exp(x[i]));
    }
    EXPECT_NEAR(FitPowersRefined(x, y, 50).fit[77], y[77], 1e-15);
    EXPECT_EQ(FitPowersRefined(x, y, 51).code, ErrPolynomialOrderTooHigh);
    const PolynomialFit twice = FitPowersRefined({1, 2, 1, 2}, {1, 3, 1, 3}, 2);
    EXPECT_EQ(twice.code, WarnRankDeficient);
    EXPECT_NEAR(twice.fit[1], 3.0, 1e-14);
}

TEST(LinearFits, MatricesOfLowRank) {
    Problem problem = RandomProblem(30, 3, 8);
    Rows twice = problem.rows, empty = problem.rows;
    for (int i = 0; i < 30; ++i) {
        twice[i][2] = 2.0 * twice[i][0];
        empty[i][1] = 0.0;
    }
    // With the cut at n eps, the minimum-norm solution remains: the solution for one column,
    // distributed over both.
    const GeneralFit shortest = FitRows(GenLSFit80_head, twice, problem.y, {}, 6, 1);
    Rows two = twice;
    for (Samples &row : two)
        row.pop_back();
    const Solution exact = SolveNormal(two, problem.y, {});
    EXPECT_NEAR(shortest.c[0], static_cast<double>(exact.c[0]) / 5, 1e-14);
    EXPECT_NEAR(shortest.c[2], static_cast<double>(exact.c[0]) / 5 * 2, 1e-14);
    EXPECT_NEAR(shortest.covariance[0][0], static_cast<double>(exact.covariance[0][0]) / 25, 1e-14);
    // A column of zeros makes the matrix exactly rank-deficient.
    for (const int32_t algorithm : {0, 6}) {
        const GeneralFit found = FitRows(GenLSFit80_head, empty, problem.y, {}, algorithm, 1);
        EXPECT_EQ(found.code, 0);
        EXPECT_EQ(found.c[1], 0.0);
        EXPECT_EQ(found.covariance[1][1], 0.0);
    }
    for (const int32_t algorithm : {1, 2, 3, 4, 5}) {
        const GeneralFit found = FitRows(GenLSFit80_head, empty, problem.y, {}, algorithm, 1);
        EXPECT_EQ(found.code, ErrSingularMatrix) << algorithm;
        EXPECT_TRUE(found.c.empty() && found.fit.empty() && found.covariance.empty());
        EXPECT_TRUE(std::isnan(found.mse));
    }
}

TEST(LinearFits, ChecksOfMatricesOfTerms) {
    const Problem problem = RandomProblem(5, 2, 9);
    const auto code = [&](const Rows &rows, const Samples &y, const Samples &w, int32_t algorithm) {
        return FitRows(GenLSFit80_head, rows, y, w, algorithm, 0).code;
    };
    EXPECT_EQ(code(problem.rows, {1, 2, 3}, {}, 0), ErrSizeMismatch);
    EXPECT_EQ(code(problem.rows, problem.y, {1, 2}, 0), ErrSizeMismatch);
    EXPECT_EQ(code({{}, {}}, {1, 2}, {}, 9), ErrOrderNotPositive);
    EXPECT_EQ(code({{1, 2}}, {1}, {}, 9), ErrPolynomialOrderTooHigh);
    EXPECT_EQ(FitRows(GenLSFit80_head, {Samples(20000, 1.0)}, {1}, {}, 0, 1).code,
              ErrPolynomialOrderTooHigh)
        << "and not because the covariance needs too much memory";
    EXPECT_EQ(code(problem.rows, problem.y, {}, 7), ErrInvalidSelector);
    EXPECT_EQ(code(problem.rows, problem.y, {}, -1), ErrInvalidSelector);
    Problem broken = problem;
    broken.rows[4][1] = nan;
    for (const auto &[algorithm, expected] :
         {std::pair(0, ErrNonFiniteInput), std::pair(1, ErrNonFiniteInput),
          std::pair(4, ErrSingularMatrix), std::pair(5, ErrNonFiniteInput),
          std::pair(6, ErrNonFiniteInput)}) {
        EXPECT_EQ(code(broken.rows, problem.y, {}, algorithm), expected) << algorithm;
        EXPECT_EQ(code(problem.rows, problem.y, {1, 1, nan, 1, 1}, algorithm), expected);
    }
    // A target that is not finite is not a failure.
    Samples y = problem.y;
    y[3] = nan;
    const GeneralFit lost = FitRows(GenLSFit80_head, problem.rows, y, {}, 0, 0);
    EXPECT_EQ(lost.code, 0);
    EXPECT_TRUE(std::isnan(lost.c[0]) && std::isnan(lost.mse));
    EXPECT_TRUE(lost.covariance.empty());

    // Standard deviations; 0 counts as 1.
    const GeneralFit byDeviations =
        FitRows(GenLSFit_head, problem.rows, problem.y, {2, 0, 0.5, -4, 1}, 0, 1);
    const GeneralFit byWeights =
        FitRows(GenLSFit80_head, problem.rows, problem.y, {0.25, 1, 4, 0.0625, 1}, 0, 1);
    EXPECT_EQ(byDeviations.c, byWeights.c);
    EXPECT_EQ(byDeviations.covariance, byWeights.covariance);
    EXPECT_EQ(byDeviations.mse, byWeights.mse);
}

TEST(LinearFits, SolvesUpperTriangles) {
    const DBLArray r({2, 1, 4, 9, 0.5, -1, 9, 9, 4}), v({8, 1, 8}), x({0, 0, 0});
    const auto solve = [&](const DBLArray &triangle, const DBLArray &to) {
        return qx::SolveUpperTriangular({triangle.data(), 3, 3}, {v.data(), 3}, {to.data(), 3});
    };
    EXPECT_EQ(solve(r, x), 0);
    EXPECT_EQ(x.values(), (Samples{-3, 6, 2}));
    EXPECT_EQ(v[0], 8.0);
    EXPECT_EQ(solve(r, v), 0);
    EXPECT_EQ(v.values(), x.values());
    for (const double bad : {0.0, nan})
        for (const int at : {0, 4, 8}) {
            const DBLArray broken(r.values());
            broken.data()[at] = bad;
            EXPECT_EQ(solve(broken, v), ErrSingularMatrix);
        }
}

// Lines.

struct LineFit {
    ErrorCode code;
    double slope, intercept, mse;
    Samples fit;
};
LineFit FitLine(const Samples &x, const Samples &y, const Samples &w = {}) {
    const DBLArray inOut(y);
    LineFit line = {};
    line.code = LinFit_head(inOut.handle(), DBLArray(x).handle(), DBLArray(w).handle(), &line.slope,
                            &line.intercept, &line.mse);
    line.fit = inOut.values();
    return line;
}

TEST(LinearFits, LinesAreLeastSquares) {
    Noise noise(3);
    for (const int32_t n : {2, 3, 10, 1001}) {
        Samples x, y, w;
        Rows rows;
        for (int32_t i = 0; i < n; ++i) {
            x.push_back(noise.symmetric() + 0.5);
            y.push_back(2.0 * x[i] - 1.0 + noise.symmetric());
            w.push_back(noise.symmetric() * 1e100); // the scale does not matter
            rows.push_back({1.0, x[i]});
        }
        for (const Samples &weights : {Samples(), w}) {
            const LineFit line = FitLine(x, y, weights);
            const Solution exact = SolveNormal(rows, y, weights);
            const auto model = [&](std::size_t i) { return exact.c[1] * x[i] + exact.c[0]; };
            EXPECT_EQ(line.code, 0);
            EXPECT_NEAR(line.slope, static_cast<double>(exact.c[1]), 1e-13);
            EXPECT_NEAR(line.intercept, static_cast<double>(exact.c[0]), 1e-13);
            EXPECT_NEAR(line.fit[n - 1], static_cast<double>(model(n - 1)), 1e-13);
            const auto mse = static_cast<double>(MeanSquare(y, weights, model));
            EXPECT_NEAR(line.mse, mse, (weights.empty() ? 1.0 : 1e100) * 1e-14);

            // The same coefficients without the fit, and y is unchanged.
            double slope, intercept;
            ErrorCode err = 1;
            const DBLArray data(y);
            EXPECT_EQ(LinFitCoef80_head(data.handle(), DBLArray(x).handle(),
                                        DBLArray(weights).handle(), &slope, &intercept, &err),
                      0);
            EXPECT_EQ(err, 0);
            EXPECT_EQ(slope, line.slope);
            EXPECT_EQ(intercept, line.intercept);
            EXPECT_EQ(data.values(), y);
        }
    }
}

TEST(LinearFits, OddWeightsAndDataOfLines) {
    const Samples x = {1, 2, 4}, y = {1, 3, 4};
    EXPECT_EQ(FitLine(x, {1, 2}).code, ErrSizeMismatch);
    EXPECT_EQ(FitLine(x, y, {1}).code, ErrSizeMismatch);
    EXPECT_EQ(FitLine({1}, {2}, {nan}).code, ErrFewerThanTwo);
    EXPECT_EQ(FitLine(x, y, {0, nan, 0}).code, ErrNonFiniteInput);
    const LineFit one = FitLine(x, y, {0, 0, 3});
    EXPECT_EQ(one.code, ErrTooFewWeights);
    EXPECT_TRUE(std::isnan(one.slope) && std::isnan(one.intercept) && std::isnan(one.mse));
    EXPECT_TRUE(one.fit.empty());
    EXPECT_EQ(FitLine(x, y, {0, 0, 0}).slope, FitLine(x, y).slope);
    EXPECT_EQ(FitLine(x, y, {0, 0, 0}).mse, FitLine(x, y).mse);
    EXPECT_EQ(FitLine(x, y, {-1, 0, 1}).slope, 1.0);

    const LineFit vertical = FitLine({2, 2}, {1, 3});
    EXPECT_EQ(vertical.code, 0);
    EXPECT_FALSE(std::isfinite(vertical.slope));

    double slope, intercept;
    ErrorCode err = 0;
    EXPECT_EQ(
        LinFitCoef_head(DBLArray(y).handle(), DBLArray({1, 2}).handle(), &slope, &intercept, &err),
        0);
    EXPECT_EQ(err, ErrSizeMismatch);
    EXPECT_TRUE(std::isnan(slope) && std::isnan(intercept));
}

// Polynomials.

TEST(LinearFits, FixedTermsOfPolynomials) {
    Noise noise(5);
    Samples x, y, w;
    for (int i = 0; i < 40; ++i) {
        x.push_back(noise.symmetric());
        y.push_back(noise.symmetric());
        w.push_back(noise.symmetric());
    }
    // c1 and c3 given (c1 twice: the later value counts; orders 9 and -1 do not).
    const PolynomialFit found =
        FitPowers(x, y, 4, 1, w, {1, 9, 3, 1, -1}, {7.0, 5.0, -2.0, 0.5, 3.0});
    Samples rest = y;
    for (std::size_t i = 0; i < y.size(); ++i)
        rest[i] -= 0.5 * x[i] - 2.0 * x[i] * x[i] * x[i];
    const Solution exact = SolveNormal(Powers(x, {0, 2, 4}), rest, w);
    ASSERT_EQ(found.code, 0);
    EXPECT_EQ(found.c[1], 0.5);
    EXPECT_EQ(found.c[3], -2.0);
    for (const int j : {0, 1, 2})
        EXPECT_NEAR(found.c[2 * j], static_cast<double>(exact.c[j]), 1e-14);
    const auto model = [&](std::size_t i) {
        Long f = 0;
        for (int j = 4; j >= 0; --j)
            f = f * x[i] + found.c[j];
        return f;
    };
    EXPECT_NEAR(found.mse, static_cast<double>(MeanSquare(y, w, model)), 1e-15);
    EXPECT_NEAR(found.fit[17], static_cast<double>(model(17)), 1e-15);

    // All terms are given: nothing is solved, so the algorithm is not checked.
    const PolynomialFit given = FitPowers({1, 2}, {1, 1}, 1, 99, {}, {1, 0}, {3.0, 2.0});
    EXPECT_EQ(given.code, 0);
    EXPECT_EQ(given.c, (Samples{2, 3}));
    EXPECT_EQ(given.fit, (Samples{5, 8}));
    EXPECT_EQ(given.mse, (16 + 49) / 2.0);
    EXPECT_EQ(FitPowers({}, {}, 0, 0, {}, {0}, {3.0}).code, ErrEmptyInput);
}

TEST(LinearFits, HighOrdersOfPolynomials) {
    Noise noise(6);
    Samples x, y;
    for (int i = 0; i < 100; ++i) {
        x.push_back(2.0 * i / 99.0 - 1.0);
        y.push_back(noise.symmetric());
    }
    const PolynomialFit highest = FitPowers(x, y, 25, 0), capped = FitPowers(x, y, 30, 0);
    EXPECT_EQ(highest.code, 0);
    EXPECT_EQ(highest.c.size(), 26U);
    EXPECT_EQ(capped.code, WarnPolynomialOrderCapped);
    ASSERT_EQ(capped.c.size(), 31U);
    for (int j = 0; j < 31; ++j)
        EXPECT_EQ(capped.c[j], j < 26 ? highest.c[j] : 0.0);
    EXPECT_EQ(capped.mse, highest.mse);

    // With fixed terms: the free terms among the first 26, or the first two free terms of all.
    std::vector<int32_t> orders;
    for (int32_t j = 1; j < 28; ++j)
        orders.push_back(j);
    const Samples zeros(orders.size(), 0.0);
    const PolynomialFit two = FitPowers(x, y, 30, 0, {}, orders, zeros);
    const Solution exact = SolveNormal(Powers(x, {0, 28}), y, {});
    EXPECT_EQ(two.code, WarnPolynomialOrderCapped);
    EXPECT_NEAR(two.c[0], static_cast<double>(exact.c[0]), 1e-14);
    EXPECT_NEAR(two.c[28], static_cast<double>(exact.c[1]), 1e-14);
    EXPECT_EQ(two.c[29], 0.0);
    const PolynomialFit few = FitPowers(x, y, 30, 0, {}, {2, 30}, {0.25, 1.0});
    EXPECT_NE(few.c[25], 0.0);
    EXPECT_EQ(few.c[26], 0.0);
    EXPECT_EQ(few.c[2], 0.25);
    EXPECT_EQ(few.c[30], 1.0);
    EXPECT_NEAR(
        few.fit[0],
        [&] {
            Long f = 0;
            for (int j = 30; j >= 0; --j)
                f = f * x[0] + few.c[j];
            return static_cast<double>(f);
        }(),
        1e-8);
}

TEST(LinearFits, ChecksOfPolynomials) {
    const Samples x = {1, 2, 3}, y = {2, 4, 6};
    EXPECT_EQ(FitPowers(x, {1, 2}, -1, 9).code, ErrSizeMismatch);
    EXPECT_EQ(FitPowers(x, y, -1, 9, {1}).code, ErrSizeMismatch);
    EXPECT_EQ(FitPowers(x, y, -1, 9, {}, {1}, {}).code, ErrSizeMismatch);
    EXPECT_EQ(FitPowers(x, y, -1, 9).code, ErrPolynomialOrderNegative);
    EXPECT_EQ(FitPowers(x, y, 3, 9).code, ErrPolynomialOrderTooHigh);
    EXPECT_EQ(FitPowers(x, y, std::numeric_limits<int32_t>::max(), 0).code,
              ErrPolynomialOrderTooHigh);
    // Orders that fix nothing still count in the first check, but not in the second.
    EXPECT_EQ(FitPowers(x, y, 3, 0, {}, {9}, {0.0}).code, ErrPolynomialOrderTooHigh);
    EXPECT_EQ(FitPowers(x, y, 2, 7).code, ErrInvalidSelector);
    EXPECT_EQ(FitPowers({1, infinity, 3}, y, 1, 0).code, ErrNonFiniteInput);
    const PolynomialFit failed = FitPowers({1, 1, 1}, y, 2, 4);
    EXPECT_EQ(failed.code, ErrSingularMatrix);
    EXPECT_TRUE(failed.c.empty() && failed.fit.empty() && std::isnan(failed.mse));

    const DBLArray fit, c;
    double mse;
    EXPECT_EQ(PolyFit_head(DBLArray(x).handle(), DBLArray(y).handle(), 1, 0, fit.handle(),
                           c.handle(), &mse),
              0);
    EXPECT_NEAR(c[0], 0.0, 1e-14);
    EXPECT_NEAR(c[1], 2.0, 1e-14);
    EXPECT_EQ(PolyFit80_head(DBLArray(x).handle(), DBLArray(y).handle(), 1, 0,
                             I32Array({0}).handle(), DBLArray({1.0}).handle(), fit.handle(),
                             c.handle(), &mse),
              0);
    EXPECT_NEAR(c[1], (1 + 6 + 15) / 14.0, 1e-14);
}

// Robust norms.

// K. A. Brownlee, "Statistical theory and methodology in science and engineering", 1965: three
// predictors and the loss.
const Samples stackLoss = {80, 27, 89, 42, 80, 27, 88, 37, 75, 25, 90, 37, 62, 24, 87, 28, 62,
                           22, 87, 18, 62, 23, 87, 18, 62, 24, 93, 19, 62, 24, 93, 20, 58, 23,
                           87, 15, 58, 18, 80, 14, 58, 18, 89, 14, 58, 17, 88, 13, 58, 18, 82,
                           11, 58, 19, 93, 12, 50, 18, 89, 8,  50, 18, 86, 7,  50, 19, 72, 8,
                           50, 19, 79, 8,  50, 20, 80, 9,  56, 20, 82, 15, 70, 20, 91, 15};
constexpr int32_t stackDays = 21;

void WriteStackLoss(const qx::RowBlock &block) {
    for (int32_t i = 0; i < block.count; ++i) {
        block.column(0)[i] = 1.0;
        for (int32_t j = 0; j < 4; ++j)
            block.column(j + 1)[i] = stackLoss[4 * (block.first + i) + j];
    }
}
Samples ResidualsOfStackLoss(const double *c) {
    Samples rest;
    for (int i = 0; i < stackDays; ++i) {
        const double *const day = &stackLoss[4 * i];
        rest.push_back(day[3] - c[0] - c[1] * day[0] - c[2] * day[1] - c[3] * day[2]);
    }
    return rest;
}
Samples FitStackLoss(qx::FitNorm norm, const Samples &w = {}, double unit = 1.0) {
    const auto rows = [unit](const qx::RowBlock &block) {
        WriteStackLoss(block);
        for (int32_t i = 0; i < block.count; ++i)
            block.column(4)[i] *= unit;
    };
    const DBLArray weights(w), c({0, 0, 0, 0});
    EXPECT_EQ(qx::SolveRobustly({rows, stackDays, 4, w.empty() ? nullptr : weights.data()}, norm,
                                {1e-10, 0.0, qx::robustIterations}, c.data()),
              0);
    return c.values();
}

TEST(LinearFits, LeastAbsoluteResidualsOfTheStackLoss) {
    const auto sumAt = [](const Samples &c) {
        double sum = 0.0;
        for (const double rest : ResidualsOfStackLoss(c.data()))
            sum += std::fabs(rest);
        return sum;
    };
    // The minimum, by linear programming.
    const Samples best = {-39.68985507, 0.83188406, 0.57391304, -0.06086957};
    const Samples found = FitStackLoss(qx::leastAbsolute);
    EXPECT_LT(sumAt(found), sumAt(best) * 1.0006);
    for (int j = 0; j < 4; ++j)
        EXPECT_NEAR(found[j], best[j], 0.02 * std::fabs(best[j]));
}

// The steps end by the change relative to the residuals, so a unit of the data changes nothing.
TEST(LinearFits, RobustFitsDoNotDependOnTheUnitOfTheData) {
    for (const qx::FitNorm norm : {qx::leastAbsolute, qx::bisquare}) {
        const Samples plain = FitStackLoss(norm);
        for (const double unit : {0x1p-20, 0x1p20}) {
            const Samples found = FitStackLoss(norm, {}, unit);
            for (int j = 0; j < 4; ++j)
                EXPECT_NEAR(found[j] / unit, plain[j], 1e-12 * std::fabs(plain[j])) << norm;
        }
    }
}

double MedianOf(Samples values) {
    std::sort(values.begin(), values.end());
    return values[values.size() / 2];
}

// The final solution is the weighted fit with the biweights of its own residuals.
TEST(LinearFits, BisquareFitOfTheStackLossIsAFixedPoint) {
    Rows rows;
    Samples loss, some;
    for (int i = 0; i < stackDays; ++i) {
        const double *const day = &stackLoss[4 * i];
        rows.push_back({1.0, day[0], day[1], day[2]});
        loss.push_back(day[3]);
        some.push_back(i % 3 + 0.5);
    }
    for (const Samples &w : {Samples(), some}) {
        const Solution plain = SolveNormal(rows, loss, w);
        const Samples found = FitStackLoss(qx::bisquare, w);
        Samples adjusted = ResidualsOfStackLoss(found.data()), distances;
        for (int i = 0; i < stackDays; ++i) {
            Long leverage = 0;
            for (int j = 0; j < 4; ++j)
                for (int l = 0; l < 4; ++l)
                    leverage += rows[i][j] * plain.covariance[j][l] * rows[i][l];
            const double weight = w.empty() ? 1.0 : w[i];
            adjusted[i] *= static_cast<double>(std::sqrt(weight / (1 - weight * leverage)));
        }
        for (const double value : adjusted)
            distances.push_back(std::fabs(value - MedianOf(adjusted)));
        const double scale = MedianOf(distances) / 0.6745;
        Samples weights;
        for (int i = 0; i < stackDays; ++i) {
            const double q = adjusted[i] / (4.685 * scale);
            weights.push_back((w.empty() ? 1.0 : w[i]) *
                              (std::fabs(q) < 1 ? std::pow(1 - q * q, 2) : 0.0));
        }
        const Solution expected = SolveNormal(rows, loss, weights);
        for (int j = 0; j < 4; ++j)
            EXPECT_NEAR(found[j], static_cast<double>(expected.c[j]), 1e-7);
        EXPECT_GT(std::fabs(found[0] - static_cast<double>(plain.c[0])), 1.0);
    }
}

TEST(LinearFits, RobustPolynomialsIgnoreOutliers) {
    Noise noise(11);
    Samples x, y, w;
    for (int i = 0; i < 200; ++i) {
        x.push_back(0.01 * i);
        y.push_back(1.0 - 2.0 * x[i] + 3.0 * x[i] * x[i] + 0.01 * noise.symmetric());
        w.push_back(1.0 + 0.5 * noise.symmetric());
        if (i % 5 == 2)
            y[i] += 40.0 * noise.positive();
    }
    const DBLArray fit(x), c({0, 0, 0});
    const Samples truth = {1.0, -2.0, 3.0};
    const DBLArray weights(w);
    for (const bool isWeighted : {false, true})
        for (const auto &[norm, bound] :
             {std::pair(qx::leastSquares, infinity), std::pair(qx::leastAbsolute, 0.01),
              std::pair(qx::bisquare, 0.01)}) {
            double mse;
            const DBLArray xs(x), ys(y);
            const qx::FitSamples samples = {
                {xs.data(), 200}, {ys.data(), 200}, {weights.data(), isWeighted ? 200 : 0}};
            ASSERT_EQ(qx::FitPolynomial(samples, {}, qx::bySVD, {c.data(), 3},
                                        {{fit.data(), 200}, &mse}, norm,
                                        {1e-6, 0.0, qx::robustIterations}),
                      0);
            double worst = 0.0;
            for (int j = 0; j < 3; ++j)
                worst = std::max(worst, std::fabs(c[j] - truth[j]));
            EXPECT_LT(worst, bound) << norm;
            if (norm == qx::leastSquares) {
                EXPECT_GT(worst, 1.0); // the outliers matter
            }
        }
}

qx::ConstRealVector ViewOf(const DBLArray &array) {
    return {array.data(), static_cast<std::ptrdiff_t>(array.values().size())};
}

TEST(LinearFits, WeightsOfRobustNorms) {
    DBLArray out(6);
    const qx::RealVector weights(out.data(), 6);
    const DBLArray residuals({-2, 1, 0, 0.001, 4, -1}), w({1, -2, 3, 1, 1, 1});
    ASSERT_EQ(qx::LeastAbsoluteWeights(ViewOf(residuals), ViewOf(w), weights), 0);
    EXPECT_EQ(out.values(), (Samples{0.5, 2, 300, 100, 0.25, 1}));
    const DBLArray exact({0, 0, 0, 0, 0, 0}), ones({1, 1, 1, 1, 1, 1});
    ASSERT_EQ(qx::LeastAbsoluteWeights(ViewOf(exact), {}, weights), 0);
    EXPECT_EQ(out[0], 1.0 / 1e-07);
    // If the scale is 0, or if most samples would be lost, the weights are unchanged.
    ASSERT_EQ(qx::BisquareWeights(ViewOf(exact), ViewOf(ones), ViewOf(w), 2, weights), 0);
    EXPECT_EQ(out.values(), (Samples{1, 2, 3, 1, 1, 1}));
    const DBLArray spread({-1, 1, 0.6, -1.1, 5e5, 0.9}), factors({1, 1, 2, 1, 2, 1});
    ASSERT_EQ(qx::BisquareWeights(ViewOf(spread), ViewOf(factors), {}, 6, weights), 0);
    EXPECT_EQ(out[4], 1.0);
    ASSERT_EQ(qx::BisquareWeights(ViewOf(spread), ViewOf(factors), {}, 5, weights), 0);
    EXPECT_EQ(out[4], 0.0);
    EXPECT_GT(out[0], 0.5);
    const DBLArray broken({1, nan, 2, 1, 1, 1});
    EXPECT_EQ(qx::BisquareWeights(ViewOf(broken), ViewOf(ones), {}, 1, weights), ErrNaNInData);
    EXPECT_EQ(qx::LeastAbsoluteWeights(ViewOf(broken), {}, weights), ErrNaNInData);
    // All leverages of 0.9999 and above are treated alike.
    DBLArray leverage({0.0, 0.75, 0.9999999, 1.0});
    qx::LeverageFactors(ViewOf(leverage), {}, {leverage.data(), 4});
    EXPECT_EQ(leverage[1], 2.0);
    EXPECT_NEAR(leverage[2], 100.0, 1e-9);
    EXPECT_EQ(leverage[3], leverage[2]);
}

// Scores and steps.

TEST(LinearFits, GoodnessOfFit) {
    double sse, rSquare, rmse;
    const auto score = [&](const Samples &y, const Samples &fit, const Samples &w, int32_t dof) {
        return GoodnessOfFit_head(DBLArray(y).handle(), DBLArray(fit).handle(),
                                  DBLArray(w).handle(), dof, &sse, &rSquare, &rmse);
    };
    EXPECT_EQ(score({1, 2, 3, 6}, {1, 3, 3, 5}, {}, 0), 0);
    EXPECT_EQ(sse, 2.0);
    EXPECT_EQ(rSquare, 1.0 - 2.0 / 14.0);
    EXPECT_EQ(rmse, 1.0);
    EXPECT_EQ(score({1, 2, 3, 6}, {1, 3, 3, 5}, {1, -3, 1, 4}, 1), 0);
    EXPECT_EQ(sse, 1.0); // weights keep their signs, and the mean is unweighted
    EXPECT_EQ(rSquare, 1.0 - 1.0 / (4.0 - 3.0 + 0.0 + 36.0));
    EXPECT_EQ(rmse, 1.0);
    EXPECT_EQ(score({3, 3}, {3, 3}, {}, 1), 0);
    EXPECT_EQ(rSquare, 1.0);
    EXPECT_EQ(score({3, 3}, {3, 4}, {}, 1), 0);
    EXPECT_EQ(rSquare, infinity);

    EXPECT_EQ(score({}, {1}, {}, 0), ErrEmptyInput);
    EXPECT_EQ(score({1}, {1, 2}, {}, 0), ErrSizeMismatch);
    EXPECT_EQ(score({1, 2}, {1, 2}, {1}, 0), ErrSizeMismatch);
    EXPECT_EQ(score({1}, {1}, {}, 5), ErrFewerThanTwo);
    EXPECT_EQ(score({1, 2}, {1, 2}, {}, 2), ErrTooFewForParameters);
    EXPECT_TRUE(std::isnan(sse) && std::isnan(rSquare) && std::isnan(rmse));
}

TEST(LinearFits, DampedSteps) {
    const auto step = [](const Samples &coefficients, const Samples &a, const Samples &gradient,
                         double lambda, Samples *result) {
        const DBLArray c(coefficients);
        const auto n = static_cast<int32_t>(gradient.size());
        const DBLMatrix matrix(n, n);
        for (std::size_t i = 0; i < a.size(); ++i)
            matrix.data()[i] = a[i];
        ErrorCode err = 1;
        EXPECT_EQ(GetNewCoef_head(c.handle(), matrix.handle(), DBLArray(gradient).handle(), &lambda,
                                  &err),
                  err);
        *result = c.values();
        return err;
    };
    Samples c;
    // (4, 2; 2, 12) d = (8, 16)
    EXPECT_EQ(step({1, 1}, {2, 2, 2, 6}, {8, 16}, 1.0, &c), 0);
    EXPECT_NEAR(c[0], 1.0 + 16.0 / 11.0, 1e-15);
    EXPECT_NEAR(c[1], 1.0 + 12.0 / 11.0, 1e-15);
    // A row of tiny elements still provides a pivot.
    EXPECT_EQ(step({0, 0}, {1e-200, 2e-200, 1, 1}, {5e-200, 3}, 0.0, &c), 0);
    EXPECT_NEAR(c[0], 1.0, 1e-15);
    EXPECT_NEAR(c[1], 2.0, 1e-15);
    EXPECT_EQ(step({1, 1, 1}, {2, 2, 2, 6}, {8, 16}, 1.0, &c), ErrEmptyInput);
    EXPECT_EQ(step({}, {}, {}, 1.0, &c), ErrEmptyInput);
    EXPECT_EQ(step({1, 1}, {nan, 2, 2, 6}, {8, 16}, 1.0, &c), ErrNonFiniteInput);
    EXPECT_EQ(step({1, 1}, {1, 1, 1, 1}, {8, 16}, 0.0, &c), ErrSingularMatrix);
    EXPECT_EQ(step({1, nan}, {2, 1, 1, 2}, {8, 16}, 0.0, &c), ErrSingularMatrix);
    EXPECT_TRUE(c.empty());
}

} // namespace
} // namespace qx::test
