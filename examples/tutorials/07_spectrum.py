"""
Measure amplitudes in a spectrum
================================

One tone lies between two lines of the spectrum, and another is 60 dB weaker. The choice of window decides
whether both amplitudes can be read.
"""

import matplotlib.pyplot as plt
import numpy as np
import qx

fs = 1000.0
t = np.arange(4000) / fs
x = 2 * np.sin(2 * np.pi * 100.1 * t) + 0.002 * np.sin(2 * np.pi * 130 * t)


def amplitudes(window):
    spectrum = qx.spectra.periodogram(x, fs, window, scaling="spectrum")
    return spectrum.frequencies, np.sqrt(2 * spectrum.values)


# %%
# With the flat-top window, both are correct to 0.3 percent; without a window, the weak tone is lost.

figure, axes = plt.subplots(figsize=(8, 3))
for window in ("boxcar", "hann", "flattop"):
    f, amplitude = amplitudes(window)
    weak = amplitude[(f > 125) & (f < 135)].max()
    print(f"{window:8} strong {amplitude.max():.4f}   weak {weak:.6f}")
    axes.semilogy(f, amplitude + 1e-9, label=window)
axes.set(xlabel="Frequency (Hz)", ylabel="Amplitude", xlim=(80, 150), ylim=(1e-6, 5))
axes.legend()

# %%
# ``qx.measure.tone`` measures a tone directly, and no window has to be chosen.

qx.measure.tone(x, fs)
