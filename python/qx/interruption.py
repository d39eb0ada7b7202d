"""Handles Ctrl-C on the command line: it prints one line and ends the process within a second.

The interpreter raises KeyboardInterrupt only when the main thread returns from C code, which may take long, and then
closes everything that is open. Therefore a second thread, woken by the signal itself, ends the process if this takes
too long.
"""

import atexit
import contextlib
import ctypes
import os
import signal
import socket
import sys
import threading
import time

from .outputs import forget_all

SECONDS = 0.5  # for the process to end by itself
EXIT = 128 + signal.SIGINT


class Watch:
    """A context manager within which an interruption ends the process in time."""

    def __init__(self):
        self._telling = threading.Lock()
        self._told = False

    def __enter__(self):
        self._receiver, self._sender = socket.socketpair()
        self._sender.setblocking(False)
        signal.set_wakeup_fd(self._sender.fileno(), warn_on_full_buffer=False)
        threading.Thread(target=self._wait, daemon=True).start()
        atexit.register(self._end)  # functions that are registered later run earlier
        return self

    def __exit__(self, kind, *_):
        if kind is not KeyboardInterrupt:
            return False
        self._tell()
        return True

    def _wait(self):
        with contextlib.suppress(OSError):
            while self._receiver.recv(1)[0] != signal.SIGINT:
                pass
            threading.Event().wait(SECONDS)
            forget_all()
            self._tell()
            ctypes.CDLL(None).signal(signal.SIGINT, None)  # Python's own function works only in the main thread
            os.kill(os.getpid(), signal.SIGINT)
            time.sleep(0.1)
            os.kill(os.getpid(), signal.SIGKILL)

    def _tell(self):
        with self._telling:
            if not self._told:
                self._told = True
                start = "\r" if sys.stderr.isatty() else ""  # overwrites the ^C that a terminal shows
                with contextlib.suppress(OSError):
                    os.write(2, f"{start}qx: interrupted\n".encode())

    def _end(self):
        """Ends the process by the default action of the signal, so that a shell's loop ends as well."""
        if self._told:
            signal.signal(signal.SIGINT, signal.SIG_DFL)
            os.kill(os.getpid(), signal.SIGINT)
