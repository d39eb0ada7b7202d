"""
FIR filter design
=================
"""

import numpy as np
import qx

# %%
# A truncated ideal lowpass, with a window that the caller chooses
# ----------------------------------------------------------------

h, _ = qx.FIRCoefs(1.0, 0.2, 0.0, 31, 0)
windowed = qx.AllWinH(h, 2, np.nan, 0, 0)
print(np.round(h[13:18], 6), round(windowed.sum(), 6))

# %%
# The best lowpass of 31 taps: equal ripples, ten times smaller in the stop band
# ------------------------------------------------------------------------------

import matplotlib.pyplot as plt
h, ripple = qx.Parks(31, 1.0, [(1, 0, 0.2, 1), (0, 0.25, 0.5, 10)], 0, 100)
print("pass band within", round(ripple, 6), "stop band within", round(ripple / 10, 6))
gain = np.abs(np.fft.rfft(h, 4096))
figure, axes = plt.subplots(figsize=(8, 2.6))
axes.plot(np.linspace(0, 0.5, len(gain)), gain)
axes.set(xlabel="Frequency (cycles per sample)", ylabel="Gain")

# %%
# A differentiator, on a parabola
# -------------------------------

h, ripple = qx.Parks(20, 1.0, [(2 * np.pi, 0, 0.5, 1)], 1, 0)
t = np.arange(40) / 10
slope = np.convolve(t**2, h, "valid") * 10
print("within one percent:", np.allclose(slope, 2 * t[10:-9] - 0.1, rtol=0.011))

# %%
# A narrow bandpass: a few taps replace many
# ------------------------------------------

design = qx.FIRNarrowCoef_head(8000, 60, 110, 1000, 0.01, 60, 2, {})
model, interpolator = design["model"], design["interpolator"]
noise = np.random.default_rng(1).normal(size=4000)
y = qx.FIRnarrowFilter_head(noise, design)
print("stretch", design["M"], "taps", len(model), "+", len(interpolator), "of", len(y) - len(noise) + 1)
