"""
Decimation
==========
"""

import numpy as np
import qx

# %%
# A block: every n-th sample, or means of groups
# ----------------------------------------------

x = np.arange(10.0)
print(qx.DecimateCIN(x, 3, 0))
print(qx.DecimateCIN(x, 3, 1))

# %%
# A stream: an incomplete group continues in the next block
# ---------------------------------------------------------

start = count = total = 0
for block in (x[:4], x[4:5], x[5:]):
    means, start, count, total = qx.DecimateContinuous_H(block, 3, 1, start, 0, count, total)
    print(means, f"{count} under way, {start} still needed")

# %%
# The response of a cascaded integrator-comb filter
# -------------------------------------------------

import matplotlib.pyplot as plt
impulse = np.zeros(512)
impulse[0] = 1
frequency = np.arange(257) / 512
figure, axes = plt.subplots(figsize=(8, 2.6))
for stages in (1, 2, 4):
    # The phases of the decimated impulse response, interleaved again.
    response = np.zeros(512)
    for phase in range(8):
        y, *_ = qx.CICDecimatorByMovH(impulse, [], stages, 8, 1, 0, 1, phase)
        response[phase::8][:y.size] = y
    level = 20 * np.log10(np.abs(np.fft.rfft(response)) + 1e-9)
    print(f"{stages} stages: {level[80]:.1f} dB at {frequency[80]:.3f} of the rate")
    axes.plot(frequency, level, label=f"{stages} stages")
axes.legend()
axes.set(ylim=(-120, 5), xlabel="Frequency, of the sampling rate", ylabel="dB")

# %%
# A frequency shift
# -----------------

phase = 0.0
z, phase = qx.CxComplexModulatorH(np.exp(0.2j * np.arange(1000)), -0.2 / (2 * np.pi), 1.0, phase)
print(f"a tone at zero frequency: {z[0]:.6f} ... {z[-1]:.6f}; the next phase is {phase:.6f}")
