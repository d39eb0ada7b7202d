"""
Elliptic integrals and functions
================================
"""

import numpy as np
import qx
from qx.plots import curves

# %%
# Elliptic integrals and the Jacobian functions
# ---------------------------------------------

m = np.linspace(0, 0.999, 300)
curves(m, {"K(m)": qx.QX_Elliptic1(m, np.nan), "E(m)": qx.QX_Elliptic2(m, np.nan)},
       xlabel="m")
u = np.linspace(-8, 8, 500)
curves(u, dict(zip(("sn", "cn", "dn", "amplitude"), qx.QX_EllipticJ(u, 0.9))), (-2, 2), "u")
