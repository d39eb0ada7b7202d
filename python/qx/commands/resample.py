"""The command resample."""

import argparse
import math
import sys

from ..outputs import add_force
from .values import add_command

EXAMPLES = """\
examples:
  python3 -m qx generate sine tone.wav --rate 48000
  python3 -m qx resample tone.wav tone44.wav --rate 44100
  python3 -m qx resample tone.wav tone.flac --rate 96000

The extension of the new file determines its format: .wav, .flac, .aiff, .w64 or .rf64. The sample format of
the old file is kept where the new format has it. In integer formats, samples that the filter takes beyond
full scale are clipped and counted."""


def rate(text):
    value = int(text)
    if not 1 <= value <= 10_000_000:
        raise argparse.ArgumentTypeError(f"{text} is not between 1 and 10000000")
    return value


def resample(options):
    import tqdm

    from .. import outputs
    from ..resampling import resample_file
    outputs.check(options.target, options.force, inputs=outputs.identities([options.source]))
    # No bar is shown for a file that is done within a second.
    with tqdm.tqdm(unit=" frames", unit_scale=True, delay=1, leave=False, disable=not sys.stderr.isatty()) as bar:
        done = resample_file(options.source, options.target, options.rate, bar.update,
                             lambda sound: bar.reset(sound.frames))
    print(f"{options.source}: {done.read} frames at {done.sound.samplerate} Hz")
    if done.wrong:
        print(f"qx: {options.source}: {done.wrong}", file=sys.stderr)
    written = -(-done.read * done.up // done.down)
    print(f"{options.target}: {written} frames at {options.rate} Hz{done.format_note}")
    if done.clipped:
        beyond = 20 * math.log10(done.highest)
        print(f"qx: {options.target}: {done.clipped} sample{'s' * (done.clipped != 1)} beyond full scale, by "
              f"up to {beyond:.2g} dB, clipped", file=sys.stderr)


def add(commands):
    command = add_command(commands, "resample", EXAMPLES,
                          help="changes the sampling rate of an audio file")
    command.add_argument("source", metavar="IN")
    command.add_argument("target", metavar="OUT")
    command.add_argument("--rate", type=rate, required=True, metavar="HZ",
                         help="samples per second of the new file")
    add_force(command, "replaces an existing file, but never the file that is read")
    command.set_defaults(run=resample)
