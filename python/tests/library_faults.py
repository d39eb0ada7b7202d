"""What a library may do while reading a hostile file: functions for the workers of qx/isolation.py."""

import ctypes
import os
import tempfile
import time

import numpy as np


def crashes(tell, path, file, number):
    os.kill(os.getpid(), number)


def writes_nowhere(tell, path, file):
    ctypes.memset(8, 0, 8)


def never_ends(tell, path, file):
    while True:
        pass


def sleeps(tell, path, file):
    tell("begun")
    time.sleep(3600)


def takes(tell, path, file, size):
    return len(np.ones(size // 8))


def crashes_later(tell, path, file):
    """Dies if the worker has read another file before."""
    if os.environ.get("QX_TEST_READ"):
        os.abort()
    os.environ["QX_TEST_READ"] = "yes"
    return os.getpid()


def gives(tell, path, file, count):
    for i in range(3):
        tell(np.full(count, i))
    kept = tempfile.TemporaryFile()
    kept.write(b"kept")
    return {"path": path, "big": np.arange(count), "file": kept, "folder": os.listdir(tempfile.gettempdir())}


class Unusual(Exception):
    def __init__(self, one, two):
        super().__init__(one)


def raises(tell, path, file):
    raise Unusual(1, 2)
