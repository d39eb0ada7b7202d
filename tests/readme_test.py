"""Runs every command of the README, in order, in a fresh copy of the sources.

    readme_test.py SOURCE BUILD            on this machine, with the libraries of BUILD
    readme_test.py SOURCE BUILD --bare     on a Debian with nothing installed (tools/setup/bare-root):
                                           what ./run installs there must suffice for all that follows
    readme_test.py SOURCE BUILD --windows  the commands for 64-bit Windows, with the build of win64

All indented lines of the README and its C and Python blocks are run, except those listed here with a reason. The
exit status is 77 if nothing was run.
"""

import fcntl
import os
import re
import shutil
import subprocess
import sys
import tempfile
from pathlib import Path

SKIPPED = 77
DEBIAN_PATH = "/usr/local/sbin:/usr/local/bin:/usr/sbin:/usr/bin:/sbin:/bin"
PACKAGES_CACHE = "bare-root.debs"

# Commands that are not run, and why.
LEFT_OUT = {
    "./test": "it runs this test",
    "./test --all": "it runs this test",
    "tools/site": "site_test builds it",
}
SHORTENED = {
    # The benchmark takes minutes; the first row is enough.
    "bench/run fft": "(bench/run fft || true) | grep -m 1 ' complex '",
    # The given build was configured in this way.
    "cmake --preset win64": "[ -f build/win64/build.ninja ]",
}

# The files that the placeholders of the README refer to.
FILES = r"""
import numpy as np, pathlib, soundfile
t = np.arange(4000) / 1000
pulses = 1 / (1 + np.exp(-((t % 1) - 0.3) / 0.01)) - 1 / (1 + np.exp(-((t % 1) - 0.6) / 0.01))
pathlib.Path("recordings").mkdir(exist_ok=True)
for name in ("measurement.csv", "recordings/first.csv", "recordings/second.csv"):
    np.savetxt(name, np.column_stack([t, pulses]), delimiter=",", header="time (s),force (N)", comments="")
x = np.linspace(0, 4, 40)
np.savetxt("decay.csv", np.column_stack([x, 3 * np.exp(-x / 2)]), delimiter=",", header="x,y", comments="")
soundfile.write("IN.wav", 0.5 * np.sin(0.05 * np.arange(48000)), 48000)
"""
NAMES = {"peaks FILE": "peaks measurement.csv", "pulse FILE": "pulse measurement.csv",
         "tones FILE": "tones measurement.csv",
         "view FILE": "view measurement.csv >view.log & "  # serves until it is ended
                      "while kill -0 $! && ! grep -q http view.log; do sleep 0.1; done; "
                      "python3 -c 'import urllib.request as r; "
                      "assert b\"<h1>measurement.csv\" in r.urlopen(open(\"view.log\").read().strip()).read()'; "
                      "kill $!",
         "fit FILE": "fit decay.csv"}

# Commands that must succeed after a command that begins with the given text.
AFTERWARDS = {
    "./run": "[ -s out/report.html ]",
    "./run recordings/": "[ -s out/index.html ]",
    "python3 -m qx resample": "[ -s OUT.flac ]",
    "python3 -m venv": "(cd / && unset PYTHONPATH && ~/qx/bin/python3 -c 'import qx, sys;"
                       " assert qx.__file__.startswith(sys.prefix); assert qx.Mean_head([1.0, 3.0]) == 2.0')",
    "cc -Iinclude": "./a.out | grep '^2.33333 ('",
    "c++ -std=c++20 -Iinclude -Ibuild/release/include examples/first_call": "./a.out | grep ErrOrderNotPositive",
    "c++ -std=c++20 -Iinclude -Ibuild/release/include examples/ten_tasks": "./a.out >/dev/null",
    "cmake --install": "[ -f ~/qx-library/include/qx/qx.h ]",
    "cc first.c": "(cd / && \"$OLDPWD/first\" | grep '^2.33333 (')",
    "tools/site": "[ -s build/site/index.html ]",
    "cp build/win64": "tools/wine-run first.exe | grep '^2.33333 ('",
}


def commands(readme):
    """The commands of the README and the texts of its blocks, as bash lines, in their order."""
    language, block, lines, python = None, [], [], []
    for line in readme.split("\n"):
        if line.startswith("```"):
            if language == "c":
                lines.append("cat >first.c <<'END'\n" + "\n".join(block) + "\nEND")
            elif language == "python":
                # A block continues the previous one; the last line may show how a failure is raised.
                python += block
                run = "{ python3 - 2>&1 || true; } <<'END' | grep 'Error: Mean_head.*ErrEmptyInput'\n" \
                    if "raises" in block[-1] else "python3 - <<'END'\n"
                lines.append(run + "\n".join(python) + "\nEND")
            language, block = line[3:] if language is None else None, []
        elif language is not None:
            block.append(line)
        elif line.startswith("    ") and line.strip():
            # A remark on a command follows it after several blanks.
            lines.append(re.sub(r"(\S)  +[^#\s].*", r"\1", line.strip()))
    return lines


def script(readme, windows):
    """All commands as a script that stops at the first failing command and prints each one before it runs."""
    text = ["set -euo pipefail"]
    prepared = False
    for line in commands(readme):
        shown = line.split("\n")[0]
        of_windows = bool(re.search(r"win64|mingw", line))
        if line in LEFT_OUT or (of_windows != windows and not shown.startswith("cat >first.c")):
            continue
        if not prepared and shown.startswith("./run m"):
            text += ["python3 - <<'END'" + FILES + "END"]
            prepared = True
        for name, file in NAMES.items():
            line = line.replace(name, file)
        text += [f"echo {quoted('== ' + shown)}", SHORTENED.get(line, line)]
        held = [check for start, check in AFTERWARDS.items() if shown == start or (
            " " in start and shown.startswith(start))]
        text += [f"{check} || {{ echo 'does not hold: '{quoted(check)}; exit 1; }}" for check in held]
    return "\n".join(text) + "\necho '== all run'\n"


