#!/usr/bin/python3
"""Writes data/windows.dat: windows from their formulas at 40 digits (mpmath), Dolph-Chebyshev from
the product form of the Chebyshev polynomial's inverse transform, each value rounded to double.

A line: NAME FORM PARAM n w[0] ... w[n-1].  FORM is periodic or symmetric."""

from pathlib import Path

from mpmath import acosh, besseli, cos, cosh, exp, mp, mpf, pi, sin, sqrt

mp.dps = 40

COSINE_SUMS = {
    1: ["0.5", "0.5"],
    2: ["0.54", "0.46"],
    3: ["0.42323", "0.49755", "0.07922"],
    4: ["0.4265907136715391", "0.4965606190885641", "0.07684866723989682"],
    5: ["0.42", "0.5", "0.08"],
    6: ["0.215578948", "0.41663158", "0.277263158", "0.083578947", "0.006947368"],
    7: ["0.35875", "0.48829", "0.14128", "0.01168"],
    8: ["0.27105140069342415", "0.43329793923448606", "0.21812299954311062", "0.0659254463880309",
        "0.010811742098372268", "0.0007765848252250934", "1.3887217350903198e-05"],
    9: ["0.323215218", "0.471492057", "0.17553428", "0.028497078", "0.001261367"],
    11: ["0.3635819", "0.4891775", "0.1365995", "0.0106411"],
}


def cosine_sum(a):
    return lambda t: sum((-1) ** k * mpf(c) * cos(2 * pi * k * t) for k, c in enumerate(a))


def parzen(t):
    u = abs(2 * t - 1)
    return 1 - 6 * u ** 2 + 6 * u ** 3 if u <= mpf(1) / 2 else 2 * (1 - u) ** 3


def bohman(t):
    u = abs(2 * t - 1)
    return (1 - u) * cos(pi * u) + sin(pi * u) / pi


# Windows as functions of t = i / denominator in [0, 1].
SHAPES = {
    30: lambda t: 1 - abs(2 * t - 1),
    31: lambda t: mpf("0.62") - mpf("0.48") * abs(t - mpf(1) / 2) - mpf("0.38") * cos(2 * pi * t),
    32: bohman,
    33: parzen,
    34: lambda t: 1 - (2 * t - 1) ** 2,
}


def kaiser(beta):
    return lambda t: besseli(0, beta * sqrt(1 - (2 * t - 1) ** 2)) / besseli(0, beta)


def chebyshev(order, y):
    if abs(y) <= 1:
        return cos(order * mp.acos(y))
    return cosh(order * acosh(y)) if y > 0 else (-1) ** order * cosh(order * acosh(-y))


def dolph_chebyshev(length, ratio):
    """Plain sum over all frequencies, without using symmetry; the window is centred on (length - 1) / 2."""
    order = length - 1
    x0 = cosh(acosh(mpf(ratio)) / order)
    middle = mpf(order) / 2
    spectrum = [chebyshev(order, x0 * cos(pi * k / length)) for k in range(length)]
    w = [sum(s * cos(2 * pi * k * (i - middle) / length) for k, s in enumerate(spectrum))
         for i in range(length)]
    peak = max(w)
    return [v / peak for v in w]


def lines():
    def line(name, form, param, w):
        return " ".join([str(name), form, repr(param), str(len(w))] + [repr(float(v)) for v in w])

    for n in (2, 3, 4, 8, 9, 64, 101):
        for name, shape in [*((k, cosine_sum(a)) for k, a in COSINE_SUMS.items()), *SHAPES.items()]:
            yield line(name, "periodic", 0.0, [shape(mpf(i) / n) for i in range(n)])
            yield line(name, "symmetric", 0.0, [shape(mpf(i) / (n - 1)) for i in range(n)])
        for beta in (0.5, 4.0, 8.6):
            yield line(60, "periodic", beta, [kaiser(beta)(mpf(i) / n) for i in range(n)])
        for ratio in (10.0, 1000.0):
            yield line(61, "symmetric", ratio, dolph_chebyshev(n, ratio))
            yield line(61, "periodic", ratio, dolph_chebyshev(n + 1, ratio)[:n])
        for sigma in (0.1, 0.2, 3.0):
            yield line(62, "symmetric", sigma,
                       [exp(-((i - mpf(n - 1) / 2) / (sigma * n)) ** 2 / 2) for i in range(n)])
            yield line(62, "periodic", sigma,
                       [exp(-((i - mpf(n) / 2) / (sigma * mpf(n + 1))) ** 2 / 2)
                        for i in range(n)])


if __name__ == "__main__":
    (Path(__file__).parent / "data" / "windows.dat").write_text("\n".join(lines()) + "\n")
