"""Audio files at another sampling rate, in blocks: the memory does not depend on the length."""

import math
import os

import numpy as np
import soundfile

from .calls import call

ATTENUATION = 123.0  # dB by the estimate, 122 by the spectrum of the taps, of what would fold back
PASSBAND = 0.9  # the part of the lower band that passes unchanged
FRAMES_AT_ONCE = 1 << 15
LARGEST_FACTOR = 1 << 17  # beyond it the taps fill the memory
SAMPLE_BYTES = {"PCM_U8": 1, "PCM_16": 2, "PCM_24": 3, "PCM_32": 4, "FLOAT": 4}


def low_pass(up, down, attenuation=ATTENUATION, passband=PASSBAND):
    """Taps for a change of the rate by up / down, of odd number and unit sum: a sinc with Kaiser's
    window, whose stopband begins where the lower of both bands ends. The estimates of length and
    shape are those of scipy.signal.kaiserord."""
    edge = 1 / max(up, down)  # of the lower band, 1 being half the rate of the grid
    width = edge * (1 - passband)
    half = math.ceil((attenuation - 7.95) / (2.285 * math.pi * width) / 2)
    cutoff = edge * (1 + passband) / 2
    taps = (np.sinc(cutoff * np.arange(-half, half + 1))
            * np.kaiser(2 * half + 1, 0.1102 * (attenuation - 8.7)))
    return taps / taps.sum()


class Resampler:
    """A stream of frames, one to a row, from one rate to another. Frame 0 stays at time 0."""

    def __init__(self, rate, new_rate, channels, **design):
        common = math.gcd(rate, new_rate)
        self.up, self.down = new_rate // common, rate // common
        if max(self.up, self.down) > LARGEST_FACTOR:
            raise ValueError(f"{rate} and {new_rate} Hz have too small a common divisor, {common}")
        self.taps = low_pass(self.up, self.down, **design)
        self.channels = channels
        self.read = self.written = 0
        self.reset, self.offset, self.count, self.state = 1, 0, 0, np.zeros((0, 0))

    def put(self, frames):
        """The frames at the new rate that these and those before make whole."""
        self.read += len(frames)
        # The positions of a call, `up` to each frame in hand, have room in 30 bits.
        most = min(FRAMES_AT_ONCE, 2 ** (29 - (self.up - 1).bit_length()))
        return np.concatenate([self._resample(frames[first:first + most])
                               for first in range(0, len(frames), most)] or [frames])

    def end(self):
        """The last frames, whose windows reach beyond the end."""
        due = -(-self.read * self.up // self.down) - self.written
        return self._resample(np.zeros((len(self.taps) // 2 // self.up + 1, self.channels)))[:due]

    def _resample(self, frames):
        self.offset, self.state, self.count, resampled = call(
            "RationalResampleMultiCh_H", np.ascontiguousarray(frames.T), self.up, self.down,
            self.reset, self.offset, self.taps, self.state, self.count)
        self.reset = 0
        self.written += resampled.shape[1]
        return resampled.T


def opened(path):
    if not os.path.exists(path):
        raise OSError(f"{path}: no such file")
    try:
        return soundfile.SoundFile(path)
    except soundfile.SoundFileError as error:
        reason = getattr(error, "error_string", error)
        raise OSError(f"{path}: cannot be read as audio: {reason}") from None


def resample_file(source, target, rate, progress=lambda frames: None):
    """Writes the sound of the open file `source` to `target`, a WAV file in the same sample format,
    which appears when it is whole; `progress` is told of frames as they are read. The stream that
    did it is the result."""
    resampler = Resampler(source.samplerate, rate, source.channels)
    bytes_due = (source.frames * rate / source.samplerate * source.channels
                 * SAMPLE_BYTES.get(source.subtype, 8))
    kind = "RF64" if bytes_due > 2**32 - 2**16 else "WAV"  # where a plain WAV file ends
    subtype = source.subtype if soundfile.check_format(kind, source.subtype) else None
    part = f"{target}.part"
    try:
        with soundfile.SoundFile(part, "w", rate, source.channels, subtype, format=kind) as out:
            while len(frames := source.read(FRAMES_AT_ONCE, always_2d=True)):
                out.write(resampler.put(frames))
                progress(len(frames))
            out.write(resampler.end())
        os.replace(part, target)
    except soundfile.SoundFileError as error:
        raise OSError(f"{target}: cannot be written: {error}") from None
    finally:
        if os.path.exists(part):
            os.remove(part)
    return resampler
