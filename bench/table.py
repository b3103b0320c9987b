"""Runs the programs of all groups, prints one table of medians beside the best peer's, and writes everything
to bench.json. Arguments: the programs' folder, the folder for the results; options: see scripts/bench."""
import argparse
import json
import os
import pathlib
import re
import statistics
import subprocess
import sys

OURS = "tessella"
CLOCK = "/process_time"  # how Google Benchmark marks the clock that main.cpp asks for
GROUPS = ["rectangles", "regions", "cuts", "windows", "pointer", "shadows", "fills", "blits", "desktop", "figures",
          "archive", "text", "built_in_font"]

# These merge with lists of bands that the library reports as damaged, each time with the call stack. They run
# with the reports off, which leaves the work itself, and on; all other rows report nothing and run with
# assertions on.
REPORTING = re.compile(r"unions, random")

# (row; the least ratio; the one to aim at). The first match counts; other rows are for information.
GOALS = [(re.compile(row), least, aim) for row, least, aim in [
    (r"unions, .* n = 10$", 0.8, 1.1),
    (r"unions, .* n = 100$", 0.8, 1.5),
    (r"unions, .* n = 1000$", 0.8, 1.5),
    (r"unions, .* n = 10000$", 0.9, 3),
    (r"subtractions, .* n = 10$", 1.1, 2),
    (r"subtractions, .* n = 100$", 1.2, 3),
    (r"subtractions, .* n = 1000$", 1.2, 3),
    (r"subtractions, .* n = 10000$", 1.7, 5),
    (r"region [-+&] region, ", 0.4, 0.8),
    (r"cut of 16x16, clip of 10{2,} ranges", 1.0, 5),
    (r"cut of ", 1.0, 1.6),
    (r"visible regions, 10 windows$", 1.0, 1.5),
    (r"visible regions, 100 windows$", 1.1, 2),
    (r"visible regions, 1000 windows$", 1.2, 2.5),
    (r"solid fill 1024x768, (16|24|32) bits", 0.9, 1.0),
    (r"solid fill 300x200, ", 0.8, 0.9),
    (r"FillRegion 16x16, .*clip of 1 range,", 0.8, 1.1),
    (r"copy 1024x768, 32 bits", 0.85, 0.95),
    (r"copy 16x16, 32 bits", 0.9, 1.1),
    (r"convert ", 1.0, 2),
    (r"blend 300x200, random alpha, 32 bits", 0.8, 2),
    (r"blend 300x200, random alpha, 16 bits", 1.2, 2.6),
    (r"blend 300x200, alpha like an icon's", 1.0, 1.6),
    (r"blend 300x200, uniform alpha, 32 bits", 1.0, 1.7),
    (r"blend 300x200, uniform alpha, 16 bits", 2.0, 4),
    (r"(shade|FillRegionAlpha) 300x200, 32 bits", 1.0, 1.5),
    (r"(shade|FillRegionAlpha) 300x200, 16 bits", 1.0, 2),
    (r"diffuse 300x200, opaque, 16 bits", 6, 10),
    (r"diffuse 300x200, over, 16 bits", 5, 6),
    (r"diffuse 300x200, opaque, 8 bits", 4, 6),
    (r"64 lines, horizontal, ", 1.0, 1.3),
    (r"64 lines, vertical, ", 0.95, 1.0),
    (r"64 lines, 45 degrees, ", 0.8, 1.0),
    (r"64 lines, random, ", 0.7, 0.95),
    (r"64 filled ellipses \d+x\d+, \d+ bits", 1.5, 5),
    (r"64 outlined ellipses \d+x\d+, \d+ bits", 10, 30),
    (r"1-bit text, transparent, 32 bits,", 1.5, 5),
    (r"1-bit text, opaque, 32 bits,", 1.0, 1.4),
    (r"grey text, 8x16, 32 bits,", 1.0, 2),
    (r"grey text, proportional, 32 bits,", 1.0, 1.5),
    (r"grey text, proportional, 16 bits,", 0.8, 1.1),
    (r"loading the built-in font$", 0.33, 0.67),
    (r"start-up: archive and key layouts$", 0.67, 0.9),
    (r"desktop ", 0.8, 1.4),
]]

