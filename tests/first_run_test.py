"""The set-up and the first build as a new user sees them: they report what is missing, how far they are and why
they fail, end when they are interrupted, and build from the pinned sources only.

    first_run_test.py SOURCE [TEST...]

The tests named Terminal need a pseudo-terminal; without one they end with status 77, which marks a test as not
run.
"""

import contextlib
import fcntl
import os
import pty
import re
import select
import shutil
import signal
import stat
import subprocess
import sys
import tempfile
import termios
import time
import unittest
from pathlib import Path

SOURCE = Path(sys.argv.pop(1)).resolve()
SKIPPED = 77
# The documented limit is a second; other tests run at the same time.
PROMPT = 2.0


def machine_cache():
    script = f'. "{SOURCE}/tools/setup/common.sh"; echo "$CACHE"'
    return Path(subprocess.run(["bash", "-c", script], capture_output=True, text=True,
                               check=True).stdout.strip())


SOURCES = Path(os.environ.get("QX_SOURCES", machine_cache() / "sources"))


def processes_with(text):
    """The processes whose environment contains the text."""
    found = []
    for entry in Path("/proc").glob("[0-9]*"):
        with contextlib.suppress(OSError):
            if text.encode() in (entry / "environ").read_bytes():
                command = (entry / "cmdline").read_bytes().replace(b"\0", b" ").decode(errors="replace")
                if command:  # a process that has ended is still listed, with an empty command line
                    found.append(f"{entry.name}: {command[:100]}")
    return found


class Terminal:
    """A command on its own pseudo-terminal."""

    def __init__(self, *command, **more):
        self.master, slave = pty.openpty()

        def take():
            os.setsid()
            fcntl.ioctl(slave, termios.TIOCSCTTY, 0)

        self.process = subprocess.Popen(list(map(str, command)), stdin=slave, stdout=slave, stderr=slave,
                                        preexec_fn=take, **more)
        os.close(slave)
        self.text = ""

    def read(self, until=None, seconds=60):
        """Reads until a pattern is found, or to the end."""
        limit = time.monotonic() + seconds
        while time.monotonic() < limit and not (until and re.search(until, self.text)):
            if select.select([self.master], [], [], 0.1)[0]:
                try:
                    self.text += os.read(self.master, 4096).decode(errors="replace")
                except OSError:
                    break  # the other side is closed
        return self.text

    def type(self, text):
        os.write(self.master, text.encode())

    def close(self):
        os.close(self.master)
        return self.process.wait()


class Case(unittest.TestCase):
    def setUp(self):
        folder = tempfile.TemporaryDirectory()
        self.addCleanup(folder.cleanup)
        self.folder = Path(folder.name)
        self.programs = self.folder / "bin"
        self.programs.mkdir()
        self.cache = self.folder / "cache"
        self.environment = {**os.environ, "PATH": f"{self.programs}:{os.environ['PATH']}",
                            "QX_CACHE": str(self.cache)}
        for name in ("QX_WATCHED", "QX_SOURCES"):
            self.environment.pop(name, None)

    def program(self, name, text):
        """Makes a program of this name that precedes the machine's on the path."""
        path = self.programs / name
        path.write_text(f"#!/bin/bash\n{text}\n", "utf-8")
        path.chmod(path.stat().st_mode | stat.S_IXUSR)

    def take_from_cache(self, *names):
        """Links these parts of the machine's cache into the test's cache."""
        self.cache.mkdir(exist_ok=True)
        for name in names:
            (self.cache / name).symlink_to(SOURCES if name == "sources" else machine_cache() / name)

    def fresh_copy(self):
        copy = self.folder / "copy"
        shutil.copytree(SOURCE, copy, symlinks=True,
                        ignore=shutil.ignore_patterns("build", "out", ".git", "__pycache__"))
        return copy

    def copied_setup(self):
        """A copy of the set-up scripts and of what they use."""
        copy = self.folder / "copy"
        for part in ("tools/setup", "src/mathlib"):
            shutil.copytree(SOURCE / part, copy / part)
        return copy / "tools/setup"

    def run_script(self, *command):
        return subprocess.run(list(map(str, command)), capture_output=True, text=True,
                              env=self.environment)

    def watched(self, text):
        return ["bash", "-c", f'. "{SOURCE}/tools/setup/common.sh"; {text}']

    def last_line(self, ran):
        return ran.stderr.strip().split("\n")[-1]

    def nothing_runs(self):
        self.assertEqual(processes_with(f"QX_CACHE={self.cache}"), [])


