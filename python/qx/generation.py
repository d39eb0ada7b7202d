"""Signals by name: waves, noises and patterns of a given number of samples."""

import numpy as np

from . import outputs
from .calls import call

STATE = {"s1": 0, "s2": 0, "s3": 0}  # every seed restarts the stream


def _wave(export, *after):
    """A continuous wave; `after` names the options behind the phase."""
    def generate(n, o):
        return call(export, n, o.amplitude, o.frequency / o.rate, o.phase,
                    *(getattr(o, name) for name in after))[0]
    return generate


def _pulse(o, n, export, *arguments):
    return call(export, np.empty(0), n, *arguments)


SIGNALS = {
    "sine": _wave("SineWaveCIN"),
    "square": _wave("SquareWaveCIN", "duty"),
    "triangle": _wave("TriangleWaveCIN"),
    "sawtooth": _wave("SawtoothWaveCIN"),
    "chirp": lambda n, o: call("ChirpCIN", n, o.amplitude, o.frequency / o.rate, o.to / o.rate),
    "white": lambda n, o: call("White2026", n, o.amplitude, o.seed, 0, 0.0),
    "gauss": lambda n, o: call("Gauss2026", n, o.amplitude, o.seed, 0, 0.0),
    "periodic": lambda n, o: call("PeriodNoise", n, o.amplitude, o.seed, STATE)[0],
    "gamma": lambda n, o: o.amplitude * call("Gamma2026", n, float(o.order), o.seed, 0, 0.0),
    "poisson": lambda n, o: o.amplitude * call("Poisson2026", n, o.mean, o.seed, 0, 0.0),
    "binomial": lambda n, o: o.amplitude * call("Binomial2026", n, float(o.trials), o.probability,
                                                o.seed, 0, 0.0),
    "ramp": lambda n, o: call("RampPtrn", n, -o.amplitude, o.amplitude),
    "pulse": lambda n, o: call("PulsePtrn", n, o.amplitude, round(o.delay * o.rate),
                               round(o.width * o.rate)),
    "impulse": lambda n, o: call("ImpulsePtrn", n, o.amplitude, round(o.delay * o.rate)),
    "sinc": lambda n, o: call("SincWave", n, o.amplitude, o.delay * 2 * o.frequency,
                              2 * o.frequency / o.rate),
    "gauss-pulse": lambda n, o: _pulse(o, n, "GaussPulseH", o.amplitude, o.delay, 1 / o.rate,
                                       o.frequency, 0.5, 6.0),
    "monopulse": lambda n, o: _pulse(o, n, "GaussMonopulseH", 1 / o.rate, o.delay, o.frequency,
                                     o.amplitude),
    "triangle-pulse": lambda n, o: _pulse(o, n, "AperiodTriangleH", o.amplitude, o.delay,
                                          1 / o.rate, o.width, 0.5),
}


# What has a frequency, by the options that say it.
FREQUENCIES: dict[str, tuple[str, ...]] = {
    "chirp": ("frequency", "to"),
    **{name: ("frequency",) for name in ("sine", "square", "triangle", "sawtooth", "sinc", "gauss-pulse",
                                         "monopulse")}}


def generate(options):
    """The samples that the options of the command ask for."""
    for name in FREQUENCIES.get(options.signal, ()):
        frequency = getattr(options, name)
        if abs(frequency) > options.rate / 2:
            raise ValueError(f"--{name} {frequency:g} Hz is above half the sampling rate, "
                             f"{options.rate / 2:g} Hz (--rate)")
    n = round(options.seconds * options.rate)
    return SIGNALS[options.signal](n, options)


def write(path, samples, rate):
    """A table of times and values, or audio of 32-bit floats, by the name's ending."""
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
