"""
Convolution
===========
"""

import numpy as np
import qx

# %%
# Direct sums and transforms agree to rounding error
# --------------------------------------------------

x, y = np.array([1.0, 2, 3, 4]), np.array([1.0, -1])
print(qx.Convolution(x, y, 0))
print(qx.Convolution(x, y, 1).round(12))

# %%
# Finding an echo
# ---------------

import matplotlib.pyplot as plt
noise = np.random.default_rng(5)
pulse = np.sin(2 * np.pi * np.linspace(0, 6, 120)**1.5 / 3) * np.hanning(120)
received = 0.5 * noise.normal(size=1000)
received[430:550] += pulse
correlation = qx.Rxy80(pulse, received, 1, 0)
lag = np.argmax(correlation) - (len(pulse) - 1)
print("the echo begins at sample", lag)
figure, (top, bottom) = plt.subplots(2, 1, figsize=(8, 3.6), sharex=True)
top.plot(received, color="#9db8d9", linewidth=0.8)
bottom.plot(correlation[len(pulse) - 1:], color="#c8553d", linewidth=0.9)
top.set(ylabel="Received")
bottom.set(xlabel="Lag (samples)", ylabel="Correlation")

# %%
# Deconvolution
# -------------

blurred = qx.Convolution(x, [4.0, 2, 1], 0)
print(qx.Deconvolution(blurred, [4.0, 2, 1]).round(12))

# %%
# The period of a signal in noise
# -------------------------------

t = np.arange(400)
x = np.sin(2 * np.pi * t / 25) + noise.normal(size=400)
own = qx.AutoCorrelation80(x, 1)
print("the period is", np.argmax(own[len(x) - 1 + 10:len(x) - 1 + 40]) + 10)
