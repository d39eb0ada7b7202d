"""
Filter a signal without delay
=============================

A slow wave on a drifting baseline is disturbed at 200 Hz. A Butterworth lowpass removes the disturbance; run
forwards and backwards, it does not delay the wave.
"""

import matplotlib.pyplot as plt
import numpy as np
import qx

fs = 1000.0
t = np.arange(4001) / fs
wave = 5 + 0.3 * t + np.sin(2 * np.pi * 2 * t)
x = wave + 0.5 * np.sin(2 * np.pi * 200 * t)

# %%
# A filter is an object: design it once, and apply it to any signal.

lowpass = qx.filters.butterworth(4, 40, fs=fs)
lowpass

# %%
# Its response shows which frequencies pass. At the cutoff, the gain is 3 dB down.

response = lowpass.response(512)
figure, axes = plt.subplots(figsize=(8, 3))
axes.plot(response.frequencies, response.decibels)
axes.axvline(40, color="0.6", linestyle=":")
axes.set(xlabel="Frequency (Hz)", ylabel="Gain (dB)", ylim=(-120, 5))

# %%
# Called like a function, the filter runs forwards and delays the wave; ``zero_phase`` adds no delay.

delayed = lowpass(x)
y = lowpass.zero_phase(x)
print(f"largest error with delay    {np.abs(delayed - wave)[500:].max():.3f}")
print(f"largest error without delay {np.abs(y - wave).max():.1e}")

# %%
# The offset and the ramp are preserved, even at the ends of the signal.

figure, axes = plt.subplots(figsize=(8, 3))
axes.plot(t, x, color="0.8", label="measured")
axes.plot(t, delayed, label="forwards")
axes.plot(t, y, label="zero phase")
axes.set(xlabel="Time (s)", xlim=(0, 1))
axes.legend(loc="lower right")
