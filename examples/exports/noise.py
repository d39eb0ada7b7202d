"""
Noise
=====
"""

import matplotlib.pyplot as plt
import numpy as np
import qx

# %%
# A stream and its seed
# ---------------------

state = {"s1": 0, "s2": 0, "s3": 0}
x, state = qx.white(5, 1.0, 42, state)       # seed 42 restarts the stream
y, state = qx.white(5, 1.0, -1, state)       # -1 continues it
both, _ = qx.white(10, 1.0, 42, state)
print(np.array_equal(np.concatenate([x, y]), both))

# %%
# Histograms of all kinds of noise
# --------------------------------

n, seed, nothing = 20000, 7, {}
noises = {
    "white, amplitude 1": qx.white(n, 1.0, seed, state)[0],
    "Gauss, sigma 1": qx.Gauss(n, 1.0, seed, state, nothing)[0],
    "PeriodNoise, amplitude 0.01": qx.PeriodNoise(n, 0.01, seed, state)[0],
    "GammaNoiseH, order 3": qx.GammaNoiseH(n, 3, seed, state)[0],
    "PoissonNoiseH, mean 4": qx.PoissonNoiseH(n, 4.0, seed, state)[0],
    "BinomialNoiseH, 20 trials of 0.3": qx.BinomialNoiseH(n, 20, 0.3, seed, state, nothing)[0],
}
figure, axes = plt.subplots(6, 2, figsize=(8, 9), width_ratios=[3, 1], layout="constrained")
for (name, x), (left, right) in zip(noises.items(), axes):
    left.plot(x[:200], linewidth=0.8, color="#2f6db3")
    left.set_title(name, fontsize=9, loc="left")
    bins = 40 if x.dtype.kind == "f" and np.any(x % 1) else np.arange(x.max() + 2) - 0.5
    right.hist(x, bins, color="#2f6db3")
    right.set_yticks([])
for name, x in noises.items():
    print(f"{name:34} mean {x.mean():7.4f}  variance {x.var():7.4f}")

# %%
# Periodic noise has a flat spectrum
# ----------------------------------

x, state = qx.PeriodNoise(64, 1.0, seed, state)
print(np.round(np.abs(np.fft.rfft(x)) / 32, 12))

# %%
# Noise of 2026: direct access to any position, and several streams of one key
# ----------------------------------------------------------------------------

key, stream = 42, 0
whole = qx.Gauss2026(1000, 1.0, key, stream, 0.0)
part = qx.Gauss2026(10, 1.0, key, stream, 500.0)  # from position 500 on
print("the same:", bool((part == whole[500:510]).all()))
channels = np.array([qx.White2026(20000, 1.0, key, one, 0.0) for one in range(3)])
print(np.corrcoef(channels).round(3))
