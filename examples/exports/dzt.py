"""
Narrow band of a long transform
===============================
"""

import numpy as np
import qx

# %%
# A narrow band of a long spectrum, without computing the rest
# ------------------------------------------------------------

x = np.cos(2 * np.pi * 1000.25 * np.arange(4096) / 4096)
_, band = qx.ReDZTH(x, 4, 4096, 4 * 1000 - 4, 9)
print("quarter bins from 999 to 1001:", np.abs(band).round(1))