class Missing(Case):
    def test_packages_without_root(self):
        self.program("dpkg-query", "exit 1")
        self.program("id", "echo 1000")
        ran = self.run_script(SOURCE / "tools/setup/native")
        self.assertEqual((ran.returncode, ran.stderr.count("\n")), (1, 1), ran.stderr)
        self.assertRegex(ran.stderr, "As root: apt-get update && apt-get install build-essential .*python3")

    def test_network(self):
        self.program("apt-get", "echo 'E: Could not resolve'; exit 100")
        ran = self.run_script(SOURCE / "tools/setup/libm", "linux")
        self.assertEqual(ran.returncode, 1)
        self.assertIn("E: Could not resolve", ran.stderr)
        self.assertRegex(self.last_line(ran),
                         r"source package musl \S+ is needed and cannot be fetched.*source-musl\.log")
        self.program("dpkg-query", "exit 1")
        self.program("dpkg", "exit 0")
        self.program("id", "echo 0")
        ran = self.run_script(SOURCE / "tools/setup/native")
        self.assertEqual(ran.returncode, 1)
        self.assertRegex(self.last_line(ran), r"installing packages failed: .*apt-install\.log")

    def test_no_network_is_needed_where_the_cache_has_all(self):
        self.take_from_cache("lapack", "libm")
        self.program("apt-get", "echo 'E: Could not resolve'; exit 100")
        for script in ("native", "libm", "lapack"):
            ran = self.run_script(SOURCE / "tools/setup" / script, *["linux"] * (script != "native"))
            self.assertEqual((ran.returncode, ran.stderr), (0, ""))


class Failing(Case):
    def setUp(self):
        super().setUp()
        self.take_from_cache("sources")
        for name in ("gfortran", "gcc"):
            self.program(name, f'[ "$1" = -dumpfullversion ] && exec /usr/bin/{name} "$1"\n'
                         "echo 'x:1:1: Error: made up' >&2; exit 1")
        self.program("make", "echo 'x:1:1: Error: made up' >&2; exit 1")

    def test_the_lines_of_the_compiler_are_shown(self):
        for script in ("lapack", "libm"):
            ran = self.run_script(SOURCE / "tools/setup" / script, "linux")
            self.assertEqual(ran.returncode, 1)
            self.assertIn("\nx:1:1: Error: made up\n", ran.stderr)
            self.assertRegex(self.last_line(ran), rf"failed: the whole output is in .*{script}-linux\.log")
            self.assertEqual(list(self.cache.glob(f"{script}/*/*.a")), [])

    def test_the_first_run_shows_them_too(self):
        (self.programs / "gcc").unlink()
        self.take_from_cache("libm")
        ran = self.run_script(self.fresh_copy() / "run")
        self.assertEqual(ran.returncode, 1)
        self.assertIn("\nx:1:1: Error: made up\n", ran.stderr)
        self.assertRegex(self.last_line(ran), r"\[run\] setting up failed: .*build/setup\.log")


