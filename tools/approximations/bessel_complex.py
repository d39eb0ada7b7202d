#!/usr/bin/python3
"""Constants of the complex Bessel functions: src/special/tables/bessel_complex.h.

The polynomials u_k of Debye's expansion (F. W. J. Olver, Asymptotics and Special Functions, 1974,
chapter 10), logarithms and arc tangents in two doubles, and 1 / gamma(1 + x) about 0.

usage: bessel_complex.py > src/special/tables/bessel_complex.h
"""

from fractions import Fraction

from mpmath import atan, log, mp, mpf, pi, rgamma, taylor

mp.dps = 60
DEBYE = 20
STEPS = 32
RECIPROCAL = 24


def debye_polynomials(count):
    # u_{k+1}(t) = t^2 (1 - t^2) u_k'(t) / 2 + 1/8 int_0^t (1 - 5 s^2) u_k(s) ds; u_k = t^k times
    # a polynomial in t^2, whose coefficients are kept here
    u = [[Fraction(1)]]
    while len(u) < count:
        k = len(u) - 1
        following = [Fraction(0)] * (k + 2)
        for j, c in enumerate(u[-1]):
            power = k + 2 * j
            following[j] += c * power / 2 + c / (8 * (power + 1))
            following[j + 1] += -c * power / 2 - 5 * c / (8 * (power + 3))
        u.append(following)
    return u


def pair(value):
    high = float(value)
    return f"{{{high.hex()}, {float(value - high).hex()}}}"


def lines(values, joint=", "):
    text = line = ""
    for value in values:
        if line and len(line) + len(value) > 92:
            text += f"    {line.rstrip()}\n"
            line = ""
        line += value + joint
    return text + f"    {line.rstrip()}\n"


print("""#ifndef QX_SPECIAL_TABLES_BESSEL_COMPLEX_H
#define QX_SPECIAL_TABLES_BESSEL_COMPLEX_H

#include "frame/extended.h"

// Made by tools/approximations/bessel_complex.py.

// clang-format off

namespace qx::table {
""")
print("// u_k(t) = t^k times a polynomial in t^2 of degree k, ascending.")
print(f"inline constexpr int longDebyeCount = {DEBYE};")
print("inline constexpr double longDebye[longDebyeCount][longDebyeCount] = {")
for row in debye_polynomials(DEBYE):
    values = [repr(float(mpf(c.numerator) / c.denominator)) for c in row]
    body = lines(values).strip().rstrip(",")
    print(f"    {{{body}}},")
print("};\n")
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
