"""
Chirp-z transform
=================
"""

import numpy as np
import qx

# %%
# A closer look at two neighbouring tones
# ---------------------------------------

import matplotlib.pyplot as plt
n, rate = 1000, 1000.0
t = np.arange(n) / rate
x = np.hanning(n) * (np.sin(2 * np.pi * 100.2 * t) + 0.7 * np.sin(2 * np.pi * 105.7 * t))
low, high, points = 90.0, 115.0, 400
a = np.exp(2j * np.pi * low / rate)
w = np.exp(-2j * np.pi * (high - low) / points / rate)
zoomed = np.abs(qx.ChirpZT_head(x, a, w, points, 1))
frequency = low + np.arange(points) * (high - low) / points
print("the stronger tone is near", round(frequency[np.argmax(zoomed)], 2), "Hz")
bins = np.abs(np.fft.rfft(x))[90:116]
figure, axes = plt.subplots(figsize=(8, 2.6))
axes.plot(frequency, zoomed, color="#c8553d", label="on the arc")
axes.plot(np.arange(90, 116), bins, "o", color="#2f6db3", label="bins of the transform")
axes.legend(frameon=False)
axes.set(xlabel="Frequency (Hz)", ylabel="Magnitude")

# %%
# Around the whole circle and back
# --------------------------------

x = np.array([3.0, -1, 4, 1, -5])
w = np.exp(-2j * np.pi / 5)
spectrum = qx.ChirpZT_head(x, 1, w, 0, 0)
print(qx.InvChirpZT_head(spectrum, 1, w, 0).real.round(12))
