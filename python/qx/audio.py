"""Audio files by libsndfile: every format and coding that it reads."""

import os

import numpy as np

from .tables import InputError

STARTS = (b"RIFF", b"RIFX", b"RF64", b"FORM", b"fLaC", b"OggS", b".snd", b"caff", b"riff")
ENDINGS = (".wav", ".wave", ".flac", ".aif", ".aiff", ".aifc", ".ogg", ".oga", ".opus", ".mp3", ".au",
           ".snd", ".caf", ".w64", ".rf64", ".voc")
FRAMES_AT_ONCE = 1 << 20


def is_audio(path, start):
    return start[:4] in STARTS or os.path.splitext(path)[1].lower() in ENDINGS and b"\0" in start


def read(path, column, first, most):
    """Samples of one channel from a frame on, the rate, the channel from 1 and the numbers of
    channels and frames."""
    import soundfile
    try:
        with soundfile.SoundFile(path) as file:
            channels, frames = file.channels, file.frames
            if column is not None and not (str(column).isdigit() and 1 <= int(column) <= channels):
                raise InputError(f"{path}: no channel {column!r} among its {channels}")
            channel = int(column or 1)
            if frames == 0:
                raise InputError(f"{path}: the file holds no samples")
            if not 0 <= first < frames:
                raise InputError(f"{path}: has {frames} samples, none at {first}")
            file.seek(first)
            wanted = min(frames - first, most)
            values, count = np.empty(wanted), 0
            while count < wanted:
                part = file.read(min(FRAMES_AT_ONCE, wanted - count), dtype="float64", always_2d=True)
                if not len(part):
                    break
                values[count:count + len(part)] = part[:, channel - 1]
                count += len(part)
            rate = float(file.samplerate)
    except soundfile.LibsndfileError as error:
        reason = error.error_string.strip().rstrip(".")
        raise InputError(f"{path}: cannot be read as audio: {reason}") from None
    if count == 0:
        raise InputError(f"{path}: the file holds no samples")
    values = values[:count]
    wrong = np.flatnonzero(~np.isfinite(values))
    if len(wrong):
        raise InputError(f"{path}: sample {first + wrong[0] + 1} is not a finite number")
    return values, rate, channel, channels, frames
