"""
Bessel and Airy functions of complex argument
=============================================
"""

import numpy as np
import qx
from qx.plots import curves

# %%
# A Bessel function of the first kind along lines in the plane
# ------------------------------------------------------------

x = np.linspace(0.01, 20, 400)
curves(x, {f"Re J 2.5 (x + {y}i)": qx.QX_CxBesselJr(2.5, x + 1j * y, 0).real
           for y in (0, 1, 2)}, (-1.1, 1.1))

# %%
# Both sides of the cut
# ---------------------

for z in (complex(-2, 0.0), complex(-2, -0.0)):
    print(z.imag, qx.QX_CxBesselKr(0.5, z, 0))

# %%
# Scaled Hankel function: without scaling it overflows here
# ---------------------------------------------------------

print(qx.QX_CxBesselH1r(1, 3 - 900j, 1))

# %%
# Ai on the circle of radius 3
# ----------------------------

angle = np.linspace(-np.pi, np.pi, 400)
values = qx.QX_CxAiryAi(3 * np.exp(1j * angle), 0)
curves(angle, {"Re Ai": values.real, "Im Ai": values.imag})