def quoted(text):
    return "'" + text.replace("'", "'\\''") + "'"


def copied(source, target):
    """Copies the files that a clone would have, including uncommitted ones."""
    if (source / ".git").exists():
        names = subprocess.run(["git", "-C", source, "ls-files", "-co", "--exclude-standard", "-z"],
                               capture_output=True, text=True, check=True).stdout.split("\0")
        for name in filter(None, names):
            if (source / name).is_file():
                (target / name).parent.mkdir(parents=True, exist_ok=True)
                shutil.copy2(source / name, target / name)
    else:
        shutil.copytree(source, target, symlinks=True, dirs_exist_ok=True,
                        ignore=shutil.ignore_patterns("build", "out", "__pycache__"))


def machine_cache(source):
    return Path(subprocess.run(["bash", "-c", '. "$0"; echo "$CACHE"', source / "tools/setup/common.sh"],
                               capture_output=True, text=True, check=True).stdout.strip())


def on_this_machine(source, build, windows):
    if windows and subprocess.run([source / "tools/setup/wine", "64"], stdout=subprocess.DEVNULL).returncode:
        return skipped("there is no Wine here")
    with tempfile.TemporaryDirectory() as name:
        copy = Path(name) / "qxanalysis"
        copy.mkdir()
        copied(source, copy)
        (copy / "build").mkdir()
        (copy / "build" / ("win64" if windows else "release")).symlink_to(build)
        environment = {**os.environ, "HOME": name, "PATH": DEBIAN_PATH,
                       "QX_CACHE": str(machine_cache(source))}
        for variable in ("PYTHONPATH", "QX_LIBRARY_DIR"):
            environment.pop(variable, None)
        ran = subprocess.run(["bash", "-c", script((source / "README.md").read_text("utf-8"), windows)],
                             cwd=copy, env=environment, stdin=subprocess.DEVNULL)
        return ran.returncode


# Runs first: an installation that is interrupted while packages are being unpacked, which the first ./run
# must repair.
INTERRUPTED = """
tools/setup/native & native=$!
until ls /var/lib/dpkg/info/libc6-dev*.list >/dev/null 2>&1 || ! kill -0 $native; do sleep 0.1; done
kill -TERM $native && ! wait $native
[ ! -e /proc/$native ] && echo "== interrupted: $(dpkg --audit | wc -l) lines of dpkg --audit"
"""

# Mounts the virtual file systems in a separate mount namespace, and enters the root.
ENTER = """
set -e
mount -t proc proc "$1/proc"
mount --rbind /dev "$1/dev"
mount --bind "$2" "$1/var/cache/apt/archives"
exec chroot "$1" /usr/bin/env -i HOME=/root PATH="$3" LANG=C.UTF-8 bash -c 'cd /root/qxanalysis && . ./.readme'
"""


def on_a_bare_root(source):
    made = subprocess.run([source / "tools/setup/bare-root"], stdout=subprocess.PIPE, text=True)
    if made.returncode == SKIPPED:
        return skipped("there is no bare Debian root")
    if made.returncode:
        return made.returncode
    if subprocess.run(["unshare", "--mount", "true"], capture_output=True).returncode:
        return skipped("nothing can be mounted")
    cache = machine_cache(source)
    root = cache / "bare-root.used"
    lock = (cache / "bare-root.used.lock").open("w")  # held until this program ends
    fcntl.flock(lock, fcntl.LOCK_EX)
    shutil.rmtree(root, ignore_errors=True)
    subprocess.run(["cp", "-a", made.stdout.strip(), root], check=True)
    try:
        copy = root / "root/qxanalysis"
        copy.mkdir(parents=True)
        copied(source, copy)
        (copy / ".readme").write_text(
            INTERRUPTED + script((source / "README.md").read_text("utf-8"), False), "utf-8")
        # Copies the machine's way to reach Debian, and the third-party libraries compiled so far; the sources
        # are fetched.
        for file in ("resolv.conf", "hosts"):
            shutil.copy(f"/etc/{file}", root / "etc" / file)
        ways = subprocess.run(["apt-config", "dump"], capture_output=True, text=True).stdout
        (root / "etc/apt/apt.conf.d/90machine").write_text(
            "".join(re.findall(r"^Acquire::https?::.*\n", ways, re.MULTILINE)), "utf-8")
        (root / "etc/dpkg/dpkg.cfg.d/quick").write_text("force-unsafe-io\n", "utf-8")
        if (cache / "lapack").exists():
            shutil.copytree(cache / "lapack", root / "root/.cache/qxanalysis/lapack")
        packages = cache / PACKAGES_CACHE
        (packages / "partial").mkdir(parents=True, exist_ok=True)
        return subprocess.run(["unshare", "--mount", "--propagation", "private", "bash", "-c", ENTER, "bash",
                               root, packages, DEBIAN_PATH], stdin=subprocess.DEVNULL).returncode
    finally:
        shutil.rmtree(root, ignore_errors=True)


def skipped(reason):
    print(f"SKIPPED: {reason}; nothing has run")
    return SKIPPED


def main(source, build, mode=""):
    source, build = Path(source).resolve(), Path(build).resolve()
    if mode == "--bare":
        return on_a_bare_root(source)
    return on_this_machine(source, build, mode == "--windows")


if __name__ == "__main__":
    sys.exit(main(*sys.argv[1:]))
