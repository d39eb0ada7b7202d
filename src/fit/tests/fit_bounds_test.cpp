#include "fit/confidence_bounds.h"
#include "fit/tests/least_squares.h"
#include "fit/tests/nist_models.h"
#include "frame/arrays.h"
#include "qx/qx.h"
#include "tests/support/recipe.h"
#include "tests/support/test_data.h"

#include <gtest/gtest.h>

#include <cmath>
#include <functional>
#include <sstream>
#include <string>

namespace qx::test {
namespace {

constexpr double eps = 0x1p-52;

struct Bounds {
    ErrorCode code;
    Samples lowerC, upperC, lower, upper;
};

typedef decltype(&ConfBndLinear_head) ConfExport;
typedef decltype(&PredBndLinear_head) PredExport;

Bounds Conf(ConfExport conf, const Samples &x, const Samples &y, const Samples &w, const Samples &c,
            double confidence) {
    const DBLArray lowerC({7.0}), upperC, lower, upper;
    Bounds result = {};
    result.code =
        conf(DBLArray(x).handle(), DBLArray(y).handle(), DBLArray(w).handle(), DBLArray(c).handle(),
             confidence, lowerC.handle(), upperC.handle(), lower.handle(), upper.handle());
    result.lowerC = lowerC.values();
    result.upperC = upperC.values();
    result.lower = lower.values();
    result.upper = upper.values();
    return result;
}
Bounds Pred(PredExport pred, const Samples &x, const Samples &y, const Samples &w, const Samples &c,
            double confidence) {
    const DBLArray lower, upper;
    Bounds result = {};
    result.code = pred(DBLArray(x).handle(), DBLArray(y).handle(), DBLArray(w).handle(),
                       DBLArray(c).handle(), confidence, lower.handle(), upper.handle());
    result.lower = lower.values();
    result.upper = upper.values();
    return result;
}

// The logarithm to base 3 and the matrix of the terms 1, x, sin x, wrapped in the common form of
// the exports.
ErrorCode ConfLog3(DBL1D x, DBL1D y, DBL1D w, DBL1D c, double confidence, DBL1D lowerC,
                   DBL1D upperC, DBL1D lower, DBL1D upper) {
    return ConfBndLog_head(x, y, w, c, 3.0, confidence, lowerC, upperC, lower, upper);
}
ErrorCode PredLog3(DBL1D x, DBL1D y, DBL1D w, DBL1D c, double confidence, DBL1D lower,
                   DBL1D upper) {
    return PredBndLog_head(x, y, w, c, 3.0, confidence, lower, upper);
}
double Term(double x, int32_t j) { return j == 0 ? 1.0 : j == 1 ? x : std::sin(x); }
struct Terms : DBLMatrix {
    explicit Terms(DBL1D handle) : DBLMatrix(qx::In<DBL1D>(handle).size(), 3) {
        const qx::In<DBL1D> x = handle;
        for (int32_t i = 0; i < x.size(); ++i)
            for (int32_t j = 0; j < 3; ++j)
                data()[3 * i + j] = Term(x.data()[i], j);
    }
};
ErrorCode ConfTerms(DBL1D x, DBL1D y, DBL1D w, DBL1D c, double confidence, DBL1D lowerC,
                    DBL1D upperC, DBL1D lower, DBL1D upper) {
    return ConfBndGenLS_head(Terms(x).handle(), y, w, c, confidence, lowerC, upperC, lower, upper);
}
ErrorCode PredTerms(DBL1D x, DBL1D y, DBL1D w, DBL1D c, double confidence, DBL1D lower,
                    DBL1D upper) {
    return PredBndGenLS_head(Terms(x).handle(), y, w, c, confidence, lower, upper);
}

struct Model {
    const char *name;
    ConfExport conf;
    PredExport pred;
    Samples c;
    std::function<Long(Long x, const std::vector<Long> &c)> value;
};

const std::vector<Model> &Models() {
    static const std::vector<Model> models = {
        {"line",
         ConfBndLinear_head,
         PredBndLinear_head,
         {1.5, -2.0},
         [](Long x, auto &c) { return c[0] * x + c[1]; }},
        {"exponential",
         ConfBndExp_head,
         PredBndExp_head,
         {2.5, -0.7},
         [](Long x, auto &c) { return c[0] * std::exp(c[1] * x); }},
        {"power",
         ConfBndPower_head,
         PredBndPower_head,
         {0.75, 1.3},
         [](Long x, auto &c) { return c[0] * std::pow(x, c[1]); }},
        {"logarithm",
         ConfLog3,
         PredLog3,
         {-1.25, 2.0},
         [](Long x, auto &c) { return c[0] * std::log(c[1] * x) / std::log(Long{3}); }},
        {"Gaussian",
         ConfBndGauss_head,
         PredBndGauss_head,
         {4.0, 2.5, -0.8},
         [](Long x, auto &c) {
             const Long z = (x - c[1]) / c[2];
             return c[0] * std::exp(-z * z / 2);
         }},
        {"polynomial",
         ConfBndPoly_head,
         PredBndPoly_head,
         {1.0, -2.0, 0.5, 0.125},
         [](Long x, auto &c) { return c[0] + x * (c[1] + x * (c[2] + x * c[3])); }},
        {"matrix",
         ConfTerms,
         PredTerms,
         {1.0, -2.0, 0.5},
         [](Long x, auto &c) {
             return c[0] + c[1] * x + c[2] * Long{std::sin(static_cast<double>(x))};
         }},
    };
    return models;
}

// Derivatives by central differences of fourth order in extended precision: 14 digits.
std::vector<Long> Derivatives(const Model &model, double x, const std::vector<Long> &c) {
    std::vector<Long> d;
    for (std::size_t j = 0; j < c.size(); ++j) {
        const Long h = 0x1p-13L;
        const auto at = [&](Long step) {
            std::vector<Long> moved = c;
            moved[j] += step;
            return model.value(x, moved);
        };
        d.push_back((8 * (at(h) - at(-h)) - (at(2 * h) - at(-2 * h))) / (12 * h));
    }
    return d;
}

struct HalfWidths {
    std::vector<Long> coefficients, curve, observation, values;
};

// The definition, with the inverse of the normal equations.
HalfWidths ByDefinition(const Model &model, const Samples &x, const Samples &y, const Samples &w,
                        double confidence) {
    const std::size_t p = model.c.size();
    const std::vector<Long> c(model.c.begin(), model.c.end());
    std::vector<std::vector<Long>> normal(p, std::vector<Long>(p)), rows;
    HalfWidths result;
    Long squares = 0;
    int used = 0;
    for (std::size_t i = 0; i < x.size(); ++i) {
        const Long weight = w.empty() ? 1.0 : std::fabs(w[i]);
        rows.push_back(Derivatives(model, x[i], c));
        result.values.push_back(model.value(x[i], c));
        squares += weight * (y[i] - result.values[i]) * (y[i] - result.values[i]);
        used += weight != 0;
        for (std::size_t j = 0; j < p; ++j)
            for (std::size_t l = 0; l < p; ++l)
                normal[j][l] += weight * rows[i][j] * rows[i][l];
    }
    const auto inverse = Inverse(normal);
    const int dof = used - static_cast<int>(p);
    const Long width = TwoSidedT(confidence, dof) * std::sqrt(squares / dof);
    for (std::size_t j = 0; j < p; ++j)
        result.coefficients.push_back(width * std::sqrt(inverse[j][j]));
    for (const auto &row : rows) {
        Long form = 0;
        for (std::size_t j = 0; j < p; ++j)
            for (std::size_t l = 0; l < p; ++l)
                form += row[j] * inverse[j][l] * row[l];
        result.curve.push_back(width * std::sqrt(form));
        result.observation.push_back(width * std::sqrt(form + 1));
    }
    return result;
}

void ExpectAround(const Samples &lower, const Samples &upper, const std::vector<Long> &middle,
                  const std::vector<Long> &half) {
    ASSERT_EQ(lower.size(), middle.size());
    ASSERT_EQ(upper.size(), middle.size());
    for (std::size_t i = 0; i < middle.size(); ++i) {
        const double tolerance = static_cast<double>(1e-12L * (std::fabs(middle[i]) + half[i]));
        ASSERT_NEAR(lower[i], static_cast<double>(middle[i] - half[i]), tolerance) << i;
        ASSERT_NEAR(upper[i], static_cast<double>(middle[i] + half[i]), tolerance) << i;
    }
}

TEST(FitBounds, QuantilesToTheLastDigits) {
    std::istringstream in = qx::test::Uncommented(TestData("fit_bounds.dat"));
    int count = 0;
    std::string word;
    for (double confidence, dof, exact; in >> word && word == "t"; ++count) {
        in >> confidence >> dof >> exact;
        EXPECT_NEAR(TwoSidedT(confidence, dof) / exact, 1.0, 8 * eps) << confidence << " " << dof;
    }
    EXPECT_EQ(count, 81);
    EXPECT_NEAR(TwoSidedT(0.95, 1e9), 1.959963987, 1e-9); // the normal quantile and 2.4 / dof
    EXPECT_NEAR(TwoSidedT(1e-130, 1) / (1.5707963267948966e-130), 1.0, 8 * eps);
}

TEST(FitBounds, FollowTheDefinition) {
    Noise noise(1);
    for (const Model &model : Models())
        for (const int n : {5, 40, 1030}) // 1030: two blocks of rows and more
            for (const bool isWeighted : {false, true}) {
                SCOPED_TRACE(std::string(model.name) + " " + std::to_string(n) +
                             (isWeighted ? " weighted" : ""));
                Samples x, y, w;
                const std::vector<Long> c(model.c.begin(), model.c.end());
                for (int i = 0; i < n; ++i) {
                    x.push_back(0.25 + 5.0 * (n - i) / n);
                    y.push_back(static_cast<double>(model.value(x[i], c)) +
                                0.1 * noise.symmetric());
                    if (isWeighted)
                        w.push_back(n > 5 && i % 6 == 5 ? 0.0 : 0.2 + 3.0 * noise.symmetric());
                }
                const double confidence = isWeighted ? 0.3 : 0.95;
                const HalfWidths exact = ByDefinition(model, x, y, w, confidence);
                const Bounds curve = Conf(model.conf, x, y, w, model.c, confidence);
                const Bounds observation = Pred(model.pred, x, y, w, model.c, confidence);
                ASSERT_EQ(curve.code, 0);
                ASSERT_EQ(observation.code, 0);
                ExpectAround(curve.lowerC, curve.upperC, c, exact.coefficients);
                ExpectAround(curve.lower, curve.upper, exact.values, exact.curve);
                ExpectAround(observation.lower, observation.upper, exact.values, exact.observation);
            }
}

TEST(FitBounds, AreThoseOfRsPredict) {
    std::istringstream in = qx::test::Uncommented(TestData("fit_bounds.dat"));
    std::string word, name;
    int fits = 0;
    while (in >> word) {
        if (word == "t") {
            std::getline(in, word);
            continue;
        }
        int p, n;
        double level;
        in >> name >> p >> n >> level;
        SCOPED_TRACE(name);
        ++fits;
        const auto read = [&](int rows, int cols) {
            std::vector<Samples> columns(cols);
            for (int i = 0; i < rows; ++i)
                for (Samples &column : columns)
                    in >> column.emplace_back();
            return columns;
        };
        const auto c = read(p, 3), rows = read(n, 7);
        const auto near = [](const Samples &found, const Samples &expected) {
            ASSERT_EQ(found.size(), expected.size());
            for (std::size_t i = 0; i < found.size(); ++i)
                EXPECT_NEAR(found[i], expected[i], 1e-9 * std::fabs(expected[i]) + 1e-10);
        };
        const Bounds curve = Conf(ConfBndPoly_head, rows[0], rows[1], rows[2], c[0], level);
        const Bounds observation = Pred(PredBndPoly_head, rows[0], rows[1], rows[2], c[0], level);
        near(curve.lowerC, c[1]);
        near(curve.upperC, c[2]);
        near(curve.lower, rows[3]);
        near(curve.upper, rows[4]);
        near(observation.lower, rows[5]);
        near(observation.upper, rows[6]);
        if (p == 2) {
            const Bounds line =
                Conf(ConfBndLinear_head, rows[0], rows[1], rows[2], {c[0][1], c[0][0]}, level);
            near(line.lower, rows[3]);
            near(line.upperC, {c[2][1], c[2][0]});
        }
    }
    EXPECT_EQ(fits, 5);
}

// Certified standard deviations of the coefficients, with 11 digits.
TEST(FitBounds, DeviationsCertifiedByNIST) {
    for (const auto &set : qx::test::ReadNistSets(TestData("nist_nonlinear.dat"))) {
        if (set.name != "DanWood")
            continue;
        const Bounds found = Conf(ConfBndPower_head, set.x, set.y, {}, set.certified, 0.9);
        ASSERT_EQ(found.code, 0);
        const double t = TwoSidedT(0.9, 4.0);
        for (int j = 0; j < 2; ++j)
            EXPECT_NEAR((found.upperC[j] - found.lowerC[j]) / (2 * t * set.errors[j]), 1.0, 2e-10);
    }
    std::ifstream file(TestData("nist_linear.dat"));
    int checked = 0;
    std::string name, kind;
    for (int n, k, predictors; file >> name >> kind >> n >> k >> predictors;) {
        Samples c(k), errors(k), x, y;
        double squares;
        for (int j = 0; j < k; ++j)
            file >> c[j] >> errors[j];
        file >> squares;
        Samples h;
        for (int i = 0; i < n; ++i) {
            file >> y.emplace_back();
            for (int j = 0; j < predictors; ++j)
                file >> h.emplace_back();
        }
        if (squares == 0.0)
            continue; // the deviations are 0
        SCOPED_TRACE(name);
        Bounds found = {};
        if (kind == "polynomial") {
            found = Conf(ConfBndPoly_head, h, y, {}, c, 0.95);
        } else {
            const DBLMatrix matrix(n, k);
            std::copy(h.begin(), h.end(), matrix.data());
            const DBLArray low, high, lower, upper;
            found.code = ConfBndGenLS_head(
                matrix.handle(), DBLArray(y).handle(), DBLArray().handle(), DBLArray(c).handle(),
                0.95, low.handle(), high.handle(), lower.handle(), upper.handle());
            found.lowerC = low.values();
            found.upperC = high.values();
        }
        ASSERT_EQ(found.code, 0);
        const double t = TwoSidedT(0.95, n - k);
        for (int j = 0; j < k; ++j)
            EXPECT_NEAR((found.upperC[j] - found.lowerC[j]) / (2 * t * errors[j]), 1.0, 2e-7) << j;
        ++checked;
    }
    EXPECT_EQ(checked, 9);
}

TEST(FitBounds, SamplesWithoutWeightHaveBoundsAndDoNotCount) {
    const Samples x = {1, 2, 3, 4, 5, 6}, y = {2, 3, 7, 8, 8, 11}, w = {1, 2, 1, 0.5, 1, 1};
    const Bounds six = Pred(PredBndLinear_head, x, y, w, {2, 0}, 0.9);
    Samples longX = x, longY = y, longW = w;
    for (const double more : {100.0, 3.0}) {
        longX.push_back(more);
        longY.push_back(-1e6);
        longW.push_back(0.0);
    }
    const Bounds eight = Pred(PredBndLinear_head, longX, longY, longW, {2, 0}, 0.9);
    ASSERT_EQ(eight.upper.size(), 8U);
    for (std::size_t i = 0; i < 6; ++i)
        EXPECT_NEAR(eight.upper[i], six.upper[i], 1e-13);
    EXPECT_NEAR(eight.lower[7], six.lower[2], 1e-13);
    EXPECT_GT(eight.upper[6] - 200.0, 20.0);
}

TEST(FitBounds, PolynomialsKeepGivenTermsAboveTheFittedOrder) {
    Samples x, y, c(31, 0.0);
    for (int i = 0; i < 200; ++i) {
        x.push_back(std::cos(0.0157 * i));
        y.push_back(x[i] + (i % 2 == 0 ? 0.1 : -0.1));
    }
    c[1] = 1.0;
    c[30] = 1e-3;
    const Bounds found = Conf(ConfBndPoly_head, x, y, {}, c, 0.9);
    ASSERT_EQ(found.code, 0);
    EXPECT_EQ(found.lowerC[30], 1e-3);
    EXPECT_EQ(found.upperC[30], 1e-3);
    EXPECT_LT(found.lowerC[25], found.upperC[25]);
}

TEST(FitBounds, ScalingOfUnitsCostsNoDigits) {
    const Samples x = {1, 2, 3, 4, 5, 6}, y = {2, 3, 7, 8, 8, 11};
    const Bounds plain = Conf(ConfBndLinear_head, x, y, {}, {2, 0}, 0.9);
    for (const double unit : {0x1p-500, 0x1p500, 0x1p900}) {
        Samples scaledX, scaledY;
        for (const double v : x)
            scaledX.push_back(v * unit);
        for (const double v : y)
            scaledY.push_back(v * unit);
        const Bounds found = Conf(ConfBndLinear_head, scaledX, scaledY, {}, {2, 0}, 0.9);
        ASSERT_EQ(found.code, 0);
        EXPECT_NEAR(found.upperC[0], plain.upperC[0], 1e-14);
        EXPECT_NEAR(found.upperC[1] / unit, plain.upperC[1], 1e-13);
        EXPECT_NEAR(found.lower[4] / unit, plain.lower[4], 1e-13);
    }
}

TEST(FitBounds, CodesInTheirOrder) {
    const Samples x = {1, 2, 3, 4}, y = {2, 3, 3, 5}, c = {1, 1};
    const auto line = [&](const Samples &at, const Samples &of, const Samples &w, const Samples &by,
                          double confidence) {
        const Bounds conf = Conf(ConfBndLinear_head, at, of, w, by, confidence);
        EXPECT_EQ(Pred(PredBndLinear_head, at, of, w, by, confidence).code, conf.code);
        EXPECT_TRUE(conf.code == 0 || (conf.lowerC.empty() && conf.upper.empty()));
        return conf.code;
    };
    EXPECT_EQ(line(x, y, {}, c, 0.5), 0);
    EXPECT_EQ(line({}, y, {1}, c, 0.5), ErrEmptyInput);
    EXPECT_EQ(line(x, {}, {1}, c, 0.5), ErrEmptyInput);
    EXPECT_EQ(line(x, y, {1}, {}, 0.5), ErrEmptyInput);
    EXPECT_EQ(line({1}, {1, 2}, {}, c, 0.5), ErrSizeMismatch);
    EXPECT_EQ(line({1, nan}, {1, 2}, {1}, c, 0.5), ErrSizeMismatch);
    EXPECT_EQ(line(x, y, {}, {1, 2, nan}, 0.5), ErrSizeMismatch);
    EXPECT_EQ(line({1, nan}, {1, 2}, {}, c, 0.5), ErrFewerThanThree);
    EXPECT_EQ(line({1, nan, 3}, {1, 2, 3}, {0, 0, 0}, c, 0.5), ErrNonFiniteInput);
    EXPECT_EQ(line(x, {1, 2, 3, infinity}, {}, c, 0.5), ErrNonFiniteInput);
    EXPECT_EQ(line(x, y, {1, 1, 1, nan}, c, 0.5), ErrNonFiniteInput);
    EXPECT_EQ(line(x, y, {}, {1, nan}, 0.5), ErrNonFiniteInput);
    EXPECT_EQ(line(x, y, {}, {1e308, 1}, 0.5), ErrNonFiniteInput) << "values overflow";
    EXPECT_EQ(line(x, y, {1, 0, 0, 1}, c, 7), ErrTooFewForParameters);
    EXPECT_EQ(line(x, y, {0, 0, 0, 0}, c, 0.5), ErrTooFewForParameters);
    for (const double confidence : {0.0, 1.0, -1.0, nan, infinity})
        EXPECT_EQ(line({1, 1, 1, 1}, y, {}, c, confidence), ErrProbabilityOutOfRange);
    EXPECT_EQ(line({0.1, 0.1, 0.1, 0.1}, y, {}, c, 0.5), ErrSingularMatrix);
    EXPECT_EQ(line(x, y, {0, 0, 0, 1e-300}, c, 0.5), ErrTooFewForParameters);

    EXPECT_EQ(Conf(ConfBndPower_head, {1, 2, 0, nan}, y, {}, c, 7).code, ErrNonFiniteInput);
    EXPECT_EQ(Conf(ConfBndPower_head, {1, 2, 0, 3}, y, {0, 0, 0, 0}, c, 7).code,
              ErrNotStrictlyPositive);
    EXPECT_EQ(Conf(ConfBndExp_head, x, y, {}, {0, 1}, 0.5).code, ErrSingularMatrix);
    EXPECT_EQ(Conf(ConfBndExp_head, x, y, {}, {1, 500}, 0.5).code, ErrNonFiniteInput);
    EXPECT_EQ(Conf(ConfBndGauss_head, x, y, {}, {1, 2, 0}, 0.5).code, ErrSingularMatrix);
    EXPECT_EQ(Conf(ConfBndGauss_head, x, y, {}, {1, 2}, 0.5).code, ErrSizeMismatch);
    EXPECT_EQ(Conf(ConfBndGauss_head, x, y, {}, {1, 1e6, 1}, 0.5).code, ErrSingularMatrix);
    EXPECT_EQ(Conf(ConfBndPoly_head, x, y, {}, {1, 2, 3, 4}, 0.5).code, ErrTooFewForParameters);

    const auto log = [&](const Samples &at, const Samples &by, double base) {
        const DBLArray lower, upper;
        return PredBndLog_head(DBLArray(at).handle(), DBLArray(y).handle(), DBLArray().handle(),
                               DBLArray(by).handle(), base, 0.5, lower.handle(), upper.handle());
    };
    EXPECT_EQ(log(x, c, 10), 0);
    EXPECT_EQ(log({-1, -2, -3, -4}, {1, -1}, 10), 0);
    EXPECT_EQ(log(x, {1, -1}, 10), ErrNotStrictlyPositive);
    EXPECT_EQ(log({-1, 2, 3, 4}, c, 10), ErrNotStrictlyPositive);
    for (const double base : {0.0, 1.0, -2.0, nan})
        EXPECT_EQ(log(x, c, base), ErrNotStrictlyPositive);
    EXPECT_EQ(log(x, c, infinity), ErrNonFiniteInput);
    EXPECT_EQ(log(x, {1}, infinity), ErrSizeMismatch);
}

TEST(FitBounds, DependentColumnsAreFoundAtAnyLength) {
    for (const int32_t n : {3, 100, 5000, 200000})
        for (const double at : {0.1, 1e9 / 3}) {
            const DBLMatrix h(n, 3);
            Noise noise(5);
            Samples y;
            for (int32_t i = 0; i < n; ++i) {
                const double x = noise.symmetric();
                h.data()[3 * i] = x;
                h.data()[3 * i + 1] = x * at;
                h.data()[3 * i + 2] = 1.0;
                y.push_back(noise.symmetric());
            }
            const DBLArray lower, upper;
            const ErrorCode code = PredBndGenLS_head(
                h.handle(), DBLArray(y).handle(), DBLArray().handle(),
                DBLArray({1.0, 2.0, 3.0}).handle(), 0.9, lower.handle(), upper.handle());
            EXPECT_EQ(code, n == 3 ? ErrTooFewForParameters : ErrSingularMatrix) << n;
            EXPECT_EQ(Conf(ConfBndLinear_head, Samples(n, at), y, {}, {1, 1}, 0.9).code,
                      ErrSingularMatrix)
                << n;
        }
}

} // namespace
} // namespace qx::test
