"""What the checks share: the tree's files, and running one command for each of many files."""
import concurrent.futures
import os
import pathlib
import subprocess
import sys
import typing

ROOT = pathlib.Path(__file__).resolve().parents[2]


def files(*suffixes):
    """Paths below ROOT with one of the suffixes, as strings with slashes; builds and hidden folders left out."""
    found = []
    for folder, folders, names in os.walk(ROOT):
        folders[:] = [name for name in folders if not name.startswith((".", "build"))]
        found += [pathlib.Path(folder, name) for name in names if name.endswith(suffixes)]
    return sorted(path.relative_to(ROOT).as_posix() for path in found)


def finish(looked_at, complaints):
    """Prints the complaints and ends the check; a check that looked at nothing has failed."""
    for complaint in complaints:
        print(complaint)
    if not looked_at:
        sys.exit("nothing to check")
    print(f"{looked_at} looked at, {len(complaints)} complaints")
    sys.exit(1 if complaints else 0)


class Job(typing.NamedTuple):
    name: object
    command: list
    text: str = None  # standard input
    stamp: pathlib.Path = None  # a file that stands for this very job's success, now or in an earlier run


def run_each(jobs):
    """Runs the jobs that have not succeeded yet, as many at once as there are processors. Complaints of those that
    fail."""
    def run(job):
        if job.stamp and job.stamp.exists():
            return None
        done = subprocess.run(job.command, input=job.text, cwd=ROOT, text=True, check=False,
                              stdout=subprocess.PIPE, stderr=subprocess.STDOUT)
        if done.returncode != 0:
            return f"{job.name}:\n{done.stdout}"
        if job.stamp:
            job.stamp.parent.mkdir(exist_ok=True)
            job.stamp.touch()
        return None

    complaints = []
    with concurrent.futures.ThreadPoolExecutor(len(os.sched_getaffinity(0))) as pool:
        for done, complaint in enumerate(pool.map(run, jobs), 1):
            if sys.stderr.isatty():
                print(f"\r{done} of {len(jobs)}", end="" if done < len(jobs) else "\n", file=sys.stderr, flush=True)
            complaints += [complaint] if complaint else []
    return complaints
