"""The command fit."""

import os

from ..outputs import add_force
from . import reading
from .values import add_command

METHODS = ("squares", "absolute", "bisquare")
EXAMPLES = """\
examples:
  python3 -m qx generate gauss-pulse bells.csv --rate 1000 --delay 0.5 --frequency 20
  python3 -m qx fit bells.csv --model line
  python3 -m qx fit bells.csv --model gaussian --fix c=0 --plot bell.svg
  python3 -m qx fit bells.csv --model polynomial --order 3 --x time --y x --method squares

A plot of an earlier fit (SVG) is replaced. Another file of that name is replaced only with --force."""


def values(texts):
    """The numbers of all options NAME=NUMBER, by the name of the parameter."""
    said = {}
    for text in texts:
        name, _, value = text.partition("=")
        try:
            said[name.strip()] = float(value)
        except ValueError:
            raise ValueError(f"{text!r} is not NAME=NUMBER") from None
    return said


def fit(options):
    from .. import fitting, outputs
    path = options.plot or os.path.join("out", "fit.svg")
    outputs.check(path, options.force, "fit", outputs.identities([options.file]))
    fitting.parameters_of(options.model, options.order)
    fixed = values(options.fix)
    told = fitting.Options(METHODS.index(options.method), values(options.guess),
                           {**values(options.lower), **fixed}, {**values(options.upper), **fixed})
    columns = fitting.read(options.file, options.x, options.y, options.weights, options.decimal,
                           options.missing, options.time, options.dates, options.thousands)
    result = fitting.fit(options.model, columns, told, options.order)
    for line in fitting.lines(result):
        print(line)
    fitting.plot(result, path)
    print(f"Data, fit and residuals: {path}")


def add(commands):
    command = add_command(commands, "fit", EXAMPLES, help="fits a column of a text table against another")
    command.add_argument("file")
    command.add_argument("--model", required=True, metavar="MODEL",
                         help="line, polynomial, exponential, power, logarithm or gaussian")
    command.add_argument("--order", type=int, default=2, help="order of a polynomial, 2 by default")
    command.add_argument("--x", metavar="NAME", help="column of x, by name or number; the first by default")
    command.add_argument("--y", metavar="NAME", help="column of y; the first other column by default")
    command.add_argument("--weights", metavar="NAME", help="column of weights; none by default")
    command.add_argument("--method", choices=METHODS, default="squares",
                         help="least squares, least absolute residuals, or bisquare weights, which "
                              "ignore outliers")
    for name, text in (("guess", "start value of a parameter"), ("lower", "least value of a parameter"),
                       ("upper", "greatest value of a parameter"), ("fix", "value of a parameter")):
        command.add_argument(f"--{name}", metavar="NAME=NUMBER", action="append", default=[],
                             help=text + "; can be repeated")
    reading.missing(reading.add_options(command, signal=False), "skip")
    command.add_argument("--plot", metavar="FILE", help="file of the plot, out/fit.svg by default; can also be .png or .pdf")
    add_force(command)
    command.set_defaults(run=fit)