# One union into 10,000 rectangles may cost this much more than one into 1,000.
GROWTH_ROWS = [("unions, sparse rectangles, n = 1000", 1_000),
               ("unions, sparse rectangles, n = 10000", 10_000)]
MOST_GROWTH = 25

VECTOR_FEATURES = re.compile(r"(sse|ssse|avx|amx|fma|neon|asimd|sve|erms|fsrm)\w*$")


def pattern(text):
    try:
        return re.compile(text)
    except re.error as error:
        raise argparse.ArgumentTypeError(f"'{text}' is no regular expression: {error}") from error


def parse_arguments():
    parser = argparse.ArgumentParser(prog="bench", description="Measures the library beside its peers.")
    parser.add_argument("programs", type=pathlib.Path, help=argparse.SUPPRESS)
    parser.add_argument("results", type=pathlib.Path, help=argparse.SUPPRESS)
    parser.add_argument("--filter", type=pattern, default="", metavar="REGEX",
                        help="only rows that match")
    parser.add_argument("--repetitions", type=int, default=9, metavar="N",
                        help="medians are of so many rounds (9)")
    arguments = parser.parse_args()
    if arguments.repetitions < 1:
        parser.error("--repetitions must be at least 1")
    return arguments


def machine():
    """The processor's name and what it can do, as the kernel tells."""
    fields = {}
    for line in pathlib.Path("/proc/cpuinfo").read_text(encoding="utf-8").splitlines():
        name, _, value = line.partition(":")
        fields.setdefault(name.strip(), value.strip())
    flags = (fields.get("flags") or fields.get("Features") or "").split()
    return {"processor": fields.get("model name") or os.uname().machine,
            "processors": os.cpu_count(),
            "vector_features": [flag for flag in flags if VECTOR_FEATURES.match(flag)],
            "load": os.getloadavg()}


def row_of(name):
    return name.removesuffix(CLOCK).rpartition("/")[0]


def contender_of(name):
    return name.removesuffix(CLOCK).rpartition("/")[2]


def names_in(program):
    """The group's measurements in the order of its source. Before it lists them, the program has compared the
    contenders' results."""
    return subprocess.run([program, "--benchmark_list_tests"], stdout=subprocess.PIPE, text=True,
                          check=True).stdout.splitlines()


def measure(program, names, assertions, arguments):
    """Google Benchmark's reports on the named measurements, one of each of several rounds. Machines have slow and fast
    moments; a row's contenders come one right after the other, so that a round sees them alike."""
    environment = {name: value for name, value in os.environ.items()
                   if not name.startswith("VELLUM_SAFE_ASSERT")}
    if assertions == "off":
        environment["VELLUM_SAFE_ASSERT"] = "none"
    alternatives = "|".join(re.sub(r"[.+]", r"\\\g<0>", name) for name in names)
    reports = []
    for number in range(1, arguments.repetitions + 1):
        report = arguments.results / f"{program.name}-{assertions}-{number}.json"
        subprocess.run([program, f"--benchmark_filter=^({alternatives})$", "--benchmark_min_time=0.02",
                        f"--benchmark_out={report}", "--benchmark_out_format=json"],
                       env=environment, stdout=subprocess.DEVNULL, stderr=subprocess.DEVNULL, check=True)
        reports.append(json.loads(report.read_text(encoding="utf-8")))
    return reports


