"""The server of `view`, and all pages in a browser."""

import asyncio
import http.client
import json
import os
import sys
import tempfile
import threading
import time
import unittest
import urllib.parse
from pathlib import Path

import numpy as np

PYTHON = Path(__file__).resolve().parent.parent
sys.path.insert(0, str(PYTHON))
from qx import design, design_page, many, recording, report, serving, viewing  # noqa: E402

ECG = PYTHON.parent / "examples/data/ecg_208_360hz.csv"
PICTURE = PYTHON.parent / "docs/page.png"
FLAGS = ("--headless --no-sandbox --disable-gpu --disable-quic --no-first-run --disable-background-networking "
         "--disable-component-update --disable-sync").split()


class Served:
    """A separate server for some files, in a thread."""

    def __init__(self, *paths, **options):
        self.opened = [viewing.Opened(str(path), options) for path in paths]
        self._loop, ready = asyncio.new_event_loop(), threading.Event()

        def told(address):
            self.address = address
            ready.set()

        self._task = self._loop.create_task(serving.serve(self.opened, 0, told))
        self._thread = threading.Thread(target=self._run, daemon=True)
        self._thread.start()
        ready.wait(20)
        self.parts = urllib.parse.urlsplit(self.address)

    def _run(self):
        try:
            self._loop.run_until_complete(self._task)
        except asyncio.CancelledError:
            pass

    def close(self):
        self._loop.call_soon_threadsafe(self._task.cancel)
        self._thread.join(20)

    def get(self, path, host=None, method="GET"):
        connection = http.client.HTTPConnection("127.0.0.1", self.parts.port, timeout=30)
        connection.request(method, path, headers={"Host": host or self.parts.netloc})
        response = connection.getresponse()
        text = response.read().decode()
        connection.close()
        return response.status, text, response.headers

    def ask(self, what, **query):
        status, text, _ = self.get(f"{self.parts.path}0/{what}?{urllib.parse.urlencode(query)}")
        return status, json.loads(text)


class InFolder(unittest.TestCase):
    def setUp(self):
        folder = tempfile.TemporaryDirectory()
        self.addCleanup(folder.cleanup)
        self.folder = Path(folder.name)

    def served(self, *paths, **options):
        served = Served(*paths, **options)
        self.addCleanup(served.close)
        return served


