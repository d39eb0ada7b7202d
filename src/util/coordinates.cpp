#include "util/coordinates.h"

#include "frame/constants.h"
#include "frame/extended.h"
#include "util/scaling.h"

#include <cmath>

namespace qx {

namespace {

// Beyond it a sum of three products by elements of a rotation may overflow where its result does
// not.
constexpr double largestPlain = 0x1p1021;

double LargestOf(const DBL *const *arrays, int count, int32_t n) {
    double largest = 0.0;
    for (int k = 0; k < count; ++k)
        largest = std::fmax(largest, LargestMagnitude(arrays[k], n));
    return largest;
}

// The product of three turns is formed in twice the precision: what is left are the errors of the
// sines and cosines.
struct ExtendedRotation {
    Extended m[3][3];
};

ExtendedRotation Turn(int axis, double angle) {
    ExtendedRotation turn = {};
    const double c = std::cos(angle);
    const double s = std::sin(angle);
    const int u = (axis + 1) % 3;
    const int v = (axis + 2) % 3;
    turn.m[axis][axis] = {1.0, 0.0};
    turn.m[u][u] = turn.m[v][v] = {c, 0.0};
    turn.m[u][v] = {s, 0.0};
    turn.m[v][u] = {-s, 0.0};
    return turn;
}

ExtendedRotation operator*(const ExtendedRotation &a, const ExtendedRotation &b) {
    ExtendedRotation product;
    for (int i = 0; i < 3; ++i)
        for (int j = 0; j < 3; ++j)
            product.m[i][j] =
                (a.m[i][0] * b.m[0][j] + a.m[i][1] * b.m[1][j]) + a.m[i][2] * b.m[2][j];
    return product;
}

double Determinant(const Rotation &r) {
    const auto minor = [&r](int i, int j) { return r.m[1][i] * r.m[2][j] - r.m[1][j] * r.m[2][i]; };
    return r.m[0][0] * minor(1, 2) - r.m[0][1] * minor(0, 2) + r.m[0][2] * minor(0, 1);
}

// How far the columns are from orthonormal, m'm - 1, exact to the rounding of the result.
Rotation Departure(const Rotation &r) {
    Rotation departure;
    for (int i = 0; i < 3; ++i)
        for (int j = 0; j < 3; ++j) {
            Extended sum = {i == j ? -1.0 : 0.0, 0.0};
            for (int k = 0; k < 3; ++k)
                sum = sum + ExactProduct(r.m[k][i], r.m[k][j]);
            departure.m[i][j] = sum.high + sum.low;
        }
    return departure;
}

// One step of Newton and Schulz towards the orthogonal polar factor, m - m (m'm - 1) / 2.
void StepToOrthogonal(Rotation &r, const Rotation &departure) {
    const Rotation old = r;
    for (int i = 0; i < 3; ++i)
        for (int j = 0; j < 3; ++j) {
            double correction = 0.0;
            for (int k = 0; k < 3; ++k)
                correction += old.m[i][k] * departure.m[k][j];
            r.m[i][j] = old.m[i][j] - 0.5 * correction;
        }
}

} // namespace

EulerAxes AxesOf(int32_t sequence) {
    enum { X, Y, Z };
    static constexpr int axes[eulerSequences][3] = {
        {X, Y, X}, {X, Y, Z}, {X, Z, X}, {X, Z, Y}, {Y, X, Y}, {Y, X, Z},
        {Y, Z, X}, {Y, Z, Y}, {Z, X, Y}, {Z, X, Z}, {Z, Y, X}, {Z, Y, Z},
    };
    const auto [first, second, third] = axes[sequence];
    const double sign = (second - first + 3) % 3 == 1 ? 1.0 : -1.0;
    return {first, second, third, 3 - first - second, sign};
}

Rotation RotationOf(EulerAngles angles, EulerAxes axes) {
    const ExtendedRotation product =
        Turn(axes.third, angles.third) *
        (Turn(axes.second, angles.second) * Turn(axes.first, angles.first));
    Rotation rotation;
    for (int i = 0; i < 3; ++i)
        for (int j = 0; j < 3; ++j)
            rotation.m[i][j] = product.m[i][j].high;
    return rotation;
}

// With i, j, k the first, second and other axis and e the sign: three axes give
//     m[k][k] = cos a1 cos a2, m[k][j] = -e sin a1 cos a2, m[k][i] = e sin a2,
// two give
//     m[i][k] = -e cos a1 sin a2, m[i][j] = sin a1 sin a2, m[i][i] = cos a2.
// The third angle is read from what is left when the first has been turned back, so that it makes
// up for the error that the first has near the lock.
EulerAngles AnglesOf(const Rotation &rotation, EulerAxes axes) {
    const auto &m = rotation.m;
    const int i = axes.first;
    const int j = axes.second;
    const int k = axes.other;
    const double e = axes.sign;
    const double sine = axes.isProper() ? m[i][j] : -e * m[k][j];
    const double cosine = axes.isProper() ? -e * m[i][k] : m[k][k];
    const double reach = std::sqrt(sine * sine + cosine * cosine);
    EulerAngles angles;
    angles.second = axes.isProper() ? std::atan2(reach, m[i][i]) : std::atan2(e * m[k][i], reach);
    if (reach < 4 * kEpsilon) {
        angles.first = std::atan2(e * m[j][k], m[j][j]);
        angles.third = 0.0;
        return angles;
    }
    angles.first = std::atan2(sine, cosine);
    // Column j of the rotation without the first turn.
    const double c = std::cos(angles.first);
    const double s = e * std::sin(angles.first);
    const auto left = [&](int row) { return m[row][j] * c + m[row][k] * s; };
    angles.third = std::atan2(axes.isProper() ? -e * left(k) : e * left(i), left(j));
    return angles;
}

ErrorCode NearestRotation(const DBL *matrix, Rotation &rotation) {
    constexpr double farthest = 1e-6;
    for (int i = 0; i < 3; ++i)
        for (int j = 0; j < 3; ++j)
            rotation.m[i][j] = matrix[3 * i + j];
    // Elements beyond 2 are no rotation's; their products might overflow.
    for (int element = 0; element < 9; ++element)
        if (!(std::fabs(matrix[element]) <= 2.0))
            return ErrBadCoefficients;
    Rotation departure = Departure(rotation);
    for (const auto &row : departure.m)
        for (const double element : row)
            if (std::fabs(element) > farthest)
                return ErrBadCoefficients;
    if (Determinant(rotation) < 0.0)
        return ErrBadCoefficients;
    // The departure is squared by each step: 1e-6, 1e-12, 1e-24.
    StepToOrthogonal(rotation, departure);
    StepToOrthogonal(rotation, Departure(rotation));
    return 0;
}

void Rotate2D(const DBL *x, const DBL *y, int32_t n, double angle, DBL *newX, DBL *newY) {
    const DBL *const from[] = {x, y};
    const bool isHuge = LargestOf(from, 2, n) > largestPlain;
    const double scale = isHuge ? 0.25 : 1.0;
    const double c = scale * std::cos(angle);
    const double s = scale * std::sin(angle);
    const double matrix[] = {c, s, -s, c};
    MultiplyPlane(x, y, n, matrix, newX, newY);
    if (isHuge) {
        ShiftAndMultiply(newX, n, 0.0, 4.0);
        ShiftAndMultiply(newY, n, 0.0, 4.0);
    }
}

void Rotate3D(const DBL *const from[3], int32_t n, const Rotation &rotation, DBL *const to[3]) {
    const bool isHuge = LargestOf(from, 3, n) > largestPlain;
    Rotation scaled = rotation;
    if (isHuge)
        for (auto &row : scaled.m)
            for (double &element : row)
                element *= 0.25;
    MultiplySpace(from, n, scaled, to);
    if (isHuge)
        for (int k = 0; k < 3; ++k)
            ShiftAndMultiply(to[k], n, 0.0, 4.0);
}

namespace {

// A zero without its sign, so that the azimuth of (-1, -0) is pi and that of (-0, 0) is 0.
double Unsigned(double x) { return x + 0.0; }

// atan2 may round to -pi.
double Azimuth(double y, double x) {
    const double azimuth = std::atan2(Unsigned(y), Unsigned(x));
    return azimuth == -kPi ? kPi : azimuth;
}

// What the azimuth becomes where the distance from the axis is negative or the azimuth itself is
// beyond its range.
double AzimuthInRange(double azimuth, double fromAxis) {
    if (fromAxis >= 0.0 && azimuth > -kPi && azimuth <= kPi)
        return azimuth;
    const double side = fromAxis < 0.0 ? -1.0 : 1.0;
    return Azimuth(side * std::sin(azimuth), side * std::cos(azimuth));
}

double Inclination(double fromAxis, double height) {
    return std::atan2(fromAxis, Unsigned(height));
}

struct Point {
    double first, second, third;
};

Point CartesianToCylindrical(Point p) {
    return {std::hypot(p.first, p.second), Azimuth(p.second, p.first), p.third};
}
Point CylindricalToCartesian(Point p) {
    return {p.first * std::cos(p.second), p.first * std::sin(p.second), p.third};
}
Point CylindricalToSpherical(Point p) {
    const double fromAxis = std::fabs(p.first);
    return {std::hypot(fromAxis, p.third),
            fromAxis == 0.0 ? 0.0 : AzimuthInRange(p.second, p.first),
            Inclination(fromAxis, p.third)};
}
Point SphericalToCylindrical(Point p) {
    const double fromAxis = p.first * std::sin(p.third);
    return {std::fabs(fromAxis), fromAxis == 0.0 ? 0.0 : AzimuthInRange(p.second, fromAxis),
            p.first * std::cos(p.third)};
}
// The distance from the axis may overflow where no result does.
Point CartesianToSpherical(Point p) {
    constexpr double down = 0x1p-2;
    constexpr double up = 0x1p+2;
    const double fromAxis = std::hypot(down * p.first, down * p.second);
    if (std::isnormal(fromAxis))
        return {up * std::hypot(fromAxis, down * p.third), Azimuth(p.second, p.first),
                Inclination(fromAxis, down * p.third)};
    return {std::hypot(std::hypot(p.first, p.second), p.third), Azimuth(p.second, p.first),
            Inclination(std::hypot(p.first, p.second), p.third)};
}
Point SphericalToCartesian(Point p) {
    const double fromAxis = p.first * std::sin(p.third);
    return {fromAxis * std::cos(p.second), fromAxis * std::sin(p.second),
            p.first * std::cos(p.third)};
}
Point Copied(Point p) { return p; }

template <Point (*Convert)(Point)>
void ConvertEach(const DBL *const points[3], int32_t n, DBL *const converted[3]) {
    for (int32_t i = 0; i < n; ++i) {
        const Point p = Convert({points[0][i], points[1][i], points[2][i]});
        converted[0][i] = p.first;
        converted[1][i] = p.second;
        converted[2][i] = p.third;
    }
}

} // namespace

void ConvertCoordinates(Coordinates from, Coordinates to, const DBL *const points[3], int32_t n,
                        DBL *const converted[3]) {
    typedef void (*Conversion)(const DBL *const *, int32_t, DBL *const *);
    static constexpr Conversion conversions[coordinateKinds][coordinateKinds] = {
        {ConvertEach<Copied>, ConvertEach<CartesianToSpherical>,
         ConvertEach<CartesianToCylindrical>},
        {ConvertEach<SphericalToCartesian>, ConvertEach<Copied>,
         ConvertEach<SphericalToCylindrical>},
        {ConvertEach<CylindricalToCartesian>, ConvertEach<CylindricalToSpherical>,
         ConvertEach<Copied>},
    };
    conversions[static_cast<int32_t>(from)][static_cast<int32_t>(to)](points, n, converted);
}

} // namespace qx
