"""Audio files at another sampling rate, in blocks: the memory does not depend on the length."""

import math
import os

import numpy as np
import soundfile

from . import multirate, outputs

FRAMES_AT_ONCE = 1 << 15
LARGEST_FACTOR = 1 << 17  # beyond it the taps fill the memory
FORMATS = {".wav": "WAV", ".wave": "WAV", ".flac": "FLAC", ".aif": "AIFF", ".aiff": "AIFF",
           ".w64": "W64", ".rf64": "RF64"}
BYTES_OF_32 = 2**32 - 2**16  # where files end that have their length in 32 bits
REALS = ("FLOAT", "DOUBLE")  # sample formats that hold what lies beyond full scale
SAMPLE_BYTES = {"PCM_U8": 1, "PCM_16": 2, "PCM_24": 3, "PCM_32": 4, "FLOAT": 4}


class Resampler:
    """Frames of a file at another rate, one to a row, block by block, and what is said of them afterwards."""

    def __init__(self, rate, new_rate, channels):
        common = math.gcd(rate, new_rate)
        self.up, self.down = new_rate // common, rate // common
        if max(self.up, self.down) > LARGEST_FACTOR:
            raise ValueError(f"{rate} and {new_rate} Hz have too small a common divisor, {common}")
        self.stream = multirate.Resampler(self.up, self.down, channels, axis=0)
        self.read = 0
        self.clipped, self.highest, self.format_note = 0, 0.0, ""

    def put(self, frames):
        """The frames at the new rate that these and those before make whole."""
        self.read += len(frames)
        return self.stream(frames)

    def end(self):
        """The last frames, whose filter reaches beyond the end."""
        return self.stream.finish()


def opened(path):
    if not os.path.exists(path):
        raise OSError(f"{path}: no such file")
    try:
        return soundfile.SoundFile(path)
    except soundfile.SoundFileError as error:
        reason = getattr(error, "error_string", error)
        raise OSError(f"{path}: cannot be read as audio: {reason}") from None


def format_for(target, source, rate):
    """The format and the sample format of the new file; a ValueError where there is none."""
    ending = os.path.splitext(target)[1].lower()
    if ending not in FORMATS:
        raise ValueError(f"{target}: the name must end in one of {', '.join(FORMATS)}")
    kind = FORMATS[ending]
    bytes_due = (source.frames * rate / source.samplerate * source.channels
                 * SAMPLE_BYTES.get(source.subtype, 8))
    if bytes_due > BYTES_OF_32 and kind in ("WAV", "AIFF"):
        if kind == "AIFF":
            raise ValueError(f"{target}: an AIFF file cannot be so long; .w64 and .rf64 can")
        kind = "RF64"
    if soundfile.check_format(kind, source.subtype):
        return kind, source.subtype
    # FLAC has no more than 24 bits; what is lost otherwise is a coding, such as that of Vorbis.
    return kind, "PCM_24" if SAMPLE_BYTES.get(source.subtype, 0) > 2 or source.subtype in REALS else "PCM_16"


def resample_file(source, target, rate, progress=lambda frames: None):
    """Writes the sound of the open file `source` to `target`, in the format that its ending names and
    the same sample format if that has it; the file appears when it is whole. `progress` is told of
    frames as they are read. The stream that did it is the result: `clipped` samples were beyond full
    scale, the farthest at `highest` times that."""
    resampler = Resampler(source.samplerate, rate, source.channels)
    kind, subtype = format_for(target, source, rate)
    if subtype != source.subtype:
        resampler.format_note = f", {subtype} in place of {source.subtype}"

    def put(out, frames):
        if subtype not in REALS:
            beyond = np.abs(frames).max(initial=0)
            if beyond > 1:
                resampler.clipped += int(np.count_nonzero(np.abs(frames) > 1))
                resampler.highest = max(resampler.highest, float(beyond))
        out.write(frames)

    try:
        with outputs.whole(target) as part, \
                soundfile.SoundFile(part, "w", rate, source.channels, subtype, format=kind) as out:
            while len(frames := source.read(FRAMES_AT_ONCE, always_2d=True)):
                put(out, resampler.put(frames))
                progress(len(frames))
            put(out, resampler.end())
    except soundfile.SoundFileError as error:
        raise OSError(f"{target}: cannot be written: {error}") from None
    return resampler
