"""Rational approximations by interpolation at Chebyshev points, in multiple precision.

A rational interpolant at the Chebyshev points of the interval comes within a small factor of the
minimax error. That is as good as minimax here, because degrees are chosen so that the error of
the approximation is well below half an ulp of a double.
"""

from mpmath import mp, mpf, matrix, lu_solve, cos, pi

mp.dps = 60


def nodes(a, b, n):
    return [(a + b) / 2 + (b - a) / 2 * cos((2 * i + 1) * pi / (2 * n)) for i in range(n)]


def horner(coefficients, x):
    """Ascending coefficients."""
    y = mpf(0)
    for c in reversed(coefficients):
        y = y * x + c
    return y


def as_double(x):
    return mpf(float(x))


def solve(points, function, p, q):
    n = p + q + 1
    system, right = matrix(n, n), matrix(n, 1)
    for i, h in enumerate(points):
        f = function(h)
        for j in range(p + 1):
            system[i, j] = h**j
        for j in range(q):
            system[i, p + 1 + j] = -f * h ** (j + 1)
        right[i] = f
    s = lu_solve(system, right)
    return [s[j] for j in range(p + 1)], [mpf(1)] + [s[p + 1 + j] for j in range(q)]


def fits(function, a, b, p, q, warp, centre):
    """(centre, exact coefficients, coefficients as doubles), with the coefficients rounded in several ways.

    The coefficients are in powers of the distance from the centre. Either all are rounded, or the
    denominator is rounded first and the numerator then fitted to it, which compensates for the
    rounding of the denominator where that is large.
    """
    low, high, unwarp = warp[0](a), warp[0](b), warp[1]
    values = {}

    def known(x):
        if x not in values:
            values[x] = function(x)
        return values[x]
    candidates = (as_double((a + b) / 2), mpf(0)) if centre is None else (as_double(centre),)
    for centre in candidates:
        def points(n):
            return [unwarp(x) - centre for x in nodes(low, high, n)]
        exact = solve(points(p + q + 1), lambda h: known(h + centre), p, q)
        numerator, denominator = ([as_double(c) for c in cs] for cs in exact)
        yield centre, exact, (numerator, denominator)
        refitted, _ = solve(points(p + 1), lambda h: horner(exact[0], h) / horner(exact[1], h)
                            * horner(denominator, h), p, 0)
        yield centre, exact, ([as_double(c) for c in refitted], denominator)


def errors(function, a, b, centre, sets, weight, points=151):
    """The largest error relative to function * weight, for each pair of coefficient sets."""
    worst = [mpf(0)] * len(sets)
    signs = [None] * len(sets)
    for i in range(points):
        x = a + (b - a) * mpf(2 * i + 1) / (2 * points)
        f = function(x)
        for k, (numerator, denominator) in enumerate(sets):
            q = horner(denominator, x - centre)
            if signs[k] is not None and (q > 0) != signs[k]:
                raise ArithmeticError("the denominator changes its sign in the interval")
            signs[k] = q > 0
            worst[k] = max(worst[k], abs(horner(numerator, x - centre) / q / f - 1) * weight(x))
    return worst


PLAIN = (lambda x: x, lambda x: x)


