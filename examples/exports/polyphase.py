"""
Polyphase
=========
"""

import numpy as np
import qx

# %%
# A stream in blocks
# ------------------

rng = np.random.default_rng(1)
x = rng.normal(size=1000)
taps = np.sinc(np.arange(-24, 25) / 3) * np.hamming(49) / 3
once, *_ = qx.ppMultiRateFIRH_DBL(x, [], 3, 3, 2, taps, 1.0, 1, 1, 0, 0)

state, delay, phase, reset, blocks = [], 0, 0, 1, []
for block in np.split(x, [1, 10, 500]):
    y, state, delay, phase = qx.ppMultiRateFIRH_DBL(block, state, 3, 3, 2, taps, 1.0,
                                                    reset, 1, delay, phase)
    blocks.append(y)
    reset = 0
print("rate 3/2:", once.size, "outputs; equal in blocks:", np.array_equal(np.concatenate(blocks), once))

# %%
# A sine at four rates
# --------------------

import matplotlib.pyplot as plt
n = np.arange(40)
sine = np.sin(0.35 * n)
figure, axes = plt.subplots(figsize=(8, 2.6))
for mode, L, M, label in ((0, 1, 1, "1/1"), (1, 3, 1, "3/1"), (2, 1, 2, "1/2"), (3, 3, 2, "3/2")):
    cutoff = 1 / max(L, M)
    h = np.sinc(np.arange(-12 * L, 12 * L + 1) * cutoff) * np.hamming(24 * L + 1)
    h *= 1 / h.sum()
    y, *_ = qx.ppMultiRateFIRH_DBL(sine, [], mode, L, M, h, 1.0, 1, 1, 0, 0)
    print(f"{label}: {y.size} outputs")
    axes.plot(np.arange(y.size) * M / L, y + 2.5 * mode, ".-", ms=3, lw=0.6, label=label)
axes.legend(loc="upper right", ncol=4, fontsize=8)
axes.set(xlabel="Input sample", yticks=[])
