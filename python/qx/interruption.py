"""Ctrl-C on the command line: one line, and the process has ended within a second.

The interpreter raises KeyboardInterrupt once the main thread is back from whatever C code it is in,
which may be long. So a second thread, woken by the signal itself, ends the process where the first
has not done so in time.
"""

import contextlib
import os
import signal
import socket
import sys
import threading

from . import outputs

SECONDS = 0.5  # for the main thread to end by itself


def end():
    """Ends the process as the signal does by default, so that a shell's loop ends as well."""
    outputs.forget_all()
    signal.signal(signal.SIGINT, signal.SIG_DFL)
    os.kill(os.getpid(), signal.SIGINT)


def told():
    """The line, on a terminal in place of the ^C that it shows."""
    start = "\r" if sys.stderr.isatty() else ""
    with contextlib.suppress(OSError):
        os.write(2, f"{start}qx: interrupted\n".encode())


class Watch:
    """While it is entered, an interruption ends the process in time."""

    def __enter__(self):
        self.ended = threading.Event()
        self.receiver, self.sender = socket.socketpair()
        self.sender.setblocking(False)
        self.before = signal.set_wakeup_fd(self.sender.fileno(), warn_on_full_buffer=False)
        threading.Thread(target=self._wait, daemon=True).start()
        return self

    def _wait(self):
        while received := self.receiver.recv(1):
            if received[0] == signal.SIGINT and not self.ended.wait(SECONDS):
                outputs.forget_all()
                told()
                os.kill(os.getpid(), signal.SIGKILL)

    def __exit__(self, *_):
        self.ended.set()
        signal.set_wakeup_fd(self.before)
        self.sender.close()
