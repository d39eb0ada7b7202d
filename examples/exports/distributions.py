"""
Distributions
=============
"""

import numpy as np
import qx
from qx.plots import curves

# %%
# Probabilities and quantiles
# ---------------------------

print("P(T <= 2.5), 9 degrees of freedom ", qx.TDist_head(2.5, 9))
print("quantile of that probability      ", qx.InvTdist_head(qx.TDist_head(2.5, 9), 9))
print("chi-square, 95 % point, 4 degrees ", qx.InvChiSquare_head(0.95, 4))

# %%
# Student's distribution approaches the normal distribution
# ---------------------------------------------------------

t = np.linspace(-4, 4, 200)
curves(t, {**{f"dof {dof}": qx.TDist_head(t, dof) for dof in (1, 3, 10)},
           "normal": qx.NormDist_head(t)}, xlabel="t")

# %%
# Chi-square and F distributions
# ------------------------------

x = np.linspace(0, 20, 300)
curves(x, {f"dof {dof}": qx.ChiSquare_head(x, dof) for dof in (1, 2, 5, 10)},
       xlabel="chi-square")
f = np.linspace(0, 5, 300)
curves(f, {f"dof {n}, {d}": qx.FDist_head(f, n, d) for n, d in ((1, 4), (5, 4), (10, 40))},
       xlabel="F")

# %%
# Quantiles
# ---------

p = np.linspace(0.005, 0.995, 200)
curves(p, {"normal": qx.InvNdist_head(p), "t, dof 3": qx.InvTdist_head(p, 3),
           "chi-square, dof 2": qx.InvChiSquare_head(p, 2)}, (-4, 9), "p")