class Table:
    """A C++ header of coefficient sets, each with its interval and its measured error."""

    def __init__(self, script, guard):
        self.lines = [
            f"#ifndef {guard}", f"#define {guard}", "", '#include "special/rational.h"', "",
            f"// Made by tools/approximations/{script}. Each set: the centre, then numerator and",
            "// denominator in ascending powers of the distance from the centre. The comment gives",
            "// the degrees, the interval, and the largest relative error measured there, first with",
            "// exact coefficients, then with these doubles.", "",
            "namespace qx::table {", ""]
        self.guard = guard

    def values(self, values, indent="    "):
        text = [f"{float(v)!r}" for v in values]
        body, line = [], indent
        for i, t in enumerate(text):
            piece = t + ("," if i + 1 < len(text) else "")
            if len(line) + len(piece) > 98:
                body.append(line.rstrip())
                line = indent
            line += piece + " "
        return body + [line.rstrip()]

    def array(self, name, values):
        self.lines += [f"inline constexpr double {name}[] = {{"] + self.values(values) + ["};"]

    def comment(self, line):
        while len(line) > 97:
            cut = line.rindex(" ", 0, 97)
            self.lines.append("// " + line[:cut])
            line = line[cut + 1:]
        self.lines.append("// " + line)

    def add(self, name, what, function, a, b, p, q, warp=PLAIN, weight=lambda x: 1, shift=0,
            centre=None):
        """With a shift, the fit and the error are those of function + shift, which then has no zero.
        A centre is given if the terms would cancel in powers about 0 or about the middle of the interval."""
        a, b = mpf(a), mpf(b)
        best = None
        plain = function
        function = (lambda x: plain(x) + shift) if shift else plain
        for centre, exact, rounded in fits(function, a, b, p, q, warp, centre):
            try:
                worst = errors(function, a, b, centre, [exact, rounded], weight, 41)
            except ArithmeticError:
                continue
            if best is None or worst[1] < best[0]:
                best = worst[1], centre, exact, rounded
        _, centre, exact, rounded = best
        worst = errors(function, a, b, centre, [exact, rounded], weight)
        line = (f"{what}; degree {p} over {q} on [{mp.nstr(a, 6)}, {mp.nstr(b, 6)}]: "
                f"{mp.nstr(worst[0], 2)}, {mp.nstr(worst[1], 2)}")
        print(name, line, flush=True)
        self.comment(line)
        numerator, denominator = rounded
        if shift:
            numerator = [c - shift * d for c, d in zip(exact[0], denominator + [0] * p)]
        self.lines += [f"inline constexpr Rational<{p + 1}, {q + 1}> {name} = {{",
                       f"    {float(centre)!r},", "    {"] + self.values(numerator, "        ") + \
                      ["    },", "    {"] + self.values(denominator, "        ") + ["    }", "};", ""]

    def pieces(self, name, what, function, width, count, degree):
        """Polynomials on `count` intervals of the same width from 0 on, in the distance from the middle of the
        interval in widths."""
        rows, worst, rounded = [], mpf(0), mpf(0)
        for k in range(count):
            values = [(h, function(width * (k + mpf(1) / 2 + h))) for h in nodes(-mpf(1) / 2, mpf(1) / 2, degree + 1)]
            system = matrix(degree + 1, degree + 1)
            for i, (h, _) in enumerate(values):
                for j in range(degree + 1):
                    system[i, j] = h**j
            exact = list(lu_solve(system, matrix([f for _, f in values])))
            for i in range(9):
                h = mpf(i - 4) / 9
                f = function(width * (k + mpf(1) / 2 + h))
                worst = max(worst, abs(horner(exact, h) / f - 1))
                rounded = max(rounded, abs(horner([as_double(c) for c in exact], h) / f - 1))
            rows.append(exact)
        line = (f"{what}; degree {degree} in {count} pieces of width {mp.nstr(width, 6)} from 0 on: "
                f"{mp.nstr(worst, 2)}, {mp.nstr(rounded, 2)}")
        print(name, line, flush=True)
        self.comment(line)
        self.lines += [f"inline constexpr double {name}[{count}][{degree + 1}] = {{"]
        for row in rows:
            body = self.values(row, "     ")
            body[0] = "    {" + body[0].lstrip()
            body[-1] += "},"
            self.lines += body
        self.lines += ["};", ""]

    def pairs(self, name, what, values, rest=lambda v, high: v - high):
        """Numbers in twice the precision, each as a double and the rest."""
        self.comment(what)
        self.lines += [f"inline constexpr Extended {name}[] = {{"]
        for v in values:
            high = as_double(v)
            self.lines.append(f"    {{{float(high).hex()}, {float(rest(v, high)).hex()}}},")
        self.lines += ["};", ""]

    def write(self, path):
        with open(path, "w") as file:
            file.write("\n".join(self.lines + ["} // namespace qx::table", "", "#endif", ""]))
