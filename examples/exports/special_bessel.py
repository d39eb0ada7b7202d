"""
Bessel functions
================
"""

import numpy as np
import qx
from qx.plots import curves

# %%
# Bessel functions of real order
# ------------------------------

x = np.linspace(0.01, 20, 500)
curves(x, {**{f"J {v}": qx.QX_BesselJr(v, x) for v in (0, 0.5, 2.5)},
           **{f"Y {v}": qx.QX_BesselYr(v, x) for v in (0, 2.5)}}, (-1.1, 1.1))

# %%
# Modified Bessel functions
# -------------------------

x = np.linspace(0.01, 4, 300)
curves(x, {**{f"I {v}": qx.QX_BesselIr(v, x) for v in (0, 1, 2.5)},
           **{f"K {n}": qx.QX_BesselKn(n, x) for n in (0, 1, 2)}}, (0, 5))

# %%
# Spherical Bessel functions
# --------------------------

x = np.linspace(0.05, 20, 500)
curves(x, {**{f"j {n}": qx.QX_BesselJs(n, x) for n in (0, 1, 2)},
           **{f"y {n}": qx.QX_BesselYs(n, x) for n in (0, 1)}}, (-0.6, 1.05))

# %%
# Airy functions and their derivatives
# ------------------------------------

x = np.linspace(-10, 3, 500)
curves(x, dict(zip(("Ai", "Ai'", "Bi", "Bi'"), qx.QX_Airy(x))), (-1.2, 2.0))

# %%
# Kelvin functions of order 0
# ---------------------------

x = np.linspace(0.01, 7, 300)
curves(x, dict(zip(("ber", "bei", "ker", "kei"),
                   (*qx.QX_KelvinI(x, 0), *qx.QX_KelvinK(x, 0)))), (-6, 6))

# %%
# Struve functions
# ----------------

x = np.linspace(0.01, 20, 400)
curves(x, {f"H {v}": qx.QX_Struve(x, v) for v in (0.0, 1.0, 2.0)})

# %%
# Parabolic cylinder functions
# ----------------------------

x = np.linspace(-5, 5, 400)
curves(x, {f"D {v}": qx.QX_ParabolicCylinder(x, v) for v in (0.0, 1.0, 2.0, 3.5)}, (-4, 6))
