"""Every header compiles alone, with both compilers. Argument: the flags, as the build uses them."""
import sys

from tree import ROOT, Job, files, finish, run_each

jobs = [Job(f"{header} ({compiler})",
            [compiler, "-std=c++20", "-fsyntax-only", *sys.argv[1:], f"-I{ROOT}/include", f"-I{ROOT}",
             f"-I{ROOT}/tests", "-x", "c++", "-"],
            f'#include "{ROOT}/{header}"\n')
        for header in files(".h") for compiler in ("g++", "clang++")]
finish(len(jobs), run_each(jobs))
