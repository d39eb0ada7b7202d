"""
Pulses
======
"""

import numpy as np
import qx

# %%
# A step with ringing
# -------------------

t = np.arange(400)
decay = np.exp(-(t - 120) / 30.0)
y = np.where(t < 120, 0.0, 1 - decay * np.cos((t - 120) / 12.0))
high, low, amplitude = qx.StateLevels(y, 0.0, 1e-3, 0, 100, 0)
print(f"states at {low:.3f} and {high:.3f}")

# %%
# Its transition, between 10% and 90% of the amplitude
# ----------------------------------------------------

levels = {"high": 90.0, "mid": 50.0, "low": 10.0, "percent": 1}
options = {"method": 0, "bins": 100}
(levels, slew, duration, start, end, low_ref, mid_ref, high_ref, pre_under, pre_over, post_under,
 post_over) = qx.TransMeas(y, 0.0, 1e-3, 1, 1, levels, options, 0)
print(f"rises in {1e3 * duration:.2f} ms from {start:.4f} s on, overshoot {post_over:.1f}%")
import matplotlib.pyplot as plt
figure, axes = plt.subplots(figsize=(8, 2.6))
axes.plot(t * 1e-3, y, color="#8795a6", linewidth=0.9)
axes.plot([start, end], [low_ref, high_ref], "o", color="#2f6db3")
axes.set(xlabel="Time (s)")

# %%
# Pulses: period, width and duty cycle
# ------------------------------------

square = np.repeat(np.tile([0.0, 1.0], 6), 50) + 0.01 * np.random.default_rng(2).normal(size=600)
levels = {"high": 90.0, "mid": 50.0, "low": 10.0, "percent": 1}
period, width, duty, center, *references = qx.PulseMeas(square, 0.0, 1e-3, 1, 2, levels, options, 0)
print(f"period {period:.4f} s, width {width:.4f} s, duty cycle {duty:.3f}, center {center:.4f} s")
