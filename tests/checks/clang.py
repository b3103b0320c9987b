"""Compiles every source of the build again with clang, or looks for mistakes in those of the product with clang-tidy.
Sources that passed are not looked at again until they or a file that they include change. Arguments: warnings or
tidy, the build folder."""
import functools
import hashlib
import json
import pathlib
import shlex
import subprocess
import sys

from tree import ROOT, Job, finish, run_each


def output(*command):
    return subprocess.run(command, stdout=subprocess.PIPE, text=True, check=True).stdout


what, build = sys.argv[1], pathlib.Path(sys.argv[2])
rules = output("clang++", "--version") + (ROOT / ".clang-tidy").read_text(encoding="utf-8")

# What each object was made of, as its compiler has told; nothing for an object that is not built.
made_of = {}
for line in output("ninja", "-C", build, "-t", "deps").splitlines():
    if line.startswith("    "):
        current.append(line.strip())
    elif line:
        current = []
        if line.endswith("(VALID)"):
            made_of[line.split(": #deps")[0]] = current


@functools.cache
def digest(path):
    return hashlib.sha256((build / path).read_bytes()).hexdigest()


def stamp(target, command):
    if target not in made_of:
        return None
    key = [rules, shlex.join(map(str, command)), *map(digest, made_of[target])]
    return build / "checked" / hashlib.sha256("\n".join(key).encode()).hexdigest()


jobs = []
tidied = set()
for entry in json.loads((build / "compile_commands.json").read_text(encoding="utf-8")):
    path = pathlib.Path(entry["file"]).relative_to(ROOT)
    flags = shlex.split(entry["command"])[1:]
    out = flags.index("-o")
    command = ["clang++", "-fsyntax-only", *flags[:out], *flags[out + 2:]]
    if what == "tidy":
        if path.parts[0] in ("bench", "tests") or path in tidied:
            continue
        tidied.add(path)
        command = ["clang-tidy", "--quiet", "-p", build, entry["file"]]
    jobs.append(Job(path, command, stamp=stamp(flags[out + 1], [*flags, *command])))
finish(len(jobs), run_each(jobs))
