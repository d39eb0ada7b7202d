#include "fit/tests/nist_models.h"
#include "qx/nonlinear_fits.h"
#include "tests/support/heap_probe.h"
#include "tests/support/hostile_host.h"
#include "tests/support/recipe.h"
#include "tests/support/test_data.h"

#include <gtest/gtest.h>

#include <functional>
#include <limits>

namespace qx::test {
namespace {

typedef std::vector<double> Values;

constexpr double inf = std::numeric_limits<double>::infinity();
const double nan = std::numeric_limits<double>::quiet_NaN();

// The 27 sets of NIST, from both starts, with derivatives and by differences.
TEST(NonlinearFit, FindsTheCertifiedValues) {
    const auto sets = qx::test::ReadNistSets(qx::test::TestData("nist_nonlinear.dat"));
    ASSERT_EQ(sets.size(), 27U);
    for (const auto &set : sets) {
        const qx::test::NistProblem problem(set);
        for (int start = 0; start < 2; ++start)
            for (const bool withDerivatives : {true, false}) {
                SCOPED_TRACE(set.name + " " + std::to_string(start + 1));
                Values p;
                const auto found = problem.fit(start, withDerivatives, &p);
                EXPECT_EQ(found.end, FitEnd::Converged);
                EXPECT_GE(problem.digits(p), withDerivatives ? 10.2 : 8.4);
                EXPECT_LT(found.iterations, 700);
            }
    }
}

// From other starts around the answer, a result reported as converged either has the certified
// digits or is another minimum, where no change of a coefficient lowers the sum of squares.
TEST(NonlinearFit, ReportsConvergenceOnlyAtMinima) {
    Noise noise(11);
    int converged = 0, elsewhere = 0;
    for (const auto &set : qx::test::ReadNistSets(qx::test::TestData("nist_nonlinear.dat"))) {
        for (int i = 0; i < 4; ++i) {
            auto moved = set;
            for (double &one : moved.starts[0])
                one *= std::exp(2.0 * noise.symmetric());
            const qx::test::NistProblem problem(moved);
            Values p;
            const auto found = problem.fit(0, true, &p, 1e-10);
            if (found.end != FitEnd::Converged)
                continue;
            ++converged;
            if (problem.digits(p) >= 6)
                continue;
            ++elsewhere;
            const double cost = problem.squares(p);
            for (double &one : p)
                for (const double factor : {1 - 1e-4, 1 + 1e-4}) {
                    const double kept = one;
                    one *= factor;
                    EXPECT_GE(problem.squares(p), cost * (1 - 1e-12)) << set.name << " " << i;
                    one = kept;
                }
        }
    }
    EXPECT_GT(converged, 60);
    EXPECT_LT(elsewhere, 15);
}

// The export.

typedef std::function<double(double x, const Values &p)> Model;
const std::map<std::string, Model> models = {
    {"decay", [](double x, const Values &p) { return p[0] * std::exp(-p[1] * x) + p[2]; }},
    {"resonance",
     [](double x, const Values &p) {
         return p[0] / (1 + (x - p[1]) / p[2] * ((x - p[1]) / p[2])) + p[3];
     }},
    {"saturation", [](double x, const Values &p) { return p[0] * x / (p[1] + x); }},
    {"line", [](double x, const Values &p) { return p[0] * x + p[1]; }},
};

// A call that passes the model as its context.
struct Fit {
    Model model;
    Values x, y, w = {}, guess, lower = {}, upper = {};
    int32_t loss = 0;
    double scale = 1, tolerance = 0;
    int32_t iterations = 0;
    FitProcedure procedure = Evaluate, jacobian = nullptr;

    ErrorCode code = 1;
    Values p = {}, residuals = {}, covariance = {};
    double cost = -1;
    int32_t reason = -1;
    Values least = {}, most = {}; // the range of parameters at which the model was evaluated
    int calls = 0;

