"""What libtessella.so shows to the dynamic linker is the list of the public interface, and its soname is the one that
applications are linked against. Arguments: the library, the list, the soname."""
import pathlib
import re
import subprocess
import sys

from tree import finish


def output(*command):
    return subprocess.run(command, stdout=subprocess.PIPE, text=True, check=True).stdout


library, listing, soname = sys.argv[1:]
lines = pathlib.Path(listing).read_text(encoding="utf-8").splitlines()
wanted = [line for line in lines if line and not line.startswith("#")]
# A constructor is there once for whole objects and once for bases, under one readable name.
shown = {line.split(maxsplit=2)[2] for line in
         output("nm", "--dynamic", "--defined-only", "--demangle", library).splitlines()}

complaints = [f"exported, but not in the list: {name}" for name in sorted(shown - set(wanted))]
complaints += [f"in the list, but not exported: {name}" for name in wanted if name not in shown]
if wanted != sorted(set(wanted)):
    complaints.append("the list is not sorted, or names something twice")
found = re.findall(r"\(SONAME\).*\[(.*)\]", output("readelf", "--dynamic", "--wide", library))
if found != [soname]:
    complaints.append(f"soname {found} instead of {soname}")
finish(len(shown), complaints)
