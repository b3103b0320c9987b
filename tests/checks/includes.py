"""Reads every include line against the arrows that never run (docs/architecture.md)."""
import re

from tree import ROOT, files, finish

DEVICE = r"<(linux/.*|sys/ioctl\.h|termios\.h|sys/io\.h|signal\.h|csignal|poll\.h|sys/poll\.h)>"
CXX_LIBRARY = r"<[a-z_0-9]+>"
PUBLIC = r"include/tessella(\.h|/.*)"

# (who, by path; what it never includes: a path in the tree, or a system header in angle brackets; because)
NEVER = [
    (r"(include/)?(common|file)/.*|(xml|bundle)/.*", r"(include/)?tessella[./].*",
     "the foundation builds and is tested without graphics"),
    # An application's thread blocks a signal there.
    (r"(include|tessella|xml|bundle|examples)/(?!guide/input\.).*(?<!_l)\.\w+", DEVICE,
     "logic runs on a machine without a console"),
    (r"(include/)?tessella/region.*",
     rf"(?!include/tessella/(region|types|export)\.h|tessella/coordinates\.h|include/common/assert\.h"
     rf"|tessella/region|{CXX_LIBRARY}|<immintrin\.h>).*",
     "a region knows coordinates and assertions only"),
    (r"tessella/pixel/.*", r"(include/)?tessella/(window|event|mouse|keyboard|key_layout|cursor|font_|cgf|session_(l|state)).*",
     "a context knows a region, not who wants it"),
    (r"(include/)?tessella/(?!pixel/|video_mode|image).*", r"tessella/pixel/.*",
     "only the mode's two factories know pixel formats"),
    (r"tessella/(mouse|keyboard)_l.*", r"(include/)?tessella/(window|key_layout).*",
     "device threads push and wake"),
    (PUBLIC, rf"(?!{PUBLIC}|{CXX_LIBRARY}|<sys/time\.h>).*", "the boundary is the product"),
    *((rf"examples/{one}/.*", rf"(?!include/tessella|examples/{one}/|<).*", "examples have what applications have")
      for one in ("gallery", "keys", "text", "desktop")),
    (r"examples/(guide/)?[^/]*", r"(?!include/tessella|<).*", "examples have what applications have"),
    (r"(?!tests/).*", r"tests/.*", "production never knows its tests"),
]

INCLUDE = re.compile(r'^[ \t]*#[ \t]*include[ \t]*([<"])([^>"]+)[>"]', re.MULTILINE)
TEST_SEAM = re.compile(r"^[ \t]*#[ \t]*(el)?if.*\bTEST", re.MULTILINE)


def target(path, quote, name):
    """The path in the tree that an include names, or the name in angle brackets."""
    places = ["include", ".", "tests"]
    if quote == '"':
        places.insert(0, (ROOT / path).parent)
    for place in places:
        found = (ROOT / place / name).resolve()
        if found.is_file() and found.is_relative_to(ROOT):
            return found.relative_to(ROOT).as_posix()
    return f"<{name}>"


sources = files(".cpp", ".h", ".inl")
complaints = []
for path in sources:
    text = (ROOT / path).read_text(encoding="utf-8")
    for included in (target(path, *include.groups()) for include in INCLUDE.finditer(text)):
        complaints += [f"{path} includes {included}: {because}" for who, never, because in NEVER
                       if re.fullmatch(who, path) and re.fullmatch(never, included)]
    if TEST_SEAM.search(text):
        complaints.append(f"{path}: code for tests only; seams are real interfaces or none")
finish(len(sources), complaints)
