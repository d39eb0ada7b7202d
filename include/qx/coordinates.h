#ifndef QX_COORDINATES_H
#define QX_COORDINATES_H

/* Rotations of the coordinate system, Euler angles, and Cartesian, spherical and cylindrical
   coordinates. Angles are in radians, matrices are 3 by 3. Outputs are separate arrays.

   The coordinate system is rotated and the points stay fixed, so the new coordinates of a point are
   R times its old ones. For a positive angle a (c = cos a, s = sin a) about one axis, R is:

       about X: | 1  0  0 |    about Y: | c  0 -s |    about Z: |  c  s  0 |
                | 0  c  s |             | 0  1  0 |             | -s  c  0 |
                | 0 -s  c |             | s  0  c |             |  0  0  1 |

   Three Euler angles rotate the system three times, each time about an axis of the system as
   rotated so far. The axes, in the order of the angles, are selected by sequence:

       0 XYX   1 XYZ   2 XZX   3 XZY   4 YXY   5 YXZ
       6 YZX   7 YZY   8 ZXY   9 ZXZ   10 ZYX   11 ZYZ

   and the direction matrix is R = R3 R2 R1. For example, with angles 1, 2, 3 as indices of c and s,
   under sequence 10 (ZYX: yaw, pitch, roll) R is

       |  c2 c1                c2 s1               -s2    |
       |  s3 s2 c1 - c3 s1     s3 s2 s1 + c3 c1     s3 c2 |
       |  c3 s2 c1 + s3 s1     c3 s2 s1 - s3 c1     c3 c2 |

   and under sequence 9 (ZXZ)

       |  c3 c1 - s3 c2 s1     c3 s1 + s3 c2 c1     s3 s2 |
       | -s3 c1 - c3 c2 s1    -s3 s1 + c3 c2 c1     c3 s2 |
       |  s2 s1               -s2 c1                c2    |

   A given matrix is replaced by the rotation nearest to it (in the Frobenius norm), so that its
   rounding errors do not stretch the coordinates. NaN and infinities are refused. */

#include "qx/types.h"

QX_BEGIN_DECLS

/** Coordinates of points in the plane in a system rotated by `angle`: newX = x cos(angle) + y
    sin(angle), newY = y cos(angle) - x sin(angle). Coordinates beyond the range of a double become
    infinite.
    Codes: ErrSizesDisagree (x and y differ in length), ErrNonFiniteInput (a coordinate or the
    angle), ErrOutOfMemory (an array cannot be resized).
    NaN: x, y, angle refused with ErrNonFiniteInput. */
QX_API ErrorCode CoordRotation2D_head(QX_IN DBL1D x, QX_IN DBL1D y, double angle, QX_OUT DBL1D newX,
                                      QX_OUT DBL1D newY);

/** Coordinates of points in space in the system given by a direction matrix: (newX, newY, newZ)' =
    R (x, y, z)', with R the rotation nearest to `direction`.
    Codes: ErrSizesDisagree (x, y and z differ in length, or the matrix is not 3 by 3),
    ErrNonFiniteInput (a coordinate or an element of the matrix), ErrBadCoefficients (not a
    rotation: an element of R'R - 1 is beyond 1e-6, or the determinant is -1), ErrOutOfMemory (an
    array cannot be resized).
    NaN: x, y, z, direction refused with ErrNonFiniteInput. */
QX_API ErrorCode CoordRotationDirection_head(QX_IN DBL1D x, QX_IN DBL1D y, QX_IN DBL1D z,
                                             QX_IN DBL2D direction, QX_OUT DBL1D newX,
                                             QX_OUT DBL1D newY, QX_OUT DBL1D newZ);

/** Coordinates of points in space in the system rotated by three Euler angles (see above).
    Codes: ErrSizesDisagree (x, y and z differ in length), ErrInvalidSelector (sequence),
    ErrNonFiniteInput (a coordinate or an angle), ErrOutOfMemory (an array cannot be resized).
    NaN: x, y, z, angle1, angle2, angle3 refused with ErrNonFiniteInput. */
