"""
Resampling
==========
"""

import numpy as np
import qx

# %%
# A kernel of 16 samples on each side, with 256 entries per sample
# ----------------------------------------------------------------

side, oversample = 16, 256
position = np.arange(-side * oversample, side * oversample + 1) / oversample
kernel = 0.9 * np.sinc(0.9 * position) * np.kaiser(position.size, 9.0) / oversample

# %%
# Any spacing, in blocks
# ----------------------

ratio = np.pi / 3
design = {"ratio": ratio, "mode": 0, "start": 20.0, "proto": kernel, "oversample": oversample}
x = np.cos(0.5 * np.arange(2000))
state, outputs = {}, []
for block in np.split(x, [300, 301, 1500]):
    state, y, count = qx.Resample_Const(block, state, design, int(not state), 1)
    outputs.append(y[:count])  # zeros follow the outputs
y = np.concatenate(outputs)
error = y - np.cos(0.5 * (20 + ratio * np.arange(y.size)))
print(f"{y.size} outputs, largest error {np.abs(error).max():.1e}")

# %%
# A list of times
# ---------------

import matplotlib.pyplot as plt
times = np.cumsum(np.random.default_rng(2).uniform(0.2, 1.5, size=60)) + 20
design = {"mode": 0, "antiAlias": 0, "proto": kernel, "oversample": oversample}
found, last, served, consumed = qx.Resample_Variable(x[:60], times, design, 0.0)
print(f"{served} of {times.size} times served; {consumed} samples can be discarded")
print("the next time, counted from the first sample that remains:", found[served])
figure, axes = plt.subplots(figsize=(8, 2.6))
axes.plot(np.arange(60), x[:60], ".", color="#999", label="samples")
axes.plot(times[:served], found[:served], "x", color="#2f6db3", label="at the given times")
axes.legend()
axes.set(xlabel="Input sample")
