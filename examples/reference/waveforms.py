import matplotlib.pyplot as plt  # hidden
import numpy as np
import qx

#%% Waves keep their phase from block to block
phase = 0.0
blocks = []
for _ in range(4):
    x, phase = qx.call("SineWaveCIN", 25, 1.0, 0.0123, phase)
    blocks.append(x)
whole, _ = qx.call("SineWaveCIN", 100, 1.0, 0.0123, 0.0)
print("phase behind the last block", phase)
print("largest difference from one block of 100:", np.abs(np.concatenate(blocks) - whole).max())

#%% The waves
f, n, table = 0.01, 250, np.array([0.0, 1.0, 0.2, -1.0])
waves = {
    "SineWaveCIN": qx.call("SineWaveCIN", n, 1.0, f, 0.0)[0],
    "SquareWaveCIN, duty 30": qx.call("SquareWaveCIN", n, 1.0, f, 0.0, 30.0)[0],
    "TriangleWaveCIN": qx.call("TriangleWaveCIN", n, 1.0, f, 0.0)[0],
    "SawtoothWaveCIN": qx.call("SawtoothWaveCIN", n, 1.0, f, 0.0)[0],
    "ArbitraryWaveCIN": qx.call("ArbitraryWaveCIN", n, 1.0, f, 0.0, table, 0)[0],
    "ArbitraryWaveCIN, interpolated": qx.call("ArbitraryWaveCIN", n, 1.0, f, 0.0, table, 1)[0],
    "ChirpCIN": qx.call("ChirpCIN", n, 1.0, 0.0, 0.1),
}


def plots(named):  # hidden
    figure, axes = plt.subplots(len(named), figsize=(8, 1.1 * len(named)), sharex=True, layout="constrained")  # hidden
    for (name, x), place in zip(named.items(), axes):  # hidden
        place.plot(x, linewidth=1.1, color="#2f6db3")  # hidden
        place.set_title(name, fontsize=8, loc="left")  # hidden
        place.tick_params(labelsize=7)  # hidden


plots(waves)  # hidden

#%% Patterns, ramps and pulses
nothing = []
plots({  # hidden
    "SinePtrn, 2.5 cycles": qx.call("SinePtrn", n, 1.0, 0.0, 2.5),
    "Square, duty 30": qx.call("Square", n, 1.0, 30.0, 4.0),
    "PulsePtrn": qx.call("PulsePtrn", n, 1.0, 50, 60),
    "ImpulsePtrn": qx.call("ImpulsePtrn", n, 1.0, 125),
    "SincWave": qx.call("SincWave", n, 1.0, 12.5, 0.1),
    "RampPtrn": qx.call("RampPtrn", n, -1.0, 1.0),
    "RampPtrn85, in equal ratios": qx.call("RampPtrn85", n, 0.01, 1.0, 0, 1),
    "GaussPulseH": qx.call("GaussPulseH", nothing, n, 1.0, 1.25, 0.01, 4.0, 0.5, 6.0),
    "GaussMonopulseH": qx.call("GaussMonopulseH", nothing, n, 0.01, 1.25, 1.0, 1.0),
    "AperiodTriangleH": qx.call("AperiodTriangleH", nothing, n, 1.0, 0.5, 0.01, 1.5, 0.3),
    "PeriodicSincH, order 5": qx.call("PeriodicSincH", nothing, n, 1.0, 5, 0.1, 12.5),
})  # hidden

#%% Modulation of a carrier of 50 Hz, sampled at 1 kHz
step, t = 0.001, np.arange(n) * 0.001
signal = 90 * np.sin(2 * np.pi * 5 * t)
modulated = {}
_, modulated["PhasMod"], peak, _ = qx.call("PhasMod", n, step, 50.0, signal, 0.0, 0.0)
_, modulated["FreqMod"], _, _ = qx.call("FreqMod", n, step, 50.0, signal / 3, 0.0, 0.0)
print("peak deviation in degrees", peak)
plots(modulated)  # hidden
