"""Shared by the scripts in this folder: lines of a data file and points next to thresholds."""

import mpmath
from mpmath import mp, mpf

mp.dps = 40
EPS = mpf(2)**-52
STEP = mpf(2)**-40  # off a threshold, to either side


def sides(*thresholds):
    for t in thresholds:
        yield float(mpf(t) * (1 - STEP))
        yield float(mpf(t) * (1 + STEP))


def row(name, arguments, output, value, tolerance, scale=0):
    """Prints NAME ARGUMENT ... OUTPUT VALUE BOUND; the bound is absolute: a multiple of eps times the
    larger of the value and a scale. It is about four times the measured peak. Values outside the range
    of doubles are left out."""
    value = mpmath.re(value)
    if value != 0 and not 1e-290 < abs(value) < 1e308:
        return
    bound = tolerance * EPS * max(abs(value), scale)
    print(name, *[repr(float(a)) for a in arguments], output, mpmath.nstr(value, 20), mpmath.nstr(bound, 3))
