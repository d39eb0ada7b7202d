"""Signals by name: waves, noise and patterns with a given number of samples."""

import math

import numpy as np

from . import noise, outputs, signals


def _wave(make, *more):
    """A continuous wave; `more` are functions of the options for the arguments after the phase."""
    return lambda n, o: make(n, o.frequency, o.rate, o.amplitude, math.radians(o.phase), *(one(o) for one in more))


def _times(n, o):
    """The times of the samples, relative to the pulse."""
    return np.arange(n) / o.rate - o.delay


SIGNALS = {
    "sine": _wave(signals.sine),
    "square": _wave(signals.square, lambda o: o.duty / 100),
    "triangle": _wave(signals.triangle),
    "sawtooth": _wave(signals.sawtooth),
    "chirp": lambda n, o: signals.chirp(n, o.frequency, o.to, o.rate, o.amplitude),
    "white": lambda n, o: noise.uniform(n, o.amplitude, o.seed),
    "gauss": lambda n, o: noise.gaussian(n, o.amplitude, o.seed),
    "periodic": lambda n, o: noise.periodic(n, o.amplitude, o.seed),
    "gamma": lambda n, o: o.amplitude * noise.gamma(n, o.order, o.seed),
    "poisson": lambda n, o: o.amplitude * noise.poisson(n, o.mean, o.seed),
    "binomial": lambda n, o: o.amplitude * noise.binomial(n, o.trials, o.probability, o.seed),
    "ramp": lambda n, o: signals.ramp(n, -o.amplitude, o.amplitude),
    "pulse": lambda n, o: signals.pulse(n, round(o.delay * o.rate), round(o.width * o.rate), o.amplitude),
    "impulse": lambda n, o: signals.impulse(n, round(o.delay * o.rate), o.amplitude),
    "sinc": lambda n, o: signals.sinc(n, 2 * o.frequency / o.rate, o.delay * 2 * o.frequency, o.amplitude),
    "gauss-pulse": lambda n, o: signals.gauss_pulse(_times(n, o), o.frequency, amplitude=o.amplitude),
    "monopulse": lambda n, o: signals.gauss_monopulse(_times(n, o), o.frequency, o.amplitude),
    "triangle-pulse": lambda n, o: signals.triangle_pulse(
        _times(n, o) - o.width / 2, o.width, amplitude=o.amplitude),
}


# The signals with a frequency, and the options that give it.
FREQUENCIES: dict[str, tuple[str, ...]] = {
    "chirp": ("frequency", "to"),
    **{name: ("frequency",) for name in ("sine", "square", "triangle", "sawtooth", "sinc", "gauss-pulse",
                                         "monopulse")}}


def generate(options):
    """The samples for the options of the command."""
    for name in FREQUENCIES.get(options.signal, ()):
        frequency = getattr(options, name)
        if abs(frequency) > options.rate / 2:
            raise ValueError(f"--{name} {frequency:g} Hz is above half the sampling rate, "
                             f"{options.rate / 2:g} Hz (--rate)")
    n = round(options.seconds * options.rate)
    return SIGNALS[options.signal](n, options)


def write(path, samples, rate):
    """Writes a table of times and values, or audio of 32-bit floats, depending on the extension."""
    ending = path.lower().rpartition(".")[2]
    if ending == "csv":
        times = np.arange(len(samples)) / rate
        with outputs.whole(path) as part:
            np.savetxt(part, np.column_stack([times, samples]), "%.17g", ",",
                       header="time [s],x", comments="")
    elif ending == "wav":
        from . import audio
        if rate != int(rate):
            raise ValueError(f"a WAV file needs a whole number of samples per second, not {rate}")
        with outputs.whole(path) as part, audio.written(part, int(rate), 1, "FLOAT", "WAV") as file:
            file.write(samples)
    else:
        raise ValueError(f"{path}: the name must end in .csv or .wav")
