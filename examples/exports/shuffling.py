"""
Shuffling
=========
"""

import numpy as np
import qx

# %%
# A shuffle also returns the original index of each element
# ---------------------------------------------------------

x = np.array([1.5, 2.5, 3.5, 4.5, 5.5])
state = {"s1": 1, "s2": 2, "s3": 3}
shuffled, indices, state = qx.RiffleArrayDBL2012_head(x, 42, state, 1)
print(shuffled, indices)
print(np.array_equal(shuffled, x[indices]))

# %%
# A random permutation of numbers
# -------------------------------

order, state = qx.RiffleIntNum2012_head(8, -1, state, 1)
print(order)
