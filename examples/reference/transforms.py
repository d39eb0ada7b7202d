import numpy as np
import qx

#%% Few cosines carry a smooth signal
x = np.exp(-np.linspace(-2, 2, 200)**2)
coefficients = qx.call("DCT_1DH", x, 0)
kept = coefficients.copy()
kept[20:] = 0
again = qx.call("InvDCT_1DH", kept)
print("20 of 200 coefficients, greatest error", np.abs(again - x).max())

#%% The envelope of a modulated oscillation
import matplotlib.pyplot as plt  # hidden
t = np.arange(1000) / 1000
x = np.exp(-((t - 0.5) / 0.2)**2) * np.cos(2 * np.pi * 40 * t)
envelope = np.hypot(x, qx.call("FastHilbertTransformH", x))
print("greatest value of the envelope", envelope.max())
figure, axes = plt.subplots(figsize=(8, 2.6))  # hidden
axes.plot(t, x, color="#9db8d9", linewidth=0.8, label="signal")  # hidden
axes.plot(t, envelope, color="#c8553d", label="envelope")  # hidden
axes.legend(frameon=False)  # hidden
axes.set(xlabel="Time (s)", ylabel="Amplitude")  # hidden

#%% The Hartley transform is its own inverse but for 1/n
x = np.arange(5.0)
print(qx.call("InvFHTH", qx.call("FHTH", x)))

#%% A narrow band of a long spectrum, without the rest of it
x = np.cos(2 * np.pi * 1000.25 * np.arange(4096) / 4096)
_, band = qx.call("ReDZTH", x, 4, 4096, 4 * 1000 - 4, 9)
print("quarter bins from 999 to 1001:", np.abs(band).round(1))
