"""
Eigenproblems
=============
"""

import numpy as np
import qx

# %%
# Eigenvalues of random matrices lie in a disc
# --------------------------------------------

import matplotlib.pyplot as plt
rng = np.random.default_rng(2)
n = 200
values = qx.EigenValueVector_head(rng.normal(size=(n, n)) / np.sqrt(n), 0)[0]
figure, axes = plt.subplots(figsize=(3.4, 3.4))
axes.plot(values.real, values.imag, ".", color="#2f6db3")
axes.add_patch(plt.Circle((0, 0), 1, fill=False, color="#b34a2f"))
axes.set_aspect("equal")

# %%
# Modes of a chain of masses: the eigenvectors of a symmetric matrix
# ------------------------------------------------------------------

n = 40
chain = 2 * np.eye(n) - np.eye(n, k=1) - np.eye(n, k=-1)
modes, squares = qx.SymEvectorEvalue_head(chain, 1)
figure, axes = plt.subplots(figsize=(8, 2.4))
for mode in range(3):
    axes.plot(modes[:, mode], label=f"frequency {np.sqrt(squares[mode]):.3f}")
axes.legend()

# %%
# Schur form with eigenvalues in order of decreasing modulus
# ----------------------------------------------------------

a = np.array([[1.0, 2, 0], [-3, 1, 1], [0, 1, 5]])
t, u, w = qx.Schur80_head(a, 1, 4)
print(np.round(t, 3), w, np.abs(u @ t @ u.T - a).max())
