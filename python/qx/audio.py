"""Audio files, read by libsndfile, in every format and coding that it supports."""

import contextlib
import errno
import os
import re
import shutil
import struct

import numpy as np

from .files import InputError

STARTS = (b"RIFF", b"RIFX", b"RF64", b"FORM", b"fLaC", b"OggS", b".snd", b"caff", b"riff")
ENDINGS = (".wav", ".wave", ".flac", ".aif", ".aiff", ".aifc", ".ogg", ".oga", ".opus", ".mp3", ".au",
           ".snd", ".caf", ".w64", ".rf64", ".voc")
FRAMES_AT_ONCE = 1 << 20
FULL = 1 << 20  # bytes; with less free space, the disk counts as full


def is_audio(path, start):
    return b"\0" in start and (start[:4] in STARTS or os.path.splitext(path)[1].lower() in ENDINGS)


def read(path, local, column, first, most, whole, outlines, outline):
    """Samples of one channel from a frame on, the rate, the number of the channel from 1, and the numbers of
    channels and frames. `whole` receives all samples from `first` on. `outlines` receives those of the other
    channels, by their indices, in objects created by `outline`. Messages call the file `path`; `local` is the
    actual file."""
    import soundfile
    try:
        with soundfile.SoundFile(local) as file:
            channels, frames = file.channels, file.frames
            if column is not None and not (str(column).isdigit() and 1 <= int(column) <= channels):
                raise InputError(f"{path}: no channel {column!r} among its {channels}")
            channel = int(column or 1)
            if frames and not 0 <= first < frames:
                raise InputError(f"{path}: has {frames} samples, none at {first}")
            values, frames = _channel(path, file, channel, first, most, whole, outlines, outline)
            rate = float(file.samplerate)
    except soundfile.LibsndfileError as error:
        reason = error.error_string.strip().rstrip(".")
        raise InputError(f"{path}: cannot be read as audio: {reason}") from None
    if not len(values):
        wrong = wrong_length(local, 0)
        raise InputError(f"{path}: the file holds no samples" + f": {wrong}" * bool(wrong))
    return values, rate, channel, channels, frames


def _channel(path, file, channel, first, most, whole, outlines, outline):
    kept, seen = [], 0
    outlines.update({i: outline() for i in range(file.channels) if i != channel - 1})
    while len(parts := file.read(FRAMES_AT_ONCE // file.channels + 1, dtype="float64", always_2d=True)):
        part = parts[:, channel - 1]
        wrong = np.flatnonzero(~np.isfinite(part))
        if len(wrong):
            raise InputError(f"{path}: sample {seen + wrong[0] + 1} is not a finite number")
        begin, end = max(0, first - seen), max(0, first + most - seen)
        kept.append(part[begin:max(begin, end)].copy())
        whole.add(np.ascontiguousarray(part[begin:]))
        for i, one in outlines.items():
            beside = parts[begin:, i]
            one.add(np.where(np.isfinite(beside), beside, np.nan))
        seen += len(part)
    return np.concatenate(kept) if kept else np.empty(0), seen


@contextlib.contextmanager
def written(path, rate, channels, subtype, kind):
    """A new audio file to write to. It is complete if the block ends without an exception: on a full disk,
    libsndfile only says "System error", and for the last samples of a FLAC file it says nothing."""
    import soundfile
    try:
        with soundfile.SoundFile(path, "w", rate, channels, subtype, format=kind) as file:
            yield file
            frames = file.frames
        if soundfile.info(path).frames == frames:
            return
        reason = "it was not written completely"
    except soundfile.SoundFileError as error:
        reason = str(error)
    if shutil.disk_usage(os.path.dirname(path) or ".").free < FULL:
        raise OSError(errno.ENOSPC, os.strerror(errno.ENOSPC))
    raise OSError(reason)


def wrong_length(local, frames):
    """What is wrong with the lengths that a file announces, or an empty text. `frames` is the number of frames
    that could be read."""
    try:
        return _wrong_length(local, frames)
    except struct.error:
        return "the file is cut off: its header ends early"


def _wrong_length(local, frames):
    size = os.path.getsize(local)
    with open(local, "rb") as file:
        start = file.read(24)
        if start[:4] == b"OggS":
            file.seek(max(0, size - (1 << 17)))
            end = file.read()
            last = end.rfind(b"OggS")
            return "" if last >= 0 and end[last + 5] & 4 else "the file is cut off: its last page is missing"
        if start[:4] == b".snd":
            data, length = struct.unpack(">II", start[4:12])
            return _cut(length, size - data) if length != OPEN else LEFT_OPEN
        if chunks := CHUNKS.get(start[:4]):
            return _wrong_chunks(file, start, size, frames, *chunks)
    import soundfile
    with soundfile.SoundFile(local) as file:
        return _cut(file.frames, frames, "samples")


OPEN = 0xFFFFFFFF  # the length written by recorders that cannot go back to the header
LEFT_OPEN = "the header does not give the length: the file is read to its end"
# By the first bytes: the struct of name and length of a chunk, the start of the first chunk, the name of the chunk
# with the samples, the number of bytes to which chunks are padded, and the part of its own head that a length counts.
CHUNKS = {b"RIFF": ("<4sI", 12, b"data", 2, 0), b"RIFX": (">4sI", 12, b"data", 2, 0),
          b"RF64": ("<4sI", 12, b"data", 2, 0), b"FORM": (">4sI", 12, b"SSND", 2, 0),
          b"caff": (">4sq", 8, b"data", 1, 0), b"riff": ("<4s12xQ", 40, b"data", 8, 24)}


def _cut(announced, there, what="bytes of samples"):
    return f"the file is cut off: {there} of {announced} {what} are there" if there < announced else ""


def _wrong_chunks(file, start, size, frames, head, at, samples, filled, counted):
    announced, long, width = None, None, struct.calcsize(head)
    while at + width <= size:
        file.seek(at)
        name, length = struct.unpack(head, file.read(width))
        length -= counted
        if name == b"COMM":
            announced = struct.unpack(">hI", file.read(6))[1]
        elif name == b"ds64":
            long = struct.unpack("<QQ", file.read(16))[1]
        rest = size - at - width
        if name == samples:
            length = long if length == OPEN and long is not None else length
            if length in (OPEN, -1):
                return LEFT_OPEN
            if length > rest:
                return _cut(length, rest)
            if announced is not None and announced != frames:
                return f"the header announces {announced} samples, but there are {frames}"
        elif not 0 <= length <= rest or not re.fullmatch(rb"[\x20-\x7e]{4}", name):
            return f"{rest + width} bytes at the end of the file belong to no chunk: the header may be wrong"
        at += width + -(-length // filled) * filled
    if start[:4] in (b"RIFF", b"RIFX", b"FORM"):
        named = struct.unpack(head[0] + "I", start[4:8])[0] + 8
        if abs(named - size) > 1 and named not in (8, OPEN + 8):
            return f"the header announces a file of {named} bytes, but it has {size}"
    return ""
