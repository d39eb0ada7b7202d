"""Files that are broken or malicious: whatever a library does with one, it is refused in one line."""

import gzip
import io
import os
import signal
import subprocess
import sys
import tempfile
import threading
import time
import unittest
import zipfile
from pathlib import Path
from unittest import mock

import numpy as np

PYTHON = Path(__file__).resolve().parent.parent
sys.path[:0] = [str(PYTHON), str(PYTHON / "tests")]
import hostile_files  # noqa: E402
import library_faults as faults  # noqa: E402
from qx import audio, files, isolation, recording, viewing  # noqa: E402

EACH = 8  # files of each kind


class Isolation(unittest.TestCase):
    def setUp(self):
        folder = tempfile.TemporaryDirectory()
        self.addCleanup(folder.cleanup)
        self.path = Path(folder.name) / "a.csv"
        self.path.write_text("1\n2\n")

    def refused(self, reason, function, *arguments):
        with self.assertRaisesRegex(recording.InputError, rf"^{self.path}: .*{reason}"):
            isolation.read(function, self.path, *arguments)
        self.assertEqual(isolation.read(faults.takes, self.path, 80), 10)  # by another worker

    def test_crashes_hangs_and_floods_are_refusals(self):
        self.refused(r"crashed \(SIGSEGV\)", faults.writes_nowhere)
        self.refused(r"crashed \(SIGABRT\)", faults.crashes, signal.SIGABRT)
        self.refused(r"lack of memory \(SIGKILL\)", faults.crashes, signal.SIGKILL)
        self.refused("reading takes more than 1074 MB of memory; QX_READ_MB allows more", faults.takes, 3 << 30)
        with mock.patch.object(isolation, "STILL", 1):
            self.refused("done nothing for 1 s", faults.sleeps)
        with mock.patch.dict(os.environ, {"QX_READ_SECONDS": "1"}):
            self.refused("more than 1 s of processor time; QX_READ_SECONDS allows more", faults.never_ends)
        with mock.patch.dict(os.environ, {"QX_READ_MB": "4e3"}):
            self.assertEqual(isolation.read(faults.takes, self.path, 5 << 28), 5 << 25)

    def test_a_crash_over_what_an_earlier_file_left_behind_is_tried_again(self):
        isolation.close()
        first = isolation.read(faults.crashes_later, self.path)
        self.assertNotEqual(isolation.read(faults.crashes_later, self.path), first)
        isolation.close()

    def test_results_come_whole(self):
        for count in (10, 1 << 17):
            told = []
            found = isolation.read(faults.gives, self.path, count, told=told.append)
            self.assertEqual([part[-1] for part in told], [0, 1, 2])
            self.assertEqual((found["path"], found["folder"]), (str(self.path), []))
            found["big"] += 1  # it belongs to the caller
            self.assertEqual(found["big"][-1], count)
            with found["file"] as kept:
                kept.seek(0)
                self.assertEqual(kept.read(), b"kept")
        self.refused("Unusual: 1", faults.raises)

        def gives_up(value):
            raise KeyboardInterrupt
        with self.assertRaises(KeyboardInterrupt):
            isolation.read(faults.sleeps, self.path, told=gives_up)
        self.assertEqual(isolation.read(faults.gives, self.path, 3)["big"].tolist(), [0, 1, 2])

    def test_workers_end_with_their_process_and_leave_no_files(self):
        script = ("import sys, tempfile; sys.path[:0] = sys.argv[1:3]; import library_faults; from qx import isolation\n"
                  "tell = lambda _: print(isolation.last.process.pid, tempfile.gettempdir(), flush=True)\n"
                  "take = isolation._take\n"
                  "def taken():\n    isolation.last = take(); return isolation.last\n"
                  "isolation._take = taken\n"
                  "isolation.read(library_faults.sleeps, sys.argv[3], told=tell)\n")
        for number in (signal.SIGKILL, signal.SIGTERM):
            process = subprocess.Popen([sys.executable, "-c", script, PYTHON, PYTHON / "tests", self.path],
                                       stdout=subprocess.PIPE, text=True)
            worker = int(process.stdout.readline().split()[0])
            process.send_signal(number)
            process.communicate()
            limit = time.monotonic() + 5
            while os.path.exists(f"/proc/{worker}") and time.monotonic() < limit:
                time.sleep(0.01)
            self.assertFalse(os.path.exists(f"/proc/{worker}"))

    def test_threads_read_side_by_side(self):
        found = []
        threads = [threading.Thread(target=lambda: found.append(recording.read(self.path).values.tolist()))
                   for _ in range(3)]
        for thread in threads:
            thread.start()
        for thread in threads:
            thread.join()
        self.assertEqual(found, [[1, 2]] * 3)
        self.assertEqual(len(isolation._idle), 1)

    def test_a_pipe_with_a_name_is_read(self):
        pipe = self.path.with_name("pipe")
        os.mkfifo(pipe)
        writer = threading.Thread(target=lambda: pipe.write_bytes(b"3\n4\n5\n"))
        writer.start()
        self.assertEqual(recording.read(pipe).values.tolist(), [3, 4, 5])
        writer.join()


