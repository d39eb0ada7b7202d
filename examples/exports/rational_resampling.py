"""
Rational resampling
===================
"""

import numpy as np
import qx

# %%
# From 48 kHz to 44.1 kHz without delay
# -------------------------------------

from qx.multirate import low_pass
L, M = 147, 160
taps = low_pass(L, M)
rate = 48000
t = np.arange(9600) / rate
x = np.sin(2 * np.pi * 1000 * t)
offset, state, count, y = qx.RationalResample_H(x, L, M, 1, 0, taps, [], 0)
times = np.arange(y.size) / 44100
error = y - np.sin(2 * np.pi * 1000 * times)
print(f"{taps.size} taps; {y.size} outputs, {count} samples kept for the next block")
print(f"largest error within the stream: {20 * np.log10(np.abs(error[200:]).max()):.1f} dB")

# %%
# The measured alias rejection
# ----------------------------

import matplotlib.pyplot as plt
frequencies = np.linspace(100, 23900, 120)
levels = []
for frequency in frequencies:
    tone = np.sin(2 * np.pi * frequency * t)
    *_, y = qx.RationalResample_H(tone, L, M, 1, 0, taps, [], 0)
    levels.append(20 * np.log10(np.sqrt(2 * np.mean(y[400:] ** 2))))
levels = np.array(levels)
print(f"worst of the tones above 22.05 kHz: {levels[frequencies >= 22050].max():.1f} dB")
passed = levels[frequencies <= 0.9 * 22050]
print(f"tones below 19.8 kHz: {passed.min():.4f} to {passed.max():.4f} dB")
figure, axes = plt.subplots(figsize=(8, 2.6))
axes.plot(frequencies / 1000, levels, color="#2f6db3")
axes.axvline(22.05, color="#999", lw=0.8)
axes.set(xlabel="Tone at 48 kHz, kHz", ylabel="Level at 44.1 kHz, dB")

# %%
# Channels in the rows of a matrix
# --------------------------------

stereo = np.stack([x, -x])
offset, state, count, y = qx.RationalResampleMultiCh_H(stereo, L, M, 1, 0, taps,
                                                       np.zeros((0, 0)), 0)
print(y.shape, np.abs(y[0] + y[1]).max())
