"""The section of the report that removes mains hum and baseline wander from a recording that has them, with
filters designed for its rate."""

import contextlib
import dataclasses

import numpy as np

from . import figures, filters, measure, spectra, stats
from .outcomes import QxError
from .sections import Row, Section, number, uncertain
from .sections_recording import over_time

MAINS = (50.0, 60.0)  # Hz
NOTCH = 1.0  # Hz on either side of the hum
WANDER = 0.5  # Hz; slower components are wander
NOTABLE = 0.2  # part of the standard deviation; less wander is ignored
LEAST_RATE = 100.0  # Hz; below it, hum and wander cannot be separated from the signal
LEAST_SECONDS = 8.0
STANDS_OUT = 6.0  # times the median of its neighbours; noise hardly reaches 4
SHOWN = 5.0  # seconds


@dataclasses.dataclass
class Hum:
    mains: float
    amplitude: float
    excess: float  # ratio to the median of its neighbours


def lines_of(recording):
    """The spectrum up to the highest frequency of interest: its frequencies and amplitudes."""
    found = spectra.periodogram(recording.values, recording.rate, "hann", scaling="spectrum")
    count = int(np.searchsorted(found.frequencies, MAINS[-1] + 6 * NOTCH))
    return found.frequencies[:count].copy(), np.sqrt(2 * found.values[:count])


def line_at(recording, frequency, spectrum):
    """The amplitude of the tone within the notch, and by how much the line exceeds the median around it; `spectrum`
    is what lines_of returns."""
    frequencies, lines = spectrum
    away = np.abs(frequencies - frequency)
    line = lines[away <= NOTCH].max(initial=0.0)
    around = lines[(away > NOTCH) & (away <= 5 * NOTCH)]
    floor = np.median(around) if len(around) else 0.0
    if not line > STANDS_OUT * floor > 0:  # the tone at the line does not matter
        return line, line / floor if floor > 0 else 0.0
    with contextlib.suppress(QxError):
        return measure.tone(recording.values, recording.rate, frequency, NOTCH).amplitude, line / floor
    return line, line / floor


def hum_of(recording):
    """The hum of the mains; None if neither frequency stands out."""
    spectrum = lines_of(recording)
    found = [Hum(mains, *line_at(recording, mains, spectrum)) for mains in MAINS if mains + 5 * NOTCH < recording.rate / 2]
    return max((one for one in found if one.excess > STANDS_OUT), key=lambda one: one.excess, default=None)


def filters_for(rate, mains):
    """A highpass against wander, and a bandstop against hum or None."""
    bandstop = filters.butterworth(2, (mains - NOTCH, mains + NOTCH), "bandstop", rate) if mains else None
    return filters.butterworth(2, WANDER, "highpass", rate), bandstop


def wander_of(values, highpass):
    """What the highpass removes. It is applied to the values less a straight line, continued by their mirror
    image. A continuation by point reflection would take the noise of the end points for wander."""
    t = np.arange(len(values)) - (len(values) - 1) / 2
    line = values.mean() + t * (t @ values / (t @ t))
    rest = values - line
    return line + rest - highpass.zero_phase(rest, extension="even")


def is_fit(recording):
    return bool(recording.rate and recording.rate >= LEAST_RATE
                and len(recording.values) >= LEAST_SECONDS * recording.rate
                and 1e-140 < np.ptp(recording.values) < 1e140)


def cleaned(recording):
    """The section; None if there is nothing to remove."""
    if not is_fit(recording):
        return None
    hum = hum_of(recording)
    rate, values, unit = recording.rate, recording.values, recording.unit
    highpass, bandstop = filters_for(rate, hum and hum.mains)
    wander = wander_of(values, highpass)
    after = values - wander
    deviation, wander_rms = stats.std(values), stats.std(wander)
    if not hum and wander_rms < NOTABLE * deviation:
        return None
    source = "Filter.zero_phase"
    share = wander_rms / deviation
    rows = [Row(f"Wander below {WANDER:g} Hz, RMS", number(wander_rms, 4), unit, source + ", stats.std")]
    text = (f"Components below {WANDER:g} Hz have {100 * share:.2g} % of the standard deviation, so a Butterworth "
            "highpass removes them. ")
    if hum:
        after = bandstop.zero_phase(after)
        left = dataclasses.replace(recording, values=after)
        rest, _ = line_at(left, hum.mains, lines_of(left))
        before = uncertain(hum.amplitude, hum.amplitude / hum.excess)
        rows += [Row(f"Hum at {hum.mains:g} Hz, before", before[0], unit, "measure.tone", before[1]),
                 Row(f"Hum at {hum.mains:g} Hz, after", number(rest, 4), unit, source + ", measure.tone")]
        text += (f"At {hum.mains:g} Hz a line is {hum.excess:.3g} times as high as its neighbours, so a Butterworth "
                 "bandstop removes the mains hum. ")
    else:
        text += "No mains hum stands out of the spectrum, so none is removed. "
    rows.append(Row("RMS of the rest", number(stats.rms(after), 6), unit, source + ", stats.rms"))
    used = highpass if bandstop is None else highpass * bandstop
    if recording.whole:
        text += f"Hum and wander are measured in the {len(values)} samples in memory. "
    return Section("Without hum and wander", text + "The filters are applied forward and backward to the signal, "
                   "continued at its ends, so that nothing is delayed.", rows,
                   [traces(recording, after, wander), response(rate, used)])


def traces(recording, after, wander):
    start = max(0.0, (len(after) / recording.rate - SHOWN) / 2)
    return over_time(recording, "Before and after", x_range=(start, start + SHOWN), curves=[
        figures.Curve("before", recording.values, figures.GREY), figures.Curve("wander", wander, figures.WARM),
        figures.Curve("after", after)])


def response(rate, used):
    frequencies = np.concatenate([np.geomspace(0.01, rate / 2, 3000),
                                  *(mains + np.linspace(-5, 5, 801) for mains in MAINS)])
    frequencies = np.unique(frequencies[(frequencies > 0) & (frequencies <= rate / 2)])
    decibels = 2 * np.maximum(used.response(frequencies).decibels, -50)
    return figures.Plot("Gain of both passes through all filters", "Frequency (Hz)", "Gain (dB)",
                        [figures.Curve("gain", decibels)], x=frequencies, y_range=(-103, 5), may_be_log=True)
