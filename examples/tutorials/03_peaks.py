"""
Find the beats of a pulse train
===============================

A signal consists of twelve pulses at irregular times, with noise. It is smoothed with local polynomials, and the
peaks are located to a fraction of a sample.
"""

import matplotlib.pyplot as plt
import numpy as np
import qx

fs = 1000.0
random = np.random.default_rng(7)
t = np.arange(4000) / fs
places = np.sort(np.arange(0.2, 3.8, 0.3) + 0.02 * random.random(12))
x = np.exp(-((t[:, None] - places) / 0.02) ** 2).sum(1) + 0.01 * random.normal(size=len(t))

# %%
# A Savitzky-Golay filter preserves the height and the width of a peak.

smooth = qx.filters.savgol(x, 21, 2)
peaks = qx.measure.peaks(smooth, fs)
peaks

# %%
# The positions are in seconds, because the sampling rate was given.

print(f"{len(peaks.positions)} peaks, largest error {1e3 * np.abs(peaks.positions - places).max():.2f} ms")
figure, axes = plt.subplots(figsize=(8, 3))
axes.plot(t, x, color="0.7")
axes.plot(peaks.positions, np.interp(peaks.positions, t, smooth), "v", color="C3")
axes.set(xlabel="Time (s)")
