"""
IIR filter design
=================
"""

import numpy as np
import qx

# %%
# A lowpass at 40 Hz for a rate of 360 Hz, and its gain there
# -----------------------------------------------------------

a, b = qx.BWCoefs(360, 40, 0, 4, 0)
z = np.exp(-2j * np.pi * 40 / 360)
gain = np.prod([(b0 + b1 * z + b2 * z**2) / (1 + a0 * z + a1 * z**2)
                for (a0, a1), (b0, b1, b2) in zip(a.reshape(-1, 2), b.reshape(-1, 3))])
print(round(20 * np.log10(abs(gain)), 6), "dB")

# %%
# Five families of order 5, with a ripple of 1 dB and an attenuation of 50 dB
# ---------------------------------------------------------------------------

import matplotlib.pyplot as plt
designs = {
    "Butterworth": qx.BWCoefs(1.0, 0.15, 0, 5, 0),
    "Chebyshev": qx.ChebyshevCoefs(1.0, 0.15, 0, 1.0, 5, 0),
    "inverse Chebyshev": qx.InvChebyshevCoefs(1.0, 0.15, 0, 50.0, 5, 0),
    "elliptic": qx.EllipticCoefs(1.0, 0.15, 0, 1.0, 50.0, 5, 0),
    "Bessel": qx.BesselCoefs(1.0, 0.15, 0, 5, 0),
}
impulse = np.zeros(4096)
impulse[0] = 1
figure, axes = plt.subplots(figsize=(8, 3))
for name, (a, b) in designs.items():
    response, _ = qx.IIR_Filter2(impulse, 0, a, b, [], 0)
    gain = np.abs(np.fft.rfft(response))
    axes.plot(np.linspace(0, 0.5, len(gain)), 20 * np.log10(gain + 1e-9), label=name, linewidth=1.2)
    print(f"{name:18} {20 * np.log10(gain[round(0.1 * 4096)]):8.3f} dB at 0.1,"
          f" {20 * np.log10(gain[round(0.25 * 4096)]):8.2f} dB at 0.25")
axes.set(ylim=(-80, 3), xlabel="Frequency (cycles per sample)", ylabel="Gain (dB)")
axes.legend(frameon=False, fontsize=8)

# %%
# A bandpass in sections of fourth order and of second order
# ----------------------------------------------------------

a4, b4 = qx.EllipticCoefs90(8000, 900, 1500, 0.5, 60, 4, 2, 1)
a2, b2 = qx.EllipticCoefs90(8000, 900, 1500, 0.5, 60, 4, 2, 0)
noise = np.random.default_rng(1).normal(size=1000)
y4, _ = qx.IIR_Filter2(noise, 1, a4, b4, [], 0)
y2, _ = qx.IIR_Filter2(noise, 0, a2, b2, [], 0)
print(len(a4) // 4, "and", len(a2) // 2, "sections, equal within 1e-10:", np.allclose(y4, y2, atol=1e-10))

# %%
# A narrow bandpass from poles and zeros
# --------------------------------------

a, b, zeros, poles, factor = qx.BWCoefs2026(1000.0, 1.0, 1.01, 6, 2)
print(len(a) // 2, "sections; the greatest pole has modulus", abs(poles).max().round(9))
z0 = np.exp(2j * np.pi * 1.005 / 1000)
print("gain in the middle:", abs(factor * np.prod(z0 - zeros) / np.prod(z0 - poles)).round(6))
