"""
Cosine and sine transforms
==========================
"""

import numpy as np
import qx

# %%
# A few cosines represent a smooth signal
# ---------------------------------------

x = np.exp(-np.linspace(-2, 2, 200)**2)
coefficients = qx.DCT_1DH(x, 0)
kept = coefficients.copy()
kept[20:] = 0
again = qx.InvDCT_1DH(kept)
print("20 of 200 coefficients, greatest error", np.abs(again - x).max())
