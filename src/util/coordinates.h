#ifndef QX_UTIL_COORDINATES_H
#define QX_UTIL_COORDINATES_H

#include "frame/widths.h"
#include "qx/errors.h"
#include "qx/types.h"

namespace qx {

// Rotations of the coordinate system and changes of coordinates; include/qx/coordinates.h documents
// the conventions.

struct Rotation {
    double m[3][3];
};

struct EulerAngles {
    double first, second, third;
};

// The axes of rotation of a sequence of Euler angles, 0 to 2 for X to Z. `other` is the axis that
// is neither the first nor the second, and `sign` is +1 if first, second, other are in the cyclic
// order of X, Y, Z, otherwise -1.
struct EulerAxes {
    int first, second, third, other;
    double sign;
    bool isProper() const { return third == first; }
};
constexpr int32_t eulerSequences = 12;
EulerAxes AxesOf(int32_t sequence); // 0 <= sequence < eulerSequences

// The angles must be finite.
Rotation RotationOf(EulerAngles angles, EulerAxes axes);
EulerAngles AnglesOf(const Rotation &rotation, EulerAxes axes);

// The rotation nearest to a 3 by 3 matrix of finite elements. ErrBadCoefficients.
ErrorCode NearestRotation(const DBL *matrix, Rotation &rotation);

// The coordinates of n points must be finite; the results must not overlap them.
void Rotate2D(const DBL *x, const DBL *y, int32_t n, double angle, DBL *newX, DBL *newY);
void Rotate3D(const DBL *const from[3], int32_t n, const Rotation &rotation, DBL *const to[3]);

enum class Coordinates : int32_t { Cartesian, Spherical, Cylindrical };
constexpr int32_t coordinateKinds = 3;
void ConvertCoordinates(Coordinates from, Coordinates to, const DBL *const points[3], int32_t n,
                        DBL *const converted[3]);

QX_BY_WIDTH(bool, AllFinite, (const DBL *x, int32_t n))
// newX = a x + b y, newY = c x + d y.
QX_BY_WIDTH(void, MultiplyPlane,
            (const DBL *x, const DBL *y, int32_t n, const double *matrix, DBL *newX, DBL *newY))
QX_BY_WIDTH(void, MultiplySpace,
            (const DBL *const *from, int32_t n, const Rotation &matrix, DBL *const *to))

} // namespace qx

#endif
