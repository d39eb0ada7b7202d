"""
Fit a decay with bounds
=======================

A decay with an offset is measured with noise. Its rate is known to be at least 1. The fit reports the
parameters, their standard errors and a confidence band.
"""

import matplotlib.pyplot as plt
import numpy as np
import qx

random = np.random.default_rng(7)
t = np.arange(400) / 100
y = 3 * np.exp(-1.5 * t) + 0.2 + 0.1 * random.normal(size=len(t))

fit = qx.fit.exponential(t, y, bounds={"b": (-10, -1)})
fit

# %%
# Parameters and standard errors are looked up by name.

for name, value in fit.parameters.items():
    print(f"{name} = {value:.4f} +- {fit.errors[name]:.4f}")

# %%
# ``predict`` returns the fitted curve; the residuals show whether the model fits.

figure, (above, below) = plt.subplots(2, 1, figsize=(8, 5), sharex=True, height_ratios=[3, 1])
above.plot(t, y, ".", color="0.7", markersize=4)
above.plot(t, fit.predict(t), color="C3")
above.set(ylabel="y")
below.plot(t, fit.residuals, ".", color="0.5", markersize=3)
below.set(xlabel="Time (s)", ylabel="Residual")