class Reporting(Case):
    def test_nothing_is_silent_without_a_terminal(self):
        script = f'told=$((SECONDS - 9)); watched work "{self.folder}/log" '
        slow = "bash -c 'echo [1/3]; echo [2/3]; sleep 0.5; exit 3'"
        ran = self.run_script(*self.watched(script + slow))
        self.assertEqual((ran.returncode, ran.stdout), (3, ""))
        self.assertRegex(ran.stderr, r"work: \d s \[2/3\]\n")
        ran = self.run_script(*self.watched(f'watched work "{self.folder}/log" true'))
        self.assertEqual((ran.returncode, ran.stdout, ran.stderr), (0, "", ""))

    def test_waiting_for_another_script_is_reported(self):
        first = subprocess.Popen(self.watched("lock_cache thing; echo; sleep 1"), env=self.environment,
                                 stdout=subprocess.PIPE)
        first.stdout.readline()
        ran = self.run_script(*self.watched("lock_cache thing"))
        self.assertRegex(ran.stderr, r"waiting for another script, which holds .*thing\.lock")
        first.communicate()


class Stopping(Case):
    def stopped(self, wait_for, stop, *command):
        """Starts a command, stops it when the pattern appears in a log or a message, and returns its output."""
        output = self.folder / "output"
        with output.open("w") as file:
            process = subprocess.Popen(list(map(str, command)), env=self.environment, stdout=file,
                                       stderr=file, start_new_session=True)
            limit = time.monotonic() + 60
            while process.poll() is None and time.monotonic() < limit and not wait_for():
                time.sleep(0.05)
            self.assertIsNone(process.poll(), output.read_text())
            stop(process)
            started = time.monotonic()
            process.wait(30)
            self.assertLess(time.monotonic() - started, PROMPT)
        return process.returncode, output.read_text()

    def test_a_signal_ends_all_that_was_started(self):
        self.take_from_cache("sources")
        log = self.cache / "lapack-linux.log"
        for number in (signal.SIGTERM, signal.SIGINT, signal.SIGHUP):
            status, text = self.stopped(lambda: log.exists() and re.search(r"\[\d+/\d+\]", log.read_text()),
                                        lambda process: process.send_signal(number),
                                        SOURCE / "tools/setup/lapack", "linux")
            self.assertEqual(status, -number)
            self.assertRegex(text.strip().split("\n")[-1], r"^\[lapack\] stopped after \d+ s of building")
            self.nothing_runs()
            self.assertEqual(list(self.cache.glob("lapack/*/*.a")), [])
            log.unlink()

    def test_a_command_that_ignores_signals_is_killed(self):
        started = self.folder / "started"
        program = f'trap "" TERM INT; touch "{started}"; while :; do sleep 9; done'
        deaf = f"watched deaf '{self.folder}/log' bash -c '{program}'"
        status, _ = self.stopped(started.exists, lambda process: process.terminate(), *self.watched(deaf))
        self.assertEqual(status, -signal.SIGTERM)
        self.nothing_runs()

    def test_a_partial_download_is_fetched_again(self):
        half = "touch half; sleep 60"
        self.program("apt-get", f'case "$*" in *download-only*musl=*) {half} ;; esac')
        fetched = self.cache / "sources.work/half"
        self.stopped(fetched.exists, lambda process: os.killpg(process.pid, signal.SIGKILL),
                     SOURCE / "tools/setup/libm", "linux")
        for line in processes_with(f"QX_CACHE={self.cache}"):
            os.kill(int(line.split(":")[0]), signal.SIGKILL)
        self.program("apt-get", "echo 'E: made up'; exit 100")
        ran = self.run_script(SOURCE / "tools/setup/libm", "linux")
        self.assertRegex(self.last_line(ran), r"musl \S+ is needed and cannot be fetched")
        self.assertEqual(list((self.cache / "sources").iterdir()), [])


