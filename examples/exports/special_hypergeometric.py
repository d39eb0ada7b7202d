"""
Hypergeometric functions
========================
"""

import numpy as np
import qx
from qx.plots import curves

# %%
# Gauss's hypergeometric function
# -------------------------------

x = np.linspace(-1, 0.99, 400)
curves(x, {f"F({a}, {b}; {c}; x)": qx.QX_Gauss_2011(x, a, b, c)
           for a, b, c in ((1.0, 1.0, 2.0), (0.5, 0.5, 1.0), (-3.0, 4.0, 1.0), (0.7, -1.6, 0.4))}, (-1, 4))

# %%
# Kummer's and Tricomi's confluent functions
# ------------------------------------------

x = np.linspace(-6, 4, 400)
curves(x, {f"M({a}, {b}, x)": qx.QX_Kummer(x, a, b)
           for a, b in ((1.0, 2.0), (0.5, 0.8), (-2.0, 1.0), (-1.5, 0.5))}, (-8, 8))
x = np.linspace(0.02, 8, 400)
curves(x, {f"U({a}, {b}, x)": qx.QX_Tricomi(x, a, b)
           for a, b in ((0.5, 0.5), (1.0, 2.0), (-1.5, 0.5), (-2.0, 1.5))}, (-2, 6))
