"""Tones of recordings of any length (wholes.Whole), with the resolution of the whole recording. A band is cut out
around each line that stands out of an averaged spectrum, and the tones are measured in it at a lower rate."""

import dataclasses
import math
from typing import Any

import numpy as np

from . import measure, tones, windows
from .outcomes import QxError
from .wholes import AveragedSpectrum

SEGMENT = 1 << 20  # samples in a segment of the averaged spectrum
STANDS_OUT = 3.0  # ratio of a line to the median of its neighbours from which it is examined
AROUND = 64  # lines on either side that count as neighbours
BLOCK = 1 << 18  # samples in the transforms that cut out the bands
MOST_KEPT = 1 << 18  # samples of a band, unless that makes it narrower than NARROWEST lines of a block
NARROWEST = 512
WINDOW = "blackman_harris7"
MOST_PARTS = 16  # parts in which harmonics are measured
DECIBELS_OF_BIT = 20 * math.log10(2)


def strongest(whole, rate, count=5):
    """The `tones.Tones` that stand out; None if there are none."""
    return tones.standing_out(lambda: measured(whole, rate, count))


def measured(whole, rate, count=5):
    """Up to `count` tones, the largest first, as from tones.tones for samples in memory. The residual is NaN
    (`residual_rms` needs another pass). Raises QxError if there are none."""
    centres = _centres(whole, count)
    found: list[Any] = []
    refusal: Any = None
    for centre, band in zip(centres, _bands(whole, centres)):
        try:
            found += _in_band(whole, band, centre, count)
        except QxError as error:
            refusal = error
    if not found:
        raise refusal
    largest = sorted(found, key=lambda one: -one[2])[:count]
    f, f_error, a, a_error, phase, significant = map(np.array, zip(*largest))
    return tones.Tones(f * rate, f_error * rate, a, a_error, phase, significant.astype(bool), math.nan,
                       rate / whole.count)


def spectrum(whole, rate, window=WINDOW):
    """Frequencies, the amplitudes of the lines under the window, as root mean squares over segments, and the
    resolution."""
    found = _scaled(whole, rate, window)
    amplitudes = np.sqrt(2 * found.values)
    amplitudes[[0, -1]] = 0.0, amplitudes[-1] / math.sqrt(2)
    return found.frequencies, _scale(whole) * amplitudes, found.resolution


def _scale(whole):
    return max(abs(whole.moments.least), abs(whole.moments.greatest)) or 1.0


def _scaled(whole, rate, window):
    found, scale = AveragedSpectrum(SEGMENT, window, "spectrum"), _scale(whole)
    for part in whole.parts():
        found.add(part / scale)
    return found.result(rate)


