"""Resampling of audio files in blocks, so that the memory does not depend on their length."""

import contextlib
import dataclasses
import math
import os
from typing import Any

import numpy as np
import soundfile

from . import audio, isolation, multirate, outputs
from .files import InputError

FRAMES_AT_ONCE = 1 << 15
LARGEST_FACTOR = 1 << 17  # beyond it the taps fill the memory
FORMATS = {".wav": "WAV", ".wave": "WAV", ".flac": "FLAC", ".aif": "AIFF", ".aiff": "AIFF",
           ".w64": "W64", ".rf64": "RF64"}
BYTES_OF_32 = 2**32 - 2**16  # the largest file with a length of 32 bits
REALS = ("FLOAT", "DOUBLE")  # sample formats that hold values beyond full scale
SAMPLE_BYTES = {"PCM_U8": 1, "PCM_16": 2, "PCM_24": 3, "PCM_32": 4, "FLOAT": 4}


class Resampler:
    """The frames of a file at another rate, one to a row, block by block, and remarks on them."""

    def __init__(self, rate, new_rate, channels):
        common = math.gcd(rate, new_rate)
        self.up, self.down = new_rate // common, rate // common
        if max(self.up, self.down) > LARGEST_FACTOR:
            raise ValueError(f"{rate} and {new_rate} Hz have too small a common divisor, {common}")
        self.stream = multirate.Resampler(self.up, self.down, channels, axis=0)
        self.read = 0
        self.clipped, self.highest, self.format_note = 0, 0.0, ""
        self.sound, self.wrong = None, ""

    def put(self, frames):
        """Takes frames and returns those at the new rate that are now complete."""
        self.read += len(frames)
        return self.stream(frames)

    def end(self):
        """The last frames, which the filter computes from beyond the end."""
        return self.stream.finish()


@dataclasses.dataclass
class Sound:
    """The contents of the header of an audio file."""
    samplerate: int
    channels: int
    frames: int
    subtype: str


def _read(tell, path, file):
    """Passes the Sound and then its frames, block by block, to `tell`. Returns what is wrong with the lengths that the
    file announces."""
    if not os.path.exists(file):
        raise InputError(f"{path}: no such file")
    read = 0
    try:
        with soundfile.SoundFile(file) as source:
            tell(Sound(source.samplerate, source.channels, source.frames, source.subtype))
            while len(frames := source.read(FRAMES_AT_ONCE, always_2d=True)):
                tell(frames)
                read += len(frames)
    except soundfile.SoundFileError as error:
        reason = getattr(error, "error_string", error)
        raise InputError(f"{path}: cannot be read as audio: {reason}") from None
    return audio.wrong_length(file, read)


def format_for(target, source, rate):
    """The format and the sample format of the new file; raises ValueError if there is none."""
    ending = os.path.splitext(target)[1].lower()
    if ending not in FORMATS:
        raise ValueError(f"{target}: the name must end in one of {', '.join(FORMATS)}")
    kind = FORMATS[ending]
    bytes_due = (source.frames * rate / source.samplerate * source.channels
                 * SAMPLE_BYTES.get(source.subtype, 8))
    if bytes_due > BYTES_OF_32 and kind in ("WAV", "AIFF"):
        if kind == "AIFF":
            raise ValueError(f"{target}: an AIFF file cannot be this long; .w64 and .rf64 can")
        kind = "RF64"
    if soundfile.check_format(kind, source.subtype):
        return kind, source.subtype
    # FLAC has at most 24 bits. Otherwise, only a coding is lost, such as that of Vorbis.
    return kind, "PCM_24" if SAMPLE_BYTES.get(source.subtype, 0) > 2 or source.subtype in REALS else "PCM_16"


class _Resampled:
    """The new file, written as the blocks of the old one arrive. It appears when it is complete."""

    def __init__(self, target, rate, begun, progress, stack):
        self._target, self._rate, self._begun, self._progress = target, rate, begun, progress
        self._stack = stack
        self._out: Any = None
        self.resampler: Any = None

    def take(self, told):
        """Takes the Sound, then its blocks."""
        if self._out is None:
            self._begin(told)
        else:
            self._put(self.resampler.put(told))
            self._progress(len(told))

    def _begin(self, sound):
        self.resampler = resampler = Resampler(sound.samplerate, self._rate, sound.channels)
        resampler.sound = sound
        kind, subtype = format_for(self._target, sound, self._rate)
        if subtype != sound.subtype:
            resampler.format_note = f", {subtype} in place of {sound.subtype}"
        self._counts = subtype not in REALS
        part = self._stack.enter_context(outputs.whole(self._target))
        self._out = self._stack.enter_context(audio.written(part, self._rate, sound.channels, subtype, kind))
        self._begun(sound)

    def _put(self, frames):
        if self._counts:
            beyond = np.abs(frames).max(initial=0)
            if beyond > 1:
                self.resampler.clipped += int(np.count_nonzero(np.abs(frames) > 1))
                self.resampler.highest = max(self.resampler.highest, float(beyond))
        self._out.write(frames)

    def end(self):
        self._put(self.resampler.end())


def resample_file(source, target, rate, progress=lambda frames: None, begun=lambda sound: None):
    """Writes the sound of the file `source` to `target`, in the format that its extension names, and in the same
    sample format if that format has it. The file appears when it is complete. `begun` is called with the Sound,
    `progress` with numbers of frames as they are read. Returns the stream, with its `sound`, what is `wrong` with
    the lengths that the file announces, and the number of samples that were `clipped`, the farthest at `highest`
    times full scale."""
    with contextlib.ExitStack() as stack:
        made = _Resampled(target, rate, begun, progress, stack)
        wrong = isolation.read(_read, source, told=made.take)
        made.end()
    made.resampler.wrong = wrong
    return made.resampler
