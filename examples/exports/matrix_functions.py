"""
Matrix functions
================
"""

import numpy as np
import qx

# %%
# A damped oscillator, stepped by the exponential of its matrix
# -------------------------------------------------------------

import matplotlib.pyplot as plt
a = np.array([[0.0, 1], [-4, -0.3]])
step = qx.MatrixExp_head(a * 0.1)
states = [np.array([1.0, 0])]
for _ in range(150):
    states.append(step @ states[-1])
figure, axes = plt.subplots(figsize=(8, 2.4))
axes.plot(np.arange(151) * 0.1, np.array(states)[:, 0], color="#2f6db3")
axes.set(xlabel="time", ylabel="position")

# %%
# From the step back to the matrix
# --------------------------------

print(np.round(qx.MatrixLn_head(step) / 0.1, 9))

# %%
# Square root, power, pseudo-inverse
# ----------------------------------

root = qx.MatrixSqrtH(np.array([[2.0, 1], [1, 3]]))
print(np.round(root @ root, 12))
print(qx.MatrixPower_head(np.array([[1.0, 1], [1, 0]]), 10))
print(qx.PseudoInverse_head(np.array([[1.0, 2], [2, 4], [3, 6]]), -1.0))
