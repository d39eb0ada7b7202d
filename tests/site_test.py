"""The documentation builds without a warning, its links and images lead to existing places within it, it loads
nothing from elsewhere, it covers every export and every function of the topics, and its code runs.

    site_test.py SOURCE BUILD_DIR
"""

import importlib
import os
import re
import subprocess
import sys
import tempfile
import unittest
from html.parser import HTMLParser
from pathlib import Path
from urllib.parse import unquote, urldefrag

SOURCE, BUILD = (Path(argument).resolve() for argument in sys.argv[1:3])
del sys.argv[1:3]
sys.path[:0] = [str(SOURCE / "python"), str(SOURCE / "docs/site")]
os.environ["QX_LIBRARY_DIR"] = str(BUILD)
import pages  # noqa: E402
from qx.topical.newest import TOPICS  # noqa: E402

SITE = BUILD / "site"
# Links of the theme that lead out of the site; a page does not need them.
OUTSIDE = re.compile(r"https?://(?:www\.sphinx-doc\.org|pradyunsg\.me|github\.com/pradyunsg|sphinx-gallery\.github\.io)")


class Page(HTMLParser):
    def __init__(self, path):
        super().__init__()
        self.links, self.loads, self.anchors, self.images = [], [], set(), []
        self.feed(path.read_text("utf-8"))

    def handle_starttag(self, tag, attributes):
        named = dict(attributes)
        self.anchors.update(named[key] for key in ("id", "name") if named.get(key))
        if tag == "a" and named.get("href"):
            self.links.append(named["href"])
        elif tag == "img":
            self.images.append((named.get("src"), named.get("alt")))
        if tag in ("img", "script") and named.get("src"):
            self.loads.append(named["src"])
        elif tag == "link" and named.get("href") and named.get("rel") in ("stylesheet", "icon"):
            self.loads.append(named["href"])


def look_up(name):
    parts = name.split(".")
    for n in range(len(parts), 0, -1):
        try:
            thing = importlib.import_module(".".join(parts[:n]))
            break
        except ImportError:
            continue
    for part in parts[n:]:
        thing = getattr(thing, part)
    return thing


class Site(unittest.TestCase):
    @classmethod
    def setUpClass(cls):
        built = subprocess.run([SOURCE / "tools/site", SITE], capture_output=True, text=True, check=False)
        if built.returncode:
            raise AssertionError(f"tools/site: {built.stdout}{built.stderr}")
        cls.pages = {path: Page(path) for path in SITE.rglob("*.html")}

    def test_links_and_images(self):
        wrong = []
        for path, page in self.pages.items():
            for link in {*page.links, *page.loads}:
                address, anchor = urldefrag(link)
                if re.match(r"\w+:", address):
                    if link in page.loads and not address.startswith("data:") or (
                            link in page.links and address.startswith("http") and not OUTSIDE.match(address)):
                        wrong.append(f"{path.relative_to(SITE)}: {link} is outside of the site")
                    continue
                target = (path.parent / unquote(address.split("?")[0])).resolve() if address else path
                if not target.is_file() or target.stat().st_size == 0:
                    wrong.append(f"{path.relative_to(SITE)}: {link} has no file")
                elif anchor and target in self.pages and anchor not in self.pages[target].anchors:
                    wrong.append(f"{path.relative_to(SITE)}: {link} has no such anchor")
            wrong += [f"{path.relative_to(SITE)}: image {source} has no text" for source, text in page.images
                      if text is None]
        self.assertEqual(wrong, [])

    def test_everything_is_there(self):
        exports = pages.library().entries
        for name, entry in exports.items():
            # The id of a heading is in lower case; the label is kept as well.
            self.assertIn(f"export-{name}".lower().replace("_", "-"),
                          self.pages[SITE / f"exports/{entry['family']}.html"].anchors)
        for topic in TOPICS:
            anchors = self.pages[SITE / f"topics/{topic}.html"].anchors
            for name in importlib.import_module(f"qx.{topic}").__all__:
                self.assertIn(f"qx.{topic}.{name}", anchors)
        start = (SITE / "index.html").read_text("utf-8")
        self.assertIn(f"{len(exports)} C functions in one module", " ".join(start.split()))
        outputs = [(SITE / f"tutorials/{path.stem}.html").read_text("utf-8")
                   for path in (SOURCE / "examples/tutorials").glob("*.py")]
        self.assertEqual(len(outputs), 10)
        for text in outputs:
            self.assertIn("sphx-glr-script-out", text)

    def test_the_mathematics_is_set(self):
        self.assertIn(r"\sum", (SITE / "topics/fft.html").read_text("utf-8"))
        script = next(load for load in self.pages[SITE / "topics/fft.html"].loads if "MathJax" in load)
        name, configuration = script.split("/")[-1].split("?config=")
        folder = SITE / "_static/mathjax"
        self.assertTrue((folder / name).is_file())
        parts = re.findall(r'"([\w/-]+)"', (folder / f"config/{configuration}.js").read_text("utf-8"))
        self.assertTrue(parts)