    static int32_t Evaluate(void *context, const DBL *x, int32_t xCount, const DBL *p,
                            int32_t count, DBL *out, int32_t n) {
        Fit &fit = *static_cast<Fit *>(context);
        const Values at(p, p + count);
        fit.least.resize(at.size(), inf);
        fit.most.resize(at.size(), -inf);
        for (std::size_t j = 0; j < at.size(); ++j) {
            fit.least[j] = std::min(fit.least[j], at[j]);
            fit.most[j] = std::max(fit.most[j], at[j]);
        }
        ++fit.calls;
        for (int32_t i = 0; i < n; ++i)
            out[i] = fit.model(x[i * (xCount / n)], at);
        return 0;
    }
    const Fit &run() {
        const DBLArray parameters(Values{}), rest(Values{});
        const qx::test::DBLMatrix matrix;
        code = NonlinearFit2026(DBLArray(x).handle(), DBLArray(y).handle(), DBLArray(w).handle(),
                                procedure, jacobian, this, DBLArray(guess).handle(),
                                DBLArray(lower).handle(), DBLArray(upper).handle(), loss, scale,
                                tolerance, &iterations, parameters.handle(), matrix.handle(),
                                rest.handle(), &cost, &reason);
        p = parameters.values();
        residuals = rest.values();
        covariance = matrix.values();
        return *this;
    }
};

double Number(std::istream &in) {
    std::string word;
    in >> word;
    return word == "inf" ? inf : word == "-inf" ? -inf : std::atof(word.c_str());
}
Values Numbers(std::istream &in, std::size_t count) {
    Values values;
    for (std::size_t i = 0; i < count; ++i)
        values.push_back(Number(in));
    return values;
}

// Compares losses, weights and bounds with SciPy's best of two starts.
TEST(NonlinearFit, ReachesTheLeastCost) {
    std::istringstream in = qx::test::Uncommented(qx::test::TestData("nonlinear_fits.dat"));
    int fits = 0, cut = 0;
    for (std::string kind, name; in >> kind && kind == "fit"; ++fits) {
        Fit fit;
        std::size_t n;
        in >> name >> fit.loss >> n;
        const double cost = Number(in);
        const std::size_t count = name == "decay" ? 3 : name == "resonance" ? 4 : 2;
        fit.model = models.at(name);
        fit.guess = Numbers(in, count);
        fit.lower = Numbers(in, count);
        fit.upper = Numbers(in, count);
        const Values expected = Numbers(in, count);
        fit.y = Numbers(in, n);
        fit.w = Numbers(in, n);
        fit.scale = 0.25;
        for (std::size_t i = 0; i < n; ++i)
            fit.x.push_back(0.25 * static_cast<double>(i + 1));
        SCOPED_TRACE(name + ", loss " + std::to_string(fit.loss) + ", fit " + std::to_string(fits));
        fit.run();
        ASSERT_EQ(fit.code, 0);
        EXPECT_EQ(fit.reason, 1);
        EXPECT_LT(fit.cost, cost * (1 + 1e-10));
        for (std::size_t j = 0; j < count; ++j) {
            EXPECT_GE(fit.least[j], fit.lower[j]);
            EXPECT_LE(fit.most[j], fit.upper[j]);
            cut += fit.p[j] == fit.lower[j] || fit.p[j] == fit.upper[j];
            if (fit.cost > cost * (1 - 1e-6)) {
                EXPECT_NEAR(fit.p[j], expected[j], 3e-6 * std::fabs(expected[j]));
            }
        }
    }
    EXPECT_EQ(fits, 45);
    EXPECT_GT(cut, 10);
}

Fit Decay(double sigma = 0.05) {
    Noise noise(3);
    Fit fit;
    fit.model = models.at("decay");
    for (int i = 0; i < 30; ++i) {
        fit.x.push_back(0.1 * i);
        fit.y.push_back(2 * std::exp(-1.5 * fit.x.back()) + 0.5 + sigma * noise.symmetric());
    }
    fit.guess = {1, 1, 0};
    return fit;
}

// The covariance of a line in closed form, with weights; it is 0 for a fixed parameter.
TEST(NonlinearFit, GivesTheErrorsOfParameters) {
    Fit fit = Decay();
    fit.model = models.at("line");
    fit.guess = {0, 0};
    double s = 0, sx = 0, sxx = 0;
    for (std::size_t i = 0; i < fit.x.size(); ++i) {
        fit.w.push_back(1.0 + i % 3);
        s += fit.w[i];
        sx += fit.w[i] * fit.x[i];
        sxx += fit.w[i] * fit.x[i] * fit.x[i];
    }
    fit.run();
    const double variance = 2 * fit.cost / 28, determinant = s * sxx - sx * sx;
    const Values expected = {s, -sx, -sx, sxx};
    for (std::size_t i = 0; i < 4; ++i)
        EXPECT_NEAR(fit.covariance[i], expected[i] * variance / determinant, 1e-12);
    for (std::size_t i = 0; i < fit.x.size(); ++i)
        EXPECT_EQ(fit.residuals[i], fit.y[i] - (fit.p[0] * fit.x[i] + fit.p[1]));
    fit.lower = {-inf, 0.5};
    fit.upper = {inf, 0.5};
    fit.run();
    EXPECT_EQ(fit.p[1], 0.5);
    EXPECT_EQ(Values(fit.covariance.begin() + 1, fit.covariance.end()), Values(3, 0.0));
    EXPECT_NEAR(fit.covariance[0], 2 * fit.cost / 29 / sxx, 1e-12);

    const auto sets = qx::test::ReadNistSets(qx::test::TestData("nist_nonlinear.dat"));
    for (const auto &set : sets) {
        const qx::test::NistProblem problem(set);
        const std::size_t count = set.certified.size();
        std::vector<DBL> covariance(count * count);
        Values p;
        problem.fit(1, true, &p, 0.0,
                    {covariance.data(), static_cast<int32_t>(count), static_cast<int32_t>(count)});
        // The sum of squares of Lanczos1 consists of rounding errors.
        const double digits = set.name == "Lanczos1" ? 1e-2 : 1e-8;
        for (std::size_t j = 0; j < count; ++j)
            EXPECT_NEAR(std::sqrt(covariance[j * (count + 1)]), set.errors[j],
                        digits * set.errors[j])
                << set.name;
    }
}

// Scaling of x, y, the parameters or the weights does not matter.
TEST(NonlinearFit, KeepsItsDigitsAtAnySize) {
    const Values plain = Decay().run().p;
    for (const double size : {1e-140, 1e-30, 1e30, 1e140}) {
        Fit fit = Decay();
        for (double &y : fit.y)
            y *= size;
        fit.model = [size](double x, const Values &p) {
            return p[0] * std::exp(-p[1] / size * x) + p[2];
        };
        fit.guess = {size, size, 0.1 * size};
        fit.run();
        EXPECT_EQ(fit.reason, 1);
        for (std::size_t j = 0; j < 3; ++j)
            EXPECT_NEAR(fit.p[j] / size, plain[j], 1e-11);
    }
}

TEST(NonlinearFit, ReportsWhyItEnds) {
    Fit fit = Decay();
    fit.run();
    EXPECT_EQ(fit.code, 0);
    EXPECT_EQ(fit.reason, 1);
    const double cost = fit.cost;
    fit.iterations = 2;
    fit.run();
    EXPECT_EQ(fit.code, ErrIterationLimit);
    EXPECT_EQ(fit.reason, 0);
    EXPECT_EQ(fit.iterations, 2);
    EXPECT_GT(fit.cost, cost);
    EXPECT_EQ(fit.p.size(), 3U);
    // Two parameters of which only the sum matters, and one without effect, in an exact fit.
    fit = Decay();
    fit.model = [](double, const Values &p) { return p[0] + p[1]; };
    fit.guess = {0, 0};
    fit.run();
    EXPECT_EQ(fit.code, WarnRankDeficient);
    EXPECT_EQ(fit.reason, 3);
    EXPECT_EQ(fit.covariance, Values(4, inf));
    fit.model = [](double x, const Values &p) { return p[0] * x; };
    fit.y = fit.x;
    fit.run();
    EXPECT_EQ(fit.reason, 3);
    EXPECT_EQ(fit.p[0], 1.0);
    fit.guess = {0.5};
    fit.run();
    EXPECT_EQ(fit.reason, 2);
    EXPECT_EQ(fit.cost, 0.0);
    // Wrong derivatives.
    fit = Decay();
    fit.jacobian = [](void *, const DBL *x, int32_t, const DBL *, int32_t, DBL *out, int32_t n) {
        for (int32_t i = 0; i < n; ++i, out += 3) {
            out[0] = -1.0;
            out[1] = x[i];
            out[2] = -x[i] * x[i];
        }
        return int32_t{0};
    };
    fit.run();
    EXPECT_EQ(fit.code, WarnLowAccuracy);
    EXPECT_EQ(fit.reason, 4);
}

int32_t Refuse(void *, const DBL *, int32_t, const DBL *, int32_t, DBL *, int32_t) { return 7; }

TEST(NonlinearFit, RefusesInvalidArguments) {
    const auto code = [](const std::function<void(Fit &)> &change) {
        Fit fit = Decay();
        change(fit);
        fit.run();
        EXPECT_TRUE(fit.p.empty() && fit.residuals.empty() && fit.covariance.empty());
        EXPECT_TRUE(std::isnan(fit.cost) && fit.reason == 0 && fit.iterations == 0);
        return fit.code;
    };
    EXPECT_EQ(code([](Fit &fit) { fit.w = {1}; }), ErrSizeMismatch);
    EXPECT_EQ(code([](Fit &fit) { fit.x.pop_back(); }), ErrSizeMismatch);
    EXPECT_EQ(code([](Fit &fit) { fit.guess = {}; }), ErrEmptyInput);
    EXPECT_EQ(code([](Fit &fit) { fit.lower = {0, 0}; }), ErrSizesDisagree);
    EXPECT_EQ(code([](Fit &fit) { fit.procedure = nullptr; }), ErrNotAvailable);
    EXPECT_EQ(code([](Fit &fit) { fit.procedure = Refuse; }), ErrNotAvailable);
    EXPECT_EQ(code([](Fit &fit) { fit.jacobian = Refuse; }), ErrNotAvailable);
    EXPECT_EQ(code([](Fit &fit) { fit.loss = 5; }), ErrInvalidSelector);
    EXPECT_EQ(code([](Fit &fit) { fit.loss = 1, fit.scale = 0; }), ErrNotStrictlyPositive);
    EXPECT_EQ(code([](Fit &fit) { fit.lower = {nan, 0, 0}; }), ErrNaNInData);
    EXPECT_EQ(code([](Fit &fit) {
                  fit.lower = {1, 1, 1}, fit.upper = {2, 0, 2};
              }),
              ErrBoundsCrossed);
    EXPECT_EQ(code([](Fit &fit) { fit.x = {1, 2}, fit.y = {1, 2}; }), ErrFitPointsTooFew);
    EXPECT_EQ(code([](Fit &fit) { fit.y[3] = nan; }), ErrNonFiniteInput);
    EXPECT_EQ(code([](Fit &fit) { fit.w.assign(30, 0), fit.w[4] = 1; }), ErrTooFewWeights);
    EXPECT_EQ(code([](Fit &fit) { fit.guess[0] = 1e200; }), ErrNonFiniteFunction);
}

// Two abscissae per sample; a model that runs another fit.
TEST(NonlinearFit, PassesAllAbscissaeAndMayBeNested) {
    Fit plain = Decay(), pairs = Decay(), inner = Decay();
    plain.run();
    pairs.x.clear();
    for (const double x : plain.x)
        pairs.x.insert(pairs.x.end(), {x, nan});
    EXPECT_EQ(pairs.run().p, plain.p);
    Fit nested = Decay();
    bool isFirst = true;
    nested.model = [&](double x, const Values &p) {
        if (isFirst)
            inner.run();
        isFirst = false;
        return models.at("decay")(x, p);
    };
    EXPECT_EQ(nested.run().p, plain.p);
    EXPECT_EQ(inner.p, plain.p);
}

} // namespace
} // namespace qx::test
