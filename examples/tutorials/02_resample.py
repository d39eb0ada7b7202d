"""
Convert audio from 48 kHz to 44.1 kHz
=====================================

The ratio of the rates is 147 / 160. `qx.multirate.resample` designs the lowpass and computes only the samples
that are kept.
"""

import matplotlib.pyplot as plt
import numpy as np
import qx

x = np.sin(2 * np.pi * 5000 * np.arange(48000) / 48000)
y = qx.multirate.resample(x, 147, 160)
print(len(x), "samples become", len(y))

# %%
# Away from the ends, the result is the tone as it would have been sampled at 44.1 kHz.

exact = np.sin(2 * np.pi * 5000 * np.arange(len(y)) / 44100)
print(f"largest error {np.abs(y - exact)[2000:-2000].max():.1e}")

# %%
# The spectrum of the result has one line; the artefacts of the conversion are far below it.

spectrum = qx.spectra.periodogram(y[2000:-2000], 44100, ("kaiser", 20.0), scaling="spectrum")
figure, axes = plt.subplots(figsize=(8, 3))
axes.plot(spectrum.frequencies / 1000, 10 * np.log10(2 * spectrum.values + 1e-30))
axes.set(xlabel="Frequency (kHz)", ylabel="Level (dB)", ylim=(-220, 10))

# %%
# A recording of any length can be converted in blocks, as a stream.

stream = qx.multirate.Resampler(147, 160)
parts = [stream(block) for block in np.split(x, [1000, 17000, 30001])]
parts.append(stream.finish())
print([len(part) for part in parts], "samples from blocks")
