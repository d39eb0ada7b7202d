"""
Peaks
=====
"""

import numpy as np
import qx

# %%
# Peaks of a whole record
# -----------------------

t = np.arange(400)
x = np.sin(0.0005 * t**2) + 0.05 * np.random.default_rng(1).normal(size=t.size)
request = {"data": x, "threshold": 0.5, "width": 11, "polarity": 0, "flags": 1 + 4}
found, state, buffer = qx.PeakD(request, {}, [])
import matplotlib.pyplot as plt
figure, axes = plt.subplots(figsize=(8, 2.6))
axes.plot(x, color="#8795a6", linewidth=0.8)
axes.plot(found["locations"], found["amplitudes"], "o", color="#2f6db3")
axes.set(xlabel="Sample")
print(found["count"], "peaks, the first at", found["locations"][0])

# %%
# A stream in blocks; the state is passed from call to call
# ---------------------------------------------------------

state, buffer, locations = {}, [], []
for i, block in enumerate(np.split(x, [130, 260])):
    request = {"data": block, "threshold": 0.5, "width": 11, "flags": (1, 0, 4)[i]}
    found, state, buffer = qx.PeakD(request, state, buffer)
    locations.extend(found["locations"])
print(len(locations), "peaks in blocks")

# %%
# Runs above a threshold
# ----------------------

indices, count = qx.PeakDetector([0.0, 2, 3, 2, 0, 0, 1, 2, 0], 1.0, 2)
print(indices)
