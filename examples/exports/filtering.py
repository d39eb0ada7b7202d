"""
Filtering
=========
"""

import numpy as np
import qx

# %%
# A running mean, and a smoothing recursion
# -----------------------------------------

x = np.array([0.0, 0, 6, 6, 6, 6])
print(qx.IIR_Filter(x, [], [1/3, 1/3, 1/3], [], [], 0)[0])
print(qx.IIR_Filter(x, [1, -0.5], [0.5], [], [], 0)[0])

# %%
# A stream in blocks: the state is passed from call to call
# ---------------------------------------------------------

whole = qx.IIR_Filter_OneState(x, [1, -0.5], [0.5], [], 0)[0]
first, state = qx.IIR_Filter_OneState(x[:3], [1, -0.5], [0.5], [], 0)
second, state = qx.IIR_Filter_OneState(x[3:], [1, -0.5], [0.5], state, 1)
print(np.array_equal(np.concatenate([first, second]), whole))

# %%
# A resonance as a cascade of two equal sections
# ----------------------------------------------

import matplotlib.pyplot as plt
angle, radius = 2 * np.pi * 0.05, 0.97
a = [-2 * radius * np.cos(angle), radius**2] * 2
b = [1 - radius, 0, -(1 - radius)] * 2
t = np.arange(600)
x = np.sin(2 * np.pi * 0.05 * t) + np.random.default_rng(2).normal(size=600)
y, _ = qx.IIR_Filter2(x, 0, a, b, [], 0)
figure, axes = plt.subplots(figsize=(8, 2.6))
axes.plot(t, x, color="#9db8d9", linewidth=0.7, label="with noise")
axes.plot(t, y, color="#c8553d", label="filtered")
axes.legend(frameon=False, loc="upper right")
axes.set(xlabel="Sample")

# %%
# Sample by sample
# ----------------

state, response = [], []
for sample in [1.0, 0, 0, 0]:
    value, state = qx.IIR_Filter_PtbyPt(sample, 0, a[:2], b[:3], state, 0)
    response.append(round(value, 6))
print(response)
