"""
Windows
=======
"""

import numpy as np
import qx

# %%
# The window itself: apply it to ones
# -----------------------------------

window = qx.AllWinH(np.ones(8), 1, np.nan, 0, 0)
print("Hanning, periodic: ", window)
print("Hanning, symmetric:", qx.AllWinH(np.ones(8), 1, np.nan, 0, 1))

# %%
# Windows and spectral leakage
# ----------------------------

import matplotlib.pyplot as plt
n = 256
x = np.cos(2 * np.pi * 40.5 * np.arange(n) / n)
figure, axes = plt.subplots(figsize=(8, 3.2))
for name, selector in (("rectangle", 0), ("Hanning", 1), ("Blackman-Harris, 4 terms", 7)):
    scaled = qx.AllWinH(x, selector, np.nan, 1, 0)
    power = qx.SpectrumH(scaled)[:n // 2]
    level = 10 * np.log10(np.maximum(power, 1e-20))
    print(f"{name:26} {level[50]:7.1f} dB at bin 50")
    axes.plot(level, label=name)
axes.legend(frameon=False)
axes.set(xlabel="Bin", ylabel="Power (dB)", ylim=(-160, 0))
