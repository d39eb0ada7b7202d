"""The words in which exports keep their plans between calls.

A plan slot or an instance word is used by one call at a time and is made for one length. Each thread therefore
keeps its own words, one for each export and the lengths of its inputs. Only the most recently used are kept.
Words are released when they are dropped, when their thread ends, and at exit.
"""

import atexit
import collections
import ctypes
import threading
import weakref

from .library import library

KEPT_PER_THREAD = 64

_caches: "weakref.WeakSet[Cache]" = weakref.WeakSet()


class Word:
    """One word, and how it is released."""

    def __init__(self, is_instance, is_measurement):
        self.value = ctypes.c_void_p(None)
        self.address = ctypes.addressof(self.value)
        self._instance, self._measurement = is_instance, is_measurement

    def release(self):
        if not self.value.value:
            return
        if self._instance:
            name = "MeasurementUnreserveProc" if self._measurement else "TransformUnreserveProc"
            getattr(library().module, name)(ctypes.byref(self.value))
        else:
            library().host.QXHostReleaseObject(self.value)
        self.value.value = None


class Cache:
    def __init__(self):
        self.words = collections.OrderedDict()
        self.latest = None  # the most recently used one
        _caches.add(self)

    def word(self, key, is_instance, is_measurement):
        word = self.words.get(key)
        if word is None:
            word = self.words[key] = Word(is_instance, is_measurement)
            if len(self.words) > KEPT_PER_THREAD:
                self.words.popitem(last=False)[1].release()
        elif word is not self.latest:
            self.words.move_to_end(key)
        self.latest = word
        return word

    def clear(self):
        self.latest = None
        while self.words:
            self.words.popitem()[1].release()

    __del__ = clear


class _PerThread(threading.local):
    def __init__(self):
        self.cache = Cache()


_per_thread = _PerThread()


def word(key, is_instance=False, is_measurement=False):
    """The address of the word for a call; the key begins with the export."""
    return _per_thread.cache.word(key, is_instance, is_measurement).address


@atexit.register
def release():
    """Releases all plans that are kept. No call may be running in another thread."""
    for cache in list(_caches):
        cache.clear()
