"""
Special matrices
================
"""

import numpy as np
import qx

# %%
# Structured matrices: Toeplitz, Vandermonde, companion
# -----------------------------------------------------

x, y = np.array([1.0, 2, 3]), np.array([0.0, 7, 8])
for kind in (2, 3, 4):
    print(qx.SpecialMatrix_head(kind, 0, x, y), "\n")

# %%
# Outer and Kronecker product
# ---------------------------

print(qx.OuterProd_head(x, y))
print(qx.KroneckerProd_H(np.eye(2), np.array([[1.0, 2]])))

# %%
# A full symmetric matrix with given eigenvalues
# ----------------------------------------------

a = qx.CreateMatrixFromEVs_head(np.array([3.0, 1, -2]))
print(a)
print(np.linalg.eigvalsh(a))

# %%
# The autocorrelation matrix of a noisy sine
# ------------------------------------------

import matplotlib.pyplot as plt
n = np.arange(400)
signal = np.sin(0.3 * n) + np.random.default_rng(1).normal(scale=0.5, size=n.size)
matrix = qx.AutoCorrMtrxH(signal, signal, 40, 2)
figure, axes = plt.subplots(figsize=(4, 3.4))
axes.imshow(matrix, cmap="RdBu")
axes.set(title="r(i - j)")
