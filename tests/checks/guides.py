"""C++ in the guides is a part of a file below examples/guide, but for its indentation, or all of one if it has
includes. Each of these programs is named in a guide."""
import re

from tree import ROOT, files, finish


def bare(text):
    return "\n".join(line.strip() for line in text.strip().splitlines())


sources = {path: bare((ROOT / path).read_text(encoding="utf-8")) for path in files(".cpp") if "examples/guide/" in path}
guides = {path: (ROOT / path).read_text(encoding="utf-8") for path in files(".md") if path.startswith("docs/")}
complaints = []
looked_at = 0
for path, text in guides.items():
    for block in re.findall(r"^```cpp\n(.*?)^```$", text, re.M | re.S):
        looked_at += 1
        whole = "#include" in block
        if not any(bare(block) == source if whole else f"\n{bare(block)}\n" in source for source in sources.values()):
            complaints.append(f"{path}: in no program of examples/guide: {block.splitlines()[0]}")
complaints += [f"{path}: in no guide" for path in sources if not any(path in text for text in guides.values())]
finish(looked_at, complaints)
