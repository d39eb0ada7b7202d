"""
Smoothing
=========
"""

import numpy as np
import qx

# %%
# A fitted polynomial preserves the height of a peak, a median removes outliers
# -----------------------------------------------------------------------------

import matplotlib.pyplot as plt
t = np.arange(240)
peaks = np.exp(-((t - 70) / 6.0)**2) + 0.8 * np.exp(-((t - 160) / 14.0)**2)
rng = np.random.default_rng(5)
x = peaks + 0.06 * rng.normal(size=t.size)
x[rng.integers(0, t.size, 12)] += 1.0
clean = qx.MedianFilter81_H(x, 3, 3)
smooth = qx.SavitzkyGolayFiltH(clean, 3, 21, [])
print("largest error:", np.abs(x - peaks).max().round(2), "before,",
      np.abs(smooth - peaks).max().round(2), "after")
figure, axes = plt.subplots(figsize=(8, 2.6))
axes.plot(t, x, color="#c9d3df", linewidth=0.8, label="signal")
axes.plot(t, clean, color="#c8553d", linewidth=0.8, label="median of 7")
axes.plot(t, smooth, color="#2f6db3", label="cubics over 21 samples")
axes.legend(frameon=False)
axes.set(xlabel="Sample")

# %%
# The coefficients of a fit are derivatives at the centre of the frame
# --------------------------------------------------------------------

_, differentiators = qx.SavitzkyGolayCoefH(2, 5, [], 1)
print(differentiators.round(4))
