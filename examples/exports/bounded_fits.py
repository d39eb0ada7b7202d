"""
Bounded fits
============
"""

import matplotlib.pyplot as plt
import numpy as np
import qx

# %%
# A decay that cannot fall below 0
# --------------------------------

random = np.random.default_rng(3)
t = np.linspace(0, 3, 40)
y = 2 * np.exp(-1.1 * t) + 0.15 * random.normal(size=t.size)
none, open_ = [], np.inf
free = qx.BoundExpFit_head(y, t, none, 1e-9, 200, none, none, none, 0)
bound = qx.BoundExpFit_head(y, t, none, 1e-9, 200, none, [0, -open_, 0], [open_, 0, open_], 0)
for name, (fit, steps, a, b, c, mse) in (("free", free), ("bound", bound)):
    print(f"{name:6} y = {a:.3f} exp({b:.3f} t) {c:+.3f}, MSE {mse:.5f}, {steps} steps")

# %%
# A peak with outliers, in three norms
# ------------------------------------

x = np.linspace(-4, 4, 80)
y = 3 * np.exp(-0.5 * ((x - 0.5) / 0.8) ** 2) + 1 + 0.1 * random.normal(size=x.size)
y[4::9] += 2.5
figure, axes = plt.subplots(figsize=(8, 2.8))
axes.plot(x, y, ".", color="#8795a6")
for method, name, colour in ((0, "least squares", "#c8553d"), (1, "least absolute", "#2f6db3"),
                             (2, "bisquare", "#1f2d3d")):
    fit, _, a, m, s, c, _ = qx.BoundGaussianFit_head(y, x, none, 1e-9, 500, none, none, none, method)
    print(f"{name:15} height {a:.3f}, at {m:.3f}, deviation {s:.3f}, on {c:.3f}")
    axes.plot(x, fit, color=colour, label=name)
axes.legend(frameon=False)

# %%
# A power law and a logarithm, with a coefficient fixed
# -----------------------------------------------------

x = np.array([1.0, 2, 3, 5, 8, 13])
y = np.array([0.9, 3.1, 5.4, 11.0, 22.8, 47.0])
print(qx.BoundPowerFit_head(y, x, none, 1e-12, 100, none, [-open_, -open_, 0], [open_, open_, 0], 0)[2:])
print(qx.BoundLogFit_head(y, x, none, 10.0, 100, none, [-open_, 1], [open_, 1], 0, 1e-12)[2:])

# %%
# A line through data of which some are wrong
# -------------------------------------------

years = np.arange(50.0, 74)
calls = np.array([0.44, 0.47, 0.47, 0.59, 0.66, 0.73, 0.81, 0.88, 1.06, 1.20, 1.35, 1.49, 1.61, 2.12,
                  11.9, 12.4, 14.2, 15.9, 18.2, 21.2, 4.30, 2.40, 2.70, 2.90])
_, a, b, _ = qx.BoundLinearFit_head(calls, years, none, none, none)
_, _, a1, b1, _ = qx.BoundLinearFitLAR_head(calls, years, none, 1e-6, 100, none, none)
_, _, a2, b2, _ = qx.BoundLinearFitBi_head(calls, years, none, 1e-6, 100, none, none)
print(f"slopes: least squares {a:.3f}, least absolute {a1:.3f}, bisquare {a2:.3f}")
