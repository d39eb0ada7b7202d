"""
Matrix factorisations
=====================
"""

import numpy as np
import qx

# %%
# Singular values of an image, and how much the first few retain
# --------------------------------------------------------------

import matplotlib.pyplot as plt
x, y = np.meshgrid(np.linspace(-3, 3, 120), np.linspace(-2, 2, 80))
picture = np.sin(3 * x * y) * np.exp(-x**2 / 4) + 0.5 * (np.hypot(x, y) < 1)
u, s, v = qx.SVDEx_head(picture, 0)
kept = [(u[:, :rank] * s[:rank]) @ v[:, :rank].T for rank in (2, 8)]
figure, axes = plt.subplots(1, 4, figsize=(9, 2))
for panel, image, title in zip(axes, [picture, *kept], ["all", "rank 2", "rank 8"]):
    panel.imshow(image, cmap="gray")
    panel.set_title(title)
    panel.axis("off")
axes[3].semilogy(s, ".", color="#2f6db3")
axes[3].set_title("singular values")

# %%
# QR factors with the longest columns first
# -----------------------------------------

a = np.array([[1.0, 2, 3], [4, 5, 6], [7, 8, 10], [1, 0, 1]])
permutation, q, r = qx.QRDecH(a, 1, 1)
print(np.round(r, 3), " a P - q r:", np.abs(a @ permutation - q @ r).max())

# %%
# Cholesky factor, with zeros above the diagonal
# ----------------------------------------------

print(qx.FullCholesky_head(a.T @ a))

# %%
# Balanced, then reduced to Hessenberg form
# -----------------------------------------

scaled = np.array([[1.0, 1e4, 1e8], [1e-4, 2, 1e4], [1e-8, 1e-4, 3]])
balanced, low, high, scale = qx.MatrixBalance_head(scaled, 3)
print(balanced, scale)
print(qx.Hessenberg_head(balanced, low, high)[0])
