#!/usr/bin/python3
"""Writes the straight-line transforms of the radices: one file kernels_<p>.cpp per radix.

    generate.py FOLDER

Each file holds three texts over a lane type V, one for each kind of data:

    ComplexTransform<p>   p complex values to p complex values
    RealTransform<p>      p real values to their half-complex spectrum
    OddTransform<p>       p real values to the complex values at the half-odd frequencies,
                          X[q] = sum over j of x[j] exp(-2 pi i j (q + 1/2) / p), 2q + 1 <= p

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
# Composite length -> its factor r; coprime factors are recognised.
SPLIT = {4: 2, 6: 2, 8: 2, 9: 3, 10: 2, 14: 2, 16: 4, 18: 2, 32: 4}


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
        if constant == 1:
            return (sign, x)
        operation, *operands = self.nodes[x]
        if operation == "*":
            return (sign, self.node("*", operands[0] * constant, operands[1]))
        return (sign, self.node("*", constant, x))


def negate(a):
    return a and (-a[0], a[1])


class Algebra:
    """Complex values are pairs (real, imaginary) of values."""

    def __init__(self):
        self.e = Expressions()

    def add(self, a, b):
        return (self.e.add(a[0], b[0]), self.e.add(a[1], b[1]))

    def subtract(self, a, b):
        return self.add(a, (negate(b[0]), negate(b[1])))

    def scale(self, constant, a):
        return (self.e.multiply(constant, a[0]), self.e.multiply(constant, a[1]))

    def turn(self, a, numerator, denominator):
        """a exp(-2 pi i numerator / denominator)"""
        c, s = cos_turn(numerator, denominator), sin_turn(numerator, denominator)
        re, im = a
        if abs(c) == abs(s):    # an eighth of a turn: the sums come first
            sign_c, sign_s = (1 if c > 0 else -1), (1 if s > 0 else -1)
            root = abs(c)
            first = self.e.add(re if sign_c > 0 else negate(re), im if sign_s > 0 else negate(im))
            second = self.e.add(im if sign_c > 0 else negate(im), negate(re) if sign_s > 0 else re)
            return (self.e.multiply(root, first), self.e.multiply(root, second))
        return (self.e.add(self.e.multiply(c, re), self.e.multiply(s, im)),
                self.e.add(self.e.multiply(c, im), negate(self.e.multiply(s, re))))

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
            odd = {k: (0, 0) for k in group}
            for j in range(1, half + 1):
                for k in group:
                    even[k] = self.add(even[k], self.scale(cos_turn(j * k, n), sums[j]))
                    odd[k] = self.add(odd[k], self.scale(sin_turn(j * k, n), differences[j]))
            for k in group:
                self.mirrored(spectrum, k, even[k], odd[k])
        return spectrum

    def mirrored(self, spectrum, k, even, odd):
        """X[k] = even - i odd and X[n-k] = even + i odd"""
        turned = (odd[1], negate(odd[0]))
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
        """Input m a + r b at frequency k has the phase a k / r + b k / m: no turning is left."""
        n = len(x)
        m = n // r
        rows = [self.transform([x[(m * a + r * b) % n] for b in range(m)]) for a in range(r)]
        columns = [self.transform([row[k] for row in rows]) for k in range(m)]
        return [columns[k % m][k % r] for k in range(n)]

    def composite(self, x, r):
        n = len(x)
        m = n // r
        is_real = all(value[1] == 0 for value in x)
        columns = [self.transform(x[j::r]) for j in range(r)]
        spectrum = [None] * n
        for k in range(m // 2 + 1 if is_real else m):
            turned = [self.turn(columns[j][k], j * k, n) for j in range(r)]
            for q, value in enumerate(self.transform(turned)):
                spectrum[k + q * m] = value
                if is_real:
                    spectrum[-(k + q * m)] = (value[0], negate(value[1]))
        return spectrum

    def odd_frequencies(self, x):
        """The spectrum of real values at the half-odd frequencies q + 1/2."""
        n = len(x)
        if n == 1:
            return list(x)
        if n % 2:
            # exp(-pi i j) turns frequency q + 1/2 into the whole frequency q + (n + 1)/2.
            signed = [x[j] if j % 2 == 0 else (negate(x[j][0]), 0) for j in range(n)]
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
                spectrum[n - 1 - (k + q * m)] = (value[0], negate(value[1]))
        return spectrum


# ---- Texts ---------------------------------------------------------------------------------

class Text:
    """The statements that outputs need, in the order in which the algebra made them."""

    def __init__(self, algebra, outputs):
        self.nodes = algebra.e.nodes
        self.outputs = outputs      # list of (store format, values)
        self.lines = []
        self.loaded = set()

    def operand(self, value):
        if value == 0:
            return "V(0.0)"
        sign, node = value
        return ("-" if sign < 0 else "") + f"t{node}"

    def needed(self):
        pending = [v[1] for _, values in self.outputs for v in values if v != 0]
        needed = set()
        while pending:
            node = pending.pop()
            if node not in needed:
                needed.add(node)
                operation, *operands = self.nodes[node]
                if operation in "+-":
                    pending += operands
                elif operation == "*":
                    pending.append(operands[1])
        return needed

    def write(self):
        stores = {}
        for form, values in self.outputs:
            last = max(v[1] for v in values if v != 0)
            stores.setdefault(last, []).append(form.format(*map(self.operand, values)))
        operations = 0
        for node in sorted(self.needed()):
            operation, *operands = self.nodes[node]
            if operation == "input":
                self.load(*operands)
            if operation in ("+", "-"):
                self.lines.append(f"const V t{node} = t{operands[0]} {operation} t{operands[1]};")
                operations += 1
            elif operation == "*":
                constant = float(operands[0])
                self.lines.append(f"const V t{node} = V({constant!r}) * t{operands[1]};")
                operations += 1
            elif isinstance(operands[0], tuple):
                self.lines.append(f"const V t{node} = x{operands[0][1]}.{operands[0][0]};")
            self.lines += stores.get(node, [])
        return operations

    def load(self, name):
        if isinstance(name, tuple):
            if name[1] not in self.loaded:
                self.loaded.add(name[1])
                self.lines.append(f"const Complex<V> x{name[1]} = in.at({name[1]});")
        else:
            node = self.nodes.index(("input", name))
            self.lines.append(f"const V t{node} = in.at({name});")


def complex_text(p):
    algebra = Algebra()
    x = [(algebra.e.input(("re", j)), algebra.e.input(("im", j))) for j in range(p)]
    spectrum = algebra.transform(x)
    return Text(algebra, [(f"out.set({k}, {{}}, {{}});", spectrum[k]) for k in range(p)])


def real_text(p):
    algebra = Algebra()
    spectrum = algebra.transform([(algebra.e.input(j), 0) for j in range(p)])
    half = [spectrum[k][0] if 2 * k <= p else spectrum[p - k][1] for k in range(p)]
    outputs = [(f"out.setPair({k}, {{}}, {{}});", half[k:k + 2]) for k in range(0, p - 1, 2)]
    if p % 2:
        outputs.append((f"out.set({p - 1}, {{}});", half[p - 1:]))
    return Text(algebra, outputs)


def odd_text(p):
    algebra = Algebra()
    spectrum = algebra.odd_frequencies([(algebra.e.input(j), 0) for j in range(p)])
    outputs = []
    for q in range((p + 1) // 2):
        form = "out.setReal({}, {{}});" if 2 * q + 1 == p else "out.set({}, {{}}, {{}});"
        values = spectrum[q][:1] if 2 * q + 1 == p else spectrum[q]
        outputs.append((form.format(q), values))
    return Text(algebra, outputs)


def struct_of(kind, p, text):
    operations = text.write()
    body = "\n".join("        " + line for line in text.lines)
    return (f"template <>\nstruct {kind}<{p}> {{ // {operations} operations\n"
            f"    template <class V, class In, class Out>\n"
            f"    static QX_INLINE void run(const In &in, const Out &out) {{\n{body}\n    }}\n}};\n")


def file_of(p):
    return "\n".join([
        f"// The kernels of radix {p}, made by fft/kernels/generate.py.\n",
        "#include \"fft/kernels/kernel_set.h\"\n\nnamespace qx {\n",
        struct_of("ComplexTransform", p, complex_text(p)),
        struct_of("RealTransform", p, real_text(p)),
        struct_of("OddTransform", p, odd_text(p)),
        f"template <>\nconst KernelSet &KernelsFor<{p}>() {{",
        f"    static constexpr KernelSet kernels = MakeKernels<{p}>();\n    return kernels;\n}}\n",
        "} // namespace qx\n"])


def main():
    folder = Path(sys.argv[1])
    folder.mkdir(parents=True, exist_ok=True)
    for p in RADICES:
        (folder / f"kernels_{p}.cpp").write_text(file_of(p))


if __name__ == "__main__":
    main()
