"""
Polynomial arithmetic
=====================
"""

import numpy as np
import qx

# %%
# Sums, products and quotients; coefficients begin with the constant term
# -----------------------------------------------------------------------

p, q = [1.0, 2.0, 3.0], [-1.0, 1.0]
print(qx.AddPolyH(p, q), qx.SubtractPolyH(p, q), qx.MultiplyPolyH(p, q))
quotient, remainder = qx.DividePolyH(p, q)
print(quotient, remainder)

# %%
# Derivatives, integrals and compositions
# ---------------------------------------

print(qx.PolyDerivativeH([1.0, 2.0, 3.0], 1))
print(qx.PolyIntegralH([1.0, 2.0, 3.0], 5.0))
print(qx.PolyComposeH([1.0, 0.0, 1.0], [2.0, 1.0]))

# %%
# A common factor in spite of rounded coefficients
# ------------------------------------------------

common = np.polynomial.polynomial.polyfromroots([0.1, -0.7])
p = qx.MultiplyPolyH(common, [1.0, 1.0 / 3])
q = qx.MultiplyPolyH(common, [0.3, 2.0, 1.0])
gcd, distance = qx.PolyGCD_H(p, q, 0.0)
print(gcd, distance < 1e-15)
print("least common multiple of degree", len(qx.PolyLCM_H(p, q, 0.0)) - 1)

# %%
# Values near a multiple root, where Horner's rule has no digits left
# -------------------------------------------------------------------

import matplotlib.pyplot as plt
p = qx.PolyFromRootsH(np.full(7, 1.0 + 0j))
x = np.linspace(0.985, 1.015, 401)
values = qx.PolyEv(p, x)
plain = np.polynomial.polynomial.polyval(x, p)
figure, axes = plt.subplots(figsize=(8, 2.6))
axes.plot(x, plain, color="#c9d3df", label="Horner's rule")
axes.plot(x, values, color="#c8553d", label="compensated")
axes.legend(frameon=False)
print(values[0], (x[0] - 1) ** 7)

# %%
# A polynomial of a matrix; zero by the Cayley-Hamilton theorem
# -------------------------------------------------------------

a = np.array([[1.0, 2.0], [3.0, 4.0]])
print(qx.EvPoly2D([-2.0, -5.0, 1.0], a, 1))

# %%
# Partial fractions of (x + 3) / ((x + 1)^2 (x^2 + 1))
# ----------------------------------------------------

denominator = qx.PolyFromRootsH(np.array([-1, -1, 1j, -1j]))
polynomial, poles, residues = qx.PartialFractionsH([3.0, 1.0], denominator, 0.0)
for pole, residue in zip(poles, residues):
    print(pole.round(12) + 0, residue.round(12) + 0)
