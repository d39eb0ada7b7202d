#!/usr/bin/python3
"""The polynomials u_k and v_k of Debye's expansions, exactly: src/special/tables/debye.h.

Source: F. W. J. Olver, Asymptotics and Special Functions, 1974, chapter 10.

usage: debye.py > src/special/tables/debye.h
"""

from fractions import Fraction

COUNT = 20


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


def slope_polynomials(u):
    # v_{k+1}(t) = u_{k+1}(t) - t (1 - t^2) (u_k(t) / 2 + t u_k'(t)), likewise
    v = [list(row) for row in u]
    for k, row in enumerate(u[:-1]):
        for j, c in enumerate(row):
            part = c * (Fraction(1, 2) + k + 2 * j)
            v[k + 1][j] -= part
            v[k + 1][j + 1] += part
    return v


def lines(values, joint=", "):
    text = line = ""
    for value in values:
        if line and len(line) + len(value) > 92:
            text += f"    {line.rstrip()}\n"
            line = ""
        line += value + joint
    return text + f"    {line.rstrip()}\n"


def main():
    print("""#ifndef QX_SPECIAL_TABLES_DEBYE_H
#define QX_SPECIAL_TABLES_DEBYE_H

// Made by tools/approximations/debye.py.

// clang-format off

namespace qx::table {

// u_k(t), for the functions, and v_k(t), for their derivatives: t^k times a polynomial in t^2 of degree
// k, ascending.""")
    print(f"inline constexpr int debyeCount = {COUNT};")
    print("inline constexpr double debye[2][debyeCount][debyeCount] = {")
    u = debye_polynomials(COUNT)
    for rows in (u, slope_polynomials(u)):
        print("    {")
        for row in rows:
            body = lines([repr(c.numerator / c.denominator) for c in row]).strip().rstrip(",")
            print(f"    {{{body}}},")
        print("    },")
    print("};\n\n} // namespace qx::table\n\n// clang-format on\n\n#endif")


if __name__ == "__main__":
    main()
