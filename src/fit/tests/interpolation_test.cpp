#include "qx/qx.h"
#include "tests/support/hostile_host.h"
#include "tests/support/recipe.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <cmath>
#include <functional>
#include <limits>
#include <vector>

namespace qx::test {
namespace {

typedef std::vector<double> Samples;
typedef long double Long;

const double nan = std::numeric_limits<double>::quiet_NaN();
constexpr double natural = 1e30;

struct Value {
    ErrorCode code;
    double yi, dy;
};
template <class Export>
Value At(Export interpolate, const Samples &x, const Samples &y, double xi) {
    Value value = {1, 0.0, 0.0};
    EXPECT_EQ(interpolate(DBLArray(y).handle(), DBLArray(x).handle(), &xi, &value.yi, &value.dy,
                          &value.code),
              0);
    return value;
}

Samples Of(const Samples &x, const std::function<double(double)> &f) {
    Samples y;
    for (const double t : x)
        y.push_back(f(t));
    return y;
}

// Lagrange's formula in long double.
Long Lagrange(const Samples &x, const Samples &y, Long xi) {
    Long sum = 0;
    for (std::size_t i = 0; i < x.size(); ++i) {
        Long term = y[i];
        for (std::size_t k = 0; k < x.size(); ++k)
            if (k != i)
                term *= (xi - x[k]) / (Long{x[i]} - x[k]);
        sum += term;
    }
    return sum;
}

TEST(Interpolation, PolynomialIsLagranges) {
    Noise noise(4);
    for (int32_t n = 1; n <= 9; ++n) {
        Samples x;
        Samples y;
        for (int32_t i = 0; i < n; ++i) {
            x.push_back((i * 5 % n) + 0.3 * noise.symmetric()); // in no order
            y.push_back(noise.symmetric());
        }
        for (const double xi : {-0.4, 0.1, n / 2.0, n - 1.2, x[0], x.back()}) {
            const Value value = At(PolyInterp_head, x, y, xi);
            EXPECT_EQ(value.code, 0);
            const auto exact = static_cast<double>(Lagrange(x, y, xi));
            EXPECT_NEAR(value.yi, exact, 2e-13 * (1 + std::fabs(exact))) << n << " " << xi;
            if (n == 1) {
                EXPECT_EQ(value.dy, 0.0);
            }
        }
    }
    // The last correction adds the farthest of the remaining points.
    const Value parabola = At(PolyInterp_head, {0, 1, 2}, {0, 1, 4}, 0.25);
    EXPECT_EQ(parabola.yi, 0.0625);
    EXPECT_EQ(parabola.dy, 0.0625 - 0.25);
    EXPECT_NEAR(At(PolyInterp_head, {0, 1, 2}, {0, 1, 4}, 0.9).dy, 0.81 - 0.9, 1e-15);
}

TEST(Interpolation, RationalFollowsRationals) {
    const auto f = [](double t) { return (1.0 + t) / (2.0 + t * t); };
    const Samples x = {0.0, 0.5, 1.1, 1.7, 2.0, 3.2, 4.0};
    for (const double xi : {0.3, 1.0, 2.4, 3.9, -0.5}) {
        const Value value = At(RatInterp_head, x, Of(x, f), xi);
        EXPECT_EQ(value.code, 0);
        EXPECT_NEAR(value.yi, f(xi), 4e-9);
        EXPECT_LT(std::fabs(value.dy), 1e-3);
    }
    // Near a pole, which no polynomial can follow.
    const auto pole = [](double t) { return 1.0 / (t - 2.1); };
    EXPECT_NEAR(At(RatInterp_head, x, Of(x, pole), 2.05).yi, pole(2.05), 1e-6);
    for (std::size_t i = 0; i < x.size(); ++i) {
        const Value value = At(RatInterp_head, x, Of(x, f), x[i]);
        EXPECT_EQ(value.yi, f(x[i]));
        EXPECT_EQ(value.dy, 0.0);
    }
    // 1 / x through (-1, -1) and (1, 1) has its pole at 0. The tableau meets it there only if
    // rounding removes the offset.
    EXPECT_EQ(At(RatInterp_head, {-1, 1}, {-1, 1 - 1e-10 + 1e-10}, 0.5).code, 0);
    EXPECT_EQ(At(RatInterp_head, {-1, 1}, {-1e7, 1e7}, 0.0).code, ErrDuplicateAbscissa);
}

Samples Spline(const Samples &x, const Samples &y, double first, double last) {
    DBLArray s;
    ErrorCode err = 1;
    EXPECT_EQ(
        Spline_head(DBLArray(y).handle(), DBLArray(x).handle(), &first, &last, s.handle(), &err),
        0);
    EXPECT_EQ(err, 0);
    return s.values();
}
double SplineAt(const Samples &x, const Samples &y, const Samples &s, double xi) {
    double yi = 0;
    ErrorCode err = 1;
    EXPECT_EQ(SpInterp_head(DBLArray(y).handle(), DBLArray(x).handle(), DBLArray(s).handle(), &xi,
                            &yi, &err),
              0);
    EXPECT_EQ(err, 0);
    return yi;
}

// The spline of a cubic with its own end slopes is the cubic, inside and outside the range, for
// ascending and descending abscissae.
TEST(Splines, ReproduceACubic) {
    const auto f = [](double t) { return 1 + t * (-2 + t * (0.5 + 0.25 * t)); };
    const auto slope = [](double t) { return -2 + t * (1 + 0.75 * t); };
    Samples x = {-1.0, -0.2, 0.5, 2.0, 2.5, 4.0};
    for (int32_t turn = 0; turn < 2; ++turn) {
        for (std::size_t n = 2; n <= x.size(); ++n) {
            const Samples part(x.begin(), x.begin() + static_cast<std::ptrdiff_t>(n));
            const Samples y = Of(part, f);
            const Samples s = Spline(part, y, slope(part[0]), slope(part.back()));
            for (std::size_t i = 0; i < n; ++i)
                EXPECT_NEAR(s[i], 1 + 1.5 * part[i], 1e-13);
            for (const double xi : {-1.7, -1.0, -0.3, 0.5, 1.9, 3.7, 5.0})
                EXPECT_NEAR(SplineAt(part, y, s, xi), f(xi), 2e-12 * (1 + std::fabs(f(xi))));
        }
        std::reverse(x.begin(), x.end());
    }
}

// The system of equations expresses continuity of the first derivative; the second one is 0 at
// natural ends.
TEST(Splines, AreSmoothWithNaturalEnds) {
    const Samples x = {0.0, 1.0, 1.5, 3.0, 4.0};
    const Samples y = {1.0, -1.0, 2.0, 0.0, 0.5};
    for (const double end : {natural, nan}) {
        const Samples s = Spline(x, y, end, end);
        EXPECT_EQ(s[0], 0.0);
        EXPECT_EQ(s[4], 0.0);
        for (std::size_t i = 0; i < x.size(); ++i)
            EXPECT_EQ(SplineAt(x, y, s, x[i]), y[i]);
        for (std::size_t i = 1; i < 4; ++i) {
            const double h = x[i] - x[i - 1];
            const double k = x[i + 1] - x[i];
            const double before = (y[i] - y[i - 1]) / h + h * (s[i - 1] + 2 * s[i]) / 6;
            const double behind = (y[i + 1] - y[i]) / k - k * (2 * s[i] + s[i + 1]) / 6;
            EXPECT_NEAR(before, behind, 1e-14);
        }
    }
    // One end clamped, one natural.
    const Samples s = Spline(x, y, -3.0, natural);
    EXPECT_EQ(s[4], 0.0);
    EXPECT_NEAR((SplineAt(x, y, s, 1e-6) - y[0]) / 1e-6, -3.0, 1e-4);
    EXPECT_EQ(Spline({2.0}, {5.0}, 1.0, 1.0), Samples{0.0}) << "a single point has no curvature";
    EXPECT_EQ(Spline({2.0, 3.0}, {5.0, 6.0}, natural, natural), (Samples{0.0, 0.0}));
}

TEST(Interpolation, CodesComeInTheirOrder) {
    for (const auto &interpolate : {PolyInterp_head, RatInterp_head}) {
        Value value = At(interpolate, {1, 2}, {1}, 0.0);
        EXPECT_EQ(value.code, ErrSizeMismatch);
        EXPECT_TRUE(std::isnan(value.yi) && std::isnan(value.dy));
        EXPECT_EQ(At(interpolate, {}, {}, 0.0).code, ErrEmptyInput);
    }
    EXPECT_EQ(At(PolyInterp_head, {1, 2, 1}, {1, 2, 3}, 0.5).code, ErrAbscissaeOrder);
    const auto spline = [](const Samples &x, const Samples &y) {
        DBLArray s(3);
        ErrorCode err = 0;
        EXPECT_EQ(Spline_head(DBLArray(y).handle(), DBLArray(x).handle(), &natural, &natural,
                              s.handle(), &err),
                  0);
        EXPECT_EQ(s.size(), 0);
        return err;
    };
    EXPECT_EQ(spline({1, 2}, {1}), ErrSizeMismatch);
    EXPECT_EQ(spline({}, {}), ErrEmptyInput);
    EXPECT_EQ(spline({1, 1}, {1, 2}), ErrAbscissaeOrder);
    EXPECT_EQ(spline({1, 2, 1}, {1, 2, 3}), ErrAbscissaeOrder);
    const double xi = 0.0;
    double yi = 0;
    ErrorCode err = 0;
    const DBLArray none(0);
    const DBLArray one{1.0};
    const DBLArray two{1.0, 1.0};
    const auto value = [&](DBL1D y, DBL1D x, DBL1D s) {
        yi = 0;
        EXPECT_EQ(SpInterp_head(y, x, s, &xi, &yi, &err), 0);
        EXPECT_TRUE(std::isnan(yi));
        return err;
    };
    EXPECT_EQ(value(one.handle(), two.handle(), two.handle()), ErrSizeMismatch);
    EXPECT_EQ(value(two.handle(), two.handle(), one.handle()), ErrSizeMismatch);
    EXPECT_EQ(value(nullptr, two.handle(), two.handle()), ErrSizeMismatch);
    EXPECT_EQ(value(two.handle(), two.handle(), nullptr), ErrSizeMismatch);
    EXPECT_EQ(value(none.handle(), none.handle(), none.handle()), ErrEmptyInput);
    EXPECT_EQ(value(one.handle(), one.handle(), one.handle()), ErrAbscissaeOrder);
    EXPECT_EQ(value(two.handle(), two.handle(), two.handle()), ErrAbscissaeOrder);
}

} // namespace
} // namespace qx::test