QX_API ErrorCode CoordRotationEuler2011_head(QX_IN DBL1D x, QX_IN DBL1D y, QX_IN DBL1D z,
                                             double angle1, double angle2, double angle3,
                                             int32_t sequence, QX_OUT DBL1D newX, QX_OUT DBL1D newY,
                                             QX_OUT DBL1D newZ);
/** As CoordRotationEuler2011_head, with sequence 10 (ZYX). */
QX_API ErrorCode CoordRotationEuler_head(QX_IN DBL1D x, QX_IN DBL1D y, QX_IN DBL1D z, double angle1,
                                         double angle2, double angle3, QX_OUT DBL1D newX,
                                         QX_OUT DBL1D newY, QX_OUT DBL1D newZ);

/** The direction matrix R = R3 R2 R1 of three Euler angles (see above), each element within 2.2e-16
    (one ulp of 1) of the exact rotation by these angles.
    Codes: ErrInvalidSelector (sequence), ErrNonFiniteInput (an angle), ErrOutOfMemory (an array
    cannot be resized).
    NaN: angle1, angle2, angle3 refused with ErrNonFiniteInput. */
QX_API ErrorCode Euler2Direction2011_head(double angle1, double angle2, double angle3,
                                          int32_t sequence, QX_OUT DBL2D direction);
/** As Euler2Direction2011_head, with sequence 10 (ZYX). */
QX_API ErrorCode Euler2Direction_head(double angle1, double angle2, double angle3,
                                      QX_OUT DBL2D direction);

/** The Euler angles of a direction matrix. angle1 and angle3 are in -pi to pi, angle2 is in -pi/2
    to pi/2 if the three axes of the sequence differ, otherwise in 0 to pi. At gimbal lock, where
    the cosine (three axes) or the sine (two axes) of angle2 is below 4 eps and only the sum or
    difference of the other two angles is determined, angle3 is 0. Near gimbal lock angle1 has few
    correct digits, and angle3 compensates: the matrix of the angles is within 4 eps of the rotation
    nearest to `direction`, at gimbal lock within 12 eps.
    Codes: ErrSizesDisagree (the matrix is not 3 by 3), ErrInvalidSelector (sequence),
    ErrNonFiniteInput (an element), ErrBadCoefficients (not a rotation: an element of R'R - 1 is
    beyond 1e-6, or the determinant is -1).
    NaN: direction refused with ErrNonFiniteInput. */
QX_API ErrorCode Direction2Euler2011_head(QX_IN DBL2D direction, int32_t sequence,
                                          QX_OUT double *angle1, QX_OUT double *angle2,
                                          QX_OUT double *angle3);

/** Converts points between kinds of coordinates. from, to: 0 Cartesian (x, y, z); 1 spherical
    (radius, azimuth, inclination from the positive z axis); 2 cylindrical (radius, azimuth,
    height). Spherical to Cartesian: x = radius sin(inclination) cos(azimuth), y = radius
    sin(inclination) sin(azimuth), z = radius cos(inclination). Results have radii of at least 0,
    azimuths above -pi and at most pi, inclinations in 0 to pi; azimuth and inclination are 0 where
    they are undefined. Inputs need not be in these ranges. If `from` and `to` are the same, the
    arrays are copied unchanged. Values beyond the range of a double become infinite.
    Codes: ErrSizesDisagree (the arrays differ in length), ErrInvalidSelector (from, to),
    ErrNonFiniteInput (a coordinate), ErrOutOfMemory (an array cannot be resized).
    NaN: first, second, third refused with ErrNonFiniteInput. */
QX_API ErrorCode CoordConversion_head(int32_t from, int32_t to, QX_IN DBL1D first,
                                      QX_IN DBL1D second, QX_IN DBL1D third, QX_OUT DBL1D newFirst,
                                      QX_OUT DBL1D newSecond, QX_OUT DBL1D newThird);

QX_END_DECLS

#endif
