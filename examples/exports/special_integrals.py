"""
Special integrals
=================
"""

import numpy as np
import qx
from qx.plots import curves

# %%
# Error function
# --------------

x = np.linspace(-3, 3, 400)
curves(x, {"erf": qx.QX_Erf(x), "erfc": qx.QX_ErfC(x)})

# %%
# Exponential integrals
# ---------------------

x = np.linspace(0.01, 3, 400)
curves(x, {f"E {n}": qx.QX_ExpI(x, n) for n in (0, 1, 2, 5)}, (0, 2.5))

# %%
# Sine and cosine integrals, hyperbolic sine and cosine integrals
# ---------------------------------------------------------------

x = np.linspace(0.05, 20, 500)
curves(x, {"Si": qx.QX_SinI(x), "Ci": qx.QX_CosI(x)})
x = np.linspace(0.05, 3, 300)
curves(x, {"Shi": qx.QX_SinhI(x), "Chi": qx.QX_CoshI(x)})

# %%
# Dilogarithm
# -----------

x = np.linspace(0, 6, 400)
curves(x, {"Li2(1 - x)": qx.QX_Diln(x)})

# %%
# Dawson's integral and the Fresnel integrals
# -------------------------------------------

x = np.linspace(-6, 6, 600)
c, s = qx.QX_FresnelIntegrals(x)
curves(x, {"Dawson": qx.QX_Dawson(x), "Fresnel C": c, "Fresnel S": s})
