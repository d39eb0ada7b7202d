"""
Polynomial roots
================
"""

import numpy as np
import qx

# %%
# All roots of a polynomial; coefficients begin with the constant term
# --------------------------------------------------------------------

roots = qx.CxPolyRoots_head(np.array([-1, 0, 0, 0, 0, 1], complex), 100)
print(np.sort_complex(roots.round(6)))

# %%
# Refining approximate roots: real roots one by one, complex roots in pairs
# -------------------------------------------------------------------------

coefficients = np.polynomial.polynomial.polyfromroots([1, 2, -0.5 + 1j, -0.5 - 1j]).real
print(qx.PolyRootsNtBst_head(coefficients, [0.8, 2.3], 50, 1e-14,
                             [-0.52 + 0.98j, -0.52 - 0.98j], 50, 1e-14))

# %%
# Multiple roots with their multiplicities
# ----------------------------------------

import matplotlib.pyplot as plt
a = np.polynomial.polynomial.polyfromroots([1] * 6 + [0.5] * 8 + [-0.75] * 5)
_, roots, _, multiplicities = qx.MultPolyRoots_head(a, 1, 0.0)
for root, times in zip(roots, multiplicities):
    print(f"{root.real:.15f}  {times} times")
scattered = qx.CxPolyRoots_head(a.astype(complex), 100)
figure, axes = plt.subplots(figsize=(8, 2.6))
axes.plot(scattered.real, scattered.imag, "o", color="#c9d3df", label="one by one")
axes.plot(roots.real, roots.imag, "+", color="#c8553d", markersize=12, label="as multiple roots")
axes.legend(frameon=False)
axes.set(xlabel="real part", ylabel="imaginary part")
