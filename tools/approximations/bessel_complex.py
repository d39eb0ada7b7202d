#!/usr/bin/python3
"""Constants of the complex Bessel functions: src/special/tables/bessel_complex.h.

Logarithms and arc tangents in two doubles, and 1 / gamma(1 + x) about 0.

usage: bessel_complex.py > src/special/tables/bessel_complex.h
"""

from mpmath import atan, log, mp, mpf, pi, rgamma, taylor

from debye import lines

mp.dps = 60
STEPS = 32
RECIPROCAL = 24


def pair(value):
    high = float(value)
    return f"{{{high.hex()}, {float(value - high).hex()}}}"


print("""#ifndef QX_SPECIAL_TABLES_BESSEL_COMPLEX_H
#define QX_SPECIAL_TABLES_BESSEL_COMPLEX_H

#include "frame/extended.h"

// Made by tools/approximations/bessel_complex.py.

// clang-format off

namespace qx::table {
""")
print("// 1 / gamma(1 + x) = sum of c[k] x^k, for |x| <= 1/2.")
print("inline constexpr double reciprocalGamma[] = {")
print(lines([repr(float(c)) for c in taylor(lambda x: rgamma(1 + x), 0, RECIPROCAL - 1)])
      + "};\n")
print(f"inline constexpr int logarithmSteps = {STEPS};")
print("// ln(k / 32) for k = first to 46.")
FIRST = 22
print(f"inline constexpr int firstLogarithm = {FIRST};")
print("inline constexpr Extended logarithms[] = {")
print(lines([pair(log(mpf(k) / STEPS)) for k in range(FIRST, 47)]) + "};\n")
print("// atan(k / 32) for k = 0 to 32.")
print("inline constexpr Extended arcTangents[] = {")
print(lines([pair(atan(mpf(k) / STEPS)) for k in range(0, STEPS + 1)]) + "};\n")
for name, value in (("extendedLnTwo", log(mpf(2))), ("extendedHalfPi", pi / 2),
                    ("extendedPi", +pi)):
    print(f"inline constexpr Extended {name} = {pair(value)};")
print("\n} // namespace qx::table\n\n// clang-format on\n\n#endif")
