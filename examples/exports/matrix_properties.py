"""
Matrix properties
=================
"""

import numpy as np
import qx

# %%
# Determinant, rank, norms and condition number
# ---------------------------------------------

a = np.array([[2.0, 1, 0], [1, 3, 1], [0, 1, 4]])
print("determinant", qx.Determinant_head(a, 0))
print("rank       ", qx.Rank_head(a, -1.0))
for norm_type, name in enumerate(("2", "1", "Frobenius", "infinity")):
    print(f"norm {name:10}", qx.Norm_head(a, norm_type),
          " condition", qx.CondNumber_head(a, norm_type))

# %%
# Tests
# -----

print("symmetric        ", qx.CheckSym_head(a, -1.0, 0))
print("positive definite", qx.CheckPosdef_head(a))
v = np.array([[1.0], [2], [3]])
print("semi-definite, rank", qx.CheckPosSemiDef_head(v @ v.T, -1.0))

# %%
# The condition numbers of Hilbert matrices
# -----------------------------------------

import matplotlib.pyplot as plt
orders = np.arange(2, 12)
conditions = [qx.CondNumber_head(1.0 / (np.indices((n, n)).sum(0) + 1), 0) for n in orders]
figure, axes = plt.subplots(figsize=(8, 2.6))
axes.semilogy(orders, conditions, "o-", color="#2f6db3")
axes.set(xlabel="order", ylabel="condition number")

# %%
# Vector norms and unit vectors
# -----------------------------

x = np.array([3.0, -4, 12])
print([qx.vectorNormH(x, p) for p in (1.0, 2.0, np.inf)])
print(qx.unitVector_head(x))

# %%
# The characteristic polynomial, coefficients in ascending order
# --------------------------------------------------------------

print(qx.MatrixCharacteristicPoly_head(a))
