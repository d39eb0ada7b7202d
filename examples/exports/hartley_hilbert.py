"""
Hartley and Hilbert transforms
==============================
"""

import numpy as np
import qx

# %%
# The envelope of a modulated oscillation
# ---------------------------------------

import matplotlib.pyplot as plt
t = np.arange(1000) / 1000
x = np.exp(-((t - 0.5) / 0.2)**2) * np.cos(2 * np.pi * 40 * t)
envelope = np.hypot(x, qx.FastHilbertTransformH(x))
print("greatest value of the envelope", envelope.max())
figure, axes = plt.subplots(figsize=(8, 2.6))
axes.plot(t, x, color="#9db8d9", linewidth=0.8, label="signal")
axes.plot(t, envelope, color="#c8553d", label="envelope")
axes.legend(frameon=False)
axes.set(xlabel="Time (s)", ylabel="Amplitude")

# %%
# The Hartley transform is its own inverse, up to the factor 1/n
# --------------------------------------------------------------

x = np.arange(5.0)
print(qx.InvFHTH(qx.FHTH(x)))
