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


def read(path, column, first, most, whole):
    """Samples of one channel from a frame on, the rate, the channel from 1 and the numbers of
    channels and frames. Where these are more than are kept, `whole` is given all of them."""
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
            values = _channel(path, file, channel, first, most, whole)
            rate = float(file.samplerate)
    except soundfile.LibsndfileError as error:
        reason = error.error_string.strip().rstrip(".")
        raise InputError(f"{path}: cannot be read as audio: {reason}") from None
    if not len(values):
        raise InputError(f"{path}: the file holds no samples")
    return values, rate, channel, channels, frames


def _channel(path, file, channel, first, most, whole):
    kept, seen = [], 0
    while len(part := file.read(FRAMES_AT_ONCE, dtype="float64", always_2d=True)):
        part = part[:, channel - 1]
        wrong = np.flatnonzero(~np.isfinite(part))
        if len(wrong):
            raise InputError(f"{path}: sample {seen + wrong[0] + 1} is not a finite number")
        begin, end = max(0, first - seen), max(0, first + most - seen)
        kept.append(part[begin:max(begin, end)].copy())
        if file.frames > most:
            whole.add(part)
        seen += len(part)
    return np.concatenate(kept) if kept else np.empty(0)
