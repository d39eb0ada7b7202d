"""
Tones
=====
"""

import numpy as np
import qx

# %%
# Tones less than two bins apart, in noise
# ----------------------------------------

rng = np.random.default_rng(1)
t = np.arange(1000) / 1000
y = (np.cos(2 * np.pi * 50.2 * t) + 0.3 * np.cos(2 * np.pi * 51.7 * t + 1)
     + 0.1 * np.cos(2 * np.pi * 120 * t - 2) + rng.normal(0, 0.01, t.size))
frequencies, amplitudes, phases, rms = qx.MultipleToneMeasurements(y, dt=1e-3, count=10, order=1)
for tone in zip(frequencies, amplitudes, phases):
    print("%.3f Hz, amplitude %.4f, phase %.3f" % tone)
print(f"residual: {rms:.4f}")

# %%
# The tone in a frequency band
# ----------------------------

frequency, amplitude, phase, offset, rms = qx.SingleToneMeasurement(y, 1e-3, 125, 10)
print(f"{frequency:.3f} Hz, amplitude {amplitude:.4f}")

# %%
# A 12-bit converter with distortion
# ----------------------------------

x = np.cos(2 * np.pi * 0.0123456 * np.arange(8192))
y = np.round((0.98 * x + 2e-4 * x**3) * 2**11) / 2**11
frequencies, amplitudes, phases, thd, sinad, snr, sfdr, enob, floor = qx.HarmonicAnalysis(y, 1e-6, 0, 5, 1.0)
print("third harmonic at %.1f Hz: %.2e" % (frequencies[2], amplitudes[2]))
print(f"THD {100 * thd:.4f} %, SINAD {sinad:.1f} dB, {enob:.2f} bits")