class Pinned(Case):
    """Libraries are built only from the pinned sources, with patches that apply, and never by cmake."""

    def setUp(self):
        super().setUp()
        self.called = self.folder / "apt-get was called"
        self.program("apt-get", f'touch "{self.called}"; exit 100')

    def offline(self):
        """A folder with the sources of musl."""
        folder = self.folder / "offline"
        folder.mkdir()
        for path in SOURCES.glob("musl_*"):
            shutil.copy(path, folder)
        self.environment["QX_SOURCES"] = str(folder)
        return folder

    def refused(self, ran, *reasons):
        self.assertEqual(ran.returncode, 1, ran.stderr)
        for reason in reasons:
            self.assertIn(reason, ran.stderr)
        self.assertEqual(list(self.cache.glob("*/*/*.a")), [])

    def test_other_sources_are_refused(self):
        offline = self.offline()
        archive = offline / "musl_1.2.3.orig.tar.gz"
        whole = archive.read_bytes()
        archive.write_bytes(whole[:-1] + bytes([whole[-1] ^ 1]))
        refused = "the source of musl is refused"
        libm = (SOURCE / "tools/setup/libm", "linux")
        self.refused(self.run_script(*libm), f"not the pinned file: {archive}", refused)
        archive.unlink()
        self.refused(self.run_script(*libm), f"missing: {archive}", refused)
        self.assertFalse(self.called.exists(), "the folder replaces the network")
        # Fetched sources are refused, too, and deleted.
        archive.write_bytes(whole[:-1])
        del self.environment["QX_SOURCES"]
        self.program("apt-get", f'case "$*" in *download-only*) cp "{offline}"/* . ;; esac')
        self.refused(self.run_script(*libm), "not the pinned file", "cannot be fetched")
        self.assertEqual(list((self.cache / "sources").iterdir()), [])

    def test_what_is_not_pinned_is_refused(self):
        setup = self.copied_setup()
        self.take_from_cache("sources")
        lock = setup / "sources.lock"
        lock.write_text(re.sub(r"^musl .*\n", "", lock.read_text(), flags=re.MULTILINE))
        self.refused(self.run_script(setup / "libm", "linux"), "musl is not pinned in")

    def test_a_patch_must_apply(self):
        setup = self.copied_setup()
        self.take_from_cache("sources")
        (setup / "patches/musl").mkdir(parents=True)
        # The first line differs from the source; patch alone would tolerate that.
        (setup / "patches/musl/made-up.patch").write_text(
            "--- a/src/math/fmax.c\n+++ b/src/math/fmax.c\n@@ -1,3 +1,3 @@\n #include <maths.h>\n \n"
            "-double fmax(double x, double y)\n+double fmax(double y, double x)\n", "utf-8")
        self.refused(self.run_script(setup / "libm", "linux"), "FAILED",
                     "made-up.patch does not apply to musl")

    def test_two_concurrent_runs_build_once_from_a_folder(self):
        self.offline()
        command = [SOURCE / "tools/setup/libm", "linux"]
        self.assertEqual(self.run_script(*command, "find").returncode, 1)
        both = [subprocess.Popen(list(map(str, command)), env=self.environment, text=True,
                                 stdout=subprocess.PIPE, stderr=subprocess.PIPE) for _ in range(2)]
        shown = [process.communicate() for process in both]
        self.assertEqual([process.returncode for process in both], [0, 0], shown)
        self.assertEqual(shown[0][0], shown[1][0])
        told = shown[0][1] + shown[1][1]
        self.assertEqual(told.count("building the mathematics library for linux"), 1, told)
        self.assertFalse(self.called.exists())
        archive = Path(shown[0][0].strip())
        self.assertEqual(self.run_script(*command, "find").stdout.strip(), str(archive))
        built = Path(subprocess.run([*command, "find"], capture_output=True, text=True).stdout.strip())
        self.assertEqual(archive.read_bytes(), built.read_bytes(), "the machine's own")
        self.assertIn("Permission is hereby granted", (archive.parent / "licences/COPYRIGHT").read_text())

    def test_the_name_depends_on_all_that_affects_the_bits(self):
        self.take_from_cache("libm")
        setup = self.copied_setup()

        def found():
            return self.run_script(setup / "libm", "linux", "find").returncode == 0

        def changed(path, old, new):
            text = path.read_text() if path.exists() else None
            path.parent.mkdir(parents=True, exist_ok=True)
            path.write_text(text.replace(old, new) if text else new)
            self.assertNotEqual(path.read_text(), text)
            self.assertFalse(found(), path)
            path.write_text(text) if text else path.unlink()
            self.assertTrue(found(), path)

        self.assertTrue(found())
        changed(setup / "libm", "-O2", "-O1")
        changed(setup / "sources.lock", "musl 1.2.3-1 24", "musl 1.2.3-1 25")
        changed(setup / "patches/musl/more.patch", "", "a patch")
        changed(setup.parent.parent / "src/mathlib/atan2.c", "{", "{ ")
        self.program("gcc", "echo 12.9.0")
        self.assertFalse(found())

    def test_cmake_only_looks(self):
        copy = self.fresh_copy()
        ran = self.run_script("cmake", "-S", copy, "--preset", "release")
        self.assertNotEqual(ran.returncode, 0)
        self.assertRegex(re.sub(r"\s+", " ", ran.stderr), r"is not built yet \(libm for linux\): run \./setup in")
        self.assertFalse(self.called.exists())
        self.assertEqual([path for path in self.cache.rglob("*") if path.is_file()], [])


