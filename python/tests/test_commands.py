"""What all commands share: examples that run, files that are not replaced, Ctrl-C."""

import argparse
import contextlib
import io
import os
import shlex
import signal
import subprocess
import sys
import tempfile
import time
import unittest
from pathlib import Path
from unittest import mock

import numpy as np
import soundfile

PYTHON = Path(__file__).resolve().parent.parent
ROOT = PYTHON.parent
sys.path.insert(0, str(PYTHON))
os.environ["PYTHONPATH"] = str(PYTHON)  # for processes that are started
from qx import __main__ as command  # noqa: E402
from qx import outputs  # noqa: E402


def commands():
    """The parsers by the names of the commands."""
    actions = command.parser()._actions
    return next(a.choices for a in actions if isinstance(a, argparse._SubParsersAction))


class InAFolder(unittest.TestCase):
    def setUp(self):
        folder = tempfile.TemporaryDirectory()
        self.addCleanup(folder.cleanup)
        self.addCleanup(os.chdir, os.getcwd())
        os.chdir(folder.name)
        os.symlink(ROOT / "examples", "examples")

    def run_command(self, *arguments):
        out = io.TextIOWrapper(io.BytesIO(), "utf-8", write_through=True)
        with contextlib.redirect_stdout(out), contextlib.redirect_stderr(out):
            code = command.main([*map(str, arguments)])
        return code, out.buffer.getvalue().decode()


async def served(opened, port, ready):
    """Replaces the server of `view`, which would not end."""
    ready(f"http://127.0.0.1:{port}/")


class Examples(InAFolder):
    @mock.patch("qx.serving.serve", served)
    def test_every_help_has_examples_and_each_runs(self):
        for name, parser in {"": command.parser(), **commands()}.items():
            examples = [line.split("-m qx ", 1)[1] for line in parser.format_help().split("\n")
                        if line.startswith("  python3 -m qx ")]
            self.assertTrue(examples, name)
            self.assertTrue(any(shlex.split(example)[0] == name for example in examples) or not name)
            os.mkdir(f"for {name}")
            os.chdir(f"for {name}")
            os.symlink(ROOT / "examples", "examples")
            for example in examples:
                with self.subTest(example):
                    code, text = self.run_command(*shlex.split(example))
                    self.assertEqual(code, 0, text)
            os.chdir("..")


ECG = "examples/data/ecg_208_360hz.csv"
WRITING = (  # arguments, the file that is written, whether the command replaces a file of its own
    (("report", ECG), "out/report.html", True),
    (("report", "many", "--workers", "1", "--output", "pages"), "pages/index.html", True),
    (("design", "bessel", "lowpass", "0.1"), "out/design.json", True),
    (("fit", ECG, "--model", "line"), "out/fit.svg", True),
    (("fit", ECG, "--model", "line", "--plot", "line.png"), "line.png", False),
    (("peaks", ECG, "--csv", "peaks.csv"), "peaks.csv", False),
    (("pulse", ECG, "--events", "--csv", "pulses.csv"), "pulses.csv", False),
    (("tones", ECG), "out/tones.svg", True),
    (("tones", ECG, "--csv", "tones.csv"), "tones.csv", False),
    (("generate", "sine", "sine.csv"), "sine.csv", False),
    (("generate", "sine", "sine.wav"), "sine.wav", False),
    (("resample", "in.wav", "out.flac", "--rate", "8000"), "out.flac", False))


