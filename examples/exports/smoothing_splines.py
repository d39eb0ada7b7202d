"""
Smoothing splines
=================
"""

import matplotlib.pyplot as plt
import numpy as np
import qx

# %%
# A curve through noisy data, with lambda chosen by cross validation
# ------------------------------------------------------------------

x = np.linspace(0, 10, 80)
clean = np.sin(x) + 0.1 * x
y = clean + 0.2 * np.random.default_rng(6).normal(size=80)
values, pieces, second, lam, effective = qx.CubicSplineFit_head(x, y, [], 0, 0.0)
print(f"lambda {lam:.4g}, effective parameters {effective:.2f}")
print(f"deviation from the clean curve {np.std(values - clean):.3f}, of the data {np.std(y - clean):.3f}")

# %%
# The same with a known standard deviation of the noise: the smoothest curve consistent with the data
# ---------------------------------------------------------------------------------------------------

known = np.full(80, 0.2)
_, _, _, lam, effective = qx.CubicSplineFit_head(x, y, known, 2, 80.0)
print(f"lambda {lam:.4g}, effective parameters {effective:.2f}")

# %%
# A least-squares spline with few knots
# -------------------------------------

knots, c, fitted, mse = qx.BSplineFit_head(x, y, [], 3, 6, [])
print("knots inside:", np.round(knots[4:-4], 3))
print(f"{len(c)} coefficients, MSE {mse:.4f}")
figure, axes = plt.subplots(figsize=(8, 2.6))
axes.plot(x, y, "o", color="#1f2d3d", markersize=3)
axes.plot(x, values, color="#2f6db3", label="smoothing spline")
axes.plot(x, fitted, "--", color="#c8553d", label="least squares, 6 knots")
axes.legend(frameon=False)
