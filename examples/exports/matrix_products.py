"""
Matrix products
===============
"""

import numpy as np
import qx

# %%
# Matrices and vectors, real and complex
# --------------------------------------

a = np.array([[1.0, 2], [3, 4], [5, 6]])
b = np.array([[1.0, 0, -1], [2, 1, 0]])
print(qx.MatrixMul_head(a, b))
print(qx.AxVect_head(a, np.array([1.0, -1])))
print(qx.vectxA_head(np.array([1.0, 0, 1]), a))
print(qx.AxBCxCIN(a + 1j, b - 1j))

# %%
# An empty inner dimension gives NaN, not zero
# --------------------------------------------

print(qx.MatrixMul_head(np.empty((2, 0)), np.empty((0, 3))))