class Outputs(InAFolder):
    def setUp(self):
        super().setUp()
        os.mkdir("many")
        Path("many/a.csv").write_text("\n".join(map(str, np.sin(np.arange(60)))))
        soundfile.write("in.wav", np.zeros(100), 4000)

    def test_a_file_is_replaced_only_if_that_is_asked_for_or_the_command_made_it(self):
        for arguments, name, own in WRITING:
            with self.subTest(name):
                path = Path(name)
                path.parent.mkdir(exist_ok=True)
                path.write_text("mine")
                code, text = self.run_command(*arguments)
                self.assertEqual((code, text), (2, f"qx: {name}: exists; --force replaces it\n"))
                self.assertEqual(path.read_text(), "mine")
                code, text = self.run_command(*arguments, "--force")
                self.assertEqual(code, 0, text)
                self.assertNotEqual(path.read_bytes(), b"mine")
                self.assertEqual(self.run_command(*arguments)[0], 0 if own else 2)
        self.assertFalse([*Path().rglob("*.part*")])
        for name in ("pages/a.csv.html", "out/design.html"):  # beside a page of the report
            Path(name).write_text("mine")
        self.assertIn("pages/a.csv.html: exists", self.run_command("report", "many", "--output", "pages")[1])
        self.assertIn("out/design.html: exists", self.run_command("design", "bessel", "lowpass", "0.1")[1])

    def test_the_input_is_never_replaced(self):
        Path("data.csv").write_text("time,x\n" + "\n".join(f"{t},{t % 7}" for t in range(60)))
        for source, before, after in (("in.wav", ("resample", "in.wav"), ("--rate", "8000")),
                                      ("data.csv", ("peaks", "data.csv", "--csv"), ()),
                                      ("data.csv", ("fit", "data.csv", "--model", "line", "--plot"), ())):
            content = Path(source).read_bytes()
            ending = Path(source).suffix
            os.symlink(source, "soft" + ending) if not os.path.lexists("soft" + ending) else None
            os.link(source, "hard" + ending) if not os.path.lexists("hard" + ending) else None
            for name in (source, f"./many/../{source}", os.path.abspath(source), "soft" + ending,
                         "hard" + ending):
                with self.subTest(name=name, command=before[0]):
                    code, text = self.run_command(*before, name, *after, "--force")
                    self.assertEqual(code, 2)
                    self.assertIn("is an input file", text)
                    self.assertEqual(Path(source).read_bytes(), content)

    def test_a_file_appears_when_it_is_whole(self):
        with self.assertRaises(KeyboardInterrupt), outputs.whole("table.csv") as part:
            Path(part).write_text("half")
            self.assertFalse(os.path.exists("table.csv"))
            raise KeyboardInterrupt
        self.assertEqual(sorted(os.listdir()), ["examples", "in.wav", "many"])
        os.symlink("elsewhere.csv", "link.csv")
        outputs.write_text("link.csv", "all of it")
        self.assertTrue(os.path.islink("link.csv"))
        self.assertEqual(Path("elsewhere.csv").read_text(), "all of it")
        self.assertEqual(self.run_command("peaks", ECG, "--csv", "/dev/null")[0], 0)
        self.assertEqual(self.run_command("generate", "sine", "no/sine.csv"), (
            2, f"qx: {os.path.realpath('no/sine.csv')}: cannot be written: No such file or directory\n"))


def alive(group):
    """The running processes of a group."""
    found = []
    for entry in Path("/proc").glob("[0-9]*/stat"):
        with contextlib.suppress(OSError):
            state, _, of_group = entry.read_text().rpartition(")")[2].split()[:3]
            if of_group == str(group) and state not in "ZX":
                found.append(entry.parent.name)
    return found


class Interruption(InAFolder):
    SECONDS = 1.0

    def started(self, *arguments):
        process = subprocess.Popen([sys.executable, *arguments], start_new_session=True, text=True,
                                   stdout=subprocess.PIPE, stderr=subprocess.PIPE)
        self.addCleanup(lambda: [os.kill(int(pid), signal.SIGKILL) for pid in alive(process.pid)])
        return process

    def ends(self, process, before):
        """Waits until the whole group has ended, and fails if that takes too long."""
        _, text = process.communicate(timeout=30)
        while alive(process.pid) and time.monotonic() - before < self.SECONDS:
            time.sleep(0.01)
        self.assertEqual(alive(process.pid), [])
        self.assertLess(time.monotonic() - before, self.SECONDS)
        return text

    def batch(self):
        """A batch of recordings that has begun to write."""
        if not os.path.isdir("many"):
            os.mkdir("many")
            values = np.random.default_rng(1).normal(size=50_000)
            np.savetxt("many/0.csv", values)
            for i in range(1, 30):
                os.link("many/0.csv", f"many/{i}.csv")
        for page in Path().glob("pages/*"):
            page.unlink()
        process = self.started("-m", "qx", "report", "many", "--workers", "2", "--output", "pages")
        while not [*Path().glob("pages/[0-9]*.html")] and process.poll() is None:
            time.sleep(0.05)
        self.assertGreater(len(alive(process.pid)), 2)
        return process

    def test_a_batch_ends_with_one_line(self):
        for tell in (os.killpg, os.kill):  # as a terminal does it, and only the one process
            with self.subTest(tell.__name__):
                process, before = self.batch(), time.monotonic()
                tell(process.pid, signal.SIGINT)
                self.assertEqual(self.ends(process, before).split("\n"), ["qx: interrupted", ""])
                self.assertEqual(process.returncode, -signal.SIGINT)  # which ends a shell's loop
                self.assertFalse([*Path("pages").glob("*.part*")])

    def test_workers_do_not_outlive_the_process_that_started_them(self):
        process, before = self.batch(), time.monotonic()
        process.kill()
        self.ends(process, before)

    def test_code_that_does_not_come_back_is_no_hindrance(self):
        process = self.started("-c", "import hashlib\nfrom qx import __main__ as command, outputs\n"
                               "def main():\n"
                               "    with outputs.whole('out.txt'):\n"
                               "        print('begun', flush=True)\n"
                               "        hashlib.pbkdf2_hmac('sha256', b'', b'', 10**9)\n"
                               "command.main = main\ncommand.run()")
        self.assertEqual(process.stdout.readline(), "begun\n")
        before = time.monotonic()
        process.send_signal(signal.SIGINT)
        self.assertEqual(self.ends(process, before), "qx: interrupted\n")
        self.assertEqual(os.listdir(), ["examples"])


if __name__ == "__main__":
    unittest.main()
