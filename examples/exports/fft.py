"""
Fourier transform
=================
"""

import numpy as np
import qx

# %%
# Amplitude and phase of a sinusoid
# ---------------------------------

n = 1000
x = 0.5 * np.cos(2 * np.pi * 50 * np.arange(n) / n + 0.25)
spectrum = qx.ReOXFFTH80(x, 0, n, 0)
print("amplitude", 2 * abs(spectrum[50]) / n, " phase", np.angle(spectrum[50]))

# %%
# Forward and inverse, with the zero frequency in the middle
# ----------------------------------------------------------

spectrum = qx.ReOXFFTH80(x, 0, n, 1)
again = qx.InvReOXFFTH80(spectrum, 1)
print("greatest difference", np.abs(again - x).max())

# %%
# A section of the input, padded with zeros
# -----------------------------------------

import matplotlib.pyplot as plt
spectrum = qx.ReOXFFTH80(x, 900, 1024, 0)
print(len(spectrum), "values from the last 100 samples")
figure, axes = plt.subplots(figsize=(8, 2.4))
axes.plot(np.abs(spectrum[:120]), color="#2f6db3")
axes.set(title="100 samples, padded to 1024", xlabel="Index", ylabel="Magnitude")
