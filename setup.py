"""Builds the Python package: the module and the stand-in host go into it, with their catalogue and
the stubs made from it. What they need to be built is what ./run installs."""

import os
import re
import shutil
import subprocess
import sys
from pathlib import Path

from setuptools import Distribution, setup
from setuptools.command.build_py import build_py
from wheel.bdist_wheel import bdist_wheel

ROOT = Path(__file__).resolve().parent
BUILD = ROOT / "build"
PROJECT = (ROOT / "CMakeLists.txt").read_text("utf-8")

LIBRARIES = ("libqxanalysis.so", "libqxrt.so", "qxanalysis.dll", "qxrt.dll", "print_hashes", "hashes.txt")


def libraries():
    """The folder of the built libraries: QX_LIBRARY_DIR, or the release build, made up to date."""
    if os.environ.get("QX_LIBRARY_DIR"):
        return Path(os.environ["QX_LIBRARY_DIR"])
    release = BUILD / "release"
    if not (release / "build.ninja").exists():
        subprocess.run(["cmake", "--preset", "release"], cwd=ROOT, check=True)
    subprocess.run(["cmake", "--build", release, "--target", "qxanalysis", "qxrt"], check=True)
    return release


class WithLibraries(build_py):
    def run(self):
        super().run()
        if self.editable_mode:
            libraries()  # the package finds them in the tree
            return
        package = Path(self.build_lib) / "qx"
        shutil.rmtree(package / "licences", ignore_errors=True)  # and what a wheel for another system has left
        for name in LIBRARIES:
            (package / name).unlink(missing_ok=True)
        ending = "dll" if (libraries() / "qxrt.dll").exists() else "so"
        # What is given to others has the hashes of the results, too (tools/package).
        with_hashes = (libraries() / "hashes.txt").exists()
        for name in LIBRARIES if with_hashes else LIBRARIES[:4]:
            if (libraries() / name).exists():
                shutil.copy(libraries() / name, package)
        shutil.copy(libraries() / "catalogue.json", package)
        shutil.copytree(libraries() / "licences", package / "licences", dirs_exist_ok=True)
        subprocess.run([sys.executable, "-m", "qx.stubs", package], check=True,
                       env={**os.environ, "PYTHONPATH": os.pathsep.join(
                           [self.build_lib, *filter(None, sys.path)]),
                            # Libraries of another system cannot be loaded here.
                            "QX_LIBRARY_DIR": str(BUILD / "release") if ending == "dll" else ""})


class HasLibraries(Distribution):
    def has_ext_modules(self):
        return True


class OfThisPlatform(bdist_wheel):
    """For any Python 3: the libraries do not know which one loads them."""

    def get_tag(self):
        return "py3", "none", os.environ.get("QX_PLATFORM") or super().get_tag()[2]


(BUILD / "python").mkdir(parents=True, exist_ok=True)
setup(version=re.search(r"project\(qxanalysis VERSION (\S+)", PROJECT)[1], distclass=HasLibraries,
      package_dir={"": "python"}, packages=["qx", "qx.commands", "qx.topical"],
      package_data={"qx": ["py.typed", "*.css", "*.js"]},
      cmdclass={"build_py": WithLibraries, "bdist_wheel": OfThisPlatform},
      options={"egg_info": {"egg_base": "build/python"}, "build": {"build_base": "build/python"}})
