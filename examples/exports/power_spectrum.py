"""
Power spectrum
==============
"""

import numpy as np
import qx

# %%
# The power of a signal, two-sided
# --------------------------------

n = 256
x = 2.0 + np.sqrt(2) * np.sin(2 * np.pi * 12 * np.arange(n) / n)
power = qx.SpectrumH(x)
print("at 0:", power[0], " at 12 and -12:", power[12], power[n - 12])
print("sum", power.sum(), " mean square", np.mean(x**2))

# %%
# A delay appears as a phase in the cross spectrum
# ------------------------------------------------

rng = np.random.default_rng(2)
noise = rng.normal(size=n)
cross = qx.CrossSpectrumH(noise, np.roll(noise, 3))
k = np.arange(1, 6)
print("delay in samples:", -np.angle(cross[k]) * n / (2 * np.pi * k))
