"""The command resample."""

import argparse
import sys


def rate(text):
    value = int(text)
    if not 1 <= value <= 10_000_000:
        raise argparse.ArgumentTypeError(f"{text} is not between 1 and 10000000")
    return value


def resample(options):
    import tqdm

    from ..resampling import opened, resample_file
    with opened(options.source) as source:
        # A file that is done within a second needs no bar.
        with tqdm.tqdm(total=source.frames, unit=" frames", unit_scale=True, delay=1, leave=False,
                       disable=not sys.stderr.isatty()) as bar:
            done = resample_file(source, options.target, options.rate, bar.update)
        print(f"{options.source}: {done.read} frames at {source.samplerate} Hz")
    written = -(-done.read * done.up // done.down)
    print(f"{options.target}: {written} frames at {options.rate} Hz")


def add(commands):
    command = commands.add_parser("resample", help="changes the sampling rate of a WAV file")
    command.add_argument("source", metavar="IN.wav")
    command.add_argument("target", metavar="OUT.wav")
    command.add_argument("--rate", type=rate, required=True, metavar="HZ",
                         help="samples per second of the new file")
    command.set_defaults(run=resample)
