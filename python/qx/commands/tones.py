"""The command tones."""

import os

from ..outputs import add_force
from . import reading
from .measure import number, show_table, show_texts, write_table
from .values import add_command, bar, positive

EXAMPLES = """\
examples:
  python3 -m qx generate sine tone.wav --rate 48000 --frequency 997
  python3 -m qx tones tone.wav
  python3 -m qx tones tone.wav --harmonics 5 --full-scale 1 --csv tones.csv
  python3 -m qx tones examples/data/ecg_208_360hz.csv --count 8 --plot hum.svg

Harmonics are measured for the largest tone, or for the tone near --fundamental. THD, SINAD, SNR and ENOB
follow IEEE 1241. A plot of an earlier run (SVG) is replaced. Other files of that name are replaced only with
--force."""


def tones(options):
    from .. import drawing, long_tones, measure, outputs, recording
    from .. import tones as topic
    from ..sections import uncertain
    path = options.plot or os.path.join("out", "tones.svg")
    inputs = outputs.identities([options.file])
    outputs.check(path, options.force, "tones", inputs)
    if options.csv:
        outputs.check(options.csv, options.force, inputs=inputs)
    with bar() as shown:
        read = recording.read(options.file, **reading.of(options), progress=shown.update)
        print(f"{read.name}: {read.choice}")
        rate = read.rate or 1.0
        if read.whole:
            found = long_tones.measured(read.whole, rate, options.count)
            found.residual_rms = long_tones.residual_rms(read.whole, found, rate)
            analysis = long_tones.harmonics(read.whole, rate, options.fundamental or found.frequencies[0],
                                            options.harmonics, options.full_scale)
            drawn = long_tones.spectrum(read.whole, rate)
            print(f"Tones of all {read.whole.count} samples; the spectrum is a mean over parts of {long_tones.SEGMENT} "
                  f"samples, harmonics are means over at most {long_tones.MOST_PARTS} of them")
        else:
            found = topic.tones(read.values, rate, options.count)
            analysis = measure.harmonics(read.values, rate, options.fundamental, options.harmonics,
                                         options.full_scale)
            drawn = topic.spectrum(read.values, rate)
    frequency = "frequency (Hz)" if read.rate else "frequency (1/sample)"
    amplitude = f"amplitude ({read.unit})" if read.unit else "amplitude"
    names = [frequency, amplitude, "phase (rad)"]
    many = len(found.frequencies)
    print(f"{many} tone{'s' * (many != 1)}; residual {found.residual_rms:.6g} {read.unit}".rstrip()
          + f" (root mean square); resolution {found.resolution:.4g}{' Hz' * bool(read.rate)}")
    columns = list(zip(found.frequencies, found.frequency_errors, found.amplitudes, found.amplitude_errors,
                       found.phases))
    show_texts([names[0], "±", names[1], "±", names[2]],
               [(*uncertain(*row[:2]), *uncertain(*row[2:4]), f"{row[4]:.6g}") for row in columns])
    if not found.significant.all():
        print("May be noise: " + ", ".join(f"{f:.6g}" for f in found.frequencies[~found.significant]))
    print("Harmonics")
    rows = [(h, *row) for h, row in enumerate(zip(analysis.frequencies, analysis.amplitudes,
                                                  analysis.phases), 1)]
    show_table(["harmonic", *names], rows)
    for label, value, unit in (("THD", 100 * analysis.thd, "%"), ("SINAD", analysis.sinad, "dB"),
                               ("SNR", analysis.snr, "dB"), ("SFDR", analysis.sfdr, "dB"),
                               ("ENOB", analysis.enob, "bits"),
                               ("noise in a bin", analysis.noise_floor, "dB of the fundamental")):
        print(f"  {label:<16} {value:>10.6g} {unit}")
    if options.csv:
        errors = [f"standard error of {name}" for name in names[:2]]
        write_table(options.csv, ["kind", "number", names[0], names[1], names[2], *errors],
                    [("tone", i, row[0], row[2], row[4], row[1], row[3]) for i, row in enumerate(columns, 1)]
                    + [("harmonic", *row, "", "") for row in rows])
    drawing.save([topic.plot(read, found, analysis, drawn)], path, "tones")
    print(f"Spectrum with tones and harmonics: {path}")


def add(commands):
    command = add_command(
        commands, "tones", EXAMPLES, help="measures tones, harmonics and noise of a recording",
        description="Measures the tones of a recording, its harmonics, distortion and noise.")
    command.add_argument("file")
    command.add_argument("--count", type=number, default=5, metavar="N",
                         help="largest number of tones, 5 by default; fewer if the rest could be noise")
    command.add_argument("--fundamental", type=positive, metavar="HZ",
                         help="approximate frequency of the tone whose harmonics are measured; by default, "
                         "the largest tone")
    command.add_argument("--harmonics", type=number, default=10, metavar="N", help="highest harmonic, 10 by default")
    command.add_argument("--full-scale", type=positive, metavar="VALUE",
                         help="amplitude of a full-scale sine, for ENOB; by default, that of the tone")
    reading.missing(reading.add_options(command), "interpolate")
    command.add_argument("--csv", metavar="FILE", help="writes both tables to this file")
    command.add_argument("--plot", metavar="FILE",
                         help="file of the plot, out/tones.svg by default; can also be .png or .pdf")
    add_force(command)
    command.set_defaults(run=tones)
