"""
Fourier transform in two dimensions
===================================
"""

import numpy as np
import qx

# %%
# A ripple across an image is one pair of bins
# --------------------------------------------

rows, cols = 12, 20
r, c = np.mgrid[:rows, :cols]
image = 3 + np.cos(2 * np.pi * (2 * r / rows + 5 * c / cols))
spectrum = qx.ReFFT2D_H(image, 0, 0, rows, cols, 0)
print("mean", spectrum[0, 0].real / image.size, " amplitude", 2 * abs(spectrum[2, 5]) / image.size)

# %%
# Forward and inverse
# -------------------

again = qx.ReInvFFT2D_H(spectrum, 0)
print("greatest difference", np.abs(again - image).max())
