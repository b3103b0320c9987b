"""Runs programs on a real framebuffer console and on the virtual console: both must show the same screen."""

import argparse
import os
import shutil
import subprocess
import sys
from pathlib import Path

import machine
import picture
import script

VIRTUAL_SECONDS = 200


class Difference(Exception):
    """The two consoles do not show the same; the text names the pictures."""


def main() -> int:
    options = parse_options()
    try:
        programs = [options.example, options.pattern, options.state, *(play[0] for play in options.play)]
        with machine.boot(options.bits, programs, options.kernel, options.keep) as real:
            print("the kernel is up", flush=True)
            # The example first: it is to meet the screen as the kernel leaves it.
            compare_program(real, options, options.example)
            compare_program(real, options, options.pattern)
            for program, path, language in options.play:
                print(f"playing {path.name} to {program.name}", flush=True)
                compare_script(real, options, program, path, str(language))
    except (
        Difference, machine.MachineError, machine.MissingPart, script.ScriptError, ValueError, OSError
    ) as error:
        print(f"realconsole.{options.bits}: {error}", file=sys.stderr)
        return 1
    except KeyboardInterrupt:
        return 130
    return 0


def parse_options() -> argparse.Namespace:
    parser = argparse.ArgumentParser(description=__doc__)
    parser.add_argument("--bits", type=int, required=True, choices=sorted(machine.VGA_MODES))
    parser.add_argument("--example", type=Path, required=True, help="holds its picture with --hold")
    parser.add_argument("--pattern", type=Path, required=True, help="the same, and tells of the device")
    parser.add_argument(
        "--play", type=Path, nargs=3, action="append", default=[], metavar=("PROGRAM", "SCRIPT", "LANGUAGE"),
        help="both consoles' users follow the script; may be repeated",
    )
    parser.add_argument("--state", type=Path, required=True, help="tells how a console is set up")
    parser.add_argument("--console", type=Path, required=True, help="the virtual console")
    parser.add_argument("--kernel", type=Path, required=True, help="what scripts/fetch-kernel left")
    parser.add_argument("--keep", type=Path, required=True, help="the folder for pictures and logs")
    return parser.parse_args()


def compare_program(real: machine.Machine, options: argparse.Namespace, program: Path) -> None:
    """With --hold a program says "ready" when its picture stands and cleans up after one line of input;
    without, it ends and leaves the picture."""
    real.start(f"{program} --hold")
    real_words = real.wait_line("ready")
    real_screen = real.screenshot()
    real.send_line()
    status, last_words = real.finish()
    if status != 0:
        raise Difference(f"{program.name} ended with status {status} on the real console: {last_words}")

    stem = options.keep / program.name
    virtual_words, virtual_screen = run_on_virtual_console(options, program, stem.with_suffix(".virtual.png"))
    if virtual_words != real_words:
        raise Difference(f"{program.name} wrote {real_words} on the real console, virtually {virtual_words}")
    compare_screens(real_screen, virtual_screen, stem)


def compare_script(
    real: machine.Machine, options: argparse.Namespace, program: Path, path: Path, language: str
) -> None:
    """The program writes the same, and shows the same at each of the script's screenshots."""
    steps = script.read_steps(options.console, path)
    names = [step.split()[1] for step in steps if step.startswith("screenshot ")]
    real_folder, virtual_folder = (options.keep / f"{program.name}.{language}" / kind for kind in ("real", "virtual"))
    for folder in (real_folder, virtual_folder):
        shutil.rmtree(folder, ignore_errors=True)
        folder.mkdir(parents=True)
    virtual_words = run_virtually(options, program, ["--script", path], virtual_folder, language)
    real.run(f"{options.pattern} --reset")  # what the program before has left in an adapter is seen
    real_words = script.Player(real, real_folder, options.state).play(steps, program, language)
    if virtual_words != real_words:
        for folder, words in ((real_folder, real_words), (virtual_folder, virtual_words)):
            folder.with_suffix(".txt").write_text("\n".join(words), encoding="utf-8")
        raise Difference(f"{program.name} wrote what differs: see the .txt in {real_folder.parent}")
    for name in names:
        screens = (picture.read_png(folder / name) for folder in (real_folder, virtual_folder))
        compare_screens(*screens, real_folder.parent / Path(name).stem)


def run_on_virtual_console(
    options: argparse.Namespace, program: Path, screenshot: Path
) -> tuple[list[str], picture.Picture]:
    screenshot.unlink(missing_ok=True)
    words = run_virtually(options, program, ["--screenshot", screenshot])
    return words, picture.read_png(screenshot)


def run_virtually(
    options: argparse.Namespace, program: Path, further: list, folder: Path | None = None, language: str = "C"
) -> list[str]:
    size = "640x480" if options.bits == 4 else "1024x768"
    command = [options.console, "--mode", f"{size}x{options.bits}", *further, "--", program]
    try:
        result = subprocess.run(
            command, stdout=subprocess.PIPE, stderr=subprocess.STDOUT, text=True, cwd=folder,
            env=os.environ | {"LC_ALL": language}, timeout=VIRTUAL_SECONDS, check=False,
        )
    except subprocess.TimeoutExpired:
        raise Difference(f"{program.name} does not end on the virtual console") from None
    if result.returncode != 0:
        raise Difference(
            f"{program.name} ended with status {result.returncode} on the virtual console: {result.stdout}"
        )
    return result.stdout.splitlines()


def compare_screens(real: picture.Picture, virtual: picture.Picture, stem: Path) -> None:
    """Leaves the real screen beside the virtual one if they differ, and a picture of where they do."""
    real_path = stem.with_suffix(".real.png")
    virtual_path = stem.with_suffix(".virtual.png")
    difference_path = stem.with_suffix(".difference.png")
    difference_path.unlink(missing_ok=True)
    picture.write_png(real_path, real)
    if (real.width, real.height) != (virtual.width, virtual.height):
        raise Difference(
            f"the real screen is {real.width}x{real.height}, the virtual one {virtual.width}x{virtual.height}"
            f"; see {real_path} and {virtual_path}"
        )
    if real.pixels == real.pixels[:3] * (real.width * real.height):
        raise Difference(f"the real screen is empty: see {real_path}")
    marked = picture.differing_pixels(real, virtual)
    if marked:
        picture.write_png(difference_path, picture.difference(real, marked))
        y, x = divmod(marked[0], real.width)
        raise Difference(
            f"{len(marked)} pixels differ, the first at ({x}, {y}): real {real.at(marked[0])}, "
            f"virtual {virtual.at(marked[0])}; see {real_path}, {virtual_path} and {difference_path}"
        )


if __name__ == "__main__":
    sys.exit(main())
