"""
Order statistics
================
"""

import numpy as np
import qx

# %%
# Median and mode
# ---------------

x = np.array([2.0, 4, 4, 4, 5, 5, 7, 90])
print("median", qx.Median_head(x), " mean", qx.Mean_head(x))
print("modes ", qx.ModeH(x, 0))

# %%
# The fullest of twenty bins
# --------------------------

samples = np.random.default_rng(1).gamma(3.0, size=2000)
print("most values lie around", qx.ModeH(samples, 20))
