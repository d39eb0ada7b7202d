"""
Matrix equations
================
"""

import numpy as np
import qx

# %%
# Covariance of a stable system driven by noise
# ---------------------------------------------

# dx/dt = a x + w with noise w of intensity s: the covariance p of x satisfies a p + p a' = -s.
a = np.array([[0.0, 1.0], [-2.0, -0.5]])
s = np.array([[0.0, 0.0], [0.0, 1.0]])
p = qx.Lyapunov_head(a, -s)
print(p)
print("residual", np.abs(a @ p + p @ a.T + s).max() < 1e-15)

# %%
# The same in discrete time, with the opposite sign
# -------------------------------------------------

a = np.array([[0.9, 0.1], [-0.2, 0.8]])
p = qx.Lyapunov2011_head(a, np.eye(2), 1)
print("positive definite:", np.linalg.eigvalsh(p) > 0)

# %%
# A Sylvester equation
# --------------------

a = np.array([[1.0, 2.0], [0.0, 3.0]])
b = np.array([[4.0]])
print(qx.Sylvester_head(a, b, [[9.0], [7.0]]))

# %%
# An equation without a unique solution
# -------------------------------------

try:
    qx.Sylvester2011_head(a, [[3.0]], [[1.0], [1.0]], 1)  # a x - x b = c, and 3 is an eigenvalue of both
except qx.QxError as error:
    print(error.name)
