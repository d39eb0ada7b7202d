"""Messages between two processes on this machine. They carry anything that can be pickled. Arrays are passed in
shared memory, which is mapped rather than copied, and open files as their descriptors."""

import array
import contextlib
import io
import mmap
import os
import pickle
import socket
import struct

IN_LINE = 1 << 16  # bytes of arrays up to which shared memory does not pay off
HEAD = struct.Struct("<QII?")  # bytes of the pickle, arrays, open files, whether the arrays are in shared memory
MOST_FILES = 250  # open files that one system message may carry


class _Pickler(pickle.Pickler):
    def __init__(self, file):
        self.buffers, self.descriptors = [], []
        super().__init__(file, 5, buffer_callback=lambda buffer: self.buffers.append(buffer.raw()))

    def persistent_id(self, value):
        if not isinstance(value, (io.BufferedRandom, io.FileIO)):  # the types that tempfile.TemporaryFile returns
            return None
        value.flush()
        self.descriptors.append(value.fileno())
        return len(self.descriptors) - 1, isinstance(value, io.FileIO)


class _Unpickler(pickle.Unpickler):
    def __init__(self, file, buffers, descriptors):
        self.descriptors = descriptors
        super().__init__(file, buffers=buffers)

    def persistent_load(self, place):
        index, raw = place
        return os.fdopen(self.descriptors[index], "r+b", 0 if raw else -1)


class Channel:
    """One end of a pair of sockets."""

    def __init__(self, connection):
        self.connection = connection

    def send(self, value):
        text = io.BytesIO()
        pickler = _Pickler(text)
        pickler.dump(value)
        lengths = [len(buffer) for buffer in pickler.buffers]
        shared = sum(lengths) >= IN_LINE
        head = HEAD.pack(text.tell(), len(lengths), len(pickler.descriptors), shared)
        with contextlib.ExitStack() as stack:
            descriptors = pickler.descriptors
            if shared:
                descriptors = [*descriptors, stack.enter_context(_in_memory(pickler.buffers)).fileno()]
            socket.send_fds(self.connection, [head[:1]], descriptors)
            self.connection.sendall(head[1:] + array.array("Q", lengths).tobytes())
            self.connection.sendall(text.getbuffer())
            for buffer in () if shared else pickler.buffers:
                self.connection.sendall(buffer)

    def receive(self):
        """The next message. Raises EOFError if the other side has ended. If the connection has a timeout, raises
        TimeoutError, but only before the first byte of a message."""
        first, descriptors, _, _ = socket.recv_fds(self.connection, 1, MOST_FILES)
        if not first:
            raise EOFError
        before = self.connection.gettimeout()
        self.connection.settimeout(None)
        try:
            size, count, files, shared = HEAD.unpack(first + self._exactly(HEAD.size - 1))
            lengths = array.array("Q", bytes(self._exactly(8 * count)))
            text = self._exactly(size)
            total = sum(lengths)
            store = _mapped(descriptors[files], total) if shared else self._exactly(total)
        finally:
            self.connection.settimeout(before)
        buffers, start = [], 0
        for length in lengths:
            buffers.append(memoryview(store)[start:start + length])
            start += length
        return _Unpickler(io.BytesIO(text), buffers, descriptors).load()

    def _exactly(self, size):
        found = bytearray(size)
        rest = memoryview(found)
        while rest:
            count = self.connection.recv_into(rest)
            if not count:
                raise EOFError
            rest = rest[count:]
        return found


def _in_memory(buffers):
    """An open file in memory, not on a disk, that holds the buffers."""
    file = os.fdopen(os.memfd_create("qx"), "wb", buffering=0)
    for buffer in buffers:
        rest = memoryview(buffer)
        while rest:
            rest = rest[file.write(rest):]
    return file


def _mapped(descriptor, size):
    """The bytes of such a file, mapped. A page that this process writes to becomes its private copy."""
    try:
        return mmap.mmap(descriptor, size, mmap.MAP_PRIVATE)
    finally:
        os.close(descriptor)
