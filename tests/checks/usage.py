"""Every tool and script helps whoever asks, refuses in a line what it doesn't know, and dies of nothing. Arguments: the
build folder, the version."""
import os
import pathlib
import subprocess
import sys

from tree import ROOT, finish

build, version = pathlib.Path(sys.argv[1]), sys.argv[2]
tools = [path for folder in ("care", "console", "tools") for path in (build / folder).iterdir()
         if path.is_file() and not path.suffix and os.access(path, os.X_OK)]
scripts = [ROOT / "scripts" / name for name in ("bench", "build", "demo", "fetch-kernel", "setup", "test")]
complaints = []


def told(path, *words):
    """The exit status, and what is written to both streams."""
    done = subprocess.run([path, *words], stdin=subprocess.DEVNULL, stdout=subprocess.PIPE, stderr=subprocess.STDOUT,
                          text=True, timeout=60, check=False)
    if done.returncode < 0 or "Traceback" in done.stdout:
        complaints.append(f"{path.name} {' '.join(words)}: dies: {done.returncode} {done.stdout}")
    return done.returncode, done.stdout


for path in tools + scripts:
    status, help_text = told(path, "--help")
    if status != 0 or path.name not in help_text:
        complaints.append(f"{path.name} --help: {status} {help_text}")
    status, refusal = told(path, "--no-such-option")
    if status != 2 or not refusal.startswith(f"{path.name}: ") or refusal.count("\n") != 1:
        complaints.append(f"{path.name} --no-such-option: {status} {refusal}")
for path in tools:
    if told(path, "--version") != (0, f"{path.name} {version}\n"):
        complaints.append(f"{path.name} --version: {told(path, '--version')}")
    for missing in (["/none/1"], ["check", "/none/1"], ["--output", "/none/1", "/none/2"], ["/none/1", "a=/none/2"],
                    [f"/none/{i}" for i in range(5)]):
        if told(path, *missing)[0] == 0:
            complaints.append(f"{path.name} {missing}: needs no file")
finish(len(tools) + len(scripts), complaints)
