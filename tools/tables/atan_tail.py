#!/usr/bin/python3
"""Prints the coefficients of the tail of the arctangent in src/mathlib/atan2.c:
(atan(t) - t) / t^3 in powers of t^2, for |t| up to 7/16, by Chebyshev interpolation."""
import mpmath as mp

mp.mp.dps = 60
LIMIT = mp.mpf(7) / 16


def tail(u):
    if u < mp.mpf(10) ** -15:
        return -mp.mpf(1) / 3 + u / 5 - u * u / 7
    t = mp.sqrt(u)
    return (mp.atan(t) - t) / t**3


ascending = [float(c) for c in reversed(mp.chebyfit(tail, [0, LIMIT**2], 12))]
points = [LIMIT * k / 500 for k in range(1, 501)]
error = max(abs(mp.polyval([mp.mpf(c) for c in reversed(ascending)], t * t) * t**2
                + 1 - mp.atan(t) / t) for t in points)
print(f"/* |t| up to 7/16, relative error of the arctangent below {mp.nstr(error, 2)} */")
print(",\n".join(c.hex() for c in ascending))
