#!/usr/bin/python3
"""Measures the errors of MultipleToneMeasurements, without noise, and with noise relative to the Cramer-Rao
bound, and writes docs/accuracy/tones.md.

    QX_LIBRARY_DIR=build/release tools/accuracy/tones.py

The bound is computed from the derivatives of the model with the true parameters, in NumPy.
"""

import sys
from pathlib import Path

import numpy as np

ROOT = Path(__file__).resolve().parents[2]
sys.path.insert(0, str(ROOT / "python"))

import qx  # noqa: E402

N = 256
TRIALS = 2000
TIMES = np.arange(N)


def bins(rng, count, apart, within):
    """Positions of tones in bins, at least `apart` from each other, in a band of `within` bins or the whole range."""
    while True:
        if within is None:
            found = np.sort(rng.uniform(1, N / 2 - 1, count))
        else:
            found = rng.uniform(5, N / 2 - 5 - within) + np.sort(rng.uniform(0, within, count))
        if count == 1 or np.diff(found).min() >= apart:
            return found


def tones(rng, count, apart, within=None):
    """Frequencies, amplitudes (from 0.1 to 1, the largest 1) and phases."""
    amplitudes = 10 ** rng.uniform(-1, 0, count)
    return (bins(rng, count, apart, within) / N, amplitudes / amplitudes.max(),
            rng.uniform(-np.pi, np.pi, count))


def samples(frequencies, amplitudes, phases):
    turns = np.outer(TIMES.astype(np.longdouble), frequencies.astype(np.longdouble))
    angles = 2 * np.arctan2(np.longdouble(0), np.longdouble(-1)) * (turns - np.floor(turns)) + phases
    return (amplitudes * np.cos(angles)).sum(1).astype(float)


def bounds(frequencies, amplitudes, phases, sigma):
    """The standard deviations of the Cramer-Rao bound of frequencies, amplitudes and phases, with an unknown
    constant."""
    angles = 2 * np.pi * np.outer(TIMES, frequencies) + phases
    slopes = np.concatenate([-2 * np.pi * TIMES[:, None] / N * amplitudes * np.sin(angles), np.cos(angles),
                             -amplitudes * np.sin(angles), np.ones((N, 1))], axis=1)
    variances = np.diag(np.linalg.inv(slopes.T @ slopes))[:-1] * sigma**2
    return np.sqrt(variances).reshape(3, -1) / [[N], [1], [1]]


def measured(y, count):
    return np.array(qx.call("MultipleToneMeasurements", y, 1.0, count, 1)[:3])


def without_noise(rng, count, apart, within):
    errors, other = [], 0
    for _ in range(TRIALS):
        true = tones(rng, count, apart, within)
        found = measured(0.3 + samples(*true), count)
        if found.shape[1] != count:
            other += 1
            continue
        error = max(np.abs(found[:2] / true[:2] - 1).max(),
                    np.abs(np.angle(np.exp(1j * (found[2] - true[2])))).max())
        if error < 1e-9:
            errors.append(error)
        else:
            other += 1
    return np.median(errors), max(errors), other


def with_noise(rng, count, apart, within, decibels):
    """Root mean square errors over the bound's standard deviations, and the number of trials with another number of
    tones."""
    sigma = np.sqrt(0.5) * 10 ** (-decibels / 20)
    ratios, other = [], 0
    for _ in range(TRIALS):
        true = tones(rng, count, apart, within)
        found = measured(samples(*true) + rng.normal(0, sigma, N), count)
        if found.shape[1] != count:
            other += 1
            continue
        errors = found - true
        errors[2] = np.angle(np.exp(1j * errors[2]))
        ratios.append(errors / bounds(*true, sigma))
    return np.sqrt(np.mean(np.square(np.concatenate(ratios, axis=1)), axis=1)), other


def false_tones(rng):
    """In how many of 10 TRIALS records of one tone in noise a second one is found."""
    frequency = np.array([0.1234])
    tone = samples(frequency, np.ones(1), np.zeros(1))
    return sum(measured(tone + rng.normal(0, 0.1, N), 2).shape[1] > 1 for _ in range(10 * TRIALS))


def main():
    rng = np.random.default_rng(27)
    exact = [("1 tone", 1, 1, None), ("2 to 8 bins: 2 tones", 2, 2, 8), ("0.5 to 2 bins: 2 tones", 2, 0.5, 2),
             ("3 tones within 3 bins, 0.5 apart", 3, 0.5, 3), ("5 tones, 0.5 apart", 5, 0.5, None),
             ("10 tones, 0.5 apart", 10, 0.5, None)]
    noisy = [("1 tone", 1, 1, None), ("2 tones, 2 apart", 2, 2, None), ("5 tones, 2 apart", 5, 2, None),
             ("2 tones within 2 bins, 1 apart", 2, 1, 2), ("2 tones within 1.5 bins, 0.5 apart", 2, 0.5, 1.5)]
    lines = []
    for name, *case in exact:
        median, largest, other = without_noise(rng, *case)
        lines.append(f"| {name} | {median:.0e} | {largest:.0e} | {other} |")
        print(lines[-1], flush=True)
    lines_of_noise = []
    for name, *case in noisy:
        for decibels in (20, 60):
            ratios, other = with_noise(rng, *case, decibels)
            lines_of_noise.append(f"| {name} | {decibels} dB | "
                                  + " | ".join(f"{ratio:.3f}" for ratio in ratios) + f" | {other} |")
            print(lines_of_noise[-1], flush=True)
    page = PAGE.format(n=N, trials=TRIALS, exact="\n".join(lines), noisy="\n".join(lines_of_noise),
                       false=false_tones(rng), records=10 * TRIALS)
    (ROOT / "docs/accuracy/tones.md").write_text(page)


PAGE = """\
# Accuracy of tones

`MultipleToneMeasurements` on {n} samples with a constant, {trials} records in each row, tones of random
frequencies, phases and amplitudes (the smallest at least a tenth of the largest). Distances are in
bins of the record. Written by `tools/accuracy/tones.py`.

**Without noise.** The largest error of a record: relative for frequencies and amplitudes, in radians for
phases. The last column counts records with an error above 1e-9 (the fit ended at other tones); the other
columns exclude them.

| Tones | Median | Largest | Others |
|---|---|---|---|
{exact}

**With white noise.** Root mean square errors, divided by the standard deviations of the Cramer-Rao bound, which no
unbiased estimate can fall below. The noise level is relative to the largest tone, so it is up to 20 dB closer to
the smallest. The last column counts records in which fewer tones were found, because the missing one could be
noise; the ratios exclude them.

| Tones | Noise | Frequency | Amplitude | Phase | Fewer |
|---|---|---|---|---|---|
{noisy}

The fit is the maximum-likelihood estimate and attains the bound if the tones are well above the noise, even half a
bin apart. Ratios below 1 are within the statistical scatter for this number of records, or belong to bounds so
wide that the neighbouring tone limits the error.

**False tones.** In {false} of {records} records of one tone in white noise, a second tone is found.
"""

if __name__ == "__main__":
    main()