class Sources(unittest.TestCase):
    def test_every_argument_has_a_meaning(self):
        used, named = set(), set()
        for entry in pages.library().entries.values():
            for argument in entry["arguments"]:
                text = pages.meaning(entry, argument)
                self.assertTrue(text, f"{entry['name']}: {argument['name']}: neither its header nor "
                                "docs/site/arguments.py says what it is")
                self.assertNotRegex(text, r"^(?:A|Every|After a) failure|empties", f"{entry['name']}: {argument['name']}")
                if text == pages.TEXTS.get(entry["family"], {}).get(argument["name"]):
                    used.add((entry["family"], argument["name"]))
                named.update([key for key in pages.keys(entry, argument) if key in pages.MEANINGS][:1])
        listed = {(family, name) for family, names in pages.TEXTS.items() for name in names}
        self.assertEqual(listed - used, set(), "in docs/site/arguments.py, but their headers say what they are")
        self.assertEqual(set(pages.MEANINGS) - named, set(), "in docs/site/arguments.py, but not arguments")

    def test_every_code_has_a_reason(self):
        for entry in pages.library().entries.values():
            self.assertEqual([code for code in entry["codes"] if not pages.reasons(entry).get(code)], [],
                             entry["name"])

    def test_names_from_scipy(self):
        text = (SOURCE / "docs/coming_from_scipy.md").read_text("utf-8")
        rows = re.findall(r"^\| `([\w.]+)` \| `(qx\.[\w.]+)` \|", text, re.MULTILINE)
        self.assertGreaterEqual(len(rows), 100)
        self.assertEqual(len(rows), text.count("\n| `"))
        for names in rows:
            for name in names:
                with self.subTest(name):
                    look_up(name)

    def test_the_programs_of_the_guides(self):
        options = [f"-I{SOURCE}/include", f"-I{BUILD}/include", "-Wall", "-Werror"]
        libraries = [f"-L{BUILD}", f"-Wl,-rpath,{BUILD}", "-lqxanalysis", "-lqxrt"]
        count = 0
        with tempfile.TemporaryDirectory() as folder:
            for guide in sorted((SOURCE / "docs/guides").glob("*.md")):
                blocks = re.findall(r"^```(c|cpp|python)\n(.*?)^```", guide.read_text("utf-8"), re.M | re.S)
                for language, code in blocks:
                    with self.subTest(f"{guide.name}: {code[:60]}"):
                        count += 1
                        source = Path(folder, f"program.{language}")
                        source.write_text(code, "utf-8")
                        if language == "python":
                            command = [sys.executable, "-c", code]
                        else:
                            compiler = ["gcc", "-std=c11"] if language == "c" else ["g++", "-std=c++20"]
                            subprocess.run([*compiler, *options, source, "-o", f"{folder}/program", *libraries],
                                           check=True)
                            command = [f"{folder}/program"]
                        done = subprocess.run(command, capture_output=True, text=True, check=True,
                                              env={**os.environ, "PYTHONPATH": str(SOURCE / "python")})
                        self.assertTrue(done.stdout or language == "python")
        self.assertGreater(count, 4)


if __name__ == "__main__":
    unittest.main()
