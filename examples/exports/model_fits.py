"""
Model fits
==========
"""

import matplotlib.pyplot as plt
import numpy as np
import qx

# %%
# An exponential: fitted to the logarithms, then refined
# ------------------------------------------------------

x = np.linspace(0, 4, 60)
noise = np.random.default_rng(7).normal(size=60)
y = 3 * np.exp(-0.9 * x) + 0.05 * noise
fit, a, b, mse = qx.ExpFit_head(y, x, [])
print(f"log-linear: a {a:.4f}, b {b:.4f}, MSE {mse:.6f}")
refined, a, b, mse, steps = qx.ExpFit80_head(y, x, [], 1e-9, [], 1, 50, 0.0)
print(f"refined:    a {a:.4f}, b {b:.4f}, MSE {mse:.6f} in {steps} steps")

# %%
# A power and a logarithm
# -----------------------

t = x + 0.5
power = qx.PowerFit_head(2 * t**-1.5 + 0.02 * noise, t, [], 1e-9, [], 50, 0.0)
print(f"power: a {power[1]:.4f}, b {power[2]:.4f} in {power[4]} steps")
logarithm = qx.LogFit_head(1.2 * np.log10(3 * t) + 0.02 * noise, t, [], 10.0)
print(f"logarithm: a {logarithm[1]:.4f}, b {logarithm[2]:.4f}")

# %%
# A Gaussian peak
# ---------------

y = 2 * np.exp(-0.5 * ((x - 1.7) / 0.4) ** 2) + 0.05 * noise
fit, a, c, s, mse, steps = qx.GaussianPeakFit_head(y, x, [], 1e-9, [], 500, 0.0)
print(f"amplitude {a:.4f}, centre {c:.4f}, deviation {s:.4f} in {steps} trials")
figure, axes = plt.subplots(figsize=(8, 2.6))
axes.plot(x, y, "o", color="#1f2d3d", markersize=3)
axes.plot(x, fit, color="#2f6db3")