class Files(unittest.TestCase):
    def setUp(self):
        folder = tempfile.TemporaryDirectory()
        self.addCleanup(folder.cleanup)
        self.folder = Path(folder.name)

    def test_spoilt_files_are_read_or_refused(self):
        left_out = []
        for kind in hostile_files.KINDS:
            with self.subTest(kind):
                try:
                    tally = hostile_files.attack(kind, EACH, 7, self.folder)
                except ImportError:
                    tally = None
                if tally is None:
                    left_out.append(kind)
                    continue
                self.assertEqual(tally.faults, [])
                self.assertEqual(tally.counts.total(), EACH)
                self.assertLess(tally.memory, isolation.MEMORY + isolation.MEMORY_A_BYTE * (1 << 16))
        if left_out:
            print(f"NOT TESTED, their packages are not installed: {', '.join(left_out)}", file=sys.stderr)

    def refuses(self, name, content, fragment):
        path = self.folder / name
        path.write_bytes(content)
        with self.assertRaises(recording.InputError) as caught:
            recording.read(path)
        self.assertRegex(str(caught.exception), f"^{path}:[^\n]*{fragment}")

    def test_what_has_once_got_through(self):
        text = hostile_files.TEXT
        self.refuses("a.csv", text + b"\xff\xfe", "is not utf-8(-sig)? text")
        self.refuses("b.csv", b"\xff\xfe" + "1\n2\n".encode("utf-16-le") + b"\x00", "is not utf-16 text throughout")
        self.refuses("c.csv", b'a,b\n1,2\n3,"4\n', "cannot be cut into cells|cell where")
        whole = hostile_files.archive("a.csv", text)
        at = whole.rindex(b"PK\x01\x02")
        self.refuses("d.zip", whole[:at + 10] + b"\x63" + whole[at + 11:], "cannot be unpacked.*compression method")
        npy = hostile_files.numpys(np.save, np.arange(9.0))
        self.refuses("e.npy", npy.replace(b"}", b"("), "cannot be read")
        for date in ("00/00/2024", "00/02/2024", "01/01/9999"):
            days = "".join(f"{date if i == 7 else f'{i + 1:02}/02/2024'},11:59:00,{i}\n" for i in range(12))
            self.refuses("d.csv", f"Date,Time,u\n{days}".encode(), "may be|is not a time")
        path = self.folder / "a.au"
        path.write_bytes(hostile_files.KINDS["AU"][2]()[:11])
        self.assertIn("cut off", audio.wrong_length(path, 0))
        path = self.folder / "f.csv"
        path.write_text("# fs = 1e400 Hz\n# sampling interval 1e-400 s\n1\n2\n")
        self.assertIsNone(recording.read(path).rate)

    def test_bombs(self):
        zeros = gzip.compress(b"1\n" * (20 << 20))
        path = self.folder / "a.csv.gz"
        path.write_bytes(zeros)
        with mock.patch.dict(os.environ, {"QX_READ_SECONDS": "1"}), self.assertRaisesRegex(
                recording.InputError, "more than 1 s of processor time"):
            recording.read(path)
        flood = io.BytesIO()
        with zipfile.ZipFile(flood, "w", zipfile.ZIP_DEFLATED) as archive, archive.open("a.npy", "w") as file:
            np.lib.format.write_array_header_1_0(file, {"descr": "<f8", "fortran_order": False, "shape": (1 << 28,)})
            for _ in range(8):
                file.write(bytes(1 << 20))
        self.refuses("a.npz", flood.getvalue(), "takes more than .* MB of memory; QX_READ_MB allows more")

    def test_names_do_not_command_the_terminal(self):
        hidden = "\x1b]0;title\x07\x9b2J\u202e\udcff\r\nx"
        text = files.printable(hidden)
        self.assertTrue(text.replace("\N{REPLACEMENT CHARACTER}", "?").isprintable(), ascii(text))
        text.encode()
        path = self.folder / os.fsdecode(b"\x1b[2J\xff.csv")
        path.write_text("u\x9b31m\u202e (V)\n1\n2\n", "utf-8")
        read = recording.read(path)
        for said in (read.name, read.channel, read.choice, str(recording.InputError(f"{path}: x"))):
            self.assertNotRegex(said, "[\x1b\x9b\u202e\udcff]")

    def test_samples_that_wait_on_the_disk_come_along(self):
        path = self.folder / "a.csv"
        values = np.arange(5000) % 11
        path.write_text("a,b\n" + "".join(f"{value},{-value}\n" for value in values))
        read = recording.read(path, outline=viewing.Levels)
        for levels, expected in ((read.envelope, values), (read.others[0].envelope, -values)):
            levels.finish()
            np.testing.assert_array_equal(levels.values, expected)


if __name__ == "__main__":
    unittest.main()
