"""
Coordinates
===========
"""

import numpy as np
import qx

# %%
# A point in a rotated coordinate system
# --------------------------------------

# Yaw, pitch and roll of a camera, in radians; the point is two metres ahead and one to the left.
x, y, z = qx.CoordRotationEuler_head([2.0], [1.0], [0.0], 0.3, -0.1, 0.0)
print(x, y, z)

# %%
# Direction matrices and Euler angles
# -----------------------------------

direction = qx.Euler2Direction2011_head(0.3, -0.1, 0.2, 10)
print(direction.round(6))
print(qx.Direction2Euler2011_head(direction, 10))
print("the same rotation as ZXZ:", qx.Direction2Euler2011_head(direction, 9))

# %%
# Cartesian to spherical and cylindrical
# --------------------------------------

radius, azimuth, inclination = qx.CoordConversion_head(0, 1, [1.0, 0.0], [1.0, 0.0], [1.0, -2.0])
print(radius, np.degrees(azimuth), np.degrees(inclination))