class Machine(Case):
    """Faults of the machine: they are reported in one clear line, and nothing incomplete is used as if complete."""

    def fake_build(self):
        """A copy whose build is a program that records when it begins and ends."""
        self.take_from_cache("libm", "lapack")
        log = self.folder / "log"
        self.program("cmake", f'echo begin >>"{log}"; sleep 0.3; echo end >>"{log}"')
        return self.fresh_copy() / "run", log

    def test_no_room_in_the_cache(self):
        self.take_from_cache("sources")
        script = (f"mount -t tmpfs -o size=2m tmpfs '{self.cache}' && ln -s '{SOURCES}' '{self.cache}/sources' || exit 77;"
                  f"'{SOURCE}/tools/setup/libm' linux; [ $? = 1 ] && ! '{SOURCE}/tools/setup/libm' linux find")
        ran = self.run_script("unshare", *["-m"] if os.geteuid() == 0 else ["-rm"], "bash", "-c", script)
        if ran.returncode == 77 or "unshare failed" in ran.stderr:
            self.skipTest(f"NOT TESTED: no disk can be mounted here: {ran.stderr}")
        self.assertEqual((ran.returncode, ran.stdout), (0, ""), ran.stderr)
        self.assertIn("No space left on device", ran.stderr)
        self.assertRegex(self.last_line(ran), r"^\[libm\] (the source of musl cannot be unpacked|building .* failed)")

    def test_no_cache_can_be_made(self):
        for name, reason in (("/proc/nobody", "No such file or directory"), (str(self.folder / "file"), "Not a directory")):
            (self.folder / "file").touch()
            self.environment["QX_CACHE"] = f"{name}/cache"
            ran = self.run_script(SOURCE / "tools/setup/libm", "linux")
            self.assertEqual((ran.returncode, ran.stderr.count("\n")), (1, 1), ran.stderr)
            self.assertRegex(ran.stderr, rf"there is no cache \(.*{name}.*{reason}\): set QX_CACHE to another folder")

    def test_a_build_that_was_killed_is_made_anew(self):
        self.take_from_cache("sources")
        started = self.folder / "started"
        self.program("ar", f'[ -f "{started}" ] && exec /usr/bin/ar "$@"\n'
                     f'head -c 1000 /bin/ls >"$2"; touch "{started}"; sleep 60')
        process = subprocess.Popen([SOURCE / "tools/setup/libm", "linux"], env=self.environment, start_new_session=True,
                                   stdout=subprocess.PIPE, stderr=subprocess.STDOUT)
        limit = time.monotonic() + 60
        while not started.exists() and time.monotonic() < limit:
            time.sleep(0.02)
        process.kill()
        for line in processes_with(f"QX_CACHE={self.cache}"):
            with contextlib.suppress(ProcessLookupError):
                os.kill(int(line.split(":")[0]), signal.SIGKILL)
        process.communicate()
        self.assertNotEqual([*self.cache.rglob("*.a")], [], "it was killed with a part of the archive written")
        command = [SOURCE / "tools/setup/libm", "linux"]
        self.assertEqual(self.run_script(*command, "find").returncode, 1)
        ran = self.run_script(*command)
        self.assertEqual(ran.returncode, 0, ran.stderr)
        built = subprocess.run([*command, "find"], capture_output=True, text=True).stdout.strip()
        self.assertEqual(Path(ran.stdout.strip()).read_bytes(), Path(built).read_bytes(), "the machine's own")

    def test_two_first_runs_build_one_after_the_other(self):
        run, log = self.fake_build()
        both = [subprocess.Popen([run], env=self.environment, stdout=subprocess.PIPE, stderr=subprocess.PIPE, text=True)
                for _ in range(2)]
        told = "".join(process.communicate()[1] for process in both)
        self.assertRegex(told, r"\[run\] waiting for another script, which holds .*/build/release.lock")
        self.assertEqual(log.read_text(), 4 * "begin\nend\n", told)

    def test_files_from_the_future_are_reported(self):
        run, log = self.fake_build()
        ahead = time.time() + 7200
        (run.parent / "build/release").mkdir(parents=True)
        for name in ("src/frame/views.h", "build/release/old.o"):
            path = run.parent / name
            path.touch()
            os.utime(path, (ahead, ahead))
            ran = self.run_script(run)
            self.assertEqual((ran.returncode, ran.stderr.count("\n")), (1, 1), ran.stderr)
            self.assertRegex(ran.stderr, rf"{name} is from the future: if the clock is right now, touch the file")
            os.utime(path)
        self.assertFalse(log.exists())


