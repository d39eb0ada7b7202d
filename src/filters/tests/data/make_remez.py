#!/usr/bin/python3
"""Equiripple filters by SciPy for fir_design_test: kind (as for Parks), taps, for each band the desired
value, its edges and its weight, then the largest weighted deviation of SciPy's taps over the grid
of the design. Frequencies are in units of the sampling rate. Designs that SciPy fails to make are left out.

usage: make_remez.py > remez.dat
"""

import numpy as np
from scipy import signal

KINDS = ["bandpass", "differentiator", "hilbert"]
noise = np.random.default_rng(20)


def grid(kind, taps, bands):
    """The grid: sixteen points per extremum, each band including its upper edge."""
    functions = taps // 2 + (taps % 2 and kind == 0)
    step = 0.5 / (16 * functions)
    points = []
    for b, (desired, low, high, weight) in enumerate(bands):
        f = max(low, step) if b == 0 and kind else low
        part = np.append(np.arange(f, high, step), high)
        # The last point before the edge is replaced by the edge.
        points += [(f, desired, weight) for f in np.delete(part, -2) if len(part) > 1] or [
            (high, desired, weight)]
    zero_at_nyquist = (kind == 0) != (taps % 2 == 1)
    return [p for p in points if not (zero_at_nyquist and p[0] > 0.5 - step)]


def deviation(kind, h, points):
    f, desired, weight = np.array(points).T
    middle = (len(h) - 1) / 2
    angles = 2 * np.pi * np.outer(f, np.arange(len(h)) - middle)
    response = (np.cos(angles) if kind == 0 else -np.sin(angles)) @ h
    if kind == 1:
        weight = np.where(desired >= 0.0001, weight / f, weight)
        desired = desired * f
    return np.abs((response - desired) * weight).max()


def random_bands(kind, taps):
    if kind:
        low = 0.0 if kind == 1 else noise.uniform(0.02, 0.1)
        high = 0.5 if taps % 2 == 0 else noise.uniform(0.4, 0.48)
        return [(round(noise.uniform(0.5, 3), 2), low, high, round(noise.uniform(0.5, 4), 2))]
    count = noise.integers(2, 5)
    width = 4 * noise.uniform(0.5, 1.2) / taps  # of a transition
    while True:
        edges = np.sort(noise.uniform(0.02, 0.48, count - 1))
        low = np.append(0, edges + width / 2)
        high = np.append(edges - width / 2, 0.5)
        if (high - low).min() > width / 2:
            break
        width *= 0.9
    gains = noise.permuted(np.arange(count) % 2 if noise.random() < 0.7
                           else noise.uniform(0, 2, count))
    if taps % 2 == 0:
        gains[-1] = 0
    return [(round(float(g), 3), l, h, round(float(w), 2)) for g, l, h, w in
            zip(gains, low, high, 10 ** noise.uniform(-1, 1, count))]


written = 0
while written < 300:
    kind = 0 if noise.random() < 0.7 else int(noise.integers(1, 3))
    taps = int(noise.integers(5, 40) if noise.random() < 0.5 else noise.integers(40, 260))
    bands = random_bands(kind, taps)
    edges = [edge for _, low, high, _ in bands for edge in (low, high)]
    try:
        h = signal.remez(taps, edges, [b[0] for b in bands], weight=[b[3] for b in bands], fs=1,
                         type=KINDS[kind], maxiter=100)
    except ValueError:
        continue
    ripple = deviation(kind, h, grid(kind, taps, bands))
    if ripple < 1e-9:  # rounding decides
        continue
    print("Parks", kind, taps, *(float(v).hex() for band in bands for v in band), ripple.hex())
    written += 1
