"""
Zero phase
==========
"""

import numpy as np
import qx

# %%
# The same filter, with and without delay
# ---------------------------------------

import matplotlib.pyplot as plt
t = np.arange(300)
pulse = np.exp(-((t - 150) / 20.0)**2)
x = pulse + 0.15 * np.random.default_rng(4).normal(size=300)
a, b = [1, -1.6, 0.68], [0.02, 0.04, 0.02]
delayed = qx.IIR_Filter(x, a, b, [], [], 0)[0]
in_place = qx.zeroPhaseFiltH(x, a, b, [], [], [], [], 0)[0]
print("peaks at", np.argmax(delayed), "and", np.argmax(in_place))
figure, axes = plt.subplots(figsize=(8, 2.6))
axes.plot(t, x, color="#c9d3df", linewidth=0.8, label="signal")
axes.plot(t, delayed, color="#2f6db3", label="one pass")
axes.plot(t, in_place, color="#c8553d", label="forward and backward")
axes.legend(frameon=False)
axes.set(xlabel="Sample")
