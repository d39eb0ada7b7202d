"""
Solve a system of equations
===========================

A system of a hundred equations with as many unknowns, what its condition number says about the accuracy of the
solution, and what happens when a matrix is singular.
"""

import matplotlib.pyplot as plt
import numpy as np
import qx

random = np.random.default_rng(7)
a, x = random.normal(size=(100, 100)), random.normal(size=100)
b = a @ x

found = qx.linalg.solve(a, b)
print(f"largest error {np.abs(found - x).max():.1e}")

# %%
# The condition number bounds the factor by which relative errors of the data can grow.

print(f"condition number {qx.linalg.cond(a):.0f}")

# %%
# A singular matrix raises NumPy's ``LinAlgError``; the message names the argument and the rule.

try:
    qx.linalg.solve([[1, 2], [2, 4]], [1, 2])
except np.linalg.LinAlgError as error:
    print(type(error).__name__, "-", error)

# %%
# For more equations than unknowns, ``lstsq`` returns the least-squares solution.

tall = random.normal(size=(200, 3))
measured = tall @ [1.0, -2.0, 0.5] + 0.01 * random.normal(size=200)
qx.linalg.lstsq(tall, measured)

# %%
# The errors of the solution grow with the condition number, as Hilbert matrices, which are notoriously
# ill-conditioned, show.

orders = np.arange(2, 9)
matrices = [1 / (np.arange(1, n + 1)[:, None] + np.arange(n)) for n in orders]
errors = [np.abs(qx.linalg.solve(h, h.sum(1)) - 1).max() for h in matrices]
figure, axes = plt.subplots(figsize=(8, 3))
axes.semilogy(orders, [2.2e-16 * qx.linalg.cond(h) for h in matrices], color="0.7", label="condition number, times eps")
axes.semilogy(orders, errors, "o-", label="error")
axes.set(xlabel="Order")
axes.legend()
