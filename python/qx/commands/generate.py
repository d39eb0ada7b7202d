"""The command generate."""

import argparse

from ..outputs import add_force
from .values import add_command, positive

# Listed here for the help, so that the libraries are loaded only to generate a signal. A test checks that
# the list is complete.
NAMES = ("sine square triangle sawtooth chirp white gauss periodic gamma poisson binomial ramp pulse "
         "impulse sinc gauss-pulse monopulse triangle-pulse").split()

EXAMPLES = """\
examples:
  python3 -m qx generate sine tone.wav --frequency 440 --seconds 2
  python3 -m qx generate chirp sweep.wav --frequency 20 --to 20000 --seconds 5 --amplitude 0.5
  python3 -m qx generate gauss noise.csv --rate 1000 --seconds 10 --seed 7"""


def seed(text):
    value = int(text)
    if not 1 <= value < 2**31:
        raise argparse.ArgumentTypeError(f"{text} is not between 1 and 2147483647")
    return value


def generate(options):
    from .. import generation, outputs
    outputs.check(options.target, options.force)
    samples = generation.generate(options)
    generation.write(options.target, samples, options.rate)
    print(f"{options.target}: {len(samples)} samples at {options.rate:g} Hz")


def add(commands):
    command = add_command(commands, "generate", EXAMPLES, help="writes a wave, noise or a pulse as CSV or WAV")
    command.add_argument("signal", choices=NAMES, metavar="SIGNAL", help=", ".join(NAMES))
    command.add_argument("target", metavar="OUT.wav|OUT.csv")
    command.add_argument("--rate", type=positive, default=44100.0, metavar="HZ",
                         help="samples per second, 44100 by default")
    command.add_argument("--seconds", type=positive, default=1.0, help="length, 1 by default")
    command.add_argument("--amplitude", type=float, default=1.0,
                         help="peak value, standard deviation (gauss) or factor; 1 by default")
    command.add_argument("--frequency", type=float, default=100.0, metavar="HZ",
                         help="frequency of waves and pulses, 100 by default")
    command.add_argument("--to", type=float, default=1000.0, metavar="HZ",
                         help="final frequency of a chirp, 1000 by default")
    command.add_argument("--phase", type=float, default=0.0, metavar="DEGREES")
    command.add_argument("--duty", type=float, default=50.0, metavar="PERCENT")
    command.add_argument("--delay", type=float, default=0.0, metavar="SECONDS", help="for pulses")
    command.add_argument("--width", type=positive, default=0.1, metavar="SECONDS", help="for pulses")
    command.add_argument("--seed", type=seed, default=1, help="seed of noise, 1 by default")
    command.add_argument("--order", type=int, default=1, help="for gamma noise")
    command.add_argument("--mean", type=float, default=1.0, help="for Poisson noise")
    command.add_argument("--trials", type=int, default=1, help="for binomial noise")
    command.add_argument("--probability", type=float, default=0.5, help="for binomial noise")
    add_force(command)
    command.set_defaults(run=generate)
