#include "qx/qx.h"
#include "tests/support/hostile_host.h"
#include "tests/support/recipe.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <array>
#include <cmath>
#include <limits>
#include <numbers>
#include <string>
#include <vector>

namespace qx::test {
namespace {

typedef std::vector<double> Numbers;
typedef std::array<std::array<long double, 3>, 3> Exact;
typedef std::array<double, 3> Angles;

constexpr double inf = std::numeric_limits<double>::infinity();
constexpr double pi = std::numbers::pi;
constexpr double eps = std::numeric_limits<double>::epsilon();
constexpr std::array<const char *, 12> sequences = {"XYX", "XYZ", "XZX", "XZY", "YXY", "YXZ",
                                                    "YZX", "YZY", "ZXY", "ZXZ", "ZYX", "ZYZ"};

// Reduces an angle up to 1e6 by its whole turns, with 2 pi in four parts whose products with the
// number of turns are exact, since the long double sine of some systems reduces with a pi of only
// 66 bits.
long double WithoutTurns(double angle) {
    const long double turns = std::round(angle / (2 * pi));
    long double rest = angle - turns * 0x1.921fb544p2L;
    rest -= turns * 0x0.42d18469p-30L;
    rest -= turns * 0x0.898cc517p-62L;
    return rest - turns * 0x0.01b839a2p-94L;
}

// The rotation of the coordinate system about one axis, as defined in the header.
Exact TurnAbout(char axis, double angle) {
    const long double c = std::cos(WithoutTurns(angle));
    const long double s = std::sin(WithoutTurns(angle));
    if (axis == 'X')
        return {{{1, 0, 0}, {0, c, s}, {0, -s, c}}};
    if (axis == 'Y')
        return {{{c, 0, -s}, {0, 1, 0}, {s, 0, c}}};
    return {{{c, s, 0}, {-s, c, 0}, {0, 0, 1}}};
}

Exact Product(const Exact &a, const Exact &b) {
    Exact product = {};
    for (int i = 0; i < 3; ++i)
        for (int j = 0; j < 3; ++j)
            for (int k = 0; k < 3; ++k)
                product[i][j] += a[i][k] * b[k][j];
    return product;
}

Exact ExactDirection(const Angles &angles, int32_t sequence) {
    const char *const axes = sequences[sequence];
    return Product(TurnAbout(axes[2], angles[2]),
                   Product(TurnAbout(axes[1], angles[1]), TurnAbout(axes[0], angles[0])));
}

Numbers Direction(const Angles &angles, int32_t sequence) {
    DBLMatrix direction(1, 1);
    EXPECT_EQ(
        Euler2Direction2011_head(angles[0], angles[1], angles[2], sequence, direction.handle()), 0);
    EXPECT_EQ(direction.rows(), 3);
    EXPECT_EQ(direction.cols(), 3);
    return direction.values();
}

struct ThreeByThree : DBLMatrix {
    explicit ThreeByThree(const Numbers &elements) : DBLMatrix(3, 3) {
        std::copy(elements.begin(), elements.end(), data());
    }
};

Angles AnglesOfMatrix(const Numbers &elements, int32_t sequence) {
    ThreeByThree matrix(elements);
    Angles angles;
    EXPECT_EQ(
        Direction2Euler2011_head(matrix.handle(), sequence, &angles[0], &angles[1], &angles[2]), 0);
    return angles;
}

double Distance(const Numbers &matrix, const Exact &exact) {
    long double largest = 0;
    for (int i = 0; i < 9; ++i)
        largest = std::max(largest, std::fabs(matrix[i] - exact[i / 3][i % 3]));
    return static_cast<double>(largest);
}

double Distance(const Numbers &a, const Numbers &b) {
    double largest = 0;
    for (std::size_t i = 0; i < a.size(); ++i)
        largest = std::max(largest, std::fabs(a[i] - b[i]));
    return largest;
}

TEST(EulerAngles, GiveTheProductOfThreeRotations) {
    Noise noise(1);
    for (int32_t sequence = 0; sequence < 12; ++sequence)
        for (int i = 0; i < 500; ++i) {
            const double reach = i < 400 ? pi : 1e6;
            const Angles angles = {reach * noise.symmetric(), reach * noise.symmetric(),
                                   reach * noise.symmetric()};
            EXPECT_LE(Distance(Direction(angles, sequence), ExactDirection(angles, sequence)),
                      2 * eps)
                << sequences[sequence];
        }
    DBLMatrix direction(1, 1);
    ASSERT_EQ(Euler2Direction_head(0.1, 0.2, 0.3, direction.handle()), 0);
    EXPECT_EQ(direction.values(), Direction({0.1, 0.2, 0.3}, 10));
}

// Converts a matrix to angles and back, and checks the ranges of the angles.
void ReturnsToMatrix(const Angles &given, int32_t sequence, double tolerance) {
    const bool isProper = sequences[sequence][0] == sequences[sequence][2];
    const Numbers matrix = Direction(given, sequence);
    const Angles angles = AnglesOfMatrix(matrix, sequence);
    const std::string where = sequences[sequence] + std::string(" ") + std::to_string(given[1]);
    EXPECT_LE(Distance(Direction(angles, sequence), matrix), tolerance) << where;
    EXPECT_LE(std::fabs(angles[0]), pi) << where;
    EXPECT_LE(std::fabs(angles[2]), pi) << where;
    EXPECT_GE(angles[1], isProper ? 0 : -pi / 2) << where;
    EXPECT_LE(angles[1], isProper ? pi : pi / 2) << where;
}

TEST(EulerAngles, AreRecoveredAtAndNearGimbalLock) {
    Noise noise(2);
    for (int32_t sequence = 0; sequence < 12; ++sequence) {
        const bool isProper = sequences[sequence][0] == sequences[sequence][2];
        for (int i = 0; i < 300; ++i) {
            const double first = pi * noise.symmetric();
            const double third = pi * noise.symmetric();
            ReturnsToMatrix({first, pi * noise.symmetric(), third}, sequence, 4 * eps);
            // Distances from large to below the last digit.
            const double off = std::ldexp(noise.symmetric(), -i % 60);
            for (const double lock : {isProper ? 0.0 : -pi / 2, isProper ? pi : pi / 2})
                ReturnsToMatrix({first, lock + off, third}, sequence,
                                std::fabs(off) > 8 * eps ? 4 * eps : 12 * eps);
        }
        // At gimbal lock the third angle is 0, and the first holds the whole rotation.
        const double lock = isProper ? 0.0 : pi / 2;
        const Angles angles = AnglesOfMatrix(Direction({0.4, lock, 0.3}, sequence), sequence);
        EXPECT_EQ(angles[2], 0.0) << sequences[sequence];
        EXPECT_NEAR(std::fabs(angles[0] - 0.4), 0.3, 4 * eps) << sequences[sequence];
    }
    // The angles themselves, away from gimbal lock.
    for (const int32_t sequence : {1, 10}) {
        const Angles angles = AnglesOfMatrix(Direction({0.5, -0.7, 2.5}, sequence), sequence);
        EXPECT_LE(Distance(Numbers(angles.begin(), angles.end()), Numbers{0.5, -0.7, 2.5}),
                  8 * eps);
    }
}

// R (1 + s) with s symmetric has R as its orthogonal factor.
TEST(DirectionMatrix, IsUsedAsItsNearestRotation) {
    Noise noise(3);
    for (int i = 0; i < 200; ++i) {
        const Exact turn =
            ExactDirection({pi * noise.symmetric(), noise.symmetric(), noise.symmetric()}, 10);
        Exact stretch = {};
        for (int row = 0; row < 3; ++row)
            for (int col = 0; col <= row; ++col)
                stretch[row][col] = stretch[col][row] = (row == col) + 1e-7L * noise.symmetric();
        const Exact stretched = Product(turn, stretch);
        Numbers elements;
        for (const auto &row : stretched)
            for (const long double element : row)
                elements.push_back(static_cast<double>(element));
        ThreeByThree matrix(elements);
        Numbers seen;
        for (int axis = 0; axis < 3; ++axis) {
            DBLArray x(Numbers{axis == 0 ? 1.0 : 0.0}), y(Numbers{axis == 1 ? 1.0 : 0.0}),
                z(Numbers{axis == 2 ? 1.0 : 0.0}), u(1), v(1), w(1);
            ASSERT_EQ(CoordRotationDirection_head(x.handle(), y.handle(), z.handle(),
                                                  matrix.handle(), u.handle(), v.handle(),
                                                  w.handle()),
                      0);
            for (const DBLArray *out : {&u, &v, &w})
                seen.push_back(out->values()[0]);
        }
        Exact transposed;
        for (int row = 0; row < 3; ++row)
            for (int col = 0; col < 3; ++col)
                transposed[row][col] = turn[col][row];
        EXPECT_LE(Distance(seen, transposed), 2 * eps);
    }
}

// Sizes around the number of lanes, coordinates of all magnitudes.
TEST(Rotation, GivesTheNewCoordinatesOfPoints) {
    Noise noise(4);
    for (const int32_t n : {0, 1, 2, 3, 4, 5, 7, 8, 9, 15, 16, 17, 33, 1000})
        for (const double size : {1e-300, 1.0, 1.7e308}) {
            Numbers x, y, z;
            for (int32_t i = 0; i < n; ++i)
                for (Numbers *values : {&x, &y, &z})
                    values->push_back(size * noise.symmetric());
            const Angles angles = {0.9, -0.4, 2.1};
            const Exact turn = ExactDirection(angles, 6);
            DBLArray a(x), b(y), c(z), u(2), v(2), w(2);
            ASSERT_EQ(CoordRotationEuler2011_head(a.handle(), b.handle(), c.handle(), angles[0],
                                                  angles[1], angles[2], 6, u.handle(), v.handle(),
                                                  w.handle()),
                      0);
            const Numbers got[] = {u.values(), v.values(), w.values()};
            for (int row = 0; row < 3; ++row) {
                ASSERT_EQ(got[row].size(), static_cast<std::size_t>(n));
                for (int32_t i = 0; i < n; ++i) {
                    const long double exact =
                        turn[row][0] * x[i] + turn[row][1] * y[i] + turn[row][2] * z[i];
                    const bool fits = std::fabs(exact) <= std::numeric_limits<double>::max();
                    EXPECT_TRUE(fits ? std::fabs(got[row][i] - exact) <= 5 * eps * size
                                     : std::isinf(got[row][i]));
                }
            }
            ASSERT_EQ(CoordRotation2D_head(a.handle(), b.handle(), 0.9, u.handle(), v.handle()), 0);
            const long double cosine = std::cos(0.9L), sine = std::sin(0.9L);
            for (int32_t i = 0; i < n; ++i) {
                const long double exact = cosine * y[i] - sine * x[i];
                if (std::fabs(exact) <= std::numeric_limits<double>::max()) {
                    EXPECT_NEAR(v.values()[i], static_cast<double>(exact), 3 * eps * size);
                }
            }
        }
}

// A sum whose first two terms overflow although the result does not.
TEST(Rotation, DoesNotOverflowInIntermediateSums) {
    const double most = std::numeric_limits<double>::max();
    DBLArray x(Numbers{most}), y(Numbers{most}), z(Numbers{-most}), u(1), v(1), w(1);
    const double r = std::sqrt(0.5);
    const double h = std::sqrt(1.0 / 3), k = std::sqrt(1.0 / 6);
    ThreeByThree matrix({h, h, h, r, -r, 0, k, k, -2 * k});
    ASSERT_EQ(CoordRotationDirection_head(x.handle(), y.handle(), z.handle(), matrix.handle(),
                                          u.handle(), v.handle(), w.handle()),
              0);
    EXPECT_NEAR(u.values()[0] / most, h, 4 * eps);
    EXPECT_EQ(w.values()[0], inf); // 4 / sqrt(6)
}

struct Converted {
    ErrorCode code;
    Numbers first, second, third;
};
Converted Convert(int32_t from, int32_t to, const Numbers &first, const Numbers &second,
                  const Numbers &third) {
    DBLArray a(first), b(second), c(third), u(2), v(2), w(2);
    const ErrorCode code = CoordConversion_head(from, to, a.handle(), b.handle(), c.handle(),
                                                u.handle(), v.handle(), w.handle());
    return {code, u.values(), v.values(), w.values()};
}

TEST(Coordinates, AreConvertedByTheirDefinition) {
    Noise noise(5);
    for (int i = 0; i < 2000; ++i) {
        const double size = std::ldexp(1.0, i % 5 == 0 ? -900 : i % 5 == 1 ? 900 : 0);
        const Numbers x = {size * noise.symmetric()}, y = {size * noise.symmetric()},
                      z = {size * noise.symmetric()};
        const Converted spherical = Convert(0, 1, x, y, z);
        const Converted cylindrical = Convert(0, 2, x, y, z);
        const long double fromAxis = std::hypot(static_cast<long double>(x[0]), y[0]);
        const long double radius = std::hypot(fromAxis, z[0]);
        const auto close = [](double got, long double exact) {
            return std::fabs(got - exact) <= 2 * eps * std::fabs(exact);
        };
        EXPECT_TRUE(close(spherical.first[0], radius));
        EXPECT_TRUE(close(spherical.second[0], std::atan2(static_cast<long double>(y[0]), x[0])));
        EXPECT_TRUE(close(spherical.third[0], std::atan2(fromAxis, z[0])));
        EXPECT_TRUE(close(cylindrical.first[0], fromAxis));
        EXPECT_EQ(cylindrical.second, spherical.second);
        EXPECT_EQ(cylindrical.third, z);
        for (const auto &[kind, given] : {std::pair(1, spherical), std::pair(2, cylindrical)}) {
            const Converted back = Convert(kind, 0, given.first, given.second, given.third);
            EXPECT_NEAR(back.first[0], x[0], 8 * eps * size);
            EXPECT_NEAR(back.second[0], y[0], 8 * eps * size);
            EXPECT_NEAR(back.third[0], z[0], 8 * eps * size);
        }
        const Converted across = Convert(1, 2, spherical.first, spherical.second, spherical.third);
        EXPECT_NEAR(across.first[0], cylindrical.first[0], 8 * eps * size);
        EXPECT_EQ(across.second, spherical.second);
        const Converted again =
            Convert(2, 1, cylindrical.first, cylindrical.second, cylindrical.third);
        EXPECT_TRUE(close(again.first[0], radius));
        EXPECT_NEAR(again.third[0], spherical.third[0], 4 * eps);
    }
}

TEST(Coordinates, KeepToTheirRangesAtEveryEdge) {
    // Azimuths are above -pi, also for signed zeros; without a direction they are 0.
    const Converted edges =
        Convert(0, 1, {-1, -1, -1, -0.0, 0, 0, 1e-320, 3e307},
                {0.0, -0.0, -1e-300, 0, 0.0, 0, 0, -4e307}, {0, 0, 0, -0.0, -2, 3, 0, 1.2e308});
    ASSERT_EQ(edges.code, 0);
    EXPECT_EQ(Numbers(edges.second.begin(), edges.second.end() - 1),
              (Numbers{pi, pi, pi, 0, 0, 0, 0}));
    EXPECT_NEAR(edges.second[7], std::atan2(-4.0, 3.0), eps);
    EXPECT_EQ(edges.third,
              (Numbers{pi / 2, pi / 2, pi / 2, 0, pi, 0, pi / 2, std::atan2(5.0, 12.0)}));
    EXPECT_NEAR(edges.first[7], 1.3e308, 1.3e308 * 2 * eps);
    EXPECT_EQ(edges.first[6], 1e-320);
    EXPECT_EQ(Convert(0, 1, {1.7e308}, {1.7e308}, {1.7e308}).first, (Numbers{inf}));

    // Radii and angles outside their ranges denote ordinary points.
    const Converted given = {0, {-2, 2, 2, 2}, {0.5, 7.0, -3 * pi, 0.5}, {0.3, 0.3, 0.3, -0.3}};
    const Converted cartesian = Convert(1, 0, given.first, given.second, given.third);
    const Converted cylindrical = Convert(1, 2, given.first, given.second, given.third);
    const Converted back = Convert(2, 0, cylindrical.first, cylindrical.second, cylindrical.third);
    EXPECT_LE(Distance(back.first, cartesian.first), 8 * eps);
    EXPECT_LE(Distance(back.second, cartesian.second), 8 * eps);
    EXPECT_LE(Distance(back.third, cartesian.third), 8 * eps);
    const Converted spherical = Convert(2, 1, {-2, 2, 0}, {0.5, 7.0, 0.5}, {1, 1, -1});
    for (const Converted &kind : {cylindrical, spherical})
        for (std::size_t i = 0; i < kind.first.size(); ++i) {
            EXPECT_GE(kind.first[i], 0.0);
            EXPECT_GT(kind.second[i], -pi);
            EXPECT_LE(kind.second[i], pi);
        }
    EXPECT_EQ(spherical.second[2], 0.0);
    EXPECT_EQ(spherical.third[2], pi);

    // Conversion to the same kind is a copy.
    for (int32_t kind = 0; kind < 3; ++kind)
        EXPECT_EQ(Convert(kind, kind, {-2}, {7}, {-0.3}).second, (Numbers{7}));
}

TEST(Coordinates, RefuseInTheOrderOfTheirCodes) {
    const double nan = std::numeric_limits<double>::quiet_NaN();
    DBLArray one(Numbers{1}), two(Numbers{1, 2}), bad(Numbers{inf}), u(3), v(3), w(3);
    const auto euler = [&](DBLArray &z, double angle, int32_t sequence) {
        return CoordRotationEuler2011_head(one.handle(), one.handle(), z.handle(), 0, angle, 0,
                                           sequence, u.handle(), v.handle(), w.handle());
    };
    EXPECT_EQ(euler(two, nan, 12), ErrSizesDisagree);
    EXPECT_EQ(euler(bad, nan, 12), ErrInvalidSelector);
    EXPECT_EQ(euler(bad, 0, 0), ErrNonFiniteInput);
    EXPECT_EQ(euler(one, inf, -1), ErrInvalidSelector);
    EXPECT_EQ(euler(one, inf, 0), ErrNonFiniteInput);
    EXPECT_EQ(u.values().size(), 0U);
    EXPECT_EQ(CoordRotation2D_head(one.handle(), two.handle(), nan, u.handle(), v.handle()),
              ErrSizesDisagree);
    EXPECT_EQ(CoordRotation2D_head(one.handle(), one.handle(), nan, u.handle(), v.handle()),
              ErrNonFiniteInput);
    EXPECT_EQ(Convert(0, 3, {1, 2}, {1}, {1}).code, ErrSizesDisagree);
    EXPECT_EQ(Convert(0, 3, {nan}, {1}, {1}).code, ErrInvalidSelector);
    EXPECT_EQ(Convert(-1, 0, {1}, {1}, {1}).code, ErrInvalidSelector);
    EXPECT_EQ(Convert(0, 0, {1}, {1}, {nan}).code, ErrNonFiniteInput);
    EXPECT_EQ(Euler2Direction2011_head(nan, 0, 0, 12, DBLMatrix(1, 1).handle()),
              ErrInvalidSelector);
    EXPECT_EQ(Euler2Direction2011_head(nan, 0, 0, 0, DBLMatrix(1, 1).handle()), ErrNonFiniteInput);

    const Numbers unit = {1, 0, 0, 0, 1, 0, 0, 0, 1};
    const auto refused = [&](const Numbers &elements, int32_t sequence) {
        ThreeByThree matrix(elements);
        double a = 0, b = 0, c = 0;
        const ErrorCode code = Direction2Euler2011_head(matrix.handle(), sequence, &a, &b, &c);
        EXPECT_TRUE(code == 0 || (std::isnan(a) && std::isnan(b) && std::isnan(c)));
        EXPECT_EQ(sequence != 0 || code == CoordRotationDirection_head(
                                               one.handle(), one.handle(), one.handle(),
                                               matrix.handle(), u.handle(), v.handle(), w.handle()),
                  true);
        return code;
    };
    const auto changed = [&](int at, double value) {
        Numbers elements = unit;
        elements[at] = value;
        return elements;
    };
    EXPECT_EQ(refused(unit, 0), 0);
    EXPECT_EQ(refused(changed(3, 9e-7), 0), 0);
    EXPECT_EQ(refused(changed(3, 1.1e-6), 0), ErrBadCoefficients);
    EXPECT_EQ(refused(changed(4, 1 + 0.6e-6), 0), ErrBadCoefficients);
    EXPECT_EQ(refused(changed(8, -1), 0), ErrBadCoefficients);
    EXPECT_EQ(refused(changed(1, 1e308), 0), ErrBadCoefficients);
    EXPECT_EQ(refused(changed(2, nan), 0), ErrNonFiniteInput);
    EXPECT_EQ(refused(changed(2, nan), 12), ErrInvalidSelector);
    DBLMatrix wide(3, 4);
    double a, b, c;
    EXPECT_EQ(Direction2Euler2011_head(wide.handle(), 12, &a, &b, &c), ErrSizesDisagree);
}

} // namespace
} // namespace qx::test
