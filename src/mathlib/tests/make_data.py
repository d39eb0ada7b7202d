#!/usr/bin/python3
"""Writes data/reference.dat: arguments that are hard for a mathematics library, and random ones,
with the values computed by mpmath to 80 digits. Each line holds the function, its arguments and
the value as a sum of two doubles, all in hexadecimal."""
import math
import pathlib
import random

import mpmath as mp

mp.mp.prec = 2400  # argument reduction may cancel over the whole exponent range
random.seed(20261)
HERE = pathlib.Path(__file__).parent


def spread(low, high, count):
    """Random arguments with uniform exponents, of both signs if low is negative."""
    signs = [1, -1] if low < 0 else [1]
    low = abs(low)
    return [random.choice(signs) * math.exp(random.uniform(math.log(low), math.log(high)))
            for _ in range(count)]


def near(value, count=2):
    result = [value]
    for _ in range(count):
        result += [math.nextafter(result[0], -math.inf), math.nextafter(result[-1], math.inf)]
        result.sort()
    return result


# 6381956970095103 * 2^797 is the double nearest to a multiple of pi/2 (W. Kahan).
TURNS = [1e10, 1e22, 1e300, 6381956970095103.0 * 2.0**797, 2.0**1023, 355.0, 710.0, 103993.0]
for multiple in (1, 2, 3, 4, 5, 10, 101, 2**20, 2**20 + 1, 10**8, 10**15):
    TURNS += near(float(multiple * mp.pi / 2), 1)
TINY = [5e-324, -1e-310, 2.0**-1022, 1e-300, -1e-20, 2.0**-28, 2.0**-27, 1e-8]
# Arguments with the largest errors that a local search found.
WORST = {
    "sin": ["-0x1.a191253366ca7p-1", "-0x1.3402b100c0ad3p+627"],
    "cos": ["0x1.2ca0ee5ba85fep+278", "-0x1.efbc97d79f95p+1"],
    "tan": ["-0x1.c278111c06f98p+214", "0x1.4c2f233aee644p-1"],
    "asin": ["-0x1.01f44114513c4p-1"], "acos": ["-0x1.0e13ef5a3962bp-1"],
    "atan": ["-0x1.6aa119cf022c9p-1", "0x1.61d1b89166789p-1"],
    "sinh": ["0x1.76c45ac1abc6bp-1", "-0x1.75686302ed1a9p-2"],
    "cosh": ["-0x1.40df6c705cfa4p+0", "0x1.84a37e7b81d9ep+3"],
    "tanh": ["-0x1.e08358fab534ap-3", "0x1.8255a97493a86p-3"],
    "exp": ["0x1.4abb4e579ac69p+3"], "exp2": ["-0x1.94acd915501f2p+6"],
    "expm1": ["0x1.81419d211ba62p-2", "0x1.6d99bbf3dd3eep-2"],
    "log": ["0x1.17b283d7d7da3p+0"], "log2": ["0x1.10393a600d2c7p+0"],
    "log10": ["0x1.6719634aa5a3fp-1"], "log1p": ["-0x1.306a34ba8005ap-2", "0x1.9d91ce13b4cebp-2"],
    "cbrt": ["-0x1.00de65bc10997p-9"],
}
UNARY = {
    "sin": (mp.sin, TURNS + TINY + spread(-1e-3, 1e3, 30) + spread(-1e3, 1e300, 20)),
    "cos": (mp.cos, TURNS + TINY + spread(-1e-3, 1e3, 30) + spread(-1e3, 1e300, 20)),
    "tan": (mp.tan, TURNS + TINY + spread(-1e-3, 1e3, 30) + spread(-1e3, 1e300, 20)),
    "asin": (mp.asin, TINY + near(0.5) + near(1.0)[:3] + spread(-1e-5, 1, 30)),
    "acos": (mp.acos, TINY + near(0.5) + near(-1.0)[2:] + spread(-1e-5, 1, 30)),
    "atan": (mp.atan, TINY + near(0.4375) + near(2.4375) + [1e300] + spread(-1e-5, 1e5, 30)),
    "sinh": (mp.sinh, TINY + near(0.34) + near(22.0) + near(710.4758, 1) + spread(-1e-5, 710, 40)),
    "cosh": (mp.cosh, TINY + near(0.34) + near(22.0) + near(710.4758, 1) + spread(-1e-5, 710, 40)),
    "tanh": (mp.tanh, TINY + near(0.1733) + near(22.0) + [700.0] + spread(-1e-5, 22, 40)),
    "exp": (mp.exp, TINY + near(709.78, 1) + near(-708.39, 1) + [-740.0] + spread(-1e-5, 700, 30)),
    "exp2": (lambda x: mp.mpf(2)**x, TINY + [1023.5, -1022.5, -1070.5] + spread(-1e-5, 1e3, 30)),
    "expm1": (mp.expm1, TINY + [-50.0, 709.0] + spread(-1e-5, 40, 30)),
    "log": (mp.log, [t for t in TINY if t > 0] + near(1.0) + spread(1e-300, 1e300, 20)
            + spread(0.5, 2, 20)),
    "log2": (lambda x: mp.log(x, 2), [5e-324, 1e-300] + near(1.0) + spread(1e-300, 1e300, 20)
             + spread(0.5, 2, 20)),
    "log10": (mp.log10, [5e-324, 1e-300] + near(1.0) + [1e22] + spread(1e-300, 1e300, 20)
              + spread(0.5, 2, 20)),
    "log1p": (mp.log1p, TINY + near(-0.2928932) + near(-1.0)[3:] + [1e300]
              + spread(-1e-5, 0.99, 20) + spread(1, 1e10, 10)),
    "cbrt": (lambda x: mp.sign(x) * mp.cbrt(abs(x)), TINY + [1e300] + spread(-1e-300, 1e300, 30)),
    "sqrt": (mp.sqrt, [abs(t) for t in TINY] + spread(1e-300, 1e300, 20)),
    "floor": (mp.floor, near(1.0) + near(-7.0) + [0.5, -0.5, 2.0**52 - 0.5, 1e300]
              + spread(-0.1, 1e17, 30)),
}
PAIRS = [(5e-324, 5e-324), (5e-324, -1e-310), (1e-310, 1.0), (1.0, 1e-310), (1e308, -1e308),
         (1e300, 1e290), (-1e-300, 1e-290), (2.0**-64, -1.0), (3.0, -2.0**66), (1.0, -2.0**-65),
         (0.4375, 1.0), (0.6875, 1.0), (1.1875, 1.0), (2.4375, 1.0), (-1.0, -1.0),
         (float.fromhex("-0x1.76290f90b3656p-1"), float.fromhex("0x1.7572c008b6a2bp+2")),
         (float.fromhex("0x1.a268caaeabd1bp+3"), float.fromhex("0x1.e37ddef3efdafp+4"))]
