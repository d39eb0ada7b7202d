#!/usr/bin/python3
"""Writes the straight-line transforms of the radices: one file kernels_<p>.cpp per radix, one for
each of a few small lengths that are transformed whole, and kernels_choice.cpp; for the loops of eight
lanes, passes_<p>.cpp and passes_choice.cpp. The file of a complex transform also holds the real
transform of twice its length that is built from it, and for odd primes from 11 on a table for single
transforms (whole.h).

    generate.py FOLDER

Each file holds four texts over a lane type V:

    PackedTransform<p>    p complex values to p complex values, real and imaginary part side by side
                          in one V
    SplitTransform<p>     the same, each part in a V of its own
    RealTransform<p>      p real values to their half-complex spectrum
    OddTransform<p>       for even p: p real values to the complex values at the half-odd
                          frequencies, X[q] = sum over j of x[j] exp(-2 pi i j (q + 1/2) / p),
                          2q + 1 < p

The files of the whole lengths have the first and, for odd p, the third.

All do the same arithmetic on the parts of each value, so packed and split data give the same bits.

The algebra works on expressions: a transform is a Python function from input expressions to
output expressions. Expressions are shared (equal ones are one node), signs move outward into
subtractions, and what no output needs is never written. So the real transforms are the complex
ones with the imaginary parts left out, and mirrored results cost nothing.

Transforms of a composite length n = r m follow Cooley and Tukey (1965): m-point transforms of
every r-th value, then for each k the r-point transform of their k-th results, turned by
exp(-2 pi i j k / n). Coprime factors need no turning (Good 1958, Thomas 1963). Odd primes work on
sums and differences of mirrored inputs. The order of the statements is the order of this
recursion, transform by transform, so that few values live at a time; see Frigo, "A fast Fourier
transform compiler" (1999), for the approach.
"""

import sys
from decimal import Decimal, getcontext
from math import gcd
from pathlib import Path

getcontext().prec = 60

