"""
The frequencies of a chain of masses
====================================

Twenty equal masses are connected by springs. The squares of the frequencies are the eigenvalues of the stiffness
matrix, and its eigenvectors are the mode shapes of the chain.
"""

import matplotlib.pyplot as plt
import numpy as np
import qx

n = 20
k = 2 * np.eye(n) - np.eye(n, k=1) - np.eye(n, k=-1)

frequencies = np.sqrt(qx.linalg.eigvalsh(k))
exact = 2 * np.sin(np.pi * np.arange(1, n + 1) / (2 * n + 2))
print(frequencies[:5])
print(f"largest error {np.abs(frequencies - exact).max():.1e}")

# %%
# The first three mode shapes.

values, vectors = qx.linalg.eigh(k)
figure, axes = plt.subplots(figsize=(8, 3))
for i in range(3):
    axes.plot(np.arange(n + 2), np.r_[0, vectors[:, i], 0], "o-", label=f"{np.sqrt(values[i]):.3f}")
axes.set(xlabel="Mass", ylabel="Displacement")
axes.legend(title="Frequency", loc="lower left")