def rows_from(reports, names, assertions):
    """The table's rows: medians over the rounds, of nanoseconds of processor time, which other programs disturb least,
    and of the ratios that each round has."""
    times = {}
    for report in reports:
        for run in report["benchmarks"]:
            times.setdefault(run["name"], []).append(run["cpu_time"])
    rows = []
    for row in dict.fromkeys(map(row_of, names)):
        measured = {contender_of(name): times[name] for name in names if row_of(name) == row}
        ours = measured.pop(OURS)
        ratios = {peer: statistics.median(theirs / our for theirs, our in zip(measured[peer], ours))
                  for peer in measured}
        best = min(ratios, key=ratios.get)
        ratio = ratios[best]
        _, least, aim = next((goal for goal in GOALS if goal[0].match(row)), (None, None, None))
        if REPORTING.match(row) and assertions == "on":
            least = aim = None  # the price of the reports, not of the work
        reach = "" if least is None else "short" if ratio < least else "ok" if ratio < aim else "aim"
        rows.append({"row": row, "assertions": assertions, "ours": statistics.median(ours),
                     "peers": {peer: statistics.median(theirs) for peer, theirs in measured.items()},
                     "best_peer": best, "ratio": ratio, "least": least, "aim": aim, "reach": reach})
    return rows


def growth_of(rows):
    """How much more one union costs in the larger region, for us and for each peer; {} if not measured."""
    costs = []
    for name, count in GROWTH_ROWS:
        for row in rows:
            if row["row"] == name:
                costs.append({who: time / count for who, time in {OURS: row["ours"], **row["peers"]}.items()})
    return {who: costs[1][who] / costs[0][who] for who in costs[0]} if len(costs) == 2 else {}


def print_table(here, rows, growth, repetitions):
    print(f"{here['processor']}, {here['processors']} processors; {' '.join(here['vector_features'])}")
    print(f"load {here['load'][0]:.1f} before; medians of {repetitions} rounds; ratio: the peer's time by ours\n")
    width = max(len(row["row"]) for row in rows)
    print(f"{'row':{width}}  asserts      ours/ns      peer/ns  best peer  ratio  least   aim")
    for row in rows:
        goals = "" if row["least"] is None else f"  {row['least']:5.1f} {row['aim']:5.1f}  {row['reach']}"
        best = row["best_peer"]
        print(f"{row['row']:{width}}  {row['assertions']:7} {row['ours']:12,.1f} {row['peers'][best]:12,.1f}"
              f"  {best:9} {row['ratio']:6.2f}{goals}")
    if growth:
        verdict = "ok" if growth[OURS] <= MOST_GROWTH else "short"
        factors = ", ".join(f"{who} {factor:.1f}x" for who, factor in growth.items())
        print(f"\ngrowth of one union, sparse rectangles, n = 1000 to 10000: {factors};"
              f" at most {MOST_GROWTH}x: {verdict}")


def main():
    arguments = parse_arguments()
    arguments.results.mkdir(parents=True, exist_ok=True)
    here, rows, reports = machine(), [], []
    for group in GROUPS:
        program = arguments.programs / group
        names = [name for name in names_in(program) if re.search(arguments.filter, row_of(name))]
        for assertions in ("off", "on"):
            some = [name for name in names if assertions == "on" or REPORTING.match(name)]
            if not some:
                continue
            print(f"bench: {group}, assertions {assertions}", file=sys.stderr)
            reports.append(measure(program, some, assertions, arguments))
            rows += rows_from(reports[-1], some, assertions)
    if not rows:
        sys.exit("bench: no row matches")
    growth = growth_of(rows)
    print_table(here, rows, growth, arguments.repetitions)
    results = arguments.results / "bench.json"
    everything = {"machine": here, "rows": rows, "growth": growth, "runs": reports}
    results.write_text(json.dumps(everything, indent=1), encoding="utf-8")
    print(f"everything: {results}")


try:
    main()
except subprocess.CalledProcessError as error:
    sys.exit(f"bench: {error.cmd[0]} failed with status {error.returncode}")
except KeyboardInterrupt:
    sys.exit(130)
