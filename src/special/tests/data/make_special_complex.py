#!/usr/bin/python3
"""References of the complex Bessel and Airy functions, by mpmath.

usage: make_special_complex.py > special_complex.dat

Each line is NAME ORDER RE IM SCALED OUTPUT VALUE BOUND; output 0 is the real part and 1 the imaginary part; Airy
functions have the order 0. mpmath has no signed zero, so values below the cut are computed above it.
"""

import math

import mpmath
from mpmath import mp, mpc, mpf

from reference import EPS

mp.dps = 60
CUT = -0.0

# Points on both sides of each threshold of special/modified_complex.h.
POINTS = [
    # power series, Temme's series and Miller's recurrences
    (0, 0.3 + 0.4j), (0, 1e-9 - 1e-9j), (0.3, 1.3 + 0.1j), (0.3, 1.4 + 0.1j), (0.5, 2.1j),
    (0.5, 3.1j), (-0.5, 2 + 1j), (2, -1.2 + 0.9j), (-2.7, 2 + 2j), (7.25, 5 - 2j), (9.9, 1e-3j),
    (15.4, 0.3 + 6.4j), (3, 20.3 + 0j), (-3.5, 8.9 + 18j), (12.1, 0.7 - 17j), (25, 21.5 + 3j),
    (1.5, -4.9 + 0.2j), (1.5, -5.2 + 0.2j), (33.3, 13 + 14j), (0.49, 4 - 0.9j), (0.49, 4 - 1.1j),
    # Hankel's expansion
    (0, 22.1 + 0j), (0.4, 23j), (6.5, -18 + 14j), (6.9, 23 - 5j), (-6.2, 900 - 20j),
    (30, -200 + 500j),
    # Debye's expansion, on both sides of the Stokes line, inside and outside of the turning points
    (10.1, 1e-6 + 1e-6j), (40, 3 - 2j), (80, 130 + 10j), (200, 90 - 300j), (-350.5, 20 + 80j),
    (1000, 700 + 100j), (700, 60 - 640j), (-999.5, 980 + 90j), (300.25, 700 + 7j),
    # the turning region
    (30, 30 + 0.5j), (50.5, 49 + 0j), (-75.3, 70 - 2j), (100, -104 + 3j), (120, 5 + 118j),
    (1000, 1000 + 0j), (-1000.5, 990 + 12j), (23.98, 51 + 0.01j),
    (39.2, -60 + 2.5j),
    # recurrences of many steps, with orders that a step of 1 rounds
    (27.912295757733457, -40.1 + 0.3j), (7.475119377612192, 1.5507676424686374 + 23.66247951133564j),
    (7.5, 17.6 - 15.8j), (39.2, -2.5 + 60j), (711.9449826288628, -675.7671276891441 + 6.4195506472302615j),
    (884.5884620119281, 10.673553636174256 + 942.0907889518545j),
    (240.06190640390335, 238.60706316676652 - 1.7936751134430586j),
    (22.52665812590174, 38.6901818812177 - 1.6122348486454139j),
    (36, 12.332749752640316 - 4.008275788979722j), (29, 0.7570295473304611 - 14.09690200470789j),
    # tiny orders, half orders, tiny moduli
    (-1e-11, 2.2 - 0.4j), (1e-4, 0.37 - 0.65j), (-0.5, 1.07 - 1.1j), (3.5, -2.97j),
    (7.636008778574624, 7.6e-13 - 9.3e-13j), (15.4, 3e-9 + 1e-8j),
    # the negative axis
    (0, complex(-3, 0)), (0.7, complex(-8, CUT)), (2, complex(-2.5, CUT)), (60.5, complex(-61, 0)),
    (-1.3, complex(-0.4, CUT)), (4.25, complex(-30, 0)),
]

ARGUMENTS = [
    0.2 - 0.1j, 1.49 + 0j, 1.51 + 0j, -1.4 + 0.4j, -1.6 + 0.4j, complex(-2.7, 0), complex(-5.5, CUT),
    1 + 1.7320j, 1 + 1.7321j, -3 + 5.1j, -4 - 6.9j, 6 + 0j, 7.1 + 7.4j, 11 - 2j, complex(-12, CUT),
    -14 + 0.2j, 40 + 60j, -60 + 90j, 100 - 5j, -300 + 3j,
]


def pair(order, z):
    """J and Y, by the definitions of mpmath."""
    return mpmath.besselj(order, z), mpmath.bessely(order, z)


def modulus_of(one, other):
    """The larger of the two where they are within a factor of 100 of each other, as where both oscillate."""
    larger, smaller = max(abs(one), abs(other)), min(abs(one), abs(other))
    return larger if larger < 100 * smaller else 0


def functions(order, z):
    j, y = pair(order, z)
    modulus = modulus_of(j, y)
    grow, turn = mpmath.exp(-abs(z.imag)), mpmath.exp(1j * z)
    yield "BesselJ", j, grow, modulus
    yield "BesselY", y, grow, modulus
    i, k = mpmath.besseli(order, z), mpmath.besselk(order, z)
    yield "BesselI", i, mpmath.exp(-abs(z.real)), modulus_of(i, k)
    yield "BesselK", k, mpmath.exp(z), modulus_of(i, k)
    h1 = j + 1j * y
    if z.imag > 100:  # cancels
        h1 = -2j / mp.pi * mpmath.expjpi(-order / 2) * mpmath.besselk(order, -1j * z)
    yield "BesselH1", h1, 1 / turn, modulus
    yield "BesselH2", j - 1j * y, turn, modulus


def airy_functions(z):
    zeta = mpf(2) / 3 * z * mpmath.sqrt(z)
    decay, growth = mpmath.exp(zeta), mpmath.exp(-abs(zeta.real))
    for derivative in (0, 1):
        ai = mpmath.airyai(z, derivative=derivative)
        bi = mpmath.airybi(z, derivative=derivative)
        modulus = modulus_of(ai, bi)
        yield "AiryAi" + "P" * derivative, ai, decay, modulus
        yield "AiryBi" + "P" * derivative, bi, growth, modulus


def rows(order, z, found, tolerance):
    below = math.copysign(1, z.imag) < 0
    for name, value, scale, modulus in found:
        if below:  # from above: conjugate, which exchanges the Hankel functions
            value, scale = mpmath.conj(value), mpmath.conj(scale)
            name = {"BesselH1": "BesselH2", "BesselH2": "BesselH1"}.get(name, name)
        for scaled in (0, 1):
            result = value * scale if scaled else value
            bound = tolerance * EPS * max(abs(value), modulus) * (abs(scale) if scaled else 1)
            if not 1e-280 < abs(result) < 1e300:
                continue
            for output, part in enumerate((result.real, result.imag)):
                print(name, repr(float(order)), repr(z.real), repr(z.imag), scaled, output,
                      mpmath.nstr(part, 20), mpmath.nstr(bound, 3))


for order, z in POINTS:
    upper = mpc(z.real, abs(z.imag))
    mp.dps = 60 + min(100, int(abs(z.imag)))
    rows(order, z, functions(mpf(order), upper), 24)
mp.dps = 60
for z in ARGUMENTS:
    upper = mpc(z.real, abs(z.imag))
    mp.dps = 60 + int(0.3 * abs(z)**1.5)
    rows(0, z, airy_functions(upper), 16)
