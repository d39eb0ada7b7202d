"""The command design."""

import json
import os

from ..outputs import add_force
from .values import add_command, positive

EXAMPLES = """\
examples:
  python3 -m qx design butterworth lowpass 40 --rate 360 --order 4
  python3 -m qx design elliptic bandstop 48 52 --rate 1000 --order 3 --ripple 0.5 --attenuation 40
  python3 -m qx design equiripple bandpass 900 1000 2000 2100 --rate 8000 --taps 121 --weight 10
  python3 -m qx design windowed highpass 0.5 --rate 100 --taps 401 --window hamming
  python3 -m qx design narrow lowpass 20 25 --rate 8000 --ripple 0.1 --attenuation 60

The page and the numbers of an earlier design in the folder are replaced. Other files of these names are
replaced only with --force.

edges: one for a lowpass or highpass, two for a bandpass or bandstop. Equiripple and narrow filters take
the edges of the pass and stop bands, twice as many, in ascending order."""


def made(options):
    """The Design for the options."""
    from .. import design
    kind, edges, rate = options.type, options.edges, options.rate
    if options.family in design.FAMILIES:
        return design.iir(options.family, kind, edges, rate, options.order, options.ripple, options.attenuation,
                          options.fourth)
    if options.family == "windowed":
        return design.windowed(kind, edges, rate, options.taps, options.window)
    if options.family == "equiripple":
        return design.equiripple(kind, edges, rate, options.taps, options.weight)
    return design.narrow(kind, edges, rate, options.ripple, options.attenuation)


def design_filter(options):
    from .. import design, design_page, outputs
    page = os.path.join(options.output, "design.html")
    numbers = os.path.join(options.output, "design.json")
    for path in (page, numbers):
        outputs.check(path, options.force, "design")
    design.check_edges(options.type, options.edges, options.rate)
    done = made(options)
    title = f"{options.family.capitalize().replace('-', ' ')} {options.type}"
    edges = ", ".join(f"{edge:g}" for edge in options.edges)
    for line in design_page.write(done, f"{title}, {edges} of {options.rate:g}", options.rate, page):
        print(line)
    outputs.write_text(numbers, json.dumps(
        {"generator": outputs.mark("design"), "family": options.family, "type": options.type,
         "rate": options.rate, "edges": options.edges, "python": done.python, **done.numbers},
        indent=1) + "\n")
    print(f"\nResponses, poles, zeros and coefficients: {page}\nCoefficients: {numbers}")


def add(commands):
    command = add_command(commands, "design", EXAMPLES, help="designs a filter and plots its responses")
    command.add_argument("family", choices=["butterworth", "chebyshev", "inverse-chebyshev", "elliptic",
                                            "bessel", "windowed", "equiripple", "narrow"])
    command.add_argument("type", choices=["lowpass", "highpass", "bandpass", "bandstop"])
    command.add_argument("edges", type=positive, nargs="+", metavar="EDGE")
    command.add_argument("--rate", type=positive, default=1.0, metavar="HZ",
                         help="samples per second, 1 by default (edges are in its unit)")
    command.add_argument("--order", type=int, default=4, help="order of the lowpass prototype of an IIR filter (4)")
    command.add_argument("--ripple", type=positive, default=1.0, metavar="DB",
                         help="ripple of the pass band (1 dB)")
    command.add_argument("--attenuation", type=positive, default=60.0, metavar="DB",
                         help="attenuation of the stop band (60 dB)")
    command.add_argument("--fourth", action="store_true",
                         help="uses sections of fourth rather than second order")
    command.add_argument("--taps", type=int, default=101, help="length of windowed and equiripple filters (101)")
    command.add_argument("--window", choices=["hanning", "hamming", "blackman"],
                         help="window of windowed filters; without it, the response is truncated")
    command.add_argument("--weight", type=positive, default=1.0, metavar="W",
                         help="weight of deviations in the stop band of equiripple filters (1)")
    command.add_argument("--output", default="out", metavar="FOLDER", help="folder for the page and the numbers")
    add_force(command)
    command.set_defaults(run=design_filter)
