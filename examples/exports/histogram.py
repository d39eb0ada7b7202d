"""
Histogram
=========
"""

import numpy as np
import qx

# %%
# A histogram over the range of the data
# --------------------------------------

import matplotlib.pyplot as plt
samples = np.random.default_rng(1).gamma(3.0, size=2000)
counts, centres = qx.histgran_head(samples, 30)
print("the fullest bin is around", centres[np.argmax(counts)])
figure, axes = plt.subplots(figsize=(8, 2.6))
axes.bar(centres, counts, width=0.9 * (centres[1] - centres[0]), color="#2f6db3")
axes.set(title="2000 gamma variates of shape 3", xlabel="Value", ylabel="Count")

# %%
# Intervals chosen by the caller
# ------------------------------

intervals = [(0.0, 1.0, 0), (1.0, 2.0, 0), (2.0, 100.0, 2)]
counts, summary = qx.GenHistH(samples, intervals)
print(counts, summary)
