"""
Trigger
=======
"""

import numpy as np
import qx

# %%
# The first rising edge
# ---------------------

y = np.sin(2 * np.pi * np.arange(200) / 50 + 1)
index, position = qx.Triggerh(y, level=0.5, slope=0, start=0)
print(index, position)

# %%
# All edges of a stream in blocks, with a band against noise
# ----------------------------------------------------------

state, first = {}, 0
for block in np.split(y + np.random.default_rng(1).normal(0, 0.05, y.size), [30, 70, 71]):
    index = -1
    while True:
        state, index, position = qx.Triggerh_86(block, 0.0, 0.2, 2, index + 1, 5, state)
        if index < 0:
            break
        print(f"at {first + position:.2f}")
    first += block.size
