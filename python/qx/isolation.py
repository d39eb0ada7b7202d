"""Files are read in a separate process with limits. If a library crashes, hangs or takes all memory while reading a
file, that file is refused with one line, and the user's process goes on.

    result = read(function, path, *arguments, told=progress)

calls function(tell, path, file, *arguments) in a worker. `file` is the file with the contents, and `path` its name
in messages. Values that the function passes to `tell` are passed to `told` in this process, and exceptions that it
raises are raised in this process. A worker is kept for the next file, since starting one takes about 0.2 s. Results
are sent by qx/messages.py, without a copy.

The limits protect against faults and excessive use of resources. They are not a sandbox: a worker has the user's
permissions.
"""

import atexit
import contextlib
import os
import pickle
import shutil
import signal
import socket
import stat
import subprocess
import sys
import tempfile
import threading
import traceback
from typing import NamedTuple

from .files import PIPE, InputError

SECONDS, SECONDS_A_BYTE = 8, 1e-5  # processor time
MEMORY, MEMORY_A_BYTE = 1 << 30, 4
WRITTEN, WRITTEN_A_BYTE = 1 << 30, 64  # bytes of each temporary file
ALLOWED_SECONDS, ALLOWED_MEMORY = "QX_READ_SECONDS", "QX_READ_MB"  # environment variables that replace these
STILL = 30  # seconds without any processor time after which a worker counts as hanging
KEPT = 400 << 20  # bytes; a worker that has used more is not kept for the next file
START = "import sys; sys.path[:] = {!r}; from qx.isolation import serve; serve({}, {})"
AVAILABLE = sys.platform == "linux" and bool(sys.executable)  # elsewhere files are read in the user's process


class Limits(NamedTuple):
    seconds: int
    memory: int
    written: int


def limits_for(size):
    """The limits for a file of `size` bytes."""
    seconds, memory = os.environ.get(ALLOWED_SECONDS), os.environ.get(ALLOWED_MEMORY)
    return Limits(int(float(seconds)) if seconds else int(SECONDS + SECONDS_A_BYTE * size),
                  int(float(memory) * 1e6) if memory else MEMORY + MEMORY_A_BYTE * size,
                  WRITTEN + WRITTEN_A_BYTE * size)


class Died(Exception):
    """A worker has ended, or was terminated, without an answer."""

    def __init__(self, reason, crashed=False):
        super().__init__(reason)
        self.crashed = crashed


class Worker:
    """A process that reads one file after another. It ends with this process, however this process ends."""

    def __init__(self):
        from .messages import Channel
        self.files, self.owner = 0, os.getpid()
        ours, theirs = socket.socketpair()
        watched, self._held = os.pipe()
        ends = (theirs.fileno(), watched)
        with theirs:
            self.process = subprocess.Popen(
                [sys.executable, *(f"-W{option}" for option in sys.warnoptions), "-c",
                 START.format(sys.path, *ends)], pass_fds=ends, stdin=subprocess.DEVNULL, stdout=subprocess.DEVNULL,
                stderr=None if os.environ.get("QX_TRACEBACK") else subprocess.DEVNULL,
                env={**os.environ, "OPENBLAS_NUM_THREADS": "1", "MALLOC_ARENA_MAX": "2"})
        os.close(watched)
        ours.settimeout(1)
        self._socket, self._channel = ours, Channel(ours)

    def close(self):
        os.close(self._held)
        self._socket.close()
        if self.owner == os.getpid():  # not a forked child, which has a copy
            self.process.kill()
            self.process.wait()

    def run(self, limits, folder, function, arguments, options, told):
        """The result of function(tell, *arguments, **options), and whether the worker can be used again."""
        self.files += 1
        try:
            self._channel.send((limits, folder, _current(), function, arguments, options))
            while True:
                kind, value, reusable = self._answer()
                if kind == "told":
                    told(value)
                else:
                    return kind, value, reusable
        except (EOFError, ConnectionError):
            raise self._death(limits) from None

    def _answer(self):
        still, before = 0, None
        while True:
            try:
                return self._channel.receive()
            except TimeoutError:
                used = self._processor_time()
                still, before = still + 1 if used == before else 0, used
                if still >= STILL:
                    raise Died(f"its reader has done nothing for {STILL} s and was terminated") from None

    def _processor_time(self):
        with contextlib.suppress(OSError), open(f"/proc/{self.process.pid}/stat") as file:
            return file.read().rpartition(")")[2].split()[11:13]

    def _death(self, limits):
        code = self.process.wait()
        if code == -signal.SIGXCPU:
            return Died(f"reading takes more than {limits.seconds} s of processor time; {ALLOWED_SECONDS} allows more")
        if code == -signal.SIGKILL:
            return Died("its reader was terminated, perhaps for lack of memory (SIGKILL)")
        if code < 0:
            return Died(f"its reader crashed ({signal.Signals(-code).name})", True)
        return Died(f"its reader ended with {code}", True)


_idle: list = []  # workers
_lock = threading.Lock()


def _take():
    with _lock:
        return _idle.pop() if _idle else Worker()


def _keep(worker):
    with _lock:
        if not _idle and worker.owner == os.getpid():
            _idle.append(worker)
            return
    worker.close()


def prepare():
    """Starts a worker in advance, so that it is ready when a file is read."""
    if AVAILABLE and not _idle:
        _keep(Worker())


