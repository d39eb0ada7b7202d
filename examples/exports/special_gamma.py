"""
Gamma and beta functions
========================
"""

import numpy as np
import qx
from qx.plots import curves

# %%
# The gamma function, its logarithm and the digamma function
# ----------------------------------------------------------

x = np.linspace(0.02, 5, 500)
curves(x, {"gamma": qx.QX_Gamma(x, np.nan), "ln gamma": qx.QX_LnGamma(x),
           "digamma": qx.QX_Psi(x)}, (-4, 8))

# %%
# Incomplete gamma and beta functions
# -----------------------------------

x = np.linspace(0.001, 12, 400)
curves(x, {f"P({a}, x)": qx.QX_Gamma(a, x) for a in (0.5, 2.0, 6.0)})
x = np.linspace(0.001, 0.999, 400)
curves(x, {f"I x({a}, {b})": qx.QX_Beta(a, b, x) for a, b in ((0.5, 0.5), (2.0, 5.0))})

# %%
# Riemann's zeta function
# -----------------------

x = np.linspace(-14, 6, 600)
curves(x, {"zeta": qx.QX_Zeta(x)}, (-1.5, 3))
