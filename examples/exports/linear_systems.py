"""
Linear systems
==============
"""

import numpy as np
import qx

# %%
# One right-hand side
# -------------------

a = np.array([[4.0, -2, 1], [-2, 4, -2], [1, -2, 4]])
b = np.array([11.0, -16, 17])
x = qx.EqsByLUDri_head(a, b)
print("x =", x, " residual", np.abs(a @ x - b).max())

# %%
# A singular matrix is a failure with a code
# ------------------------------------------

try:
    qx.EqsByLUDri_head(np.ones((2, 2)), np.ones(2))
except qx.QxError as error:
    print(error.code, error.name, "-", error.text)

# %%
# Least squares: a straight line and a parabola through noisy points
# ------------------------------------------------------------------

import matplotlib.pyplot as plt
rng = np.random.default_rng(1)
t = np.linspace(0, 4, 40)
y = 1 + 0.5 * t - 0.3 * t**2 + rng.normal(scale=0.3, size=t.size)
line = qx.GenLinEqs_head(np.vander(t, 2), y)
parabola = qx.GenLinEqs_head(np.vander(t, 3), y)
print("line    ", line)
print("parabola", parabola)
figure, axes = plt.subplots(figsize=(8, 3))
axes.plot(t, y, ".", color="#888888", label="points")
axes.plot(t, np.polyval(line, t), color="#b34a2f", label="line")
axes.plot(t, np.polyval(parabola, t), color="#2f6db3", label="parabola")
axes.legend()
axes.set(xlabel="t", ylabel="y")

# %%
# A rank-deficient system: the solution of minimum norm
# -----------------------------------------------------

print(qx.GenLinEqs_head(np.ones((2, 2)), np.array([2.0, 2])))

# %%
# A positive definite matrix with several right-hand sides
# --------------------------------------------------------

gram = a.T @ a
print(qx.EqsSetByCholeskyDri_head(gram, 1, np.eye(3)))

# %%
# A band matrix: row upperBands + i - j, column j holds a(i, j)
# -------------------------------------------------------------

n = 200
band = np.array([np.full(n, -1.0), np.full(n, 2.0), np.full(n, -1.0)])
u = qx.BandEqsDriH(band, np.full(n, 1.0 / n**2), 1, 1)
figure, axes = plt.subplots(figsize=(8, 2.4))
axes.plot(u, color="#2f6db3")
axes.set(title="The loaded string: -u'' = 1, u = 0 at both ends", xlabel="node")
