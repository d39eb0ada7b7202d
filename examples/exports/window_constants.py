"""
Window constants
================
"""

import numpy as np
import qx

# %%
# Noise bandwidth and coherent gain
# ---------------------------------

for name, selector in (("rectangle", 0), ("Hanning", 1), ("flat top", 6), ("Dolph-Chebyshev", 61)):
    constants = qx.WinConstByNameH_2016(1024, selector, np.nan)
    print(f"{name:16} {constants['enbw']:.4f} bins, gain {constants['cg']:.4f}")
