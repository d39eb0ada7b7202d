"""
Waveforms
=========
"""

import matplotlib.pyplot as plt
import numpy as np
import qx

# %%
# Waves keep their phase from block to block
# ------------------------------------------

phase = 0.0
blocks = []
for _ in range(4):
    x, phase = qx.SineWaveCIN(25, 1.0, 0.0123, phase)
    blocks.append(x)
whole, _ = qx.SineWaveCIN(100, 1.0, 0.0123, 0.0)
print("phase after the last block", phase)
print("largest difference from one block of 100:", np.abs(np.concatenate(blocks) - whole).max())

# %%
# The waves
# ---------

f, n, table = 0.01, 250, np.array([0.0, 1.0, 0.2, -1.0])
waves = {
    "SineWaveCIN": qx.SineWaveCIN(n, 1.0, f, 0.0)[0],
    "SquareWaveCIN, duty 30": qx.SquareWaveCIN(n, 1.0, f, 0.0, 30.0)[0],
    "TriangleWaveCIN": qx.TriangleWaveCIN(n, 1.0, f, 0.0)[0],
    "SawtoothWaveCIN": qx.SawtoothWaveCIN(n, 1.0, f, 0.0)[0],
    "ArbitraryWaveCIN": qx.ArbitraryWaveCIN(n, 1.0, f, 0.0, table, 0)[0],
    "ArbitraryWaveCIN, interpolated": qx.ArbitraryWaveCIN(n, 1.0, f, 0.0, table, 1)[0],
    "ChirpCIN": qx.ChirpCIN(n, 1.0, 0.0, 0.1),
}


def plots(named):
    figure, axes = plt.subplots(len(named), figsize=(8, 1.1 * len(named)), sharex=True, layout="constrained")
    for (name, x), place in zip(named.items(), axes):
        place.plot(x, linewidth=1.1, color="#2f6db3")
        place.set_title(name, fontsize=8, loc="left")
        place.tick_params(labelsize=7)


plots(waves)

# %%
# Patterns, ramps and pulses
# --------------------------

nothing = []
plots({
    "SinePtrn, 2.5 cycles": qx.SinePtrn(n, 1.0, 0.0, 2.5),
    "Square, duty 30": qx.Square(n, 1.0, 30.0, 4.0),
    "PulsePtrn": qx.PulsePtrn(n, 1.0, 50, 60),
    "ImpulsePtrn": qx.ImpulsePtrn(n, 1.0, 125),
    "SincWave": qx.SincWave(n, 1.0, 12.5, 0.1),
    "RampPtrn": qx.RampPtrn(n, -1.0, 1.0),
    "RampPtrn85, in equal ratios": qx.RampPtrn85(n, 0.01, 1.0, 0, 1),
    "GaussPulseH": qx.GaussPulseH(nothing, n, 1.0, 1.25, 0.01, 4.0, 0.5, 6.0),
    "GaussMonopulseH": qx.GaussMonopulseH(nothing, n, 0.01, 1.25, 1.0, 1.0),
    "AperiodTriangleH": qx.AperiodTriangleH(nothing, n, 1.0, 0.5, 0.01, 1.5, 0.3),
    "PeriodicSincH, order 5": qx.PeriodicSincH(nothing, n, 1.0, 5, 0.1, 12.5),
})

# %%
# Modulation of a carrier of 50 Hz, sampled at 1 kHz
# --------------------------------------------------

step, t = 0.001, np.arange(n) * 0.001
signal = 90 * np.sin(2 * np.pi * 5 * t)
modulated = {}
_, modulated["PhasMod"], peak, _ = qx.PhasMod(n, step, 50.0, signal, 0.0, 0.0)
_, modulated["FreqMod"], _, _ = qx.FreqMod(n, step, 50.0, signal / 3, 0.0, 0.0)
print("peak deviation in degrees", peak)
plots(modulated)
