"""
Linear fits
===========
"""

import matplotlib.pyplot as plt
import numpy as np
import qx

# %%
# A line, with weights
# --------------------

x = np.linspace(0, 5, 40)
noise = np.random.default_rng(3).normal(size=40)
y = 1.5 * x - 2 + 0.4 * noise
fit, slope, intercept, mse = qx.LinFit_head(y, x, [])
print(f"slope {slope:.4f}, intercept {intercept:.4f}, MSE {mse:.4f}")
sse, r_square, rmse = qx.GoodnessOfFit_head(y, fit, [], 38)
print(f"R square {r_square:.4f}, RMSE {rmse:.4f}")
_, slope, intercept, _ = qx.LinFit_head(y, x, 1 / (1 + x))
print(f"weighted: slope {slope:.4f}, intercept {intercept:.4f}")

# %%
# A polynomial, free and with a given value at 0
# ----------------------------------------------

z = 1 - 2 * x + 0.6 * x**2 + 0.4 * noise
curve, c, mse = qx.PolyFit_head(x, z, 2, 0)
print("free:          ", np.round(c, 4))
fixed, c, mse = qx.PolyFit80_head(x, z, 2, 0, np.array([0], np.int32), [1.0])
print("c[0] given as 1:", np.round(c, 4))
figure, axes = plt.subplots(figsize=(8, 2.6))
axes.plot(x, z, "o", color="#1f2d3d", markersize=3)
axes.plot(x, curve, color="#2f6db3", label="free")
axes.plot(x, fixed, "--", color="#c8553d", label="c[0] = 1")
axes.legend(frameon=False)

# %%
# Arbitrary terms: a constant and a sine of known frequency, with standard errors
# -------------------------------------------------------------------------------

H = np.column_stack([np.ones(40), np.sin(2 * x), np.cos(2 * x)])
data = H @ [0.5, 2.0, -1.0] + 0.2 * noise
c, fit, covariance, mse = qx.GenLSFit80_head(H, data, [], 0, 1)
variance = mse * 40 / (40 - 3)
for value, deviation in zip(c, np.sqrt(np.diag(covariance) * variance)):
    print(f"{value:7.4f} +- {deviation:.4f}")

# %%
# A damped step towards the minimum of a sum of squares
# -----------------------------------------------------

coefficients = np.array([0.0, 0.0, 0.0])
for step in range(3):
    rest = data - H @ coefficients
    coefficients = qx.GetNewCoef_head(coefficients, H.T @ H, H.T @ rest, 0.1)
    print(np.round(coefficients, 6))
