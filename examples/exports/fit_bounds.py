"""
Fit bounds
==========
"""

import matplotlib.pyplot as plt
import numpy as np
import qx

# %%
# Confidence bounds of a fitted line, and prediction bounds of the next observations
# ----------------------------------------------------------------------------------

noise = np.random.default_rng(5).normal(size=30)
x = np.linspace(0, 10, 30)
y = 2 + 0.7 * x + 0.8 * noise
_, slope, intercept, _ = qx.LinFit_head(y, x, [])
line = [slope, intercept]
low_c, high_c, low, high = qx.ConfBndLinear_head(x, y, [], line, 0.95)
next_low, next_high = qx.PredBndLinear_head(x, y, [], line, 0.95)
for name, value, below, above in zip(("slope", "intercept"), line, low_c, high_c):
    print(f"{name}: {value:.3f}, with 95 % confidence {below:.3f} to {above:.3f}")
figure, axes = plt.subplots(figsize=(8, 2.6))
axes.plot(x, y, "o", color="#1f2d3d", markersize=3)
axes.fill_between(x, next_low, next_high, color="#2f6db3", alpha=0.15, label="prediction")
axes.fill_between(x, low, high, color="#2f6db3", alpha=0.4, label="confidence")
axes.plot(x, slope * x + intercept, color="#2f6db3")
axes.legend(frameon=False)

# %%
# Bounds at other points: samples of weight 0 have bounds and do not change the fit
# ---------------------------------------------------------------------------------

w = np.append(np.ones(30), 0)
low, high = qx.PredBndLinear_head(np.append(x, 15), np.append(y, 0), w, line, 0.95)
print(f"at x = 15: {low[-1]:.3f} to {high[-1]:.3f}")

# %%
# Exponential, power, logarithm and peak
# --------------------------------------

grid = np.linspace(0.5, 5, 30)
models = [
    ("Exp", 5 * np.exp(-0.4 * grid), [5, -0.4], []),
    ("Power", 2 * grid**1.3, [2, 1.3], []),
    ("Log", 2 * np.log10(3 * grid), [2, 3], [10.0]),
    ("Gauss", 4 * np.exp(-(((grid - 2.5) / 0.8) ** 2) / 2), [4, 2.5, 0.8], []),
]
for name, curve, c, base in models:
    data = curve + 0.05 * noise
    low_c, high_c, low, high = qx.call(f"ConfBnd{name}_head", grid, data, [], c, *base, 0.95)
    next_low, next_high = qx.call(f"PredBnd{name}_head", grid, data, [], c, *base, 0.95)
    print(f"{name:6}", np.round((high_c - low_c) / 2, 4),
          f"curve {high[10] - low[10]:.4f}, observation {next_high[10] - next_low[10]:.4f}")

# %%
# Polynomials and arbitrary terms
# -------------------------------

data = 1 - 2 * x + 0.6 * x**2 + noise
_, c, _ = qx.PolyFit_head(x, data, 2, 1)
low_c, high_c, low, high = qx.ConfBndPoly_head(x, data, [], c, 0.9)
next_low, next_high = qx.PredBndPoly_head(x, data, [], c, 0.9)
print("polynomial:", np.round(low_c, 3), "to", np.round(high_c, 3))
H = np.column_stack([np.ones(30), np.sin(x), np.cos(x)])
data = H @ [0.5, 2.0, -1.0] + 0.2 * noise
c, _, _, _ = qx.GenLSFit80_head(H, data, [], 1, 0)
low_c, high_c, low, high = qx.ConfBndGenLS_head(H, data, [], c, 0.9)
next_low, next_high = qx.PredBndGenLS_head(H, data, [], c, 0.9)
print("any terms: ", np.round(low_c, 3), "to", np.round(high_c, 3))