RADICES = [2, 3, 4, 5, 7, 8, 9, 10, 11, 13, 14, 16, 17, 18, 19, 29, 31, 32, 37, 41, 43]
# Lengths of several factors that are transformed whole.
WHOLE = [6, 12, 15, 20, 24, 28, 30, 36, 40, 48]
# Real transforms of these are complex ones of half the length; below 20 the direct ones are faster.
BY_HALF = [n for n in range(20, 65, 2) if n // 2 in RADICES + WHOLE]
# Radices with loops of eight lanes for complex data.
WIDE = [4, 7, 8, 9, 10, 16, 32]
# Those with loops of eight lanes for columns of matrices.
WIDE_ABREAST = sorted([2, 3, 5, *WIDE])
# Those with stages of eight lanes for real data. Smaller ones fit the registers of four lanes.
WIDE_REAL = [16, 32]
# Composite length -> its factor r; coprime factors are recognised.
SPLIT = {4: 2, 6: 2, 8: 2, 9: 3, 10: 2, 12: 3, 14: 2, 15: 3, 16: 4, 18: 2, 20: 4,
         24: 3, 28: 4, 30: 5, 32: 4, 36: 4, 40: 5, 48: 3}


# ---- Exact constants -----------------------------------------------------------------------

def _pi():
    """Machin's formula."""
    def arctan_inverse(x):
        total = term = Decimal(1) / x
        k, square = 1, Decimal(x * x)
        while abs(term) > Decimal(10) ** -58:
            term /= -square
            k += 2
            total += term / k
        return total
    return 4 * (4 * arctan_inverse(5) - arctan_inverse(239))


PI = _pi()


def _sine(x):
    total, term, k = Decimal(0), x, 1
    while abs(term) > Decimal(10) ** -58:
        total += term
        term *= -x * x / ((k + 1) * (k + 2))
        k += 2
    return total


def sin_turn(numerator, denominator):
    """sin(2 pi numerator / denominator), exact at the multiples of a quarter turn."""
    eighths = 8 * (numerator % denominator)
    if eighths > 4 * denominator:
        return -sin_turn(-numerator, denominator)
    if eighths > 2 * denominator:                       # the second quarter mirrors the first
        return sin_turn(denominator - 2 * numerator, 2 * denominator)
    if eighths in (0, 2 * denominator):
        return Decimal(eighths and 1)
    return round(_sine(2 * PI * (numerator % denominator) / denominator), 50)


def cos_turn(numerator, denominator):
    return sin_turn(4 * numerator + denominator, 4 * denominator)


# ---- Expressions ---------------------------------------------------------------------------

class Expressions:
    """A node is its number; a value is 0 or a pair (sign, node)."""

    def __init__(self):
        self.nodes = []    # (operation, operands)
        self.known = {}

    def node(self, *description):
        if description not in self.known:
            self.known[description] = len(self.nodes)
            self.nodes.append(description)
        return self.known[description]

    def input(self, name):
        return (1, self.node("input", name))

    def add(self, a, b):
        if a == 0 or b == 0:
            return a or b
        (s, x), (t, y) = a, b
        if s == t:
            return (s, self.node("+", min(x, y), max(x, y)))
        if x == y:
            return 0
        if ("-", y, x) in self.known:
            return (t, self.node("-", y, x))
        return (s, self.node("-", x, y))

    def multiply(self, constant, a):
        if a == 0 or constant == 0:
            return 0
        sign, x = a
        if constant < 0:
            constant, sign = -constant, -sign
        return (sign, x if constant == 1 else self.node("*", constant, x))


def negate(a):
    return a and (-a[0], a[1])


class Transforms:
    """The transforms of a list of complex values, over the operations of a subclass."""

    def __init__(self):
        self.e = Expressions()

    # -- Transforms: a list of complex values to the list of its spectrum.

    def transform(self, x):
        n = len(x)
        if n == 1:
            return list(x)
        if n == 2:
            return [self.add(x[0], x[1]), self.subtract(x[0], x[1])]
        if n not in SPLIT:
            return self.five(x) if n == 5 else self.odd_prime(x)
        r = SPLIT[n]
        return (self.coprime if gcd(r, n // r) == 1 else self.composite)(x, r)

    def odd_prime(self, x):
        n, half = len(x), len(x) // 2
        sums = [None] + [self.add(x[j], x[n - j]) for j in range(1, half + 1)]
        differences = [None] + [self.subtract(x[j], x[n - j]) for j in range(1, half + 1)]
        total = x[0]
        for j in range(1, half + 1):
            total = self.add(total, sums[j])
        spectrum = [total] + [None] * (n - 1)
        # Two frequencies at a time share the values that they read.
        for first in range(1, half + 1, 2):
            group = range(first, min(first + 2, half + 1))
            even = {k: x[0] for k in group}
            odd = {k: self.zero for k in group}
            for j in range(1, half + 1):
                for k in group:
                    even[k] = self.add(even[k], self.scale(cos_turn(j * k, n), sums[j]))
                    odd[k] = self.add(odd[k], self.scale(sin_turn(j * k, n), differences[j]))
            for k in group:
                self.mirrored(spectrum, k, even[k], odd[k])
        return spectrum

    def mirrored(self, spectrum, k, even, odd):
        """X[k] = even - i odd and X[n-k] = even + i odd"""
        turned = self.minus_i(odd)
        spectrum[k] = self.add(even, turned)
        spectrum[-k] = self.subtract(even, turned)

    def five(self, x):
        """With cos(72) + cos(144) = -1/2 and cos(72) - cos(144) = sqrt(5)/2."""
        sums = [self.add(x[1], x[4]), self.add(x[2], x[3])]
        differences = [self.subtract(x[1], x[4]), self.subtract(x[2], x[3])]
        both = self.add(sums[0], sums[1])
        middle = self.subtract(x[0], self.scale(Decimal("0.25"), both))
        side = self.scale(Decimal(5).sqrt() / 4, self.subtract(sums[0], sums[1]))
        s1, s2 = sin_turn(1, 5), sin_turn(2, 5)
        spectrum = [self.add(x[0], both)] + [None] * 4
        odd = self.add(self.scale(s1, differences[0]), self.scale(s2, differences[1]))
        self.mirrored(spectrum, 1, self.add(middle, side), odd)
        odd = self.subtract(self.scale(s2, differences[0]), self.scale(s1, differences[1]))
        self.mirrored(spectrum, 2, self.subtract(middle, side), odd)
        return spectrum

    def coprime(self, x, r):
        """Input m a + r b at frequency k has the phase a k / r + b k / m, so no twiddles remain."""
        n = len(x)
        m = n // r
        rows = [self.transform([x[(m * a + r * b) % n] for b in range(m)]) for a in range(r)]
        columns = [self.transform([row[k] for row in rows]) for k in range(m)]
        return [columns[k % m][k % r] for k in range(n)]

    def composite(self, x, r):
        n = len(x)
        m = n // r
        is_real = all(self.is_real(value) for value in x)
        columns = [self.transform(x[j::r]) for j in range(r)]
        spectrum = [None] * n
        for k in range(m // 2 + 1 if is_real else m):
            turned = [self.turn(columns[j][k], j * k, n) for j in range(r)]
            for q, value in enumerate(self.transform(turned)):
                spectrum[k + q * m] = value
                if is_real:
                    spectrum[-(k + q * m)] = self.conjugate(value)
        return spectrum

    def odd_frequencies(self, x):
        """The spectrum of n real values at the half-odd frequencies q + 1/2."""
        n = len(x)
        if n == 1:
            return list(x)
        if n % 2:
            # exp(-pi i j) turns frequency q + 1/2 into the whole frequency q + (n + 1)/2.
            signed = [x[j] if j % 2 == 0 else self.scale(-1, x[j]) for j in range(n)]
            spectrum = self.transform(signed)
            return [spectrum[(q + (n + 1) // 2) % n] for q in range(n)]
        r = SPLIT.get(n, 2)
        m = n // r
        columns = [self.odd_frequencies(x[j::r]) for j in range(r)]
        spectrum = [None] * n
        for k in range((m + 1) // 2):
            turned = [self.turn(columns[j][k], j * (2 * k + 1), 2 * n) for j in range(r)]
            for q, value in enumerate(self.transform(turned)):
                spectrum[k + q * m] = value
                spectrum[n - 1 - (k + q * m)] = self.conjugate(value)
        return spectrum


class Split(Transforms):
    """Complex values are pairs (real, imaginary) of values; a part that is 0 costs nothing."""

    zero = (0, 0)

    def add(self, a, b):
        return (self.e.add(a[0], b[0]), self.e.add(a[1], b[1]))

    def subtract(self, a, b):
        return self.add(a, (negate(b[0]), negate(b[1])))

    def scale(self, constant, a):
        return (self.e.multiply(constant, a[0]), self.e.multiply(constant, a[1]))

    def minus_i(self, a):
        return (a[1], negate(a[0]))

    def conjugate(self, a):
        return (a[0], negate(a[1]))

    def is_real(self, a):
        return a[1] == 0

    def turn(self, a, numerator, denominator):
        """a exp(-2 pi i numerator / denominator)"""
        c, s = cos_turn(numerator, denominator), sin_turn(numerator, denominator)
        if abs(c) == abs(s):    # an eighth of a turn: the sums come first
            turned = self.scale(s / abs(s), self.minus_i(a))
            return self.scale(abs(c), self.add(self.scale(c / abs(c), a), turned))
        re, im = a
        return (self.e.add(self.e.multiply(c, re), self.e.multiply(s, im)),
                self.e.add(self.e.multiply(c, im), negate(self.e.multiply(s, re))))


class Packed(Transforms):
    """Complex values are values; "i" is the product with i, "turn" the one with c - i s."""

    zero = 0

    def add(self, a, b):
        return self.e.add(a, b)

    def subtract(self, a, b):
        return self.e.add(a, negate(b))

    def scale(self, constant, a):
        return self.e.multiply(constant, a)

    def minus_i(self, a):
        return a and (-a[0], self.e.node("i", a[1]))

    def is_real(self, a):
        return False

    def turn(self, a, numerator, denominator):
        c, s = cos_turn(numerator, denominator), sin_turn(numerator, denominator)
        if s == 0:
            return self.scale(c, a)
        if c == 0:
            return self.scale(s, self.minus_i(a))
        if abs(c) == abs(s):
            turned = self.scale(s / abs(s), self.minus_i(a))
            return self.scale(abs(c), self.add(self.scale(c / abs(c), a), turned))
        return (a[0], self.e.node("turn", c, s, a[1]))


# ---- Texts ---------------------------------------------------------------------------------

def operand(value):
    if value == 0:
        return "V(0.0)"
    return ("-" if value[0] < 0 else "") + f"t{value[1]}"


def needed_nodes(nodes, outputs):
    pending = [value[1] for _, values in outputs for value in values if value != 0]
    needed = set()
    while pending:
        node = pending.pop()
        if node not in needed:
            needed.add(node)
            if nodes[node][0] != "input":
                pending += [x for x in nodes[node][1:] if isinstance(x, int)]
    return sorted(needed)


EXPRESSIONS = {
    "+": "t{} + t{}",
    "-": "t{} - t{}",
    "*": "V({!r}) * t{}",
    "i": "TimesI(t{})",
    "turn": "Turned(t{2}, {0!r}, {1!r})",
}


def text_of(name, p, transforms, outputs):
    """The statements that the outputs (store format, values) need, in the order in which the
    algebra made them; a store follows the last of its values."""
    nodes = transforms.e.nodes
    stores = {}
    for form, values in outputs:
        last = max(value[1] for value in values if value != 0)
        stores.setdefault(last, []).append(form.format(*map(operand, values)))
    lines, loaded, loaded_pairs = [], set(), set()

    def load(node):
        """An input is loaded where it is first used."""
        name = nodes[node][1]
        if node in loaded:
            return
        loaded.add(node)
        if isinstance(name, int):
            lines.append(f"const V t{node} = in.at({name});")
            return
        part, j = name
        if j not in loaded_pairs:
            loaded_pairs.add(j)
            lines.append(f"const Complex<V> x{j} = in.at({j});")
        lines.append(f"const V t{node} = x{j}.{part};")

    for node in needed_nodes(nodes, outputs):
        operation, *operands = nodes[node]
        if operation != "input":
            for x in operands:
                if isinstance(x, int) and nodes[x][0] == "input":
                    load(x)
            operands = [float(x) if isinstance(x, Decimal) else x for x in operands]
            lines.append(f"const V t{node} = {EXPRESSIONS[operation].format(*operands)};")
        elif node in stores:    # radix 2 passes values through
            for x in range(node + 1):
                load(x)
        lines += stores.get(node, [])
    body = "\n".join("        " + line for line in lines)
    return (f"template <>\nstruct {name}<{p}> {{\n"
            f"    template <class V, class In, class Out>\n"
            f"    static QX_INLINE void run(const In &in, const Out &out) {{\n{body}\n    }}\n}};\n")


def packed_text(p):
    packed = Packed()
    spectrum = packed.transform([packed.e.input(j) for j in range(p)])
    outputs = [(f"out.set({k}, {{}});", [spectrum[k]]) for k in range(p)]
    return text_of("PackedTransform", p, packed, outputs)


def split_text(p):
    split = Split()
    x = [(split.e.input(("re", j)), split.e.input(("im", j))) for j in range(p)]
    spectrum = split.transform(x)
    outputs = [(f"out.set({k}, {{}}, {{}});", spectrum[k]) for k in range(p)]
    return text_of("SplitTransform", p, split, outputs)


def real_text(p):
    split = Split()
    spectrum = split.transform([(split.e.input(j), 0) for j in range(p)])
    half = [spectrum[k][0] if 2 * k <= p else spectrum[p - k][1] for k in range(p)]
    outputs = [(f"out.setPair({k}, {{}}, {{}});", half[k:k + 2]) for k in range(0, p - 1, 2)]
    if p % 2:
        outputs.append((f"out.set({p - 1}, {{}});", half[p - 1:]))
    return text_of("RealTransform", p, split, outputs)


def odd_text(p):
    split = Split()
    spectrum = split.odd_frequencies([(split.e.input(j), 0) for j in range(p)])
    outputs = [(f"out.set({q}, {{}}, {{}});", spectrum[q]) for q in range(p // 2)]
    return text_of("OddTransform", p, split, outputs)


def file_of(p):
    by_half = p in BY_HALF
    texts = [packed_text(p)]
    if p in RADICES or not by_half:
        texts.append(real_text(p))
    if p in RADICES:
        texts += [split_text(p)] + ([odd_text(p)] if p % 2 == 0 else [])
        texts.append(f"template <>\nconst KernelSet *KernelsFor<{p}>() {{\n"
                     f"    static constexpr KernelSet kernels = MakeKernels<{p}>();\n"
                     "    return &kernels;\n}\n")
    if p % 2 and p >= 11 and p not in SPLIT:
        texts.append(prime_turns(p))
    texts += [side_by_side(part, p, f"Whole{part}Transform<{p}>(in, out);")
              for part in (["Complex"] if by_half else ["Complex", "Real"])]
    if p in WHOLE:
        texts.append(f"template <>\nvoid ComplexAbreast<{p}>(const DBL *in, ptrdiff_t inLeg, DBL *out, "
                     "ptrdiff_t outLeg, ptrdiff_t columns) {\n"
                     f"    ComplexAbreastLeaf<{p}>(in, inLeg, out, outLeg, columns);\n}}\n")
    if 2 * p in BY_HALF:
        turns = [part(k, 2 * p) / 2 for k in range(1, (p + 1) // 2) for part in (cos_turn, sin_turn)]
        texts.append(side_by_side("Real", 2 * p,
                                  "static constexpr double turns[] = "
                                  f"{{{', '.join(repr(float(x)) for x in turns)}}};\n"
                                  f"    RealByHalf<{2 * p}>(in, out, turns);"))
    return enclosed(f"The kernels of {p}", texts)


def prime_turns(p):
    half = p // 2
    rows = [f"{float(value)!r}" for j in range(1, half + 1)
            for k in range(1, half + half % 2 + 1)
            for value in (cos_turn(j * k, p), -sin_turn(j * k, p))]
    return (f"template <>\nstruct PrimeTurns<{p}> {{\n"
            f"    static constexpr double rows[] = {{{', '.join(rows)}}};\n}};\n")


def side_by_side(part, n, body):
    return f"template <>\nvoid {part}SideBySide<{n}>(const DBL *in, DBL *out) {{\n    {body}\n}}\n"


def choice_file():
    """The kernels of each radix and length, for the choice at run time."""
    kernels = [f"    case {p}:\n        return KernelsFor<{p}>();" for p in sorted(RADICES)]
    complex_lengths = {*RADICES, *WHOLE}
    wholes = []
    for n in sorted({*complex_lengths, *BY_HALF}):
        of_complex = f"ComplexSideBySide<{n}>" if n in complex_lengths else "nullptr"
        abreast = (f"KernelsFor<{n}>()->lanes.abreastLeaf" if n in RADICES else
                   f"ComplexAbreast<{n}>" if n in WHOLE else "nullptr")
        wholes.append(f"    case {n}:\n        return {{{of_complex}, RealSideBySide<{n}>, {abreast}}};")
    return enclosed("The choice of kernels", [
        "const KernelSet *KernelsOf(int32_t radix) {\n    switch (radix) {",
        *kernels, "    default:\n        return nullptr;\n    }\n}\n",
        "LanesPasses PassesOf(int32_t radix, int32_t) {\n    return KernelsOf(radix)->lanes;\n}\n",
        "WholeTransform WholeOf(int32_t length) {\n    switch (length) {",
        *wholes, "    default:\n        return {};\n    }\n}\n"])


def passes_file_of(p):
    texts = [
        packed_text(p),
        f"template <>\nvoid TakeWideAbreast<{p}>(LanesPasses &passes) {{\n"
        f"    passes.abreastLeaf = ComplexAbreastLeaf<{p}>;\n"
        f"    passes.abreastTwiddle = ComplexAbreastTwiddle<{p}>;\n}}\n"]
    if p in WIDE:
        texts.append(f"template <>\nvoid TakeWideComplex<{p}>(LanesPasses &passes) {{\n"
                     f"    passes.complexLeaf = ComplexLanesLeaf<{p}>;\n"
                     f"    passes.complexTwiddle = ComplexLanesTwiddle<{p}>;\n"
                     "    passes.complexLanes = nativeLanes;\n}\n")
    if p in WIDE_REAL:
        texts += [split_text(p),
                  f"template <>\nvoid TakeWideReal<{p}>(LanesPasses &passes) {{\n"
                  f"    passes.realTwiddle = RealWideTwiddle<{p}>;\n"
                  "    passes.realLanes = nativeLanes;\n}\n"]
    return enclosed(f"The loops of {p} in eight lanes", texts, "kernel_set")


def passes_choice_file():
    """Stages whose columns do not fill eight lanes stay with four, as do short real ones."""
    def choice(passes, radices, condition="true"):
        cases = [f"        case {p}:\n            TakeWide{passes}<{p}>(passes);\n            break;"
                 for p in radices]
        return "\n".join([f"    if ({condition}) {{\n        switch (radix) {{", *cases,
                          "        default:\n            break;\n        }\n    }"])
    return enclosed("The choice of loops in eight lanes", [
        "LanesPasses PassesOf(int32_t radix, int32_t m) {",
        "    LanesPasses passes = avx2::PassesOf(radix, m);",
        choice("Complex", WIDE, "m % packedColumns == 0"),
        choice("Abreast", WIDE_ABREAST),
        choice("Real", WIDE_REAL, "fillsWideRealLanes(m) && m * radix >= 1024"),
        "    return passes;\n}\n"], "kernel_set")


def enclosed(title, texts, header="whole"):
    return "\n".join([f"// {title}, made by fft/kernels/generate.py.\n",
                      f"#include \"fft/kernels/{header}.h\"\n\nnamespace qx::QX_WIDTH {{\n",
                      *texts, "} // namespace qx::QX_WIDTH\n"])


def main():
    folder = Path(sys.argv[1])
    folder.mkdir(parents=True, exist_ok=True)
    for p in RADICES + WHOLE:
        (folder / f"kernels_{p}.cpp").write_text(file_of(p))
    (folder / "kernels_choice.cpp").write_text(choice_file())
    for p in WIDE_ABREAST:
        (folder / f"passes_{p}.cpp").write_text(passes_file_of(p))
    (folder / "passes_choice.cpp").write_text(passes_choice_file())


if __name__ == "__main__":
    main()
