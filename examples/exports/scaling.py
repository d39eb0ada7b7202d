"""
Scaling
=======
"""

import matplotlib.pyplot as plt
import numpy as np
import qx

# %%
# To a standard range
# -------------------

x = np.array([2.0, 5.0, 3.0, 8.0])
scaled, offset, scale = qx.Scale1DCIN(x)
print(scaled, "scale", scale, "offset", offset)
print(qx.QS1D(x))
standardised, mean, sd = qx.Norm1(x)
print(standardised.round(6), "mean", mean, "sd", round(sd, 6))
print(qx.Line1(x, 2.0, -1.0))

# %%
# Unwrapping a phase
# ------------------

t = np.arange(60) / 60
phase = 40 * t**2
wrapped = np.angle(np.exp(1j * phase))
unwrapped = qx.unWrap85(wrapped, 0)
print("largest difference from the smooth phase:", np.abs(unwrapped - phase).max())
figure, axes = plt.subplots(figsize=(8, 2.4))
axes.plot(t, wrapped, ".-", color="#8795a6", label="wrapped")
axes.plot(t, unwrapped, color="#2f6db3", label="unwrapped")
axes.legend(frameon=False)
