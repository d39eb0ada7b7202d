"""
Interpolation
=============
"""

import matplotlib.pyplot as plt
import numpy as np
import qx

# %%
# Between the points of a table
# -----------------------------

x = np.linspace(-1, 1, 9)
y = 1 / (1 + 25 * x**2)
yi, dy = qx.PolyInterp_head(y, x, 0.1)
print(f"polynomial {yi:.6f}, estimated error {dy:.1e}")
yi, dy = qx.RatInterp_head(y, x, 0.1)
print(f"rational   {yi:.6f}, estimated error {dy:.1e}")
bends = qx.Spline_head(y, x, 1e30, 1e30)  # natural ends
print(f"spline     {qx.SpInterp_head(y, x, bends, 0.1):.6f}")
print(f"function   {1 / 1.25:.6f}")

# %%
# A polynomial through many points oscillates, a spline does not
# --------------------------------------------------------------

t = np.linspace(-1, 1, 301)
polynomial = [qx.PolyInterp_head(y, x, at)[0] for at in t]
spline = [qx.SpInterp_head(y, x, bends, at) for at in t]
figure, axes = plt.subplots(figsize=(8, 2.6))
axes.plot(t, polynomial, color="#c8553d", label="polynomial")
axes.plot(t, spline, color="#2f6db3", label="spline")
axes.plot(x, y, "o", color="#1f2d3d", markersize=3)
axes.legend(frameon=False)
