#include "util/coordinates.h"

#include "frame/export.h"
#include "qx/coordinates.h"

#include <cmath>

namespace qx {
namespace {

bool AreFinite(EulerAngles angles) {
    return std::isfinite(angles.first) && std::isfinite(angles.second) &&
           std::isfinite(angles.third);
}

bool IsSequence(int32_t sequence) { return sequence >= 0 && sequence < eulerSequences; }
bool IsKind(int32_t kind) { return kind >= 0 && kind < coordinateKinds; }
bool IsThreeByThree(const Block<DBL2D> &matrix) { return matrix.rows() == 3 && matrix.cols() == 3; }

// Three arrays in, three out.
struct Points {
    In<DBL1D> first, second, third;
    int32_t size() const { return first.isEmpty() ? 0 : first.size(); }
    bool differInSize() const {
        return first.size() != second.size() || first.size() != third.size();
    }
    bool areFinite() const {
        return AllFinite(first.data(), size()) && AllFinite(second.data(), size()) &&
               AllFinite(third.data(), size());
    }
};

// Resizes the outputs, then calls work(inputs, outputs).
template <class Work>
Outcome IntoNewArrays(const Points &points, Out<DBL1D> &first, Out<DBL1D> &second,
                      Out<DBL1D> &third, Work work) {
    for (Out<DBL1D> *output : {&first, &second, &third})
        if (const Outcome bad = output->resize(points.size()))
            return bad;
    const DBL *const from[] = {points.first.data(), points.second.data(), points.third.data()};
    DBL *const to[] = {first.data(), second.data(), third.data()};
    work(from, to);
    return 0;
}

Outcome RotatedPlane(In<DBL1D> x, In<DBL1D> y, double angle, Out<DBL1D> newX, Out<DBL1D> newY) {
    if (x.size() != y.size())
        return ErrSizesDisagree;
    const int32_t n = x.isEmpty() ? 0 : x.size();
    if (!AllFinite(x.data(), n) || !AllFinite(y.data(), n) || !std::isfinite(angle))
        return ErrNonFiniteInput;
    for (Out<DBL1D> *output : {&newX, &newY})
        if (const Outcome bad = output->resize(n))
            return bad;
    Rotate2D(x.data(), y.data(), n, angle, newX.data(), newY.data());
    return 0;
}

Outcome RotatedByMatrix(In<DBL1D> x, In<DBL1D> y, In<DBL1D> z, In<DBL2D> direction, Out<DBL1D> newX,
                        Out<DBL1D> newY, Out<DBL1D> newZ) {
    const Points points = {x, y, z};
    if (points.differInSize() || !IsThreeByThree(direction))
        return ErrSizesDisagree;
    if (!points.areFinite() || !AllFinite(direction.data(), 9))
        return ErrNonFiniteInput;
    Rotation rotation;
    if (const ErrorCode bad = NearestRotation(direction.data(), rotation))
        return bad;
    return IntoNewArrays(points, newX, newY, newZ,
                         [&](auto from, auto to) { Rotate3D(from, points.size(), rotation, to); });
}

Outcome RotatedByAngles(In<DBL1D> x, In<DBL1D> y, In<DBL1D> z, EulerAngles angles, int32_t sequence,
                        Out<DBL1D> newX, Out<DBL1D> newY, Out<DBL1D> newZ) {
    const Points points = {x, y, z};
    if (points.differInSize())
        return ErrSizesDisagree;
    if (!IsSequence(sequence))
        return ErrInvalidSelector;
    if (!points.areFinite() || !AreFinite(angles))
        return ErrNonFiniteInput;
    const Rotation rotation = RotationOf(angles, AxesOf(sequence));
    return IntoNewArrays(points, newX, newY, newZ,
                         [&](auto from, auto to) { Rotate3D(from, points.size(), rotation, to); });
}

Outcome DirectionOfAngles(EulerAngles angles, int32_t sequence, Out<DBL2D> direction) {
    if (!IsSequence(sequence))
        return ErrInvalidSelector;
    if (!AreFinite(angles))
        return ErrNonFiniteInput;
    if (const Outcome bad = direction.resize(3, 3))
        return bad;
    const Rotation rotation = RotationOf(angles, AxesOf(sequence));
    for (int i = 0; i < 3; ++i)
        for (int j = 0; j < 3; ++j)
            direction.data()[3 * i + j] = rotation.m[i][j];
    return 0;
}

Outcome AnglesOfDirection(In<DBL2D> direction, int32_t sequence, OutDBL angle1, OutDBL angle2,
                          OutDBL angle3) {
    if (!IsThreeByThree(direction))
        return ErrSizesDisagree;
    if (!IsSequence(sequence))
        return ErrInvalidSelector;
    if (!AllFinite(direction.data(), 9))
        return ErrNonFiniteInput;
    Rotation rotation;
    if (const ErrorCode bad = NearestRotation(direction.data(), rotation))
        return bad;
    const EulerAngles angles = AnglesOf(rotation, AxesOf(sequence));
    angle1 = angles.first;
    angle2 = angles.second;
    angle3 = angles.third;
    return 0;
}

Outcome Converted(int32_t from, int32_t to, In<DBL1D> first, In<DBL1D> second, In<DBL1D> third,
                  Out<DBL1D> newFirst, Out<DBL1D> newSecond, Out<DBL1D> newThird) {
    const Points points = {first, second, third};
    if (points.differInSize())
        return ErrSizesDisagree;
    if (!IsKind(from) || !IsKind(to))
        return ErrInvalidSelector;
    if (!points.areFinite())
        return ErrNonFiniteInput;
    return IntoNewArrays(points, newFirst, newSecond, newThird, [&](auto given, auto converted) {
        ConvertCoordinates(static_cast<Coordinates>(from), static_cast<Coordinates>(to), given,
                           points.size(), converted);
    });
}

constexpr int32_t ZYX = 10;

} // namespace
} // namespace qx

