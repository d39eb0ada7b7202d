#!/usr/bin/python3
"""Writes dct_dst.dat: SciPy's cosine (type II, orthonormal) and sine (type I) transforms.

Each line: kind (dct, dst, dct2, dst2), rows, cols, then rows*cols inputs and as many results.
SciPy's type I sine transform has a factor 2 for each dimension, which is removed here.
"""
import numpy as np
import scipy.fft

rng = np.random.default_rng(20)
lines = []


def write(kind, x, y):
    x, y = np.atleast_2d(x), np.atleast_2d(y)
    numbers = " ".join(float(v).hex() for v in np.concatenate([x.ravel(), y.ravel()]))
    lines.append(f"{kind} {x.shape[0]} {x.shape[1]} {numbers}")


for n in (1, 2, 3, 8, 9, 26):
    x = rng.uniform(-1, 1, n)
    write("dct", x, scipy.fft.dct(x, type=2, norm="ortho"))
    write("dst", x, scipy.fft.dst(x, type=1) / 2)
for shape in ((3, 4), (4, 3), (5, 2)):
    x = rng.uniform(-1, 1, shape)
    write("dct2", x, scipy.fft.dctn(x, type=2, norm="ortho"))
    write("dst2", x, scipy.fft.dstn(x, type=1) / 4)
with open("dct_dst.dat", "w") as file:
    file.write("\n".join(lines) + "\n")
