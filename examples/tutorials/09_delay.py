"""
The delay between two sensors
=============================

Two sensors record the same noise, one 7.3 samples later than the other. The maximum of the correlation gives the
delay to the nearest sample; `qx.measure.delay` finds it to a fraction of a sample.
"""

import matplotlib.pyplot as plt
import numpy as np
import qx

random = np.random.default_rng(7)
source = qx.filters.butterworth(6, 0.15)(random.normal(size=8192))
moved = np.fft.irfft(np.fft.rfft(source) * np.exp(-2j * np.pi * np.fft.rfftfreq(8192) * 7.3))
x, y = source[2000:4000], moved[2000:4000]

print(f"delay {qx.measure.delay(x, y):.4f} samples")

# %%
# If the sampling rate is given, the delay is in seconds.

print(f"delay {1e3 * qx.measure.delay(x, y, fs=48000):.5f} ms")

# %%
# The correlation around its maximum.

correlation = qx.signals.correlate(y, x)
lags = np.arange(len(correlation)) - (len(x) - 1)
near = np.abs(lags - 7) <= 20
figure, axes = plt.subplots(figsize=(8, 3))
axes.plot(lags[near], correlation[near], "o-", markersize=3)
axes.axvline(7.3, color="C3", linewidth=1)
axes.set(xlabel="Lag (samples)", ylabel="Correlation")
