"""
Analysis of variance
====================
"""

import numpy as np
import qx

# %%
# Do three groups have the same mean?
# -----------------------------------

values = np.array([6.9, 5.4, 5.8, 4.6, 4.0, 8.3, 6.8, 7.8, 9.2, 6.5, 8.0, 10.5, 8.1, 6.9, 9.3])
groups = np.repeat([0, 1, 2], 5)
between, _, f, p, error, _, total = qx.Anova1Way_head(values, groups, 3)
print(f"between {between:.4f}  error {error:.4f}  total {total:.4f}")
print(f"F = {f:.3f}, p = {p:.5f}")

# %%
# Are rows and columns of a table independent?
# --------------------------------------------

chi_square, p = qx.Contingency_head([[20, 30, 25], [35, 25, 15]])
print(f"chi-square {chi_square:.4f}, p = {p:.4f}")

# %%
# Two factors: does the life of a battery depend on its material and on the temperature?
# --------------------------------------------------------------------------------------

life = np.array([[[130, 155, 74, 180], [34, 40, 80, 75], [20, 70, 82, 58]],
                 [[150, 188, 159, 126], [136, 122, 106, 115], [25, 70, 58, 45]],
                 [[138, 110, 168, 160], [174, 120, 150, 139], [96, 104, 82, 60]]], float)
material, temperature, _ = (index.ravel() for index in np.indices(life.shape, dtype=np.int32))
table = qx.Anova2Way_head_2017(life.ravel(), material, temperature, 3, 3, 4, 0.05)
for name, squares, degrees, _, f, p, _, critical in zip(["material", "temperature", "both", "error", "total"], *table):
    print(f"{name:12} {squares:9.1f} {degrees:3.0f}  F {f:6.2f}  p {p:.4f}  above {critical:.2f}")

# %%
# Three factors, of which two are random
# --------------------------------------

# Four machines of a plant are compared; operators and days are random samples. The machines are tested against a
# combination of mean squares, which has its own degrees of freedom.
rng = np.random.default_rng(1)
machine, operator, day, _ = (index.ravel() for index in np.indices((4, 5, 3, 2), dtype=np.int32))
y = 0.8 * machine + rng.normal(0, 0.5, (4, 5))[machine, operator] + rng.normal(0, 0.5, (4, 3))[machine, day] \
    + rng.normal(0, 0.3, machine.size)
squares, _, _, f, p, degrees = qx.ANOVA3Way_head(y, machine, operator, day, 4, -5, -3, 2)
print(f"machines: F = {f[0]:.2f}, p = {p[0]:.4f}, denominator with {degrees[0]:.2f} degrees of freedom")
