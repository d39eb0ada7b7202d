"""
Generalised problems
====================
"""

import numpy as np
import qx

# %%
# Frequencies of masses on springs: stiffness v = (frequency squared) mass v
# --------------------------------------------------------------------------

stiffness = np.array([[3.0, -1, 0], [-1, 2, -1], [0, -1, 1]])
mass = np.diag([2.0, 1, 0.5])
squares, modes = qx.GenEigenEx_head(stiffness, mass, 1)
print("frequencies", np.sqrt(np.sort(squares.real)))

# %%
# Generalised Schur form, infinite eigenvalues last
# -------------------------------------------------

s, t, q, z, alpha, beta = qx.QZ80_head(stiffness, np.diag([1.0, 1, 0]), 1, 3)
print(alpha, beta, np.abs(q @ s @ z.T - stiffness).max())
