"""
Basic statistics
================
"""

import numpy as np
import qx

# %%
# Location and spread
# -------------------

x = np.array([2.0, 4, 4, 4, 5, 5, 7, 9])
print("mean    ", qx.Mean_head(x))
print("RMS     ", qx.RMS_head(x))
print("variance", qx.Moment_head(x, 2))

# %%
# A failure has a code, a name and a text
# ---------------------------------------

try:
    qx.Moment_head(x, 0)
except qx.QxError as error:
    print(error.code, error.name, "-", error.text)