class OnATerminal(Case):
    def test_progress_and_the_end_of_a_command_are_reported(self):
        slow = "bash -c 'echo [1/3]; sleep 1.2; echo [2/3]; exit 3'"
        terminal = Terminal(*self.watched(f'watched work "{self.folder}/log" {slow}'),
                            env=self.environment)
        shown = terminal.read()
        self.assertEqual(terminal.close(), 3)
        self.assertRegex(shown, r"work: \d s \[1/3\]")
        self.assertRegex(shown, r"work: failed in \d s")

    def ended_by_ctrl_c(self, terminal, reached, stage):
        """Interrupts the first run when the pattern is shown."""
        self.assertRegex(terminal.read(until=reached), reached)
        time.sleep(1)
        self.assertNotEqual(processes_with(f"QX_CACHE={self.cache}"), [])
        started = time.monotonic()
        terminal.text = ""
        terminal.type("\x03")
        shown = terminal.read(seconds=20)
        self.assertLess(time.monotonic() - started, PROMPT)
        self.assertEqual(terminal.close(), -signal.SIGINT)
        lines = [line for line in re.split(r"[\r\n]+", shown.replace("^C", ""))
                 if line.strip() and not line.startswith(f"{stage}:")]
        self.assertEqual(len(lines), 1, shown)
        self.assertRegex(lines[0], rf"^\[run\] stopped after \d+ s of {stage}")
        self.nothing_runs()

    def test_ctrl_c_ends_the_first_run(self):
        copy = self.fresh_copy()
        self.take_from_cache("sources", "libm")
        self.ended_by_ctrl_c(Terminal(copy / "run", env=self.environment), r"\[lapack\]", "setting up")
        self.assertEqual(list(self.cache.glob("lapack/*/*.a")), [])
        shutil.rmtree(self.cache)
        self.take_from_cache("sources", "libm", "lapack")
        self.ended_by_ctrl_c(Terminal(copy / "run", env=self.environment), r" \[[1-9]\d*/\d{3}\]",
                             "building the library")


if __name__ == "__main__":
    if "OnATerminal" in sys.argv:
        try:
            os.close(os.openpty()[0])
        except OSError as error:
            print(f"SKIPPED: there is no pseudo-terminal here ({error}); nothing has run")
            sys.exit(SKIPPED)
    unittest.main(verbosity=2)  # ./test names what is skipped
