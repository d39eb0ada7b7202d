"""
From acceleration to displacement
=================================

An accelerometer has an offset. Integrated twice, the offset becomes a parabola that hides the motion;
`qx.calculus.displacement` removes it.
"""

import matplotlib.pyplot as plt
import numpy as np
import qx

fs = 1000.0
t = np.arange(4000) / fs
moved = 0.01 * np.sin(2 * np.pi * 5 * t)
acceleration = -(2 * np.pi * 5) ** 2 * moved + 0.1

# %%
# Plain integration, applied twice, drifts away.

velocity = qx.calculus.cumulative(acceleration, dx=1 / fs)
plain = qx.calculus.cumulative(velocity, dx=1 / fs)
found = qx.calculus.displacement(acceleration, fs)
print(f"error of the plain integral {np.abs(plain - moved).max():.3f} m")
print(f"error of displacement       {np.abs(found - moved).max():.1e} m")

# %%
# The motion has an amplitude of 10 mm.

figure, axes = plt.subplots(figsize=(8, 3))
axes.plot(t, 1e3 * plain, color="0.7", label="integrated twice")
axes.plot(t, 1e3 * found, label="displacement")
axes.set(xlabel="Time (s)", ylabel="Displacement (mm)", ylim=(-60, 60))
axes.legend(loc="upper left")
