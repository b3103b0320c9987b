"""The layout of every source is clang-format's; `clang-format -i FILE` mends it. It leaves comments as they are,
so their width is looked at here."""
from tree import ROOT, Job, files, finish, run_each

WIDTH = 110

sources = files(".cpp", ".h", ".inl")
jobs = [Job(path, ["clang-format", "--dry-run", "-Werror", path]) for path in sources]
complaints = [complaint.splitlines()[1] for complaint in run_each(jobs)]
for path in sources:
    for number, line in enumerate((ROOT / path).read_text().splitlines(), 1):
        if len(line) > WIDTH:
            complaints.append(f"{path}:{number}: {len(line)} columns, at most {WIDTH}")
finish(len(jobs), complaints)