def _width(whole):
    """The number of lines of a block in a band: a power of two."""
    factor = 2 ** max(2, math.ceil(math.log2(whole.count / MOST_KEPT)))
    return max(NARROWEST, BLOCK // factor)


def _centres(whole, count):
    """The lines of a block around which bands are taken: the lowest one, and those that stand out. A band at 0 or
    at half the rate contains its mirror image, so no other band is taken near these."""
    lines = _scaled(whole, 1.0, WINDOW).values
    inner = np.flatnonzero((lines[1:-1] > lines[:-2]) & (lines[1:-1] >= lines[2:])) + 1
    inner = inner[np.argsort(-lines[inner], kind="stable")][:64 * count]
    apart, nyquist = _width(whole) // 5, BLOCK // 2
    centres = [0]
    for line in inner:
        neighbours = lines[max(1, line - AROUND):line + AROUND + 1]
        if not lines[line] > STANDS_OUT * np.median(neighbours):
            continue
        place = round(int(line) * BLOCK / SEGMENT)
        place = nyquist if nyquist - place < apart else place
        if all(abs(place - other) > (apart if other in (0, nyquist) else apart // 4) for other in centres):
            centres.append(place)
        if len(centres) > 2 * count:
            break
    return centres


def _bands(whole, centres):
    """The samples of each band, as real values at a rate that is lower by the factor BLOCK / width. The centre of a
    band is shifted to a quarter of that rate; half the original rate is shifted to 0. The method is transforms of
    blocks that overlap by half, with a filter as long as this half and a gain of 1 up to a quarter of the lower
    rate."""
    width, half = _width(whole), BLOCK // 2
    order = np.fft.ifftshift(np.arange(-(width // 2), width // 2))
    response = _response(width)[order % BLOCK]
    found = [[] for _ in centres]
    for number in range((whole.count - half) // half):
        lines = np.fft.fft(whole.part(number * half, BLOCK))
        for centre, parts in zip(centres, found):
            taken = np.fft.ifft(lines[(centre + order) % BLOCK] * response) * (
                width / BLOCK)
            taken = taken[width // 4:width - width // 4]
            parts.append(taken * (-1) ** (number * centre))
    for centre, parts in zip(centres, found):
        band = np.concatenate(parts)
        yield band.real if centre in (0, half) else 2 * (band * 1j ** (np.arange(len(band)) % 4)).real


def _response(width):
    """The response of the filter that passes a band around 0, at the lines of a block."""
    t = np.arange(-(BLOCK // 4), BLOCK // 4 + 1)
    cut = 0.375 * width / BLOCK  # between the gain of 1 and the limit of the lower rate
    taps = 2 * cut * np.sinc(2 * cut * t) * windows.get(WINDOW, len(t), symmetric=True)
    whole = np.zeros(BLOCK)
    whole[t % BLOCK] = taps
    return np.fft.fft(whole).real


def _in_band(whole, band, centre, count):
    """Frequency, its error, amplitude, its error, phase and significance of the tones near the centre, in
    frequencies of the recording."""
    width = _width(whole)
    factor = BLOCK // width
    found = tones.tones(band, 1.0, count, whole.count)
    begin = BLOCK // 4  # the sample at which the band begins
    is_image = centre == BLOCK // 2
    moved = 0.0 if centre == 0 or is_image else 0.25
    for f, f_error, a, a_error, phase, significant in zip(
            found.frequencies, found.frequency_errors, found.amplitudes, found.amplitude_errors, found.phases,
            found.significant):
        away = (f - moved) / factor
        if abs(away) * BLOCK > width / 4:
            continue
        phase = phase - 2 * math.pi * math.fmod(away * begin, 1.0)
        if is_image:
            away, phase = -away, -phase
        yield (centre / BLOCK + away, f_error / factor, a, a_error, math.remainder(phase, 2 * math.pi), significant)


def residual_rms(whole, found, rate):
    """The root mean square of the residual after the tones and a constant."""
    total, squares, seen = 0.0, 0.0, 0
    for part in whole.parts():
        t, rest = np.arange(len(part)), part - whole.moments.mean
        for f, a, phase in zip(found.frequencies / rate, found.amplitudes, found.phases):
            rest -= a * np.cos(2 * math.pi * (f * t + math.fmod(f * seen, 1.0)) + phase)
        total += float(rest.sum())
        squares += float(rest @ rest)
        seen += len(part)
    return math.sqrt(max(0.0, squares - total * total / seen) / seen)


def harmonics(whole, rate, fundamental, count, full_scale=None):
    """measure.harmonics from the mean powers over at most MOST_PARTS parts of SEGMENT samples, evenly spread. The
    phases are those of the first part, and a bin is that of a part. Raises QxError if a part has no such tone."""
    there = whole.count // SEGMENT
    chosen = np.linspace(0, there - 1, min(there, MOST_PARTS)).round().astype(int)
    parts = [measure.harmonics(whole.part(int(i) * SEGMENT, SEGMENT), rate, fundamental, count, full_scale)
             for i in chosen]
    powers = np.array([one.amplitudes**2 for one in parts])
    mean = powers.mean(0)

    def beside(name, sign=1):
        """The mean over the parts of a level that each gives in decibels below its fundamental, or above it with
        sign -1."""
        return sign * 10 * math.log10(mean[0] / np.mean([own[0] / 10**(sign * getattr(one, name) / 10)
                                                         for one, own in zip(parts, powers)]))

    sinad = beside("sinad")
    bits = np.mean([one.enob - one.sinad / DECIBELS_OF_BIT for one in parts]) + sinad / DECIBELS_OF_BIT
    return dataclasses.replace(
        parts[0], amplitudes=np.sqrt(mean), sinad=sinad, snr=beside("snr"), sfdr=beside("sfdr"), enob=float(bits),
        thd=math.sqrt(np.mean([one.thd**2 * own[0] for one, own in zip(parts, powers)]) / mean[0]),
        noise_floor=beside("noise_floor", -1))
