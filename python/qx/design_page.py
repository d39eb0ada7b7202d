"""The page that shows the responses of a filter, its poles and zeros, and how a program uses it."""

import html
import math

import numpy as np

from . import figures, outputs, pages
from .sections import Row, Section, number, resolved

POINTS = 4000
FLOOR = -200.0  # dB
AROUND = 4.0  # initial range of the axes, in multiples of the highest edge
MOST_ZEROS = 300  # most zeros that are computed
MOST_ROWS = 12  # most rows of coefficients that are shown unfolded
SHOWN = 40  # most coefficients shown in C programs


def write(design, title, rate, path):
    """Writes the page and returns the lines for the terminal."""
    sections = described(design, rate)
    outputs.write_text(path, pages.page("design", title, "", sections))
    rows = sections[0].rows
    wide = max(len(row.label) for row in rows)
    return [title, "", *(f"  {row.label:<{wide}}  {row.value} {row.unit}".rstrip() for row in rows)]


def half_power(frequencies, gain):
    """The frequencies at which the magnitude crosses half of its greatest power, by linear interpolation."""
    excess = np.abs(gain) ** 2 / np.max(np.abs(gain)) ** 2 - 0.5
    at = np.flatnonzero((excess[1:] > 0) != (excess[:-1] > 0))
    share = excess[at] / (excess[at] - excess[at + 1])
    return frequencies[at] + share * (frequencies[at + 1] - frequencies[at])