class Server(InFolder):
    def test_serves_only_what_was_named_to_those_who_know_the_token_and_the_name(self):
        served = self.served(ECG)
        path, port = served.parts.path, served.parts.port
        self.assertEqual(served.parts.hostname, "127.0.0.1")
        self.assertEqual(served.get(path, f"localhost:{port}")[0], 200)
        other = path[:-2] + ("y/" if path[-2] == "x" else "x/")
        for asked, host in (("/", None), (other, None), ("/x/0/data", None), (path, "evil.example"),
                            (path, f"evil.example:{port}"), (path, "127.0.0.1"), (path, f"127.0.0.1:{port + 1}")):
            with self.subTest(asked=asked, host=host):
                self.assertEqual(served.get(asked, host)[0], 403)
        for asked in ("1/", "-1/", "x/", "..%2f..%2fetc%2fpasswd/", "0/sections?kind=lowpass", "0/sections?window=x",
                      "0/sections?order=99", "0/sections?from=nan", "0/data?version=1&from=0&to=1&points=x",
                      "0/data?version=7&from=0&to=1&points=9", "0/data?version=1&channel=9&from=0&to=1&points=9",
                      "0/sections?kind=lowpass&low=400", "0/sections?from=9&to=8"):
            with self.subTest(asked):
                status, text, headers = served.get(path + asked)
                self.assertEqual(status, 400, text)
                self.assertIn("error", json.loads(text))
                self.assertEqual(headers["X-Content-Type-Options"], "nosniff")
        self.assertEqual(served.get(path + "0/nothing")[0], 403)
        self.assertEqual(served.get(path, method="POST")[0], 403)

    def test_names_are_text(self):
        path = self.folder / "<img src=x onerror=alert(1)>&'.csv"
        path.write_text("time,<script>alert(1)</script>,</script><i id=x>\n"
                        + "".join(f"{i},{i % 7},{i % 5}\n" for i in range(99)))
        served = self.served(path, ECG)
        pages = [served.get(served.parts.path + part)[1] for part in ("", "0/")]
        pages += [served.ask("sections", channel=1)[1]["html"]]
        read = recording.read(path)
        pages += [report.page(read, report.sections_of(read)), many.index([many.report_on(path.name, path, {})])]
        for page in pages:
            self.assertNotIn("<img", page)
            self.assertNotIn("<i id", page)
            self.assertNotIn("alert(1)</script>", page)

    def test_levels_of_detail_have_the_extremes_of_the_samples(self):
        rng = np.random.default_rng(1)
        x = rng.normal(size=300_001)
        levels = viewing.Levels()
        for part in np.split(x, [1, 100, 70_000]):
            levels.add(part)
        levels.finish()
        for first, last, most in ((0, 300_001, 10), (0, 300_001, 1000), (5, 300_001, 100_000), (77, 99, 100),
                                  (250, 9000, 50)):
            start, group, lows, highs = levels.seen(first, last, most)
            self.assertLessEqual(start, first)
            self.assertLessEqual(len(lows), 2 * most + 2)
            self.assertGreaterEqual(start + group * len(lows), last)
            starts = np.arange(start, min(start + group * len(lows), len(x)), group)
            np.testing.assert_array_equal(lows, np.minimum.reduceat(x[:start + group * len(lows)], starts))
            if highs is not None:
                np.testing.assert_array_equal(highs, np.maximum.reduceat(x[:start + group * len(lows)], starts))

    def test_missing_values_are_gaps_at_their_times(self):
        path = self.folder / "gaps.csv"
        path.write_text("time (s),u\n" + "".join(f"{i / 100},{'' if i % 7 == 3 or 500 <= i < 700 else i % 5}\n"
                                                 for i in range(2000)))
        served = self.served(path, missing="skip")
        _, found = served.ask("sections", **{"from": 8, "to": 15})
        self.assertIn("from 8 to 15 s", found["html"])
        self.assertIn("missing values are left out of statistics and histogram", found["html"])
        image = next(plot["image"] for plot in found["plots"] if "image" in plot)
        self.assertAlmostEqual(image["right"], 15, delta=0.02)
        levels = served.opened[0].channels[0][2]
        np.testing.assert_array_equal(np.isnan(levels.values), [i % 7 == 3 or 500 <= i < 700 for i in range(2000)])
        seen = served.ask("data", version=1, **{"from": 0, "to": 20, "points": 5000})[1]
        self.assertAlmostEqual(seen["step"], 0.01)

    def test_sections_are_those_of_the_part_the_channel_and_the_filter(self):
        t = np.arange(20_000) / 1000
        both = np.stack([t, np.sin(2 * np.pi * 50.5 * t) + np.sin(2 * np.pi * 200 * t), np.where(t < 5, 1, 3.0)], -1)
        path = self.folder / "two.csv"
        np.savetxt(path, both, delimiter=",", header="time (s),u (V),step", comments="")
        served = self.served(path)
        _, found = served.ask("sections", kind="lowpass", low=100, to=10, window="flattop")
        self.assertRegex(found["html"], r"Tone at 50\.5\d* ")
        self.assertRegex(found["html"], r"Standard deviation of the result</td><td class=\"value\">0\.70\d+<")
        self.assertIn("flattop", "".join(plot["title"] for plot in found["plots"]))
        _, found = served.ask("sections", channel=1, **{"from": 6, "to": 8})
        self.assertRegex(found["html"], r"Mean</td><td class=\"value\">3<")
        over_time = [plot for plot in served.ask("sections", **{"from": 6, "to": 8})[1]["plots"] if plot["link"]]
        self.assertAlmostEqual(over_time[0]["image"]["left"], 6)


