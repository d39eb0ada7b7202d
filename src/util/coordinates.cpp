#include "util/coordinates.h"

#include "frame/constants.h"
#include "frame/extended.h"
#include "mathlib/elementary.h"
#include "util/scaling.h"

#include <algorithm>
#include <cmath>
#include <cstring>

namespace qx {

namespace {

// Beyond this, the sum of three products with elements of a rotation may overflow although its
// result does not.
constexpr double largestPlain = 0x1p1021;

double LargestOf(const DBL *const *arrays, int count, int32_t n) {
    double largest = 0.0;
    for (int k = 0; k < count; ++k)
        largest = std::fmax(largest, LargestMagnitude(arrays[k], n));
    return largest;
}

// The product of three rotations is formed in twice the precision, so that only the errors of the
// sines and cosines remain.
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
// The third angle is computed after the first rotation has been undone, so that it compensates for
// the error of the first angle near gimbal lock.
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
    // Column j of the matrix without the first rotation.
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
    // No rotation has elements beyond 2, and their products might overflow.
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
    // Each step squares the departure: 1e-6, 1e-12, 1e-24.
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

// Points are converted a block at a time, so that intermediate results stay in the cache.
constexpr int32_t block = 128;
typedef DBL Column[block];

// A zero without its sign, so that the azimuth of (-1, -0) is pi and that of (-0, 0) is 0.
double Unsigned(double x) { return x + 0.0; }

void WithoutSignsOfZeros(const DBL *x, int32_t n, DBL *y) {
    for (int32_t i = 0; i < n; ++i)
        y[i] = Unsigned(x[i]);
}

// atan2 may round to -pi.
void Azimuths(const DBL *y, const DBL *x, int32_t n, DBL *azimuths) {
    Column height, width;
    WithoutSignsOfZeros(y, n, height);
    WithoutSignsOfZeros(x, n, width);
    ArcTangents(height, width, n, azimuths);
    for (int32_t i = 0; i < n; ++i)
        if (azimuths[i] == -kPi)
            azimuths[i] = kPi;
}

void Inclinations(const DBL *fromAxis, const DBL *height, int32_t n, DBL *inclinations) {
    Column above;
    WithoutSignsOfZeros(height, n, above);
    ArcTangents(fromAxis, above, n, inclinations);
}

// Brings azimuths into their range, also if the distance from the axis is negative; 0 on the axis.
void AzimuthsInRange(const DBL *given, const DBL *fromAxis, int32_t n, DBL *azimuths) {
    bool areInRange = true;
    for (int32_t i = 0; i < n; ++i) {
        azimuths[i] = fromAxis[i] == 0.0 ? 0.0 : given[i];
        areInRange &= fromAxis[i] >= 0.0 && azimuths[i] > -kPi && azimuths[i] <= kPi;
    }
    if (areInRange)
        return;
    Column sines, cosines;
    SinesAndCosines(given, n, sines, cosines);
    for (int32_t i = 0; i < n; ++i) {
        const double side = fromAxis[i] < 0.0 ? -1.0 : 1.0;
        sines[i] *= side;
        cosines[i] *= side;
    }
    Azimuths(sines, cosines, n, cosines);
    for (int32_t i = 0; i < n; ++i)
        if (!(fromAxis[i] >= 0.0 && azimuths[i] > -kPi && azimuths[i] <= kPi))
            azimuths[i] = cosines[i];
}

void Magnitudes(const DBL *x, int32_t n, DBL *magnitudes) {
    for (int32_t i = 0; i < n; ++i)
        magnitudes[i] = std::fabs(x[i]);
}

void Products(const DBL *x, const DBL *y, int32_t n, DBL *products) {
    for (int32_t i = 0; i < n; ++i)
        products[i] = x[i] * y[i];
}

// Copies from and to any address, which std::copy does not guarantee.
void CopyColumn(const DBL *x, int32_t n, DBL *y) {
    std::memcpy(y, x, sizeof(DBL) * static_cast<std::size_t>(n));
}

// The coordinates of a block of n points, in and out; the results do not overlap the inputs.
typedef const DBL *const *From;
typedef DBL *const *To;

void CartesianToCylindrical(From p, int32_t n, To q) {
    Hypotenuses(p[0], p[1], n, q[0]);
    Azimuths(p[1], p[0], n, q[1]);
    CopyColumn(p[2], n, q[2]);
}
void CylindricalToCartesian(From p, int32_t n, To q) {
    Column sines, cosines;
    SinesAndCosines(p[1], n, sines, cosines);
    Products(p[0], cosines, n, q[0]);
    Products(p[0], sines, n, q[1]);
    CopyColumn(p[2], n, q[2]);
}
void CylindricalToSpherical(From p, int32_t n, To q) {
    Column fromAxis;
    Magnitudes(p[0], n, fromAxis);
    Hypotenuses(fromAxis, p[2], n, q[0]);
    AzimuthsInRange(p[1], p[0], n, q[1]);
    Inclinations(fromAxis, p[2], n, q[2]);
}
void SphericalToCylindrical(From p, int32_t n, To q) {
    Column sines, cosines;
    SinesAndCosines(p[2], n, sines, cosines);
    Products(p[0], sines, n, sines);
    Magnitudes(sines, n, q[0]);
    AzimuthsInRange(p[1], sines, n, q[1]);
    Products(p[0], cosines, n, q[2]);
}
// The distance from the axis may overflow although no result does, so the points are scaled.
void CartesianToSpherical(From p, int32_t n, To q) {
    constexpr double down = 0x1p-2;
    constexpr double up = 0x1p+2;
    Column x, y, z, fromAxis, scale;
    for (int32_t i = 0; i < n; ++i) {
        x[i] = down * p[0][i];
        y[i] = down * p[1][i];
        z[i] = down * p[2][i];
    }
    Hypotenuses(x, y, n, fromAxis);
    for (int32_t i = 0; i < n; ++i) {
        scale[i] = up;
        if (std::isnormal(fromAxis[i]))
            continue;
        scale[i] = 1.0;
        fromAxis[i] = std::hypot(p[0][i], p[1][i]);
        z[i] = p[2][i];
    }
    Hypotenuses(fromAxis, z, n, q[0]);
    Products(q[0], scale, n, q[0]);
    Azimuths(p[1], p[0], n, q[1]);
    Inclinations(fromAxis, z, n, q[2]);
}
void SphericalToCartesian(From p, int32_t n, To q) {
    Column sines, cosines, fromAxis;
    SinesAndCosines(p[2], n, sines, cosines);
    Products(p[0], sines, n, fromAxis);
    Products(p[0], cosines, n, q[2]);
    SinesAndCosines(p[1], n, sines, cosines);
    Products(fromAxis, cosines, n, q[0]);
    Products(fromAxis, sines, n, q[1]);
}
void Copied(From p, int32_t n, To q) {
    for (int k = 0; k < 3; ++k)
        CopyColumn(p[k], n, q[k]);
}

} // namespace

void ConvertCoordinates(Coordinates from, Coordinates to, const DBL *const points[3], int32_t n,
                        DBL *const converted[3]) {
    typedef void (*Conversion)(From, int32_t, To);
    static constexpr Conversion conversions[coordinateKinds][coordinateKinds] = {
        {Copied, CartesianToSpherical, CartesianToCylindrical},
        {SphericalToCartesian, Copied, SphericalToCylindrical},
        {CylindricalToCartesian, CylindricalToSpherical, Copied},
    };
    const Conversion convert = conversions[static_cast<int32_t>(from)][static_cast<int32_t>(to)];
    for (int32_t begin = 0; begin < n;) {
        const int32_t length = std::min(block, n - begin);
        const DBL *const p[] = {points[0] + begin, points[1] + begin, points[2] + begin};
        DBL *const q[] = {converted[0] + begin, converted[1] + begin, converted[2] + begin};
        convert(p, length, q);
        begin += length;
    }
}

} // namespace qx
