import matplotlib.pyplot as plt
import numpy as np
import qx


def plot(x, curves, ylim=None, xlabel="x"):
    """One plot of several named curves."""
    figure, axes = plt.subplots(figsize=(8, 2.8))
    for name, y in curves.items():
        y = np.asarray(y, float).copy()
        if ylim:
            y[(y < 3 * ylim[0]) | (y > 3 * ylim[1])] = np.nan  # poles stay open
            axes.set_ylim(*ylim)
        axes.plot(x, y, label=name, linewidth=1.2)
    axes.axhline(0, color="#8795a6", linewidth=0.6)
    axes.set_xlabel(xlabel)
    axes.legend(frameon=False, fontsize=8, loc="upper left", bbox_to_anchor=(1.0, 1.0))


#%% The gamma function, its logarithm and the digamma function
x = np.linspace(0.02, 5, 500)
plot(x, {"gamma": qx.call("QX_Gamma", x, np.nan), "ln gamma": qx.call("QX_LnGamma", x),
         "digamma": qx.call("QX_Psi", x)}, (-4, 8))

#%% Incomplete gamma and beta functions
x = np.linspace(0.001, 12, 400)
plot(x, {f"P({a}, x)": qx.call("QX_Gamma", a, x) for a in (0.5, 2.0, 6.0)})
x = np.linspace(0.001, 0.999, 400)
plot(x, {f"I x({a}, {b})": qx.call("QX_Beta", a, b, x) for a, b in ((0.5, 0.5), (2.0, 5.0))})
