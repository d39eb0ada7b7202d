"""
Convolution in two dimensions
=============================
"""

import numpy as np
import qx

# %%
# Edges of an image
# -----------------

import matplotlib.pyplot as plt
row, column = np.mgrid[-1:1:120j, -1.6:1.6:190j]
image = ((row**2 + column**2 < 0.5) + 0.5 * (np.abs(column - 0.7) < 0.25)).astype(float)
slope = np.array([[-1.0, 0, 1], [-2, 0, 2], [-1, 0, 1]])
across = qx.Convolve_2DH(image, slope, 1, 0)
down = qx.Convolve_2DH(image, slope.T.copy(), 1, 0)
figure, axes = plt.subplots(1, 2, figsize=(8, 2.6))
axes[0].imshow(image, cmap="Blues")
axes[1].imshow(np.hypot(across, down), cmap="Reds")
for axis in axes:
    axis.set_axis_off()

# %%
# Locating a pattern
# ------------------

noise = np.random.default_rng(3)
field = noise.normal(size=(60, 80))
pattern = noise.normal(size=(8, 8))
field[25:33, 40:48] += pattern
match = qx.Correlation_2DH(pattern, field, 1)
print("at", np.unravel_index(np.argmax(match), match.shape) - np.array([7, 7]))
