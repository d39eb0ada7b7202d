"""
Filter a signal that never ends
===============================

Samples arrive in blocks of any size. A stream keeps the state of the filter from block to block, and the results
are bit for bit those of the whole signal.
"""

import matplotlib.pyplot as plt
import numpy as np
import qx

random = np.random.default_rng(7)
x = random.normal(size=4000)
blocks = np.split(x, [10, 1000, 1001, 3500])
print("blocks of", [len(block) for block in blocks])

bandlimit = qx.filters.elliptic(5, 0.1, 60, 100, fs=1000)
stream = bandlimit.stream()
y = np.concatenate([stream(block) for block in blocks])
print("the same bits as the whole:", bool(np.array_equal(y, bandlimit(x))))

figure, axes = plt.subplots(figsize=(8, 3))
axes.plot(x, color="0.8")
axes.plot(y)
for edge in (10, 1000, 3500):
    axes.axvline(edge, color="0.4", linestyle=":")
axes.set(xlabel="Sample", xlim=(0, 4000))

# %%
# One stream can filter several channels.

channels = random.normal(size=(8, 4000))
stream = bandlimit.stream(channels=8)
parts = [stream(channels[:, start:start + 256]) for start in range(0, 4000, 256)]
print("the same bits:", bool(np.array_equal(np.hstack(parts), bandlimit(channels))))

# %%
# A copy of a stream continues independently; ``reset`` returns to the initial state.

other = stream.copy()
stream.reset()
first = channels[:, :256]
print("after the reset:", np.array_equal(stream(first), parts[0]))
print("the copy continued:", not np.array_equal(other(first), parts[0]))

# %%
# Running statistics work in the same way.

running = qx.stats.Running()
for block in blocks:
    latest = running(block)
latest
