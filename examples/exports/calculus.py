"""
Calculus
========
"""

import numpy as np
import qx

# %%
# An integral by every rule
# -------------------------

t = np.linspace(0, np.pi, 12)
x, step = np.sin(t), t[1] - t[0]
for rule, name in enumerate(["trapezoid", "Simpson", "Simpson 3/8", "Bode"]):
    first = qx.NumerIntegration_head(x, step, rule)
    revised = qx.NumerIntegration_2017_head(x, step, rule)
    print(f"{name:12} error {first - 2: .1e}, with the leftover at the start {revised - 2: .1e}")

# %%
# Over a plane
# ------------

y, z = np.meshgrid(np.linspace(0, 1, 9), np.linspace(0, 2, 9), indexing="ij")
print(qx.NumerIntegration2D_head(y * z**2, [0.25, 0.125], 1), "for", 0.5 * 8 / 3)

# %%
# Integral and derivative
# -----------------------

import matplotlib.pyplot as plt
t = np.linspace(0, 2, 201)
x = np.cos(2 * np.pi * t) + 0.3 * t
integral = qx.Integral_2017(x, 0.01, 3)
back = qx.Derivative85(integral, [integral[0] - 0.01 * x[0]], [integral[-1] + 0.01 * x[-1]],
                       0.01, 0)
print("largest difference inside", np.abs(back - x)[1:-1].max())
figure, axes = plt.subplots(figsize=(8, 2.4))
axes.plot(t, x, label="x", color="#2f6db3")
axes.plot(t, integral, label="its running integral", color="#c8553d")
axes.legend(frameon=False)
