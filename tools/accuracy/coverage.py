"""How often the bounds of fits hold: draws data from known models with normal errors, fits them, and
counts the trials in which the 95 % bounds contain the curve, a new observation and the coefficients.
With N trials, a true fraction of 0.95 is observed within 0.95 -+ 4 sqrt(0.0475 / N): 0.941 to 0.959 for 10^4 trials.

    QX_LIBRARY_DIR=build/release PYTHONPATH=python /usr/bin/python3 tools/accuracy/coverage.py [TRIALS]

Prints a table and fails if a fraction is outside 0.94 to 0.96.
"""

import sys

import numpy as np
import qx

X = np.linspace(0.5, 5, 24)
DEVIATIONS = np.where(np.arange(24) % 3 == 0, 2.0, 1.0)  # of the errors, in units of the noise
WEIGHTS = DEVIATIONS**-2
AT = 7  # the sample at which the bounds of curve and observation are checked; its deviation is 1
H = np.column_stack([np.ones(24), np.sin(X), np.cos(X)])


def first_numbers(fit, count):
    return list(fit[1:1 + count])


# Name, coefficients, curve, noise, fit, first argument of the bounds.
MODELS = [
    ("Linear", [1.5, -2.0], lambda c: c[0] * X + c[1], 1.0, X,
     lambda y: first_numbers(qx.call("LinFit_head", y, X, WEIGHTS), 2)),
    ("Exp", [5.0, -0.4], lambda c: c[0] * np.exp(c[1] * X), 0.05, X,
     lambda y: first_numbers(qx.call("ExpFit80_head", y, X, WEIGHTS, 1e-12, [], 1, 100, 0.0), 2)),
    ("Power", [2.0, 1.3], lambda c: c[0] * X**c[1], 0.1, X,
     lambda y: first_numbers(qx.call("PowerFit_head", y, X, WEIGHTS, 1e-12, [], 100, 0.0), 2)),
    ("Log", [2.0, 3.0], lambda c: c[0] * np.log10(c[1] * X), 0.05, X,
     lambda y: first_numbers(qx.call("LogFit_head", y, X, WEIGHTS, 10.0), 2)),
    ("Gauss", [4.0, 2.5, 0.8], lambda c: c[0] * np.exp(-((X - c[1]) / c[2])**2 / 2), 0.05, X,
     lambda y: first_numbers(qx.call("GaussianPeakFit_head", y, X, WEIGHTS, 1e-13,
                                     [4.0, 2.5, 0.8], 10000, 0.0), 3)),
    ("Poly", [1.0, -2.0, 0.5], lambda c: np.polyval(c[::-1], X), 1.0, X,
     lambda y: qx.call("PolyFit81_head", X, y, 2, WEIGHTS, 1, np.zeros(0, np.int32), [])[1]),
    ("GenLS", [0.5, 2.0, -1.0], lambda c: H @ c, 1.0, H,
     lambda y: qx.call("GenLSFit80_head", H, y, WEIGHTS, 1, 0)[0]),
]


def main():
    trials = int(sys.argv[1]) if len(sys.argv) > 1 else 10**4
    random = np.random.default_rng(20261122)
    print("| Model | curve | observation | coefficients |\n|---|---|---|---|")
    bad = 0
    for name, c, curve, noise, where, fit in MODELS:
        f = curve(np.array(c))
        base = [10.0] if name == "Log" else []
        held = np.zeros(2 + len(c))
        for errors in random.normal(size=(trials, 25)) * noise:
            y = f + DEVIATIONS * errors[:24]
            rest = [where, y, WEIGHTS, fit(y), *base, 0.95]
            low_c, high_c, low, high = qx.call(f"ConfBnd{name}_head", *rest)
            held[0] += low[AT] <= f[AT] <= high[AT]
            low, high = qx.call(f"PredBnd{name}_head", *rest)
            held[1] += low[AT] <= f[AT] + errors[24] <= high[AT]
            held[2:] += (low_c <= c) & (c <= high_c)
        held /= trials
        bad += np.sum((held < 0.94) | (held > 0.96))
        shares = [f"{share:.4f}" for share in held]
        print(f"| {name} | {shares[0]} | {shares[1]} | {', '.join(shares[2:])} |", flush=True)
    return 1 if bad else 0


if __name__ == "__main__":
    sys.exit(main())
