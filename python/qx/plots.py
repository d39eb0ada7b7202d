"""Plots of functions of one variable."""

import numpy as np


def curves(x, named, ylim=None, xlabel="x"):
    """A figure with the curves {name: values over x}. With `ylim`, the axis is limited to that range, and values far
    outside, as around a pole, are left out."""
    import matplotlib.pyplot as plt
    figure, axes = plt.subplots(figsize=(8, 2.8))
    for name, values in named.items():
        values = np.array(values, float)
        if ylim:
            low, high = ylim
            values[(values < low - (high - low)) | (values > high + (high - low))] = np.nan
            axes.set_ylim(low, high)
        axes.plot(x, values, label=name, linewidth=1.2)
    axes.axhline(0, color="#8795a6", linewidth=0.6)
    axes.set_xlabel(xlabel)
    axes.legend(frameon=False, fontsize=8, loc="upper left", bbox_to_anchor=(1.0, 1.0))
    return figure
