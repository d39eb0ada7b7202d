"""Audio files by libsndfile: every format and coding that it reads."""

import os
import re
import struct

import numpy as np

from .files import InputError

STARTS = (b"RIFF", b"RIFX", b"RF64", b"FORM", b"fLaC", b"OggS", b".snd", b"caff", b"riff")
ENDINGS = (".wav", ".wave", ".flac", ".aif", ".aiff", ".aifc", ".ogg", ".oga", ".opus", ".mp3", ".au",
           ".snd", ".caf", ".w64", ".rf64", ".voc")
FRAMES_AT_ONCE = 1 << 20


def is_audio(path, start):
    return start[:4] in STARTS or os.path.splitext(path)[1].lower() in ENDINGS and b"\0" in start


def read(path, local, column, first, most, whole):
    """Samples of one channel from a frame on, the rate, the channel from 1 and the numbers of
    channels and frames. Where these are more than are kept, `whole` is given all of them. `path` is what
    messages name, `local` the file."""
    import soundfile
    try:
        with soundfile.SoundFile(local) as file:
            channels, frames = file.channels, file.frames
            if column is not None and not (str(column).isdigit() and 1 <= int(column) <= channels):
                raise InputError(f"{path}: no channel {column!r} among its {channels}")
            channel = int(column or 1)
            if frames == 0:
                wrong = wrong_length(local, frames)
                raise InputError(f"{path}: the file holds no samples" + f": {wrong}" * bool(wrong))
            if not 0 <= first < frames:
                raise InputError(f"{path}: has {frames} samples, none at {first}")
            values, frames = _channel(path, file, channel, first, most, whole)
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
    return np.concatenate(kept) if kept else np.empty(0), seen


UNKNOWN = (0xFFFFFFFF, 0x7FFFFFFF, 0x7FFFFFFF + 1)  # what recorders write that cannot go back to the header


def wrong_length(local, frames):
    """What is wrong with the lengths that a file announces, or an empty text. `frames` is how many could be
    read."""
    size = os.path.getsize(local)
    with open(local, "rb") as file:
        start = file.read(12)
        if start[:4] in (b"RIFF", b"RIFX", b"FORM"):
            return _wrong_chunks(file, start, size, frames)
    import soundfile
    with soundfile.SoundFile(local) as file:
        announced = file.frames
    return f"the file is cut off: {frames} of {announced} samples are there" if frames < announced else ""


def _wrong_chunks(file, start, size, frames):
    """As wrong_length, of a file of chunks: each a name, a length and that many bytes."""
    order = "<" if start[:4] == b"RIFF" else ">"
    samples, at, announced = ((b"data",), 12, None) if start[:4] != b"FORM" else ((b"SSND",), 12, None)
    while at + 8 <= size:
        file.seek(at)
        name, length = struct.unpack(f"{order}4sI", file.read(8))
        if name == b"COMM":
            announced = struct.unpack(">hI", file.read(6))[1]
        rest = size - at - 8
        if name in samples:
            if length in UNKNOWN:
                return "the header leaves the length open: all to the end of the file is taken"
            if length > rest:
                return f"the file is cut off: {rest} of {length} bytes of samples are there"
            if announced is not None and announced != frames:
                return f"the header announces {announced} samples, {frames} are there"
        elif length > rest or not re.fullmatch(rb"[\x20-\x7e]{4}", name):
            return f"{rest + 8} bytes at the end of the file belong to no part of it: the header may be wrong"
        at += 8 + length + length % 2
    named = struct.unpack(f"{order}I", start[4:8])[0] + 8
    if named not in (size, size - 1, size + 1, 8) and named - 8 not in UNKNOWN:
        return f"the header announces a file of {named} bytes, which has {size}"
    return ""
