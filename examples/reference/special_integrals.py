import numpy as np
import qx
from qx.plots import curves

#%% Error function
x = np.linspace(-3, 3, 400)
curves(x, {"erf": qx.call("QX_Erf", x), "erfc": qx.call("QX_ErfC", x)})

#%% Exponential integrals
x = np.linspace(0.01, 3, 400)
curves(x, {f"E {n}": qx.call("QX_ExpI", x, n) for n in (0, 1, 2, 5)}, (0, 2.5))

#%% Sine and cosine integrals, hyperbolic sine and cosine integrals
x = np.linspace(0.05, 20, 500)
curves(x, {"Si": qx.call("QX_SinI", x), "Ci": qx.call("QX_CosI", x)})
x = np.linspace(0.05, 3, 300)
curves(x, {"Shi": qx.call("QX_SinhI", x), "Chi": qx.call("QX_CoshI", x)})

#%% Dilogarithm
x = np.linspace(0, 6, 400)
curves(x, {"Li2(1 - x)": qx.call("QX_Diln", x)})

#%% Dawson's integral and the Fresnel integrals
x = np.linspace(-6, 6, 600)
c, s = qx.call("QX_FresnelIntegrals", x)
curves(x, {"Dawson": qx.call("QX_Dawson", x), "Fresnel C": c, "Fresnel S": s})