BINARY = {
    "atan2": (mp.atan2, PAIRS + list(zip(spread(-1e-3, 1e3, 60), spread(-1e-3, 1e3, 60)))),
    "pow": (lambda x, y: mp.mpf(x)**mp.mpf(y),
            [(-2.0, 3.0), (-3.0, -2.0), (10.0, 308.0), (10.0, -320.0), (5e-324, 0.5),
             (math.nextafter(1.0, 2), 1e18), (0.9999999, 1e9), (1e-310, 1.5), (1e300, 0.001)]
            + list(zip(spread(1e-3, 1e3, 60), spread(-1e-3, 100, 60)))),
    "hypot": (lambda x, y: mp.sqrt(mp.mpf(x)**2 + mp.mpf(y)**2),
              PAIRS[:4] + PAIRS[5:] + list(zip(spread(-1e-3, 1e3, 40), spread(-1e-3, 1e3, 40)))),
    "fmod": (lambda x, y: mp.sign(x) * mp.fmod(abs(x), abs(y)),
             [(1e300, 3.0), (5.5, 1e-310), (-7.0, 2.5), (1e22, 6.283185307179586), (1e-310, 5e-324)]
             + list(zip(spread(-1e-3, 1e15, 40), spread(-1e-3, 1e3, 40)))),
}


def main():
    lines = []
    cases = [(name, f, [(float(x),) for x in values + [float.fromhex(w) for w in WORST.get(name, [])]])
             for name, (f, values) in UNARY.items()]
    cases += [(name, f, values) for name, (f, values) in BINARY.items()]
    for name, f, rows in cases:
        for row in rows:
            value = mp.mpf(f(*[mp.mpf(x) for x in row]))
            high = float(value)
            low = float(value - mp.mpf(high))
            lines.append(" ".join([name] + [x.hex() for x in row] + [high.hex(), low.hex()]))
    (HERE / "data").mkdir(exist_ok=True)
    (HERE / "data/reference.dat").write_text("\n".join(lines) + "\n")


if __name__ == "__main__":
    main()
