"""Faults of the machine: a command ends with one clear line, and no incomplete file looks complete.

Small disks are mounted in a separate namespace, which the machine must allow. Where it does not, these tests report
that they were skipped.
"""

import functools
import os
import shlex
import signal
import subprocess
import sys
import tempfile
import time
import unittest
from pathlib import Path

PYTHON = Path(__file__).resolve().parent.parent
sys.path.insert(0, str(PYTHON))
from qx import many, outputs  # noqa: E402

ECG = PYTHON.parent / "examples/data/ecg_208_360hz.csv"
MOUNTING = ["unshare", "-m"] if os.geteuid() == 0 else ["unshare", "-rm"]


@functools.lru_cache(maxsize=None)
def disks():
    """The reason why small disks cannot be mounted here, or an empty text."""
    try:
        ran = subprocess.run([*MOUNTING, "mount", "-t", "tmpfs", "tmpfs", "/mnt"], capture_output=True, text=True)
    except OSError as error:
        return str(error)
    return ran.stderr.strip() if ran.returncode else ""


class Faults(unittest.TestCase):
    def setUp(self):
        folder = tempfile.TemporaryDirectory()
        self.addCleanup(folder.cleanup)
        self.folder = Path(folder.name)
        self.disk = self.folder / "disk"
        self.disk.mkdir()
        self.environment = {**os.environ, "PYTHONPATH": str(PYTHON)}

    def shell(self, script, **environment):
        return subprocess.run(["bash", "-c", script], capture_output=True, text=True, cwd=self.folder,
                              env={**self.environment, "QX": f"{sys.executable} -m qx", "ECG": str(ECG), **environment})

    def on_a_full_disk(self, script, **environment):
        """Runs a script in the folder of a 64 KB disk, and lists the files there afterwards."""
        if why := disks():
            self.skipTest(f"NOT TESTED: no disk can be mounted here: {why}")
        inner = f"mount -t tmpfs -o size=64k tmpfs {self.disk} && cd {self.disk} && {{ {script}; }}; s=$?; ls -A; exit $s"
        return self.shell(" ".join(map(shlex.quote, [*MOUNTING, "bash", "-c", inner])), **environment)

    def fails(self, ran, pattern):
        """One line, and no file."""
        self.assertEqual((ran.returncode, ran.stdout), (2, ""), ran.stderr)
        self.assertRegex(ran.stderr, rf"\Aqx: {pattern}\n\Z")

    def test_a_full_disk(self):
        full = "cannot be written: No space left on device"
        self.fails(self.on_a_full_disk("$QX design bessel lowpass 0.1 --output ."), f"{self.disk}/design.html: {full}")
        for arguments in ("gauss long.csv --rate 1000 --seconds 50", "gauss long.wav --rate 1000 --seconds 50"):
            self.fails(self.on_a_full_disk(f"$QX generate {arguments}"), rf"{self.disk}/long.\w+: {full}")

    def test_the_last_samples_of_an_audio_file_on_a_full_disk(self):
        """The last samples of a FLAC file, about which libsndfile reports nothing."""
        script = (f"import os, numpy as np, soundfile; from qx import audio, outputs\n"
                  f"x = np.random.default_rng(1).normal(size=60_000) / 9\n"
                  f"def size(n, kind):\n"
                  f"    soundfile.write({str(self.folder / 'a')!r}, x[:n], 8000, 'PCM_16', format=kind)\n"
                  f"    return os.path.getsize({str(self.folder / 'a')!r})\n"
                  f"for kind in ('FLAC', 'WAV'):\n"
                  f"    n = next(n for n in range(30_000, 60_000, 50) if size(n, kind) > 1 << 16)\n"
                  f"    for more in (0, 500):\n"
                  f"        try:\n"
                  f"            with outputs.whole('a') as part, audio.written(part, 8000, 1, 'PCM_16', kind) as file:\n"
                  f"                file.write(x[:n + more])\n"
                  f"        except OSError as error:\n            print(error)\n")
        path = self.folder / "script.py"
        path.write_text(script)
        ran = self.on_a_full_disk(f"{sys.executable} {path}")
        self.assertEqual(ran.stdout, 4 * f"{self.disk}/a: cannot be written: No space left on device\n", ran.stderr)

    def test_no_room_for_temporary_files(self):
        many_samples = self.folder / "long.csv"
        many_samples.write_text("".join(f"{i % 9}\n" for i in range(20_000)))
        self.fails(self.on_a_full_disk("$QX view ../long.csv 2>&1 | sed -n '/^qx/p' >&2; exit 2", TMPDIR=str(self.disk)),
                   f".*the samples cannot be kept in {self.disk}.*: No space left on device")
        self.fails(self.on_a_full_disk("cat ../long.csv ../long.csv | $QX peaks -", TMPDIR=str(self.disk)),
                   f"standard input: cannot be kept in {self.disk}/.*: No space left on device")

    def test_output_that_cannot_be_written(self):
        self.fails(self.shell("$QX list variance > /dev/full"),
                   "standard output: cannot be written: No space left on device")
        (self.folder / "a").write_text("no folder")
        for path, reason in (("/proc/pages/a.html", "/proc/pages: cannot be created: No such file or directory"),
                             (self.folder / "a/b/c.html", "a/b: cannot be created: Not a directory"),
                             ("/proc/a.html", "/proc/a.html: cannot be written: No such file or directory")):
            with self.assertRaisesRegex(OSError, reason):
                outputs.write_text(path, "text")

    def test_a_removed_folder(self):
        self.fails(self.shell("mkdir gone; cd gone; rmdir ../gone; $QX generate sine ./a.csv"),
                   ".*a.csv: cannot be written: No such file or directory|No such file or directory")
        ran = self.shell("mkdir gone; cd gone; rmdir ../gone; $QX peaks $ECG", TMPDIR="/nowhere", HOME="/proc/nobody")
        self.assertEqual((ran.returncode, ran.stderr), (0, ""))

    def test_a_home_that_cannot_be_written(self):
        ran = self.shell("unset XDG_CACHE_HOME XDG_CONFIG_HOME MPLCONFIGDIR; $QX tones $ECG", HOME="/proc/nobody")
        self.assertEqual((ran.returncode, ran.stderr), (0, ""))

    def test_what_a_killed_command_leaves_is_never_whole(self):
        process = subprocess.Popen([sys.executable, "-c", "import sys, time; sys.path.insert(0, sys.argv[1])\n"
                                    "from qx import outputs\n"
                                    "with outputs.whole('a.csv') as part, open(part, 'w') as file:\n"
                                    "    print('1', file=file, flush=True); print(part, flush=True); time.sleep(99)",
                                    str(PYTHON)], cwd=self.folder, stdout=subprocess.PIPE, text=True)
        part = Path(process.stdout.readline().strip())
        process.send_signal(signal.SIGKILL)
        process.communicate()
        self.assertTrue(part.exists())
        self.assertRegex(part.name, outputs.UNFINISHED)
        self.assertFalse((self.folder / "a.csv").exists())
        self.assertEqual((many.files_of([str(self.folder)]), many.left_out([str(self.folder)])), ([], []))
        outputs.write_text(self.folder / "a.csv", "1\n2\n")
        self.assertEqual(many.files_of([str(self.folder)]), [("a.csv", str(self.folder / "a.csv"))])

    def test_two_at_once_one_with_a_clock_that_jumps(self):
        clock = self.folder / "clock.so"
        built = subprocess.run(["gcc", "-shared", "-fPIC", "-o", clock, PYTHON / "tests/clock.c"], capture_output=True)
        self.assertEqual(built.returncode, 0, built.stderr)
        both = [subprocess.Popen([sys.executable, "-m", "qx", "report", ECG, "--output", "pages"], cwd=self.folder,
                                 env={**self.environment, "LD_PRELOAD": preload}, stdout=subprocess.DEVNULL,
                                 stderr=subprocess.PIPE, text=True) for preload in ("", str(clock))]
        seen = set()
        page = self.folder / "pages/report.html"
        while any(process.poll() is None for process in both):
            if page.exists():
                seen.add(page.read_text("utf-8").endswith("</html>\n"))
            time.sleep(0.005)
        for process in both:
            self.assertEqual((process.communicate()[1], process.returncode), ("", 0))
        self.assertEqual(seen | {True}, {True})
        self.assertEqual([path.name for path in page.parent.iterdir()], ["report.html"])


if __name__ == "__main__":
    unittest.main(verbosity=2)  # ./test names what is skipped
