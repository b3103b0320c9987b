"""What programs that exist were compiled with: the layout of the public classes, bases and fields with their offsets,
and the slots of virtual operations, equal the list in abi.txt. With TESSELLA_BLESS=1 the list is written anew."""
import difflib
import os
import pathlib
import re
import subprocess

from tree import ROOT, finish

LISTING = pathlib.Path(__file__).with_name("abi.txt")
HEADER = """# The layout of the public classes, and the slots of their virtual operations, for checks.abi. A class a paragraph;
# fields stand behind their offsets. Whatever changes a line that is here breaks programs that exist.
"""
CLASS = re.compile(r"^( *)(?:class|struct) (?:GR_API )?(\w+)(?: : [^;{]+)? \{$", re.M)
LAYOUT = re.compile(r"^\*\*\* Dumping AST Record Layout\n +0 \| (?:class|struct) (Gr.*)\n((?: .*\n)*)", re.M)
# Parts of parts have a paragraph of their own, or are the standard library's.
PART = re.compile(r"^( *\d+) \|   (\S.*)$", re.M)
SIZE = re.compile(r"sizeof=(\d+), dsize=\d+, align=(\d+),\s*\|\s*(nvsize=\d+)")
SLOTS = re.compile(r"^VTable indices for '(Gr.*)' .*\n((?: .*\n)*)", re.M)


def compiled(compiler, text, *flags):
    command = [compiler, "-std=c++20", f"-I{ROOT}/include", *flags, "-o", os.devnull, "-x", "c++", "-"]
    done = subprocess.run(command, input=f"#include <tessella.h>\n{text}", text=True, check=True, stdout=subprocess.PIPE)
    return done.stdout


def public_classes():
    """Classes that are no templates; instances of those come along as parts."""
    for header in sorted((ROOT / "include" / "tessella").glob("*.h")):
        outer = ""
        for indented, name in CLASS.findall(re.sub(r"template <.*>\n.*", "", header.read_text(encoding="utf-8"))):
            outer = outer if indented else name
            yield f"{outer}::{name}" if indented else name


def paragraphs():
    """The text about each class. The compiler tells it of classes of which something is destroyed."""
    classes = list(public_classes())
    told = compiled("clang++", "".join(f"void Destroy({name}* one) {{ delete one; }}\n" for name in classes),
                    "-c", "-Xclang", "-fdump-record-layouts", "-Xclang", "-fdump-vtable-layouts").replace("_Bool", "bool")
    found = {}
    asserted = ""
    for name, layout in LAYOUT.findall(told):
        size, alignment, rest = SIZE.search(layout).groups()
        asserted += f"static_assert(sizeof({name}) == {size} && alignof({name}) == {alignment});\n"
        found[name] = [f"{name}: size={size} align={alignment} {rest}",
                       *(f"{offset}  {part}" for offset, part in PART.findall(layout))]
    for name, slots in SLOTS.findall(told):
        found[name] += ["  virtual operations:", *(line.replace(" |", " ") for line in slots.splitlines())]
    assert found.keys() >= set(classes), f"nothing is told of {set(classes) - found.keys()}"
    compiled("g++", asserted, "-fsyntax-only")  # the library's compiler has the same opinion
    return {name: "\n".join(lines) for name, lines in sorted(found.items())}


now = paragraphs()
if os.environ.get("TESSELLA_BLESS"):
    LISTING.write_text(HEADER + "".join(f"\n{text}\n" for text in now.values()), encoding="utf-8")
recorded = {text.split(": size=")[0]: text.rstrip("\n") for text in LISTING.read_text(encoding="utf-8").split("\n\n")[1:]}
complaints = []
for name in sorted(now.keys() | recorded.keys()):
    before, after = (text.get(name, "").splitlines() for text in (recorded, now))
    if before != after:
        lines = (line for line in difflib.ndiff(before, after) if not line.startswith("?"))
        complaints.append("\n".join([f"{name} is not as recorded:", *lines]))
if complaints:
    complaints.append("Programs that exist would break. If that is meant: TESSELLA_BLESS=1 ctest -R checks.abi")
finish(len(now), complaints)