class InABrowser(InFolder):
    @classmethod
    def setUpClass(cls):
        from selenium import webdriver
        from selenium.webdriver.chrome.service import Service
        options = webdriver.ChromeOptions()
        options.binary_location = "/usr/bin/chromium"
        for flag in FLAGS:
            options.add_argument(flag)
        options.set_capability("goog:loggingPrefs", {"browser": "ALL"})
        cls.browser = webdriver.Chrome(service=Service("/usr/bin/chromedriver"), options=options)
        cls.addClassCleanup(cls.browser.quit)

    def show(self, address, width=1280, dark=False):
        self.browser.execute_cdp_cmd("Emulation.setDeviceMetricsOverride", {
            "width": width, "height": 900, "deviceScaleFactor": 1, "mobile": False})
        self.browser.execute_cdp_cmd("Emulation.setEmulatedMedia", {
            "features": [{"name": "prefers-color-scheme", "value": "dark" if dark else "light"}]})
        self.browser.get("about:blank")  # an earlier page may still send requests to its server
        self.browser.get_log("browser")
        self.browser.get(address)
        self.until("return document.querySelectorAll('figure.plot canvas').length > 0 || !window.figures")

    def until(self, script, seconds=20):
        """The value of a script once it is true."""
        before = time.monotonic()
        while not (value := self.browser.execute_script(script)):
            self.assertLess(time.monotonic() - before, seconds, f"never: {script}")
            time.sleep(0.05)
        return value

    def page(self, path=ECG, **options):
        read = recording.read(path, **options)
        page = self.folder / "page.html"
        page.write_text(report.page(read, report.sections_of(read)), "utf-8")
        return page.as_uri()

    def no_complaints(self):
        self.assertEqual([entry["message"] for entry in self.browser.get_log("browser")], [])

    def test_pages_fit_every_window_in_light_and_dark(self):
        address = self.page()
        colours = set()
        for width in (1280, 390):
            for dark in (False, True):
                self.show(address, width, dark)
                self.assertLessEqual(self.browser.execute_script("return document.documentElement.scrollWidth"), width)
                self.assertTrue(self.browser.execute_script(
                    "return [...document.querySelectorAll('figcaption strong, h1')].every("
                    "one => one.scrollWidth <= one.clientWidth + 1)"))
                drawn = self.browser.execute_script(
                    "return figures.map(one => one.graph.getOption('gridLineColor') + one.graph.getColors())")
                self.assertEqual(len(drawn), 9)
                colours.add((dark, *drawn))
        self.assertEqual(len(colours), 2)
        self.no_complaints()

    def test_what_files_say_stays_text(self):
        """The names of a file, its columns, its notes and its unit are scripts that must not run in a page."""
        attack = "<img src=x onerror=window.attacked=1>"
        ends = "</script></title><script>window.attacked=1</script>"
        path = self.folder / f"{attack}&'\".csv"  # a file name has no slash
        path.write_text(f"# {ends} {attack}\ntime (s);{attack} (<b>);{ends}{attack}\n"
                        + "".join(f"{i / 10};{i % 7};{i % 5}\n" for i in range(99)))
        served = self.served(path, ECG)
        outcome = many.report_on(path.name, str(path), {})
        index, broken = self.folder / "index.html", many.Outcome(path.name, failure=f"{path}: {attack}")
        index.write_text(many.index([outcome, broken], [str(path)]), "utf-8")
        for address, needed in ((self.page(path), "document.title"), (index.as_uri(), "document.body.textContent"),
                                (served.address, "document.body.textContent"),
                                (served.address + "0/", "document.title"),
                                (served.address + "0/", "document.getElementById('sections')?.textContent")):
            with self.subTest(address=address, needed=needed):
                self.show(address)
                self.until(f"return ({needed} || '').includes({json.dumps(attack)})")
                self.browser.execute_script("typeof figures === 'undefined' || figures.forEach(one => {"
                                            "one.graph.setSelection(3); one.show([1, 2]) })")
                time.sleep(0.1)
                self.assertEqual(self.browser.execute_script(
                    "const bold = [...document.querySelectorAll('b')].map(one => one.textContent);"
                    "return [window.attacked, document.querySelectorAll('img[src=x], title ~ script').length,"
                    "bold.filter(text => !/^[-+.0-9e]+$/.test(text))]"), [None, 0, []])

    def test_zooms_in_together_and_shows_the_samples(self):
        self.show(self.page())
        self.browser.execute_script("figures[0].show([10, 10.5])")
        linked = self.browser.execute_script(
            "return figures.filter(one => one.plot.link === 'time').map(one => one.graph.xAxisRange())")
        self.assertEqual(len(linked), 4)
        for window in linked:
            np.testing.assert_allclose(window, [10, 10.5], atol=1e-6)
        values = self.browser.execute_script(
            "return figures[0].graph.file_.filter(row => row[0] >= 10 && row[0] < 10.5).map(row => row[1])")
        x = np.loadtxt(ECG, skiprows=2)
        np.testing.assert_allclose(values, x[3600:3780], atol=1e-6)
        self.browser.find_element("css selector", "button[title^='show all']").click()
        self.assertGreater(self.until("const r = figures[0].graph.xAxisRange(); return r[1] - r[0]"), 29)
        log = self.browser.find_element("css selector", ".tools input")
        log.click()
        self.assertTrue(self.until("return figures.some(one => one.log && one.graph.xAxisRange()[0] > 0)"))
        self.no_complaints()

    def test_values_of_a_design_are_seen_and_labels_of_marks_lie_apart(self):
        path = self.folder / "design.html"
        design_page.write(design.equiripple("lowpass", [100.0, 150.0], 1000.0, 101), "Equiripple lowpass", 1000.0, path)
        self.show(path.as_uri(), 390)
        self.assertTrue(self.browser.execute_script(
            "return [...document.querySelectorAll('section:first-of-type td.value')].every("
            "one => one.getBoundingClientRect().right <= 390)"))
        self.show(self.page())
        self.assertTrue(self.browser.execute_script("""
            const canvas = document.createElement("canvas").getContext("2d");
            canvas.font = "11px sans-serif";
            const labels = marks => {
              const taken = marks.map(([x, y]) => [x - 4, y - 4, 8, 8]);
              for (const [x, y] of marks) label(canvas, {x: 0, y: 0, w: 300, h: 200}, taken, "5.00", x, y);
              const found = taken.slice(marks.length);
              return found.every(one => one[0] >= 0 && taken.every(other => one === other || one[0] >= other[0] + other[2]
                || other[0] >= one[0] + one[2]
                || one[1] >= other[1] + other[3] || other[1] >= one[1] + one[3])) && found.length;
            };
            const crowd = labels(Array.from({length: 60}, (_, i) => [100 + i / 10, 100]));
            return labels([[1, 8], [2, 11], [5, 14]]) === 3 && crowd > 3 && crowd < 60;"""))
        self.no_complaints()

    def test_the_index_sorts(self):
        found = [many.Outcome(f"{name}.csv", cells=(count, "1", *["-1.23456e-05 ± 1.2e-08 mV" for _ in many.MAIN[:4]], "1"))
                 for name, count in (("b", "9"), ("a", "100"), ("c", "20"))]
        path = self.folder / "index.html"
        path.write_text(many.index(found), "utf-8")
        self.show(path.as_uri())
        self.assertTrue(self.browser.execute_script("const wide = document.querySelector('div.wide');"
                                                    "return wide.scrollWidth <= wide.clientWidth"))
        buttons = self.browser.find_elements("css selector", "th button")
        names = "return [...document.querySelectorAll('td a')].map(one => one.textContent).join()"
        for column, expected in ((1, "b.csv,c.csv,a.csv"), (1, "a.csv,c.csv,b.csv"), (0, "a.csv,b.csv,c.csv")):
            buttons[column].click()
            self.assertEqual(self.browser.execute_script(names), expected)

    def test_view_follows_choices_and_the_file(self):
        t = np.arange(200_000) / 1000
        path = self.folder / "long.csv"
        path.write_text("# sampling rate 1000 Hz\n" + "\n".join(map(str, np.round(np.sin(2 * np.pi * 50.5 * t), 6))) + "\n")
        served = self.served(path)
        self.show(served.address)
        sections = "return document.getElementById('sections').textContent"
        self.until(sections + ".includes('Tone at 50.5')")
        self.browser.execute_script("figures[0].show([100, 100.02])")
        seen = self.until("const rows = figures[0].graph.file_.filter(r => r[0] > 100 && r[0] < 100.02);"
                          "return rows.length >= 18 && rows.length <= 21 ? rows : null")
        np.testing.assert_allclose([row[1] for row in seen],
                                   np.sin(2 * np.pi * 50.5 * np.array([row[0] for row in seen])), atol=1e-5)
        first = self.browser.current_window_handle
        self.browser.switch_to.new_window("tab")
        self.show(served.address, dark=True)  # beside the other window, with its own choices
        self.browser.execute_script(
            "for (const [name, value] of [['kind', 'highpass'], ['low', '200'], ['from', '2'], ['to', '4']])"
            "  form.elements[name].value = value;"
            "form.dispatchEvent(new Event('input'))")
        self.until(sections + ".includes('Butterworth highpass')")
        self.assertIn("2001 samples from 2 to 4 s", self.browser.execute_script(sections))
        self.assertEqual(self.browser.execute_script(
            "return ['low', 'high', 'order'].map(name => form.elements[name].parentElement.offsetParent !== null)"),
            [True, False, True])  # a highpass has one edge
        self.browser.close()
        self.browser.switch_to.window(first)
        self.assertNotIn("Butterworth", self.browser.execute_script(sections))
        with path.open("a") as file:
            file.write("5\n" * 1000)
        self.until("return state.textContent.includes('has changed')")
        self.browser.refresh()
        self.until(sections + ".includes('201000 samples')")
        path.unlink()
        self.until("return state.textContent.includes('no longer exists')")
        self.browser.refresh()
        self.until("return document.body.textContent.includes('no such file')")
        self.until(sections + ".includes('201000 samples')")

    def test_the_picture_of_the_readme(self):
        """docs/page.png shows the page of the example; QX_PICTURE=1 writes it again."""
        import base64
        import io

        from PIL import Image
        self.show(self.page(), 900)
        self.browser.execute_script("document.querySelectorAll('section').forEach((one, i) => { if ([1, 2, 3, 4]"
                                    ".includes(i)) one.remove(); }); document.querySelector('table').remove()")
        self.until("return figures.some(one => one.image && one.image.complete)")
        time.sleep(0.3)
        shot = base64.b64decode(self.browser.execute_cdp_cmd("Page.captureScreenshot", {
            "captureBeyondViewport": True, "clip": {"x": 0, "y": 0, "width": 900, "height": 1130, "scale": 1}})["data"])
        made = Image.open(io.BytesIO(shot)).convert("P", palette=Image.Palette.ADAPTIVE, colors=128)
        if os.environ.get("QX_PICTURE"):
            made.save(PICTURE, optimize=True)
        kept = Image.open(PICTURE)
        self.assertEqual(kept.size, made.size)
        away = np.abs(np.asarray(kept.convert("RGB"), float) - np.asarray(made.convert("RGB"), float))
        self.assertLess(away.mean(), 6)  # of 255; other versions of the browser draw letters differently


if __name__ == "__main__":
    unittest.main()