@atexit.register
def close():
    """Ends the idle workers."""
    while _idle:
        _idle.pop().close()


if hasattr(os, "register_at_fork"):
    os.register_at_fork(after_in_child=close)


def read(function, path, *arguments, told=lambda value: None, **options):
    """The result of function(tell, path, file, *arguments, **options)."""
    path = os.fspath(path)
    with _folder() as folder:
        path, file = _named(path, folder)
        if not AVAILABLE:
            return function(told, path, file, *arguments, **options)
        size = os.path.getsize(file) if os.path.isfile(file) else 0
        limits = limits_for(size)
        try:
            return _isolated(limits, folder, function, (path, file, *arguments), options, told)
        except MemoryError:
            raise InputError(f"{path}: reading takes more than {limits.memory / 1e6:.0f} MB of memory; "
                             f"{ALLOWED_MEMORY} allows more") from None
        except Died as reason:
            raise InputError(f"{path}: cannot be read: {reason}") from None


def _isolated(limits, folder, function, arguments, options, told):
    heard = []

    def tell(value):
        heard[:] = [True]
        told(value)

    while True:
        worker, reusable = _take(), False
        try:
            kind, value, reusable = worker.run(limits, folder, function, arguments, options, tell)
        except Died as death:
            if worker.files == 1 or heard or not death.crashed:
                raise
            continue  # something left behind by an earlier file may be the reason
        finally:
            _keep(worker) if reusable else worker.close()
        if kind == "failed":
            raise value
        return value


@contextlib.contextmanager
def _folder():
    """A folder for temporary files, which is removed however the worker ends; None if it cannot be created."""
    try:
        folder = tempfile.mkdtemp(prefix="qx-")
    except OSError:
        yield None
        return
    try:
        yield folder
    finally:
        shutil.rmtree(folder, ignore_errors=True)


def _named(path, folder):
    """The name of the input in messages, and the file with its contents. Standard input and pipes are copied to a
    file."""
    if path == PIPE:
        return "standard input", _spooled("standard input", sys.stdin.buffer, folder)
    with contextlib.suppress(OSError):
        if stat.S_ISFIFO(os.stat(path).st_mode):
            with open(path, "rb") as stream:
                return path, _spooled(path, stream, folder)
    return path, path


def _spooled(name, stream, folder):
    try:
        handle, path = tempfile.mkstemp(dir=folder)
        with open(handle, "wb") as file:
            shutil.copyfileobj(stream, file, 1 << 20)
    except OSError as error:
        raise InputError(f"{name}: cannot be kept in {folder or 'a temporary folder'}: "
                         f"{error.strerror or error}") from None
    return path


def _current():
    with contextlib.suppress(OSError):
        return os.getcwd()
    return None


# The following runs in the worker.

def serve(descriptor, watched):
    """Reads files for the process that holds the other ends, and ends with it."""
    import fcntl
    import resource

    from .messages import Channel
    signal.signal(signal.SIGINT, signal.SIG_IGN)  # a terminal sends it to all processes; the other one decides
    signal.signal(signal.SIGIO, signal.SIG_DFL)
    signal.pthread_sigmask(signal.SIG_SETMASK, ())
    fcntl.fcntl(watched, fcntl.F_SETOWN, os.getpid())
    fcntl.fcntl(watched, fcntl.F_SETFL, os.O_ASYNC)  # SIGIO when it is closed, whatever a library is doing
    resource.setrlimit(resource.RLIMIT_CORE, (0, 0))
    channel = Channel(socket.socket(fileno=descriptor))
    with contextlib.suppress(EOFError, ConnectionError):
        while True:
            limits, folder, current, function, arguments, options = channel.receive()
            tempfile.tempdir = folder
            if current:
                with contextlib.suppress(OSError):
                    os.chdir(current)
            _limit(limits)
            try:
                answer = "done", function(lambda value: channel.send(("told", value, True)), *arguments, **options)
            except ConnectionError:
                raise
            except Exception as error:
                if os.environ.get("QX_TRACEBACK"):
                    traceback.print_exc()
                answer = "failed", _sendable(error, arguments[0])
            _send(channel, answer)
            del answer, function, arguments, options


def _send(channel, answer):
    import resource
    most = resource.getrusage(resource.RUSAGE_SELF).ru_maxrss << 10
    reusable = most < KEPT
    try:
        channel.send((*answer, reusable))
    except MemoryError as error:
        channel.send(("failed", error, False))


def _sendable(error, path):
    """The exception, or a plain one if the other process could not recreate it."""
    try:
        return pickle.loads(pickle.dumps(error))
    except Exception:
        return InputError(f"{path}: {type(error).__name__}: {error}")


def _limit(limits):
    import resource
    usage = resource.getrusage(resource.RUSAGE_SELF)
    used = int(usage.ru_utime + usage.ru_stime) + 1
    with open("/proc/self/statm") as file:
        reserved, resident = (int(pages) * resource.getpagesize() for pages in file.read().split()[:2])
    for what, most in ((resource.RLIMIT_CPU, used + limits.seconds),
                       (resource.RLIMIT_AS, reserved - resident + limits.memory),
                       (resource.RLIMIT_FSIZE, limits.written)):
        hard = resource.getrlimit(what)[1]
        resource.setrlimit(what, (most if hard == resource.RLIM_INFINITY else min(most, hard), hard))
