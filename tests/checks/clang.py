"""Compiles every source of the build again with clang, or looks for mistakes in those of the product with clang-tidy.
Arguments: warnings or tidy, the build folder."""
import json
import pathlib
import shlex
import sys

from tree import ROOT, finish, run_each

what, build = sys.argv[1:]
jobs = []
tidied = set()
for entry in json.loads(pathlib.Path(build, "compile_commands.json").read_text(encoding="utf-8")):
    path = pathlib.Path(entry["file"]).relative_to(ROOT)
    if what == "warnings":
        flags = shlex.split(entry["command"])[1:]
        out = flags.index("-o")
        jobs.append((path, ["clang++", "-fsyntax-only", *flags[:out], *flags[out + 2:]], None))
    elif path.parts[0] not in ("bench", "tests") and path not in tidied:
        tidied.add(path)
        jobs.append((path, ["clang-tidy", "--quiet", "-p", build, entry["file"]], None))
finish(len(jobs), run_each(jobs))