using qx::EulerAngles;
using qx::Returned;

ErrorCode CoordRotation2D_head(DBL1D x, DBL1D y, double angle, DBL1D newX, DBL1D newY) {
    return Returned(qx::RotatedPlane, x, y, angle, newX, newY);
}

ErrorCode CoordRotationDirection_head(DBL1D x, DBL1D y, DBL1D z, DBL2D direction, DBL1D newX,
                                      DBL1D newY, DBL1D newZ) {
    return Returned(qx::RotatedByMatrix, x, y, z, direction, newX, newY, newZ);
}

ErrorCode CoordRotationEuler2011_head(DBL1D x, DBL1D y, DBL1D z, double angle1, double angle2,
                                      double angle3, int32_t sequence, DBL1D newX, DBL1D newY,
                                      DBL1D newZ) {
    return Returned(qx::RotatedByAngles, x, y, z, EulerAngles{angle1, angle2, angle3}, sequence,
                    newX, newY, newZ);
}

ErrorCode CoordRotationEuler_head(DBL1D x, DBL1D y, DBL1D z, double angle1, double angle2,
                                  double angle3, DBL1D newX, DBL1D newY, DBL1D newZ) {
    return CoordRotationEuler2011_head(x, y, z, angle1, angle2, angle3, qx::ZYX, newX, newY, newZ);
}

ErrorCode Euler2Direction2011_head(double angle1, double angle2, double angle3, int32_t sequence,
                                   DBL2D direction) {
    return Returned(qx::DirectionOfAngles, EulerAngles{angle1, angle2, angle3}, sequence,
                    direction);
}

ErrorCode Euler2Direction_head(double angle1, double angle2, double angle3, DBL2D direction) {
    return Euler2Direction2011_head(angle1, angle2, angle3, qx::ZYX, direction);
}

ErrorCode Direction2Euler2011_head(DBL2D direction, int32_t sequence, double *angle1,
                                   double *angle2, double *angle3) {
    return Returned(qx::AnglesOfDirection, direction, sequence, angle1, angle2, angle3);
}

ErrorCode CoordConversion_head(int32_t from, int32_t to, DBL1D first, DBL1D second, DBL1D third,
                               DBL1D newFirst, DBL1D newSecond, DBL1D newThird) {
    return Returned(qx::Converted, from, to, first, second, third, newFirst, newSecond, newThird);
}