def frequencies_for(edges, rate):
    """Evenly spaced frequencies up to half the rate, and the same number around the edges."""
    low, high = shown_range(edges, rate)
    return np.unique(np.concatenate([np.linspace(0, rate / 2, POINTS + 1), np.linspace(low, high, POINTS + 1),
                                     np.geomspace(1e-4 * edges[0], rate / 2, POINTS // 4), edges]))


def shown_range(edges, rate):
    """The initial range of the frequency axes: the edges and their surroundings."""
    if len(edges) == 1:
        return 0.0, min(rate / 2, AROUND * edges[0])
    room = max(AROUND * (edges[-1] - edges[0]), 0.05 * edges[-1])
    return max(0.0, edges[0] - room), min(rate / 2, edges[-1] + room)


def unwrapped(gain):
    """The phase in degrees, without jumps of 360 degrees, and without jumps of 180 degrees where the gain passes
    0."""
    phase = np.angle(gain)
    phase[np.abs(gain) < 1e-12] = math.nan
    known = np.flatnonzero(np.isfinite(phase))
    phase[known] = np.unwrap(2 * phase[known]) / 2
    return np.degrees(phase)


def described(design, rate):
    """The sections: the filter, its responses, its poles and zeros, its coefficients, and its use."""
    filter_, edges = design.filter, design.edges
    frequencies = frequencies_for(edges, rate)
    response = filter_.response(frequencies, rate)
    unit, delay_unit, factor = ("Hz", "ms", 1000 / rate) if rate != 1 else ("cycles per sample", "samples", 1.0)
    gain, delay = response.values, factor * response.delay
    decibels = np.maximum(response.decibels, FLOOR)
    size = (f"{len(filter_.sos)} sections of second order" if filter_.is_iir else f"{len(filter_.taps)} taps")
    crossings = resolved(half_power(frequencies, gain), rate / 2 / POINTS)
    delays = delay[(np.abs(gain) > 0.5 ** 0.5 * np.abs(gain).max()) & np.isfinite(delay)]
    rows = [Row("Filter", size + (", " + design.note if design.note else ""), "", design.python),
            Row("Stable", "yes" if not filter_.is_iir or filter_.is_stable else "NO", "", "Filter.poles"),
            Row("Half power at", ", ".join(crossings) or "no frequency", unit, "Filter.response"),
            Row("Least gain", number(round(float(decibels.min()), 6) + 0.0, 4), "dB", "Filter.response"),
            Row("Greatest gain", number(round(float(decibels.max()), 6) + 0.0, 4), "dB", "Filter.response")]
    if len(delays):
        low, high = number(delays.min(), 4), number(delays.max(), 4)
        rows.append(Row("Group delay in the pass band", low if low == high else f"{low} to {high}", delay_unit,
                        "Filter.response"))
    return [Section("Filter", f"Edges at {', '.join(f'{edge:g}' for edge in edges)} {unit}, at a rate of {rate:g}.",
                    rows, _over_frequency(design, frequencies, rate, unit, [
                        ("Magnitude", "Gain (dB)", decibels, _gain_range(decibels)),
                        ("Phase, without jumps", "Phase (degrees)", unwrapped(gain), None),
                        ("Group delay", f"Delay ({delay_unit})", delay, _delay_range(delay, gain))])),
            Section("Responses over time", "To an impulse, and to a step.", [],
                    _over_time(filter_, rate, factor, delay_unit)),
            in_the_plane(filter_),
            Section("Coefficients", "Sections of second order, one to a row, as in SciPy's sos."
                    if filter_.is_iir else "The taps, which are also the impulse response.", [],
                    [coefficients(filter_)]),
            Section("In a program", "The same filter in Python, C and C++.", [], programs(design))]


def _gain_range(decibels):
    top = float(decibels.max())
    return max(float(decibels.min()), top - 140) - 3, top + 5


def _delay_range(delay, gain):
    """The range of the delay in the pass band; elsewhere the delay can be arbitrary."""
    passed = delay[(np.abs(gain) > 1e-3 * np.abs(gain).max()) & np.isfinite(delay)]
    room = 0.1 * np.ptp(passed) + 1e-3 * np.abs(passed).max() + 1e-12
    return float(passed.min() - room), float(passed.max() + room)


def _over_frequency(design, frequencies, rate, unit, curves):
    marks = [(float(edge), f"edge {edge:g}") for edge in design.edges]
    return [figures.Plot(title, f"Frequency ({unit})", label, [figures.Curve(title.split(",")[0].lower(), values)],
                         x=frequencies, verticals=marks, y_range=y_range, link="frequency", may_be_log=True,
                         x_range=shown_range(design.edges, rate)) for title, label, values, y_range in curves]


def _over_time(filter_, rate, factor, unit):
    settled = min(20_000, filter_._ringing() if filter_.is_iir else len(filter_.taps)) + 8
    impulse = filter_(np.r_[1.0, np.zeros(settled - 1)])
    step = filter_(np.ones(settled))
    energy = np.cumsum(impulse[::-1]**2)[::-1]
    first = int(np.count_nonzero(energy > 1e-4 * np.sum(impulse[1:]**2))) + 8  # the rest is too small to be seen
    return [figures.Plot(title, f"Time ({unit})", "Response", [figures.Curve("response", values)], step=factor,
                         x_range=(0.0, factor * min(first, settled - 1)), link="time")
            for title, values in (("Impulse response", impulse), ("Step response", step))]


def in_the_plane(filter_):
    if not filter_.is_iir and len(filter_.taps) > MOST_ZEROS:
        return Section("Poles and zeros", f"The {len(filter_.taps) - 1} zeros are not drawn; all poles are at 0.")
    poles = filter_.poles if filter_.is_iir else np.zeros(1, complex)
    return Section("Poles and zeros", "In the z plane: × poles, ○ zeros. The filter is stable if all poles are "
                   "inside the circle.", [], [plane(poles, filter_.zeros)])


def plane(poles, zeros):
    """A drawing of the poles, the zeros and the unit circle."""
    reach = max(1.0, float(np.abs(np.r_[poles, zeros, 1.0])[np.abs(np.r_[poles, zeros, 1.0]) < 3].max(initial=1))) * 1.15

    def at(point):
        return 100 + 95 * point.real / reach, 100 - 95 * point.imag / reach

    radius = 95 / reach
    parts = ['<svg class="plane" viewBox="0 0 200 200" role="img" aria-label="poles and zeros">',
             f'<circle cx="100" cy="100" r="{radius:.2f}"/><path d="M2 100H198M100 2V198"/>',
             f'<text x="{100 + radius + 1:.1f}" y="98">1</text><text x="103" y="{100 - radius - 2:.1f}">j</text>']
    for point in zeros[np.abs(zeros) < 3]:
        x, y = at(point)
        parts.append(f'<circle class="zero" cx="{x:.2f}" cy="{y:.2f}" r="2.6"/>')
    for point in poles:
        x, y = at(point)
        parts.append(f'<path class="pole" d="M{x - 2.6:.2f} {y - 2.6:.2f}l5.2 5.2m0-5.2l-5.2 5.2"/>')
    far = int(np.count_nonzero(np.abs(zeros) >= 3))
    note = f"<figcaption>{far} more zero{'s' * (far > 1)} outside the drawing.</figcaption>" if far else ""
    return "<figure>" + "".join(parts) + f"</svg>{note}</figure>"


def coefficients(filter_):
    names = ["b0", "b1", "b2", "a0", "a1", "a2"] if filter_.is_iir else ["h"]
    rows = filter_.sos if filter_.is_iir else filter_.taps[:, None]
    head = "".join(f"<th>{name}</th>" for name in ("", *names))
    body = "".join(f"<tr><th>{i}</th>" + "".join(f'<td class="value">{value!r}</td>' for value in row) + "</tr>\n"
                   for i, row in enumerate(rows.tolist()))
    text = f"sos = {filter_.sos.tolist()!r}" if filter_.is_iir else f"h = {filter_.taps.tolist()!r}"
    is_short = len(rows) <= MOST_ROWS
    return (f'<details{" open" * is_short}><summary>As a table</summary>'
            f'<div class="wide"><table><tr>{head}</tr>{body}</table></div>'
            f"</details><details><summary>As text</summary><pre>{html.escape(text)}</pre></details>")


def arrays_of(filter_):
    """a and b in the layout that the exports take."""
    if not filter_.is_iir:
        return [], filter_.taps.tolist()
    sos = filter_.sos
    return sos[:, 4:].ravel().tolist(), sos[:, :3].ravel().tolist()


def programs(design):
    """Lines of Python, C and C++ that filter x."""
    a, b = arrays_of(design.filter)
    python = f"import qx\n\nf = {design.python}\ny = f(x)  # f.zero_phase(x) has no delay"
    texts = [("Python", python)]
    if len(a) + len(b) <= SHOWN:
        texts += [("C", c_program(a, b)), ("C++", cpp_program(a, b))]
    else:
        texts.append(("C and C++", "There are too many coefficients to show here. design.json has them, for\n"
                      "IIR_Filter2 (sections) or IIR_Filter (taps) of qx/filtering.h."))
    return ["".join(f"<h3>{name}</h3><pre>{html.escape(text)}</pre>" for name, text in texts)]


def c_program(a, b):
    lines = ['#include "qx/filtering.h"', '#include "qx/host.h"', "", "/* Filters n samples in place. */",
             "ErrorCode apply(double *samples, int32_t n) {"]
    lines += [f"    const double {name}_[] = {{{', '.join(map(repr, values))}}};"
              for name, values in (("a", a), ("b", b)) if values]
    lines.append("    DBL1D x = QXHostCopy1D(QXTypeDBL, n, samples);")
    lines += [f"    DBL1D {name} = " + (f"QXHostCopy1D(QXTypeDBL, {len(values)}, {name}_);" if values else
                                        "QXHostNew1D(QXTypeDBL, 0);") for name, values in (("a", a), ("b", b))]
    if a:
        lines += ["    DBL1D state = QXHostNew1D(QXTypeDBL, 0);", "    const int32_t form = 0;",
                  "    const uint8_t keep = 0;", "    ErrorCode err;",
                  "    IIR_Filter2(x, &form, a, b, state, &keep, &err);"]
        freed = "x, a, b, state"
    else:
        lines += ["    DBL1D xState = QXHostNew1D(QXTypeDBL, 0);", "    DBL1D yState = QXHostNew1D(QXTypeDBL, 0);",
                  "    const uint8_t keep = 0;", "    ErrorCode err;",
                  "    IIR_Filter(x, a, b, xState, yState, &keep, &err);"]
        freed = "x, a, b, xState, yState"
    lines += ["    for (int32_t i = 0; err >= 0 && i < n; ++i)",
              "        samples[i] = ((double *)QXHostElements1D(x))[i];"]
    lines += [f"    QXHostFree({name});" for name in freed.split(", ")]
    return "\n".join([*lines, "    return err;", "}"])


def cpp_program(a, b):
    def array(name, values):
        return f"    const qx::host::Array1D<double> {name}{{{', '.join(map(repr, values))}}};"

    lines = ['#include "qx/filtering.h"', '#include "qx/host.hpp"', "",
             "void apply(const qx::host::Array1D<double> &x) {", array("a", a), array("b", b)]
    if a:
        lines += ["    const qx::host::Array1D<double> state;", "    const int32_t form = 0;"]
        call = "IIR_Filter2(x.handle(), &form, a.handle(), b.handle(), state.handle(), &keep, &err);"
    else:
        lines.append("    const qx::host::Array1D<double> xState, yState;")
        call = "IIR_Filter(x.handle(), a.handle(), b.handle(), xState.handle(), yState.handle(), &keep, &err);"
    return "\n".join([*lines, "    const uint8_t keep = 0;", "    ErrorCode err;", f"    {call}",
                      "    qx::host::check(err);", "}"])
