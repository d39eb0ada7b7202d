"""The section of the report that takes mains hum and baseline wander out of a recording, with filters
designed for its rate."""

import dataclasses

import numpy as np

from . import design, drawing
from .calls import call
from .sections import Row, Section, number, quantity
from .sections_spectra import amplitude_spectrum

MAINS = (50.0, 60.0)  # Hz
NOTCH = 1.0  # Hz to either side of the hum
WANDER = 0.5  # Hz; slower parts are wander
LEAST_RATE = 100.0  # Hz, of a signal in which the two can be told from the rest
LEAST_SECONDS = 8.0
STANDS_OUT = 6.0  # times the median of its neighbours; noise hardly reaches 4
SHOWN = 5.0  # seconds


def line_at(frequencies, amplitudes, frequency):
    """The greatest amplitude within the notch, and by how much it exceeds the median around it."""
    away = np.abs(frequencies - frequency)
    line = amplitudes[away <= NOTCH].max(initial=0.0)
    around = amplitudes[(away > NOTCH) & (away <= 5 * NOTCH)]
    floor = np.median(around) if len(around) else 0.0
    return line, (line / floor if floor > 0 else 0.0)


def hum_of(recording):
    """The frequency of the mains and its amplitude; None where neither stands out."""
    frequencies, amplitudes = amplitude_spectrum(recording)
    frequencies = recording.rate * frequencies
    lines = [(line_at(frequencies, amplitudes, mains), mains) for mains in MAINS
             if mains + 5 * NOTCH < recording.rate / 2]
    found = [(excess, mains, line) for (line, excess), mains in lines if excess > STANDS_OUT]
    if not found:
        return None
    _, mains, line = max(found)
    return mains, line


def filters_for(rate, mains):
    """Arguments of the cascades, with their Filters: a highpass against wander, a bandstop against
    hum."""
    kinds = [("highpass", [WANDER], design.SECOND_ORDER)]
    if mains:
        kinds.append(("bandstop", [mains - NOTCH, mains + NOTCH], design.FOURTH_ORDER))
    return [(form, *design.iir("butterworth", kind, edges, rate, 2, form=form))
            for kind, edges, form in kinds]


def both_ways(values, filters, margin):
    """Forward and backward through all filters, with ends that go on as their own mirror image turned
    round, so that the filters meet no step there."""
    head = 2 * values[0] - values[margin:0:-1]
    tail = 2 * values[-1] - values[-2:-margin - 2:-1]
    signal = np.concatenate([head, values, tail])
    for form, a, b, _ in filters:
        signal = call("zeroPhaseCascadeFiltH", signal, form, a, b, [], [], 0)[0]
    return signal[margin:margin + len(values)]


def is_fit(recording):
    return bool(recording.rate and recording.rate >= LEAST_RATE
                and len(recording.values) >= LEAST_SECONDS * recording.rate
                and np.ptp(recording.values) > 0)


def cleaned(recording):
    if not is_fit(recording):
        return None
    hum = hum_of(recording)
    rate, values = recording.rate, recording.values
    filters = filters_for(rate, hum and hum[0])
    margin = min(len(values) - 1, round(3 * rate / WANDER))
    after = both_ways(values, filters, margin)
    wander = values - both_ways(values, filters[:1], margin)
    what = "zeroPhaseCascadeFiltH, BWCoefs90"
    wander_rms = call("RMS_head", wander - call("Mean_head", wander))
    rows = [Row(f"Wander below {WANDER:g} Hz, RMS", number(wander_rms, 4), recording.unit,
                what + ", RMS_head")]
    text = "A Butterworth highpass removes what is slower than half a hertz. "
    if hum:
        frequencies, amplitudes = amplitude_spectrum(
            dataclasses.replace(recording, values=after))
        rest, _ = line_at(rate * frequencies, amplitudes, hum[0])
        rows += [Row(f"Hum at {hum[0]:g} Hz, before", number(hum[1], 4), recording.unit,
                     "ReOXFFTH80"),
                 Row(f"Hum at {hum[0]:g} Hz, after", number(rest, 4), recording.unit,
                     what + ", ReOXFFTH80")]
        text += f"A Butterworth bandstop about {hum[0]:g} Hz removes the hum of the mains. "
    else:
        text += "No hum of the mains stands out of the spectrum, so none is removed. "
    rows.append(Row("RMS of what is left", number(call("RMS_head", after), 6),
                    recording.unit, what + ", RMS_head"))
    return Section("Without hum and wander", text + "Both run forward and backward, so that "
                   "nothing is delayed.", rows,
                   [traces(recording, after, wander), responses(rate, filters)])


def traces(recording, after, wander):
    plt = drawing.pyplot()
    n = len(after)
    count = min(n, round(SHOWN * recording.rate), 12000)
    part = slice((n - count) // 2, (n + count) // 2)
    times = recording.times()[part]
    figure, (above, below) = plt.subplots(2, 1, figsize=(10, 4.6), sharex=True)
    above.plot(times, recording.values[part], color=drawing.GREY, linewidth=0.8, label="before")
    above.plot(times, wander[part], color=drawing.WARM, linewidth=1.2, label="wander")
    below.plot(times, after[part], color=drawing.BLUE, linewidth=0.9, label="after")
    for axes in (above, below):
        axes.legend(frameon=False, loc="upper right")
        axes.set_ylabel(quantity(recording))
        axes.margins(x=0.005)
    above.set_title(f"{number(count / recording.rate, 3)} s from the middle, before and after")
    below.set_xlabel(f"Time ({recording.time_unit})")
    return drawing.svg(plt, figure)


def responses(rate, filters):
    plt = drawing.pyplot()
    frequencies = np.concatenate([np.geomspace(0.01, rate / 2, 3000),
                                  *(mains + np.linspace(-5, 5, 801) for mains in MAINS)])
    frequencies = np.unique(frequencies[(frequencies > 0) & (frequencies <= rate / 2)])
    figure, axes = plt.subplots(figsize=(10, 2.8))
    gain = np.ones(len(frequencies))
    for *_, filter_ in filters:
        gain = gain * np.abs(filter_.response(frequencies / rate)) ** 2
    axes.semilogx(frequencies, 20 * np.log10(np.maximum(gain, 1e-10)), color=drawing.BLUE, linewidth=1.2)
    axes.set(title="Gain of both passes through all filters", xlabel="Frequency (Hz)",
             ylabel="Gain (dB)", ylim=(-103, 5))
    axes.xaxis.set_major_formatter(lambda value, _: f"{value:g}")
    axes.margins(x=0.005)
    return drawing.svg(plt, figure)
